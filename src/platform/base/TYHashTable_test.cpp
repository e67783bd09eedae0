#include "platform/base/TYHashTable.h"

#include "platform/base/RefusingValue.h"
#include "testing/FailingAllocator.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <numeric>
#include <random>
#include <string>
#include <vector>

namespace
{
template <class Table>
std::vector<int> VALUES(Table const& table)
{
    std::vector<int> values;
    for (auto const* entry = table.getFirst(); entry != nullptr; entry = entry->getNext())
        values.push_back(entry->getValue());
    return values;
}
using Values = std::vector<int>;
} // namespace

TEST(TYHashTable, EntriesAreFoundByKeyAndKeepTheirOrder)
{
    INStringHashTable<int> table(7);
    EXPECT_TRUE(table.add("zulu", 1).isOk());
    EXPECT_TRUE(table.add("alpha", 2).isOk());
    EXPECT_TRUE(table.add("mike", 3).isOk());
    EXPECT_EQ(3U, table.getCount());
    EXPECT_EQ(2, table.get("alpha"));
    EXPECT_EQ((Values{1, 2, 3}), VALUES(table));
    ASSERT_NE(nullptr, table.find("mike"));
    EXPECT_EQ(String("mike"), table.find("mike")->getKey());
}

TEST(TYHashTable, AnAbsentKeyGivesTheDefaultValue)
{
    int value = 0;
    TYUInt32HashTable<int*> table(3);
    EXPECT_TRUE(table.add(1, &value).isOk());
    EXPECT_EQ(&value, table.get(1));
    EXPECT_EQ(nullptr, table.get(4)); // in the same bucket
    EXPECT_EQ(nullptr, table.find(4));
    EXPECT_FALSE(table.remove(4));
}

TEST(TYHashTable, AKeyIsRefusedTheSecondTime)
{
    TYInt32HashTable<int> table(3);
    EXPECT_TRUE(table.add(-1, 10).isOk());
    EXPECT_EQ(XCode::REFUSED, table.add(-1, 11));
    EXPECT_EQ(10, table.get(-1));
    EXPECT_EQ(1U, table.getCount());
}

TEST(TYHashTable, StringKeysCompareByteByByte)
{
    TYStringHashTable<int> table(1);
    EXPECT_TRUE(table.add("a", 1).isOk());
    EXPECT_TRUE(table.add("A", 2).isOk());
    EXPECT_TRUE(table.add(String("a\0", 2), 3).isOk());
    EXPECT_TRUE(table.add("", 4).isOk());
    EXPECT_EQ(1, table.get("a"));
    EXPECT_EQ(3, table.get(String("a\0", 2)));
    EXPECT_EQ(4, table.get(String::s_empty));
}

TEST(TYHashTable, RemovingFirstMiddleAndLastKeepsTheOthersInOrder)
{
    for (std::size_t const buckets : {1U, 2U, 64U})
    {
        TYUInt32HashTable<int> table(buckets);
        for (unsigned int i = 0; i < 5; ++i)
            ASSERT_TRUE(table.add(i, static_cast<int>(i)).isOk());
        EXPECT_TRUE(table.remove(0));
        EXPECT_EQ((Values{1, 2, 3, 4}), VALUES(table));
        EXPECT_TRUE(table.remove(4));
        EXPECT_TRUE(table.remove(2));
        EXPECT_EQ((Values{1, 3}), VALUES(table));
        EXPECT_FALSE(table.remove(2));
        EXPECT_TRUE(table.add(2, 20).isOk());
        EXPECT_EQ((Values{1, 3, 20}), VALUES(table));
        EXPECT_EQ(3U, table.getCount());
    }
}

TEST(TYHashTable, AnEntryMayBeRemovedByItsOwnKey)
{
    INStringHashTable<int> table(3);
    ASSERT_TRUE(table.add("a key that is too long to sit inside the string object", 1).isOk());
    EXPECT_TRUE(table.remove(table.getFirst()->getKey()));
    EXPECT_EQ(0U, table.getCount());
}

TEST(TYHashTable, AClearedTableTakesTheSameKeysAgain)
{
    TYUInt32HashTable<int> table(2);
    for (unsigned int round = 0; round < 2; ++round)
    {
        for (unsigned int i = 0; i < 10; ++i)
            ASSERT_TRUE(table.add(i, 0).isOk());
        table.clear();
        EXPECT_EQ(0U, table.getCount());
        EXPECT_EQ(nullptr, table.getFirst());
        EXPECT_EQ(nullptr, table.find(3));
    }
}

TEST(TYHashTable, ZeroBucketsCountAsOne)
{
    TYUInt32HashTable<int> table(0);
    EXPECT_TRUE(table.add(5, 1).isOk());
    EXPECT_EQ(1, table.get(5));
}

TEST(TYHashTable, AddingWithoutMemoryChangesNothing)
{
    {
        TYHashTable<unsigned int, RefusingValue> table(2);
        RefusingValue const value(1);
        {
            RefusingValue::Guard const refusing;
            EXPECT_EQ(XCode::NO_ELEMENT, table.add(1, value));
        }
        EXPECT_EQ(0U, table.getCount());
        EXPECT_EQ(nullptr, table.find(1));
        EXPECT_EQ(nullptr, table.getFirst());
        EXPECT_TRUE(table.add(1, value).isOk());
    }
    EXPECT_EQ(0, RefusingValue::s_alive);
}

TEST(TYHashTable, ManyEntriesSurviveRemovalInARandomOrder)
{
    TYUInt32HashTable<int> table(31);
    std::vector<unsigned int> keys(1000);
    std::iota(keys.begin(), keys.end(), 0U);
    for (unsigned int const key : keys)
        ASSERT_TRUE(table.add(key, static_cast<int>(key)).isOk());
    std::mt19937 random(1);
    std::shuffle(keys.begin(), keys.end(), random);
    while (!keys.empty())
    {
        ASSERT_TRUE(table.remove(keys.back()));
        keys.pop_back();
        ASSERT_EQ(keys.size(), table.getCount());
        if (keys.size() % 100 == 0)
        {
            Values const values = VALUES(table);
            EXPECT_TRUE(std::is_sorted(values.begin(), values.end()));
            EXPECT_EQ(keys.size(), values.size());
        }
    }
}

TEST(TYHashTable, AStringIsFoundByAnyTextWithoutMakingAString)
{
    INStringHashTable<int> table(3);
    std::string const name(60, 'n');
    ASSERT_TRUE(table.add(String(name), 7).isOk());
    FailingAllocator::failNth(1);
    int const found = table.get(name);
    int const ofPart = table.get(std::string_view(name).substr(1));
    FailingAllocator::stop();
    EXPECT_EQ(7, found);
    EXPECT_EQ(0, ofPart);
    EXPECT_EQ(0UL, FailingAllocator::count());
}

TEST(TYHashTable, ARemovedKeyCanBeKept)
{
    INStringHashTable<int> table(3);
    ASSERT_TRUE(table.add("sip", 7).isOk());
    String removed("before");
    EXPECT_FALSE(table.remove("isdn", &removed));
    EXPECT_EQ("before", removed);
    EXPECT_TRUE(table.remove("sip", &removed));
    EXPECT_EQ("sip", removed);
    EXPECT_EQ(0U, table.getCount());
}
