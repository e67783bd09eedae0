#include "properties/CC_PropertyName.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>
#include <string>

namespace
{
struct Case
{
    char const* fullName;
    int type;
    char const* prefix;
    char const* name;
};
constexpr Case s_cases[] = {
    {"calling-e164", CC_PCT_CALLING, "calling-", "e164"},
    {"called-e164", CC_PCT_CALLED, "called-", "e164"},
    {"called-pi", CC_PCT_CALLED, "called-", "pi"},
    {"e164", CC_PCT_GENERAL, "", "e164"},
    {"hops", CC_PCT_GENERAL, "", "hops"},
    {"calling", CC_PCT_GENERAL, "", "calling"},
    {"calling-", CC_PCT_CALLING, "calling-", ""},
    {"called-calling-pi", CC_PCT_CALLED, "called-", "calling-pi"},
    {"Calling-pi", CC_PCT_GENERAL, "", "Calling-pi"},
    {" calling-pi", CC_PCT_GENERAL, "", " calling-pi"},
    {"", -1, "", ""},
};
} // namespace

TEST(CC_PropertyName, AFullNameIsAPrefixAndAShortName)
{
    for (Case const& row : s_cases)
    {
        SCOPED_TRACE(row.fullName);
        EXPECT_EQ(row.type, GET_PROPERTY_TYPE(row.fullName));
        String prefix("old");
        String name("old");
        SPLIT_PROPERTY_NAME(prefix, name, row.fullName);
        EXPECT_STREQ(row.prefix, prefix.c_str());
        EXPECT_STREQ(row.name, name.c_str());
    }
}

TEST(CC_PropertyName, TheFullNameMayBeOneOfTheResults)
{
    String prefix;
    String name("called-pi");
    SPLIT_PROPERTY_NAME(prefix, name, name);
    EXPECT_STREQ("called-", prefix.c_str());
    EXPECT_STREQ("pi", name.c_str());

    prefix = "calling-si";
    SPLIT_PROPERTY_NAME(prefix, name, prefix);
    EXPECT_STREQ("calling-", prefix.c_str());
    EXPECT_STREQ("si", name.c_str());
}

TEST(CC_PropertyName, EachContainerTypeHasItsPrefix)
{
    EXPECT_STREQ("calling-", CC_PROPERTY_CONTAINER_TYPE_NAME(CC_PCT_CALLING));
    EXPECT_STREQ("called-", CC_PROPERTY_CONTAINER_TYPE_NAME(CC_PCT_CALLED));
    EXPECT_STREQ("", CC_PROPERTY_CONTAINER_TYPE_NAME(CC_PCT_GENERAL));
    for (int const type : {-1, 3, 32})
        EXPECT_STREQ(ERROR::INVALID, CC_PROPERTY_CONTAINER_TYPE_NAME(static_cast<CC_PropertyContainerType>(type)));
}
