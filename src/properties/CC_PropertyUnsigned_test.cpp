#include "properties/CC_PropertyUnsigned.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

namespace
{
/// A number whose owner sees it as seconds although it is stored as minutes.
class Minutes : public CC_PropertyClass<Minutes, CC_PropertyUnsigned>
{
public:
    static constexpr char const* TYPE_NAME = "Minutes";
    static TypeId s_typeId;
    using CC_PropertyClass::CC_PropertyClass;
    unsigned long long getValue() const override { return 60 * CC_PropertyUnsigned::getValue(); }
    void setValue(unsigned long long value) override { CC_PropertyUnsigned::setValue(value / 60); }
};
Minutes::TypeId Minutes::s_typeId;
} // namespace

TEST(CC_PropertyUnsigned, PrintsAtLeastEightHexadecimalDigits)
{
    EXPECT_EQ("0x00000000", VALUE_OF(CC_PropertyUnsigned(CC_PropertyId::HOPS)));
    EXPECT_EQ("0x000000ff", VALUE_OF(CC_PropertyUnsigned(CC_PropertyId::HOPS, 255)));
    EXPECT_EQ("0x10000000000", VALUE_OF(CC_PropertyUnsigned(CC_PropertyId::HOPS, 1ULL << 40)));
    EXPECT_EQ("0xffffffffffffffff", VALUE_OF(CC_PropertyUnsigned(CC_PropertyId::HOPS, ~0ULL)));
}

TEST(CC_PropertyUnsigned, TakesNoText)
{
    CC_PropertyUnsigned property(CC_PropertyId::HOPS, 7);
    for (char const* const text : {"7", "0x00000007", ""})
        EXPECT_EQ("Invalid value", REFUSAL_OF(property, text));
}

TEST(CC_PropertyUnsigned, ComparesItsValue)
{
    CC_PropertyUnsigned property(CC_PropertyId::HOPS, 7);
    EXPECT_TRUE(property.isEqual(CC_PropertyUnsigned(CC_PropertyId::CALL_LEG_ID, 7)));
    property.setValue((1ULL << 32) + 7);
    EXPECT_FALSE(property.isEqual(CC_PropertyUnsigned(CC_PropertyId::HOPS, 7)));
}

TEST(CC_PropertyUnsigned, ADerivedClassIsComparedByItsOwnNotionOfValue)
{
    Minutes const two(CC_PropertyId::HOPS, 2);
    EXPECT_TRUE(CC_PropertyUnsigned(CC_PropertyId::HOPS, 120).isEqual(two));
    EXPECT_FALSE(CC_PropertyUnsigned(CC_PropertyId::HOPS, 2).isEqual(two));
    EXPECT_EQ("0x00000078", VALUE_OF(two));
}

TEST(CC_PropertyUnsigned, ADerivedClassNeverEqualsItsBase)
{
    Minutes const two(CC_PropertyId::HOPS, 2);
    EXPECT_FALSE(two.isEqual(CC_PropertyUnsigned(CC_PropertyId::HOPS, 120)));
    EXPECT_FALSE(two.isEqual(CC_PropertyUnsigned(CC_PropertyId::HOPS, 2)));
    Minutes same(CC_PropertyId::HOPS);
    same.setValue(120);
    EXPECT_TRUE(two.isEqual(same));
}
