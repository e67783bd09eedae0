#include "properties/CC_PropertyScreeningIndicator.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyScreeningIndicator, PrintsTheNameOfItsValue)
{
    EXPECT_EQ("User-provided, not screened",
              VALUE_OF(CC_PropertyScreeningIndicator(CC_PropertyId::SCREENING_INDICATOR,
                                                     QScreeningIndicator::USER_PROVIDED_NOT_SCREENED)));
    EXPECT_EQ("Network provided", VALUE_OF(CC_PropertyScreeningIndicator(CC_PropertyId::SCREENING_INDICATOR,
                                                                         QScreeningIndicator::NETWORK_PROVIDED)));
    CC_PropertyScreeningIndicator const invalid(CC_PropertyId::SCREENING_INDICATOR,
                                                static_cast<QScreeningIndicator>(4));
    EXPECT_EQ(ERROR::INVALID, VALUE_OF(invalid));
    EXPECT_STREQ("Screening-Indicator", invalid.getTypeName());
}

TEST(CC_PropertyScreeningIndicator, BeginsWithZeroAndComparesItsValue)
{
    CC_PropertyScreeningIndicator property(CC_PropertyId::SCREENING_INDICATOR);
    EXPECT_EQ(static_cast<QScreeningIndicator>(0), property.getValue());
    CC_PropertyScreeningIndicator const other(CC_PropertyId::SCREENING_INDICATOR,
                                              QScreeningIndicator::NETWORK_PROVIDED);
    EXPECT_FALSE(property.isEqual(other));
    property.setValue(QScreeningIndicator::NETWORK_PROVIDED);
    EXPECT_TRUE(property.isEqual(other));
}

TEST(CC_PropertyScreeningIndicator, TakesNoText)
{
    CC_PropertyScreeningIndicator property(CC_PropertyId::SCREENING_INDICATOR, QScreeningIndicator::NETWORK_PROVIDED);
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "User-provided, not screened"));
}
