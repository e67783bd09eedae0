#include "properties/CC_PropertyString.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <string>

TEST(CC_PropertyString, TakesAnyTextWhole)
{
    CC_PropertyString property(CC_PropertyId::NAME, "before");
    String error("untouched");
    for (String const& text : {String(""), String("  49 89 "), String("a\0b", 3), String("Invalid value")})
    {
        EXPECT_EQ(XCode::OK, property.setValueString(error, text));
        EXPECT_TRUE(property.getValue() == text);
        String printed("left from before");
        EXPECT_TRUE(property.getValueString(printed) == text);
    }
    EXPECT_STREQ("untouched", error.c_str());
}

TEST(CC_PropertyString, EqualityIsByteForByte)
{
    CC_PropertyString const property(CC_PropertyId::NAME, "Anna");
    EXPECT_TRUE(property.isEqual(CC_PropertyString(CC_PropertyId::DISPLAY, "Anna")));
    EXPECT_FALSE(property.isEqual(CC_PropertyString(CC_PropertyId::NAME, "anna")));
    EXPECT_FALSE(property.isEqual(CC_PropertyString(CC_PropertyId::NAME, "Anna ")));
    EXPECT_FALSE(property.isEqual(CC_PropertyString(CC_PropertyId::NAME, String("Anna\0", 5))));
}

TEST(CC_PropertyString, ATextThatFindsNoMemoryIsRefused)
{
    CC_PropertyString property(CC_PropertyId::NAME, "before");
    String const text(std::string(100, 'x').c_str());
    String error;
    XCode result;
    WITH_EACH_ALLOCATION_FAILING([&] { result = property.setValueString(error, text); },
                                 [&]
                                 {
                                     EXPECT_EQ(XCode::FAILURE, result);
                                     EXPECT_EQ("before", VALUE_OF(property));
                                 });
    EXPECT_EQ(XCode::OK, result);
    EXPECT_TRUE(property.getValue() == text);
}
