#include "properties/CC_PropertyParametrizedString.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <initializer_list>
#include <string>

namespace
{
using Property = CC_PropertyParametrizedString;

Property::ParametrizedString STRING_OF(char const* content, std::initializer_list<Property::KeyValuePair> parameters)
{
    Property::ParametrizedString string{String(content)};
    for (Property::KeyValuePair const& parameter : parameters)
        EXPECT_TRUE(string.parameters.append(parameter).isOk());
    return string;
}

Property PROPERTY_OF(char const* content, std::initializer_list<Property::KeyValuePair> parameters)
{
    return Property(CC_PropertyId::USER_TO_USER_INFORMATION, STRING_OF(content, parameters));
}
} // namespace

TEST(CC_PropertyParametrizedString, PrintsTheContentAndThenEachParameter)
{
    EXPECT_EQ("abc x=1 y=2", VALUE_OF(PROPERTY_OF("abc", {{"x", "1"}, {"y", "2"}})));
    EXPECT_EQ(" y=", VALUE_OF(PROPERTY_OF("", {{"y", ""}})));
    EXPECT_EQ("abc", VALUE_OF(Property(CC_PropertyId::UNIQUE_IDENTIFIER, "abc")));
    EXPECT_EQ("", VALUE_OF(Property(CC_PropertyId::UNIQUE_IDENTIFIER)));
}

TEST(CC_PropertyParametrizedString, ReplacesWhatStoodInTheText)
{
    String text("x");
    EXPECT_STREQ("abc", PROPERTY_OF("abc", {}).getValueString(text).c_str());
}

TEST(CC_PropertyParametrizedString, TakesNoText)
{
    Property property = PROPERTY_OF("abc", {});
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "def"));
}

TEST(CC_PropertyParametrizedString, AParameterIsFoundWhateverTheCaseOfItsKey)
{
    Property::ParametrizedString const string = STRING_OF("abc", {{"x", "1"}, {"X", "2"}, {"empty", ""}});
    EXPECT_STREQ("1", string.getParameter("X").c_str()); // the first
    EXPECT_STREQ("1", string.getParameter("x").c_str());
    String value("old");
    EXPECT_TRUE(string.getParameter("X", value));
    EXPECT_STREQ("1", value.c_str());
    EXPECT_TRUE(string.getParameter("EMPTY", value));
    EXPECT_STREQ("", value.c_str());
}

TEST(CC_PropertyParametrizedString, AnAbsentParameterIsTheEmptyText)
{
    Property::ParametrizedString const string = STRING_OF("abc", {{"x", "1"}});
    EXPECT_EQ(&String::s_empty, &string.getParameter("y"));
    String value("old");
    EXPECT_FALSE(string.getParameter("y", value));
    EXPECT_TRUE(value.isEmpty());
}

TEST(CC_PropertyParametrizedString, TheResultMayTakeThePlaceOfTheKey)
{
    Property::ParametrizedString const string = STRING_OF("abc", {{"x", "1"}});
    String both("x");
    EXPECT_TRUE(string.getParameter(both, both));
    EXPECT_STREQ("1", both.c_str());
}

TEST(CC_PropertyParametrizedString, EqualityIsExactInOrderAndCase)
{
    Property const property = PROPERTY_OF("abc", {{"x", "1"}, {"y", "2"}});
    EXPECT_TRUE(property.isEqual(property));
    EXPECT_TRUE(property.isEqual(PROPERTY_OF("abc", {{"x", "1"}, {"y", "2"}})));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF("ABC", {{"x", "1"}, {"y", "2"}})));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF("abc", {{"X", "1"}, {"y", "2"}})));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF("abc", {{"y", "2"}, {"x", "1"}})));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF("abc", {{"x", "1"}})));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF("abc", {{"x", "1"}, {"y", "3"}})));
}

TEST(CC_PropertyParametrizedString, TheSameContentSentAgainIsAChange)
{
    Property third(CC_PropertyId::USER_TO_USER_INFORMATION);
    Property fourth(CC_PropertyId::USER_TO_USER_INFORMATION);
    third.setContent(3, STRING_OF("abc", {{"x", "1"}}));
    fourth.setContent(4, third.getContent());
    EXPECT_FALSE(third.isEqual(fourth));
    EXPECT_EQ(VALUE_OF(third), VALUE_OF(fourth));
    third.setContent(fourth.getUpdateCounter(), third.getContent());
    EXPECT_TRUE(third.isEqual(fourth));
    EXPECT_EQ(0U, PROPERTY_OF("abc", {}).getUpdateCounter());

    Property copy(third);
    EXPECT_EQ(4U, copy.getUpdateCounter());
}

TEST(CC_PropertyParametrizedString, TheSharedEmptyOneIsAlwaysTheSame)
{
    EXPECT_EQ(&Property::ParametrizedString::EMPTY(), &Property::ParametrizedString::EMPTY());
    EXPECT_TRUE(Property::ParametrizedString::EMPTY() == Property::ParametrizedString());
}

TEST(CC_PropertyParametrizedString, AnAssignmentThatLacksMemoryHalfWayChangesNothing)
{
    std::string const longText(100, 'x');
    Property const source = PROPERTY_OF(longText.c_str(), {{longText.c_str(), longText.c_str()}});
    Property target = PROPERTY_OF("abc", {{"x", "1"}});
    unsigned long const failures =
        WITH_EACH_ALLOCATION_FAILING([&] { target.assign(source); }, [&] { EXPECT_EQ("abc x=1", VALUE_OF(target)); });
    EXPECT_EQ(4U, failures); // the content, the list, key and value
    EXPECT_TRUE(target.isEqual(source));
}
