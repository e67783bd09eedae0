#include "platform/base/LinkedListManager.h"

#include <gtest/gtest.h>
#include <vector>

namespace
{
class Item : public LinkedListElement<Item>
{
public:
    explicit Item(int number) : m_number(number) { ++s_alive; }
    Item(Item const& other) : LinkedListElement<Item>(other), m_number(other.m_number) { ++s_alive; }
    Item& operator=(Item const&) = default;
    virtual ~Item() { --s_alive; }

    int m_number;
    static inline int s_alive = 0;
};

class DerivedItem : public Item
{
public:
    DerivedItem(int number, bool& ended) : Item(number), m_ended(ended) {}
    ~DerivedItem() override { m_ended = true; }

private:
    bool& m_ended;
};

using Numbers = std::vector<int>;

Numbers NUMBERS(LinkedListManager<Item> const& list)
{
    Numbers numbers;
    for (Item const& item : list)
        numbers.push_back(item.m_number);
    return numbers;
}

class LinkedListManagerTest : public testing::Test
{
protected:
    void TearDown() override { EXPECT_EQ(0, Item::s_alive); }
};
} // namespace

TEST_F(LinkedListManagerTest, ItemsKeepTheOrderOfTheirAppending)
{
    LinkedListManager<Item> list;
    EXPECT_TRUE(list.isEmpty());
    for (int const number : {3, 1, 2})
        EXPECT_TRUE(list.append(new Item(number)).isOk());
    EXPECT_EQ((Numbers{3, 1, 2}), NUMBERS(list));
    EXPECT_EQ(3U, list.getCount());
    EXPECT_EQ(3, list.begin()->m_number);
}

TEST_F(LinkedListManagerTest, AnItemThatSitsInAListIsRefused)
{
    LinkedListManager<Item> list;
    LinkedListManager<Item> other;
    Item* const item = new Item(1);
    EXPECT_TRUE(list.append(item).isOk());
    EXPECT_EQ(XCode::REFUSED, list.append(item));
    EXPECT_EQ(XCode::REFUSED, other.append(item));
    EXPECT_EQ(1U, list.getCount());
    EXPECT_TRUE(other.isEmpty());
}

TEST_F(LinkedListManagerTest, ARemovedItemIsDeletedThroughItsOwnDestructor)
{
    LinkedListManager<Item> list;
    bool ended = false;
    Item* const derived = new DerivedItem(2, ended);
    for (Item* const item : {new Item(1), derived, new Item(3)})
        ASSERT_TRUE(list.append(item).isOk());
    list.remove(*derived);
    EXPECT_TRUE(ended);
    EXPECT_EQ((Numbers{1, 3}), NUMBERS(list));
    list.remove(*list.begin());
    EXPECT_EQ((Numbers{3}), NUMBERS(list));
    list.remove(*list.begin());
    EXPECT_TRUE(list.isEmpty());
    EXPECT_EQ(0U, list.getCount());
}

TEST_F(LinkedListManagerTest, ClearingDeletesAllAndTheListIsUsableAgain)
{
    LinkedListManager<Item> list;
    for (int i = 0; i < 3; ++i)
        ASSERT_TRUE(list.append(new Item(i)).isOk());
    list.clear();
    EXPECT_EQ(0, Item::s_alive);
    EXPECT_TRUE(list.append(new Item(9)).isOk());
    EXPECT_EQ((Numbers{9}), NUMBERS(list));
}

TEST_F(LinkedListManagerTest, ACopyOfALinkedItemIsNotLinked)
{
    LinkedListManager<Item> list;
    Item* const linked = new Item(1);
    ASSERT_TRUE(list.append(linked).isOk());
    Item const copy(*linked);
    EXPECT_TRUE(linked->isLinked());
    EXPECT_FALSE(copy.isLinked());
}

TEST_F(LinkedListManagerTest, AssigningLeavesTheLinksOfBothAlone)
{
    LinkedListManager<Item> list;
    Item* const linked = new Item(1);
    ASSERT_TRUE(list.append(linked).isOk());
    Item free(2);
    free = *linked;
    EXPECT_FALSE(free.isLinked());
    *linked = Item(3);
    EXPECT_TRUE(linked->isLinked());
    EXPECT_EQ((Numbers{3}), NUMBERS(list));
}

TEST_F(LinkedListManagerTest, TakingAllAppendsTheOthersInTheirOrder)
{
    Item items[4] = {Item(0), Item(1), Item(2), Item(3)};
    LinkedListManager_Untyped list;
    LinkedListManager_Untyped other;
    list.takeAll(other); // nothing from nothing
    EXPECT_TRUE(list.isEmpty());

    EXPECT_TRUE(list.append(items[0]).isOk());
    for (int i : {1, 2, 3})
        EXPECT_TRUE(other.append(items[i]).isOk());
    list.takeAll(other);
    EXPECT_TRUE(other.isEmpty());
    EXPECT_EQ(0U, other.getCount());
    EXPECT_EQ(4U, list.getCount());

    unsigned int position = 0;
    for (LinkedListElement_Untyped* element = list.getFirst(); element != list.getEnd();
         element = list.getNext(*element))
        EXPECT_EQ(static_cast<LinkedListElement_Untyped*>(&items[position++]), element);
    EXPECT_EQ(4U, position);

    list.unlink(items[3]); // the taken ones are full members
    EXPECT_TRUE(other.append(items[3]).isOk());
    EXPECT_EQ(3U, list.getCount());
    other.takeAll(list);
    EXPECT_EQ(static_cast<LinkedListElement_Untyped*>(&items[3]), other.getFirst());
    EXPECT_EQ(4U, other.getCount());
}
