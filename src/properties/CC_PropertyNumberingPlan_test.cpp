#include "properties/CC_PropertyNumberingPlan.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyNumberingPlan, PrintsTheNameOfItsValue)
{
    EXPECT_EQ("Unknown", VALUE_OF(CC_PropertyNumberingPlan(CC_PropertyId::NUMBERING_PLAN, QNumberingPlan::UNKNOWN)));
    EXPECT_EQ("Private numbering plan",
              VALUE_OF(CC_PropertyNumberingPlan(CC_PropertyId::NUMBERING_PLAN, QNumberingPlan::PRIVATE)));
    CC_PropertyNumberingPlan const invalid(CC_PropertyId::NUMBERING_PLAN, static_cast<QNumberingPlan>(2));
    EXPECT_EQ(ERROR::INVALID, VALUE_OF(invalid));
    EXPECT_STREQ("Numbering-Plan", invalid.getTypeName());
}

TEST(CC_PropertyNumberingPlan, BeginsWithZeroAndComparesItsValue)
{
    CC_PropertyNumberingPlan property(CC_PropertyId::NUMBERING_PLAN);
    EXPECT_EQ(static_cast<QNumberingPlan>(0), property.getValue());
    CC_PropertyNumberingPlan const other(CC_PropertyId::NUMBERING_PLAN, QNumberingPlan::PRIVATE);
    EXPECT_FALSE(property.isEqual(other));
    property.setValue(QNumberingPlan::PRIVATE);
    EXPECT_TRUE(property.isEqual(other));
}

TEST(CC_PropertyNumberingPlan, TakesNoText)
{
    CC_PropertyNumberingPlan property(CC_PropertyId::NUMBERING_PLAN, QNumberingPlan::PRIVATE);
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "Unknown"));
}
