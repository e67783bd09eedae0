#include "properties/CC_PropertyTypeOfNumber.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyTypeOfNumber, PrintsTheNameOfItsValue)
{
    EXPECT_EQ("Unknown", VALUE_OF(CC_PropertyTypeOfNumber(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::UNKNOWN)));
    EXPECT_EQ("International number",
              VALUE_OF(CC_PropertyTypeOfNumber(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::INTERNATIONAL)));
    EXPECT_EQ("Reserved for extension",
              VALUE_OF(CC_PropertyTypeOfNumber(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::RESERVED_FOR_EXTENSION)));
    CC_PropertyTypeOfNumber const invalid(CC_PropertyId::TYPE_OF_NUMBER, static_cast<QTypeOfNumber>(5));
    EXPECT_EQ(ERROR::INVALID, VALUE_OF(invalid));
    EXPECT_STREQ("Type-Of-Number", invalid.getTypeName());
}

TEST(CC_PropertyTypeOfNumber, BeginsWithZeroAndComparesItsValue)
{
    CC_PropertyTypeOfNumber property(CC_PropertyId::TYPE_OF_NUMBER);
    EXPECT_EQ(static_cast<QTypeOfNumber>(0), property.getValue());
    CC_PropertyTypeOfNumber const other(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::RESERVED_FOR_EXTENSION);
    EXPECT_FALSE(property.isEqual(other));
    property.setValue(QTypeOfNumber::RESERVED_FOR_EXTENSION);
    EXPECT_TRUE(property.isEqual(other));
}

TEST(CC_PropertyTypeOfNumber, TakesNoText)
{
    CC_PropertyTypeOfNumber property(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::RESERVED_FOR_EXTENSION);
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "Unknown"));
}
