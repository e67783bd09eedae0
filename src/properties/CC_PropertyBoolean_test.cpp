#include "properties/CC_PropertyBoolean.h"

#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <type_traits>

// a text would count as true
static_assert(!std::is_constructible_v<CC_PropertyBoolean, unsigned int, char const*>);
static_assert(std::is_constructible_v<CC_PropertyBoolean, unsigned int, bool>);

TEST(CC_PropertyBoolean, PrintsAndReadsTrueAndFalse)
{
    CC_PropertyBoolean property(CC_PropertyId::PROVIDES_DATA);
    String error("untouched");
    EXPECT_EQ("false", VALUE_OF(property));
    EXPECT_EQ(XCode::OK, property.setValueString(error, "true"));
    EXPECT_EQ("true", VALUE_OF(property));
    EXPECT_EQ(XCode::OK, property.setValueString(error, "false"));
    EXPECT_EQ("false", VALUE_OF(property));
    EXPECT_STREQ("untouched", error.c_str());
}

TEST(CC_PropertyBoolean, TakesNoOtherSpelling)
{
    CC_PropertyBoolean property(CC_PropertyId::PROVIDES_DATA, true);
    for (String const& text : {String("TRUE"), String("False"), String(" true"), String("true "), String("1"),
                               String(""), String("true\0", 5)})
        EXPECT_EQ("Invalid boolean value, expecting 'true' or 'false'", REFUSAL_OF(property, text)) << text.c_str();
}

TEST(CC_PropertyBoolean, TwoIdsWithTheSameValueAreEqual)
{
    CC_PropertyBoolean const data(CC_PropertyId::PROVIDES_DATA, true);
    EXPECT_TRUE(data.isEqual(CC_PropertyBoolean(CC_PropertyId::ENDPOINT_IS_ISDN, true)));
    EXPECT_FALSE(data.isEqual(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, false)));
    EXPECT_FALSE(data.isEqual(CC_PropertyString(CC_PropertyId::PROVIDES_DATA, "true")));
}
