#include "platform/base/TYVector.h"

#include "platform/base/RefusingValue.h"

#include <gtest/gtest.h>
#include <initializer_list>
#include <limits>

namespace
{
TYVector<int> VECTOR_OF(std::initializer_list<int> values)
{
    TYVector<int> vector;
    for (int const value : values)
        EXPECT_TRUE(vector.append(value).isOk());
    return vector;
}
} // namespace

TEST(TYVector, ValuesKeepTheOrderOfTheirAppending)
{
    TYVector<int> const vector = VECTOR_OF({3, 1, 2});
    ASSERT_EQ(3U, vector.getSize());
    EXPECT_EQ(3, vector[0]);
    EXPECT_EQ(1, vector[1]);
    EXPECT_EQ(2, vector[2]);
    int sum = 0;
    for (int const value : vector)
        sum += value;
    EXPECT_EQ(6, sum);
}

TEST(TYVector, RemovingClosesTheGap)
{
    TYVector<int> vector = VECTOR_OF({0, 1, 2, 3});
    vector.remove(1);
    EXPECT_EQ(VECTOR_OF({0, 2, 3}), vector);
    vector.remove(2);
    vector.remove(0);
    EXPECT_EQ(VECTOR_OF({2}), vector);
    vector.remove(0);
    EXPECT_TRUE(vector.isEmpty());
}

TEST(TYVector, AnOwnValueMayBeAppendedWhileTheVectorGrows)
{
    TYVector<int> vector = VECTOR_OF({7});
    for (std::size_t i = 0; i < 100; ++i)
        ASSERT_TRUE(vector.append(vector[0]).isOk());
    for (int const value : vector)
        EXPECT_EQ(7, value);
}

TEST(TYVector, AppendingWithoutMemoryChangesNothing)
{
    {
        TYVector<RefusingValue> vector;
        ASSERT_TRUE(vector.append(RefusingValue(1)).isOk());
        RefusingValue const second(2);
        {
            RefusingValue::Guard const refusing;
            EXPECT_EQ(XCode::NO_ELEMENT, vector.append(second));
        }
        ASSERT_EQ(1U, vector.getSize());
        EXPECT_EQ(1, vector[0].getNumber());
        EXPECT_TRUE(vector.append(second).isOk());
    }
    EXPECT_EQ(0, RefusingValue::s_alive);
}

TEST(TYVector, ReservingWithoutMemoryIsReported)
{
    TYVector<RefusingValue> vector;
    ASSERT_TRUE(vector.append(RefusingValue(1)).isOk());
    EXPECT_TRUE(vector.reserve(0).isOk());
    EXPECT_TRUE(vector.reserve(10).isOk());
    RefusingValue::Guard const refusing;
    EXPECT_EQ(XCode::NO_ELEMENT, vector.reserve(1000)); // which copies what is there
    EXPECT_EQ(1U, vector.getSize());
}

TEST(TYVector, ReservingMoreThanAnyMemoryHoldsIsReported)
{
    TYVector<int> vector = VECTOR_OF({5});
    EXPECT_EQ(XCode::NO_ELEMENT, vector.reserve(std::numeric_limits<std::size_t>::max()));
    EXPECT_EQ(VECTOR_OF({5}), vector);
}

TEST(TYVector, AfterReservingTheValuesStayInPlace)
{
    TYVector<int> vector;
    ASSERT_TRUE(vector.reserve(50).isOk());
    ASSERT_TRUE(vector.append(0).isOk());
    int const* const first = &vector[0];
    for (int i = 1; i < 50; ++i)
        ASSERT_TRUE(vector.append(i).isOk());
    EXPECT_EQ(first, &vector[0]);
}

TEST(TYVector, VectorsOfTheSameValuesAreEqual)
{
    EXPECT_EQ(TYVector<int>(), TYVector<int>());
    EXPECT_EQ(VECTOR_OF({1, 2}), VECTOR_OF({1, 2}));
    EXPECT_FALSE(VECTOR_OF({1, 2}) == VECTOR_OF({2, 1}));
    EXPECT_FALSE(VECTOR_OF({1, 2}) == VECTOR_OF({1}));
    TYVector<int> cleared = VECTOR_OF({1});
    cleared.clear();
    EXPECT_EQ(TYVector<int>(), cleared);
}
