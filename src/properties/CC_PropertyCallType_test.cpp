#include "properties/CC_PropertyCallType.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyCallType, HasTheNamesNormalAndMessage)
{
    EXPECT_STREQ("normal", CC_PropertyCallType::CALL_TYPE_NAME(CC_PropertyCallType::NORMAL));
    EXPECT_STREQ("message", CC_PropertyCallType::CALL_TYPE_NAME(CC_PropertyCallType::MESSAGE));
    for (int const value : {-1, 2})
        EXPECT_STREQ("invalid",
                     CC_PropertyCallType::CALL_TYPE_NAME(static_cast<CC_PropertyCallType::_eCallType>(value)));
}

TEST(CC_PropertyCallType, PrintsAndComparesItsValue)
{
    CC_PropertyCallType property(CC_PropertyId::CALL_TYPE);
    EXPECT_EQ("normal", VALUE_OF(property));
    CC_PropertyCallType const message(CC_PropertyId::CALL_TYPE, CC_PropertyCallType::MESSAGE);
    EXPECT_FALSE(property.isEqual(message));
    property.setValue(CC_PropertyCallType::MESSAGE);
    EXPECT_TRUE(property.isEqual(message));
    EXPECT_EQ(CC_PropertyCallType::MESSAGE, property.getValue());
    EXPECT_EQ("message", VALUE_OF(property));
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "normal"));
}
