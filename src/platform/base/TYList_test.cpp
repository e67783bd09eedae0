#include "platform/base/TYList.h"

#include "platform/base/RefusingValue.h"

#include <gtest/gtest.h>
#include <vector>

namespace
{
std::vector<int> VALUES(TYList<int> const& list)
{
    std::vector<int> values;
    for (TYList<int>::Element const* element = list.getFirst(); element != nullptr; element = element->getNext())
        values.push_back(element->getValue());
    return values;
}
using Values = std::vector<int>;
} // namespace

TEST(TYList, ValuesKeepTheOrderOfTheirAppending)
{
    TYList<int> list;
    EXPECT_TRUE(list.isEmpty());
    EXPECT_EQ(nullptr, list.getFirst());
    for (int const value : {3, 1, 2})
        EXPECT_EQ(value, list.append(value)->getValue());
    EXPECT_EQ((Values{3, 1, 2}), VALUES(list));
    EXPECT_EQ(3U, list.getCount());
}

TEST(TYList, AnElementIsRemovedWhereverItStands)
{
    TYList<int> list;
    TYList<int>::Element* const first = list.append(1);
    TYList<int>::Element* const middle = list.append(2);
    list.append(3);
    TYList<int>::Element* const last = list.append(4);
    list.remove(middle);
    EXPECT_EQ((Values{1, 3, 4}), VALUES(list));
    list.remove(last);
    list.remove(first);
    EXPECT_EQ((Values{3}), VALUES(list));
    list.remove(list.getFirst());
    EXPECT_TRUE(list.isEmpty());
    list.append(5);
    EXPECT_EQ((Values{5}), VALUES(list));
}

TEST(TYList, TheFirstOfEqualValuesIsFound)
{
    TYList<int> list;
    list.append(1);
    TYList<int>::Element* const expected = list.append(2);
    list.append(2);
    EXPECT_EQ(expected, list.find(2));
    EXPECT_EQ(nullptr, list.find(3));
}

TEST(TYList, AClearedListCanBeFilledAgain)
{
    TYList<int> list;
    list.append(1);
    list.append(2);
    list.clear();
    EXPECT_EQ(0U, list.getCount());
    list.append(3);
    EXPECT_EQ((Values{3}), VALUES(list));
}

TEST(TYList, AppendingWithoutMemoryChangesNothing)
{
    {
        TYList<RefusingValue> list;
        RefusingValue const value(1);
        ASSERT_NE(nullptr, list.append(value));
        {
            RefusingValue::Guard const refusing;
            EXPECT_EQ(nullptr, list.append(value));
        }
        EXPECT_EQ(1U, list.getCount());
        EXPECT_EQ(nullptr, list.getFirst()->getNext());
        EXPECT_NE(nullptr, list.append(value));
    }
    EXPECT_EQ(0, RefusingValue::s_alive);
}
