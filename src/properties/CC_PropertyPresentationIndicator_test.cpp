#include "properties/CC_PropertyPresentationIndicator.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyPresentationIndicator, PrintsTheNameOfItsValue)
{
    EXPECT_EQ("Presentation allowed", VALUE_OF(CC_PropertyPresentationIndicator(CC_PropertyId::PRESENTATION_INDICATOR,
                                                                                QPresentationIndicator::ALLOWED)));
    EXPECT_EQ("Presentation restricted",
              VALUE_OF(CC_PropertyPresentationIndicator(CC_PropertyId::PRESENTATION_INDICATOR,
                                                        QPresentationIndicator::RESTRICTED)));
    CC_PropertyPresentationIndicator const invalid(CC_PropertyId::PRESENTATION_INDICATOR,
                                                   static_cast<QPresentationIndicator>(4));
    EXPECT_EQ(ERROR::INVALID, VALUE_OF(invalid));
    EXPECT_STREQ("Presentation-Indicator", invalid.getTypeName());
}

TEST(CC_PropertyPresentationIndicator, BeginsWithZeroAndComparesItsValue)
{
    CC_PropertyPresentationIndicator property(CC_PropertyId::PRESENTATION_INDICATOR);
    EXPECT_EQ(static_cast<QPresentationIndicator>(0), property.getValue());
    CC_PropertyPresentationIndicator const other(CC_PropertyId::PRESENTATION_INDICATOR,
                                                 QPresentationIndicator::RESTRICTED);
    EXPECT_FALSE(property.isEqual(other));
    property.setValue(QPresentationIndicator::RESTRICTED);
    EXPECT_TRUE(property.isEqual(other));
}

TEST(CC_PropertyPresentationIndicator, TakesNoText)
{
    CC_PropertyPresentationIndicator property(CC_PropertyId::PRESENTATION_INDICATOR,
                                              QPresentationIndicator::RESTRICTED);
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "Presentation allowed"));
}
