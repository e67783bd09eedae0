#include "platform/asn1/AsnSequence.h"

#include "platform/asn1/AsnPrimitive.h"
#include "platform/asn1/Q956.h"
#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>
#include <type_traits>
#include <utility>

namespace
{
/// Optional components at every place, one of them under its own tag.
class Sparse : public AsnClass<Sparse, AsnSequence>
{
public:
    static constexpr char const* TYPE_NAME = "Sparse";
    Sparse() { declareSparse(); }

    AsnInteger m_first;
    AsnInteger m_second;
    AsnIA5String m_third;

private:
    void declareSparse()
    {
        static constexpr AsnField FIELDS[] = {
            AsnField::OF<&Sparse::m_first>("first", AsnOptional()),
            AsnField::OF<&Sparse::m_second>("second", AsnImplicit(1), AsnOptional()),
            AsnField::OF<&Sparse::m_third>("third", AsnImplicit(40), AsnOptional()),
        };
        static_assert(AsnField::ARE_DISTINCT(FIELDS));
        declare(FIELDS);
    }
};

constexpr AsnField s_sameName[] = {{"one", AsnTag(), false, nullptr}, {"one", AsnTag(), false, nullptr}};
constexpr AsnField s_sameTag[] = {{"one", AsnTag(AsnTag::CONTEXT, 1), false, nullptr},
                                  {"two", AsnTag(AsnTag::CONTEXT, 1), false, nullptr}};
static_assert(!AsnField::ARE_DISTINCT(s_sameName));
static_assert(!AsnField::ARE_DISTINCT(s_sameTag));
// components of one class never get those of another
static_assert(!std::is_assignable_v<Q956::Amount&, Q956::Time const&>);
static_assert(!std::is_assignable_v<Q956::Amount&, AsnSequence const&>);
static_assert(!std::is_assignable_v<AsnSequence&, Q956::Time const&>);
static_assert(std::is_nothrow_move_constructible_v<Sparse> && std::is_nothrow_move_assignable_v<Sparse>);
} // namespace

TEST(AsnSequence, OptionalComponentsAreAbsentAtFirst)
{
    Sparse const sparse;
    EXPECT_FALSE(sparse.isPresent(sparse.m_first));
    EXPECT_FALSE(sparse.isPresent(sparse.m_third));
    EXPECT_EQ("3000", HEX(sparse));
    EXPECT_EQ("{ }", PRINT(sparse));
    Q956::Time const time;
    EXPECT_TRUE(time.isPresent(time.m_scale)); // not optional
}

TEST(AsnSequence, EachCombinationOfOptionalComponentsHasItsEncoding)
{
    char const* const hex[] = {"3000",         "3003020107",         "3003810108",         "3006020107810108",
                               "30049F280141", "30070201079F280141", "30078101089F280141", "300A0201078101089F280141"};
    for (unsigned int present = 0; present < 8; ++present)
    {
        Sparse sparse;
        sparse.m_first = 7;
        sparse.m_second = 8;
        sparse.m_third = "A";
        if ((present & 1) != 0)
            sparse.setPresent(sparse.m_first);
        if ((present & 2) != 0)
            sparse.setPresent(sparse.m_second);
        if ((present & 4) != 0)
            sparse.setPresent(sparse.m_third);
        EXPECT_EQ(hex[present], HEX(sparse));
        Sparse decoded;
        decoded.setPresent(decoded.m_first) = 99; // must not stay
        EXPECT_EQ("", DECODE(decoded, hex[present]));
        EXPECT_TRUE(decoded == sparse);
    }
}

TEST(AsnSequence, AnAbsentComponentIsResetAndDoesNotMatter)
{
    Sparse one;
    Sparse other;
    one.m_first = 1;
    other.m_first = 2;
    EXPECT_TRUE(one == other);
    one.setPresent(one.m_first);
    EXPECT_FALSE(one == other);
    EXPECT_FALSE(other == one);
    other.setPresent(other.m_first) = 1;
    EXPECT_TRUE(one == other);
    one.setAbsent(one.m_first);
    EXPECT_FALSE(one.isPresent(one.m_first));
    EXPECT_EQ(0, one.m_first);
}

TEST(AsnSequence, ACopyIsAValueOfItsOwn)
{
    Sparse original;
    original.setPresent(original.m_third) = "text";
    Sparse copy(original);
    EXPECT_TRUE(copy == original);
    copy.m_third = "other";
    EXPECT_EQ("text", original.m_third.get());
    EXPECT_FALSE(copy == original);
    copy = original;
    EXPECT_TRUE(copy == original);
    Sparse const moved(std::move(copy));
    EXPECT_TRUE(moved == original);
    std::unique_ptr<AsnSyntax> const clone(original.clone());
    EXPECT_TRUE(clone->isEqual(original));
    EXPECT_NE(nullptr, dynamic_cast<Sparse*>(clone.get()));
    std::unique_ptr<AsnSyntax> const fresh(original.createNew());
    EXPECT_TRUE(fresh->isEqual(Sparse()));
}

TEST(AsnSequence, OnlyTheSameClassIsEqual)
{
    Q956::FlatRateCurrency const flat;
    Q956::RecordedCurrency const recorded; // alike in everything but the name
    EXPECT_EQ(HEX(flat), HEX(recorded));
    EXPECT_FALSE(flat == recorded);
    EXPECT_TRUE(flat == flat);
}

TEST(AsnSequence, ListsItsFields)
{
    Sparse sparse;
    ASSERT_EQ(3U, sparse.getNumberOfFields());
    EXPECT_STREQ("second", sparse.getFields()[1].name);
    EXPECT_EQ(AsnTag(AsnTag::CONTEXT, 1), sparse.getFields()[1].tag);
    EXPECT_TRUE(sparse.getFields()[1].isOptional);
    EXPECT_EQ(&sparse.m_second, &sparse.getComponent(1));
    sparse.use(1);
    EXPECT_TRUE(sparse.isPresent(sparse.m_second));
}

#ifndef NDEBUG // the assertion is a debug build's
TEST(AsnSequenceDeathTest, ForeignComponentsAreRefusedLoudly)
{
    Sparse sparse;
    Sparse const other;
    EXPECT_DEATH((void)sparse.isPresent(other.m_first), "not a component of this value");
}
#endif
