#include "platform/base/TYSmallVector.h"

#include <cstddef>
#include <gtest/gtest.h>

namespace
{
/// A plain value whose arrays can be made to find no memory.
struct Value
{
    unsigned int number;

    static inline unsigned int s_arrays = 0;
    static inline bool s_isRefusing = false;
    static void* operator new[](std::size_t size, std::nothrow_t const& nothrow) noexcept
    {
        s_arrays += s_isRefusing ? 0 : 1;
        return s_isRefusing ? nullptr : ::operator new[](size, nothrow);
    }
    static void operator delete[](void* memory) noexcept
    {
        --s_arrays;
        ::operator delete[](memory);
    }
};

class TYSmallVectorTest : public testing::Test
{
protected:
    ~TYSmallVectorTest() override { Value::s_isRefusing = false; }

    template <class Vector>
    static void FILL(Vector& vector, unsigned int count)
    {
        for (unsigned int i = 0; i < count; ++i)
            ASSERT_TRUE(vector.append(Value{i}).isOk());
    }
    template <class Vector>
    static void EXPECT_FIRST(Vector const& vector, unsigned int count)
    {
        ASSERT_EQ(count, vector.getSize());
        for (unsigned int i = 0; i < count; ++i)
            EXPECT_EQ(i, vector[i].number);
    }
};
} // namespace

TEST_F(TYSmallVectorTest, TheInlineValuesNeedNoMemory)
{
    Value::s_isRefusing = true;
    TYSmallVector<Value, 4> vector;
    FILL(vector, 4);
    EXPECT_FIRST(vector, 4);
}

TEST_F(TYSmallVectorTest, GrowingKeepsValuesAndOrder)
{
    {
        TYSmallVector<Value, 2> vector;
        FILL(vector, 100);
        EXPECT_FIRST(vector, 100);
        EXPECT_EQ(1U, Value::s_arrays); // outgrown ones are freed
    }
    EXPECT_EQ(0U, Value::s_arrays);
}

TEST_F(TYSmallVectorTest, GrowingWithoutMemoryChangesNothing)
{
    TYSmallVector<Value, 2> vector;
    FILL(vector, 4);
    Value::s_isRefusing = true;
    EXPECT_EQ(XCode::NO_ELEMENT, vector.append(Value{4}));
    EXPECT_FIRST(vector, 4);
    Value::s_isRefusing = false;
    EXPECT_TRUE(vector.append(Value{4}).isOk());
    EXPECT_FIRST(vector, 5);
}

TEST_F(TYSmallVectorTest, AnOwnValueMayBeAppendedWhileTheArrayGrows)
{
    TYSmallVector<Value, 1> vector;
    ASSERT_TRUE(vector.append(Value{7}).isOk());
    for (unsigned int i = 0; i < 70; ++i)
        ASSERT_TRUE(vector.append(vector[i]).isOk());
    for (Value const& value : vector)
        EXPECT_EQ(7U, value.number);
}

TEST_F(TYSmallVectorTest, RemovingMovesLaterValuesDown)
{
    for (unsigned int const size : {4U, 9U}) // inline and grown
    {
        TYSmallVector<Value, 4> vector;
        FILL(vector, size);
        vector.remove(1);
        ASSERT_EQ(size - 1, vector.getSize());
        EXPECT_EQ(0U, vector[0].number);
        EXPECT_EQ(2U, vector[1].number);
        EXPECT_EQ(size - 1, vector[size - 2].number);
        vector.remove(size - 2);
        ASSERT_EQ(size - 2, vector.getSize());
        EXPECT_EQ(size - 2, vector[size - 3].number);
    }
}

TEST_F(TYSmallVectorTest, ItCanBeEmptiedAndFilledAgain)
{
    TYSmallVector<Value, 1> vector;
    FILL(vector, 3);
    while (vector.getSize() > 0)
        vector.remove(0);
    EXPECT_EQ(vector.begin(), vector.end());
    FILL(vector, 5);
    EXPECT_FIRST(vector, 5);
}

TEST_F(TYSmallVectorTest, AWalkByIndexSurvivesAppendingInIt)
{
    TYSmallVector<Value, 2> vector;
    FILL(vector, 2);
    unsigned int visited = 0;
    for (unsigned int i = 0; i < vector.getSize(); ++i)
    {
        EXPECT_EQ(i, vector[i].number);
        if (vector.getSize() < 20)
        {
            ASSERT_TRUE(vector.append(Value{vector.getSize()}).isOk());
        }
        ++visited;
    }
    EXPECT_EQ(20U, visited);
}

TEST_F(TYSmallVectorTest, ValuesCanBeReplacedInPlace)
{
    TYSmallVector<int*, 2> pointers;
    int one = 1;
    ASSERT_TRUE(pointers.append(&one).isOk());
    pointers[0] = nullptr;
    EXPECT_EQ(nullptr, *pointers.begin());
}
