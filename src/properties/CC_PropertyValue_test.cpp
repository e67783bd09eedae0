#include "properties/CC_PropertyValue.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyTypeOfNumber.h"

#include <gtest/gtest.h>
#include <type_traits>
#include <utility>

// a call holds dozens of them
static_assert(sizeof(CC_PropertyBoolean) <= 40);
static_assert(sizeof(CC_PropertyTypeOfNumber) <= 40);
static_assert(sizeof(CC_PropertyCallLegState) <= 40);

// small values travel by value, a text by reference
static_assert(std::is_same_v<bool, decltype(std::declval<CC_PropertyBoolean const&>().getValue())>);
static_assert(std::is_same_v<String const&, decltype(std::declval<CC_PropertyString const&>().getValue())>);

TEST(CC_PropertyValue, TheValueIsItsDefaultUntilOneIsGiven)
{
    EXPECT_FALSE(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA).getValue());
    EXPECT_TRUE(CC_PropertyString(CC_PropertyId::NAME).getValue().isEmpty());
    EXPECT_EQ(QTypeOfNumber::UNKNOWN, CC_PropertyTypeOfNumber(CC_PropertyId::TYPE_OF_NUMBER).getValue());

    CC_PropertyTypeOfNumber property(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::NATIONAL);
    EXPECT_EQ(QTypeOfNumber::NATIONAL, property.getValue());
    property.setValue(QTypeOfNumber::SUBSCRIBER);
    EXPECT_EQ(QTypeOfNumber::SUBSCRIBER, property.getValue());
    EXPECT_EQ(CC_PropertyId::TYPE_OF_NUMBER, property.getId());
}

TEST(CC_PropertyValue, EqualityIsThatOfTheValueNotOfTheId)
{
    CC_PropertyTypeOfNumber const first(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::NATIONAL);
    CC_PropertyTypeOfNumber const second(CC_PropertyId::SECOND_TYPE_OF_NUMBER, QTypeOfNumber::NATIONAL);
    CC_PropertyTypeOfNumber const third(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::SUBSCRIBER);
    EXPECT_TRUE(first.isEqual(second));
    EXPECT_FALSE(first.isEqual(third));
}
