#include "properties/CC_PropertyKeys.h"

#include "properties/CC_Factory.h"
#include "properties/CC_PropertyContainer.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <typeinfo>

namespace
{
constexpr CC_PropertyKey<CC_PropertyString> TRUNK_GROUP(CC_PropertyId::FIRST_OF_MODULES + 7);
constexpr CC_PropertyKey<CC_PropertyUnsigned> CIRCUIT(CC_PropertyId::LAST_OF_MODULES);

/// Whether `set` takes the value under the key. Of the library's keys those that do not compile stand in
/// tests/compile_failure as well.
template <class Property, class... Values>
constexpr bool CAN_SET(CC_PropertyKey<Property>, Values const&...)
{
    return requires(CC_PropertyContainer & container, CC_PropertyKey<Property> key, Values const&... values)
    {
        container.set(key, values...);
    };
}

template <class Property>
void EXPECT_MADE_BY_THE_FACTORY(CC_PropertyKey<Property> key)
{
    CC_Factory factory;
    std::unique_ptr<CC_Property> const made(factory.createProperty(key.getId()));
    ASSERT_NE(made, nullptr) << std::hex << key.getId();
    CC_Property const& property = *made;
    EXPECT_EQ(typeid(property), typeid(Property));
}
} // namespace

TEST(CC_PropertyKey, ItSetsAndGetsAValueOfItsClass)
{
    CC_PropertyContainer properties;
    EXPECT_EQ(properties.set(Key::NAME, "Ada"), XCode::OK);
    EXPECT_EQ(properties.set(Key::HOPS, 3), XCode::OK);
    EXPECT_EQ(properties.set(Key::PROVIDES_DATA, true), XCode::OK);
    EXPECT_EQ(properties.set(Key::STATE, CC_PropertyCallLegState::ALERTING), XCode::OK);
    EXPECT_EQ(properties.set(Key::CAUSE, QCause::USER_BUSY, 486, "Busy"), XCode::OK);

    EXPECT_TRUE(properties.get(Key::NAME) == "Ada");
    EXPECT_TRUE(properties.get(Key::NAME) != "Bert");
    EXPECT_EQ(properties.get(Key::HOPS), 3U);
    EXPECT_EQ(properties.get(Key::PROVIDES_DATA), true);
    EXPECT_EQ(properties.get(Key::STATE), CC_PropertyCallLegState::ALERTING);
    EXPECT_EQ(properties.get(Key::CAUSE), QCause::USER_BUSY);
    EXPECT_EQ(properties.get(Key::CAUSE)->getSipCode(), 486U);
    EXPECT_EQ((*properties.get(Key::CAUSE)).getText(), "Busy");
}

TEST(CC_PropertyKey, WhatIsAbsentIsNoneAndEqualToNothing)
{
    CC_PropertyContainer const properties;
    auto const found = properties.get(Key::PROVIDES_DATA);
    EXPECT_FALSE(found);
    EXPECT_EQ(found.get(), nullptr);
    EXPECT_FALSE(found == true);
    EXPECT_FALSE(found == false);
    EXPECT_EQ(properties.get(Key::NAME).getValueOr("nobody"), "nobody");
    EXPECT_EQ(properties.get(Key::HOPS).getValueOr(9), 9U);
}

TEST(CC_PropertyKey, WhatIsThereNeedsNoFallback)
{
    CC_PropertyContainer properties;
    ASSERT_TRUE(properties.set(Key::NAME, "").isOk());
    EXPECT_EQ(properties.get(Key::NAME).getValueOr("nobody"), "");
}

TEST(CC_PropertyKey, APropertyOfAnotherClassUnderTheIdIsNone)
{
    CC_PropertyContainer properties;
    ASSERT_TRUE(properties.set(CC_PropertyBoolean(CC_PropertyId::NAME, true)).isOk());
    EXPECT_FALSE(properties.get(Key::NAME));
}

TEST(CC_PropertyKey, ADerivedClassIsOfTheKeysClass)
{
    struct Spoken : CC_PropertyString
    {
        using CC_PropertyString::CC_PropertyString;
        CC_Property* clone() const override { return new Spoken(*this); }
    };
    CC_PropertyContainer properties;
    ASSERT_TRUE(properties.set(Spoken(CC_PropertyId::NAME, "Ada")).isOk());
    EXPECT_TRUE(properties.get(Key::NAME) == "Ada");
}

TEST(CC_PropertyKey, WithoutMemoryForTheValueNothingIsSet)
{
    std::string const text(100, 'x');
    CC_PropertyContainer properties;
    XCode result;
    EXPECT_LT(2U, WITH_EACH_ALLOCATION_FAILING([&] { result = properties.set(Key::NAME, text.c_str()); },
                                               [&]
                                               {
                                                   EXPECT_EQ(result, XCode::NO_ELEMENT);
                                                   EXPECT_TRUE(properties.isEmpty());
                                               }));
    EXPECT_EQ(result, XCode::OK);
}

TEST(CC_PropertyKey, OnlyItsOwnKindOfValueIsTaken)
{
    EXPECT_TRUE(CAN_SET(Key::NAME, "Ada"));
    EXPECT_TRUE(CAN_SET(Key::NAME, String("Ada")));
    EXPECT_FALSE(CAN_SET(Key::NAME, 7));
    EXPECT_FALSE(CAN_SET(Key::NAME));
    EXPECT_FALSE(CAN_SET(Key::NAME, "Ada", "Bert"));
    EXPECT_TRUE(CAN_SET(Key::PROVIDES_DATA, true));
    EXPECT_FALSE(CAN_SET(Key::PROVIDES_DATA, 1)) << "a number is not true";
    EXPECT_FALSE(CAN_SET(Key::PROVIDES_DATA, "true"));
    EXPECT_TRUE(CAN_SET(Key::HOPS, 5));
    EXPECT_FALSE(CAN_SET(Key::HOPS, true)) << "true is no number";
    EXPECT_FALSE(CAN_SET(Key::HOPS, CC_PropertyCallLegState::CONNECTED));
    EXPECT_FALSE(CAN_SET(Key::HOPS, "5"));
    EXPECT_FALSE(CAN_SET(Key::STATE, 6));
    EXPECT_TRUE(CAN_SET(Key::PRESENTATION_INDICATOR, QPresentationIndicator::RESTRICTED));
    EXPECT_FALSE(CAN_SET(Key::PRESENTATION_INDICATOR, QScreeningIndicator::NETWORK_PROVIDED));
}

TEST(CC_PropertyKey, TheFactoryMakesWhatTheKeysSay)
{
    EXPECT_MADE_BY_THE_FACTORY(Key::NETWORK);
    EXPECT_MADE_BY_THE_FACTORY(Key::HOPS);
    EXPECT_MADE_BY_THE_FACTORY(Key::TYPE_OF_NUMBER);
    EXPECT_MADE_BY_THE_FACTORY(Key::UNNAMED_SECOND_BOOLEAN);
    EXPECT_MADE_BY_THE_FACTORY(Key::USER_TO_USER_INFORMATION);
    EXPECT_MADE_BY_THE_FACTORY(Key::CHARGE);
    EXPECT_MADE_BY_THE_FACTORY(Key::STATE);
}

// --- keys of modules -------------------------------------------------------------------------------------------------
// names stay declared for good, so each test has an id of its own

TEST(CC_PropertyKey, ADeclaredNameIsShownEverywhere)
{
    EXPECT_STREQ(CC_PropertyString(TRUNK_GROUP.getId()).getPropertyName(), "(unknown)");
    char longName[] = "Trunk-Group";
    EXPECT_EQ(TRUNK_GROUP.declare(longName, "trunk-group"), XCode::OK);
    longName[0] = '?'; // it was copied
    CC_PropertyContainer properties;
    ASSERT_TRUE(properties.set(TRUNK_GROUP, "north").isOk());
    CC_Property const& property = *properties.get(TRUNK_GROUP.getId());
    EXPECT_STREQ(property.getPropertyName(), "Trunk-Group");
    EXPECT_STREQ(property.getPropertyShortName(), "trunk-group");
    EXPECT_EQ("Properties\n  Trunk-Group: north (String)\n", DUMP(properties, 9, 9));
    ASSERT_NE(CC_PropertyTable::FIND(TRUNK_GROUP.getId()), nullptr);
    EXPECT_EQ(CC_PropertyTable::FIND(TRUNK_GROUP.getId())->create, nullptr);
    EXPECT_EQ(CC_Factory().createProperty(TRUNK_GROUP.getId()), nullptr);
    EXPECT_EQ(TRUNK_GROUP.declare("Other", "other"), XCode::REFUSED) << "it has a name";
}

TEST(CC_PropertyKey, NamesAreRefusedOutsideTheModulesRange)
{
    for (unsigned int const id : {CC_PropertyId::FIRST_OF_MODULES - 1, CC_PropertyId::LAST_OF_MODULES + 1, 0U,
                                  CC_PropertyId::NAME, CC_PropertyId::UNNAMED_STRING})
        EXPECT_EQ(CC_PropertyTable::DECLARE(id, "Nobody's", "nobodys"), XCode::REFUSED) << std::hex << id;
    EXPECT_STREQ(CC_PropertyString(CC_PropertyId::UNNAMED_STRING).getPropertyName(), "(unknown)");
}

TEST(CC_PropertyKey, NamesOfOthersAndEmptyOnesAreRefused)
{
    constexpr unsigned int FIRST = CC_PropertyId::FIRST_OF_MODULES + 20;
    ASSERT_EQ(CC_PropertyTable::DECLARE(FIRST, "Line-Card", "line-card"), XCode::OK);
    EXPECT_EQ(CC_PropertyTable::DECLARE(FIRST + 1, "Line-Card", "card"), XCode::REFUSED);
    EXPECT_EQ(CC_PropertyTable::DECLARE(FIRST + 1, "Card", "line-card"), XCode::REFUSED);
    EXPECT_EQ(CC_PropertyTable::DECLARE(FIRST + 1, "Card", "e164"), XCode::REFUSED);
    EXPECT_EQ(CC_PropertyTable::DECLARE(FIRST + 1, "", "card"), XCode::REFUSED);
    EXPECT_EQ(CC_PropertyTable::DECLARE(FIRST + 1, "Card", nullptr), XCode::REFUSED);
    EXPECT_STREQ(CC_PropertyString(FIRST + 1).getPropertyName(), "(unknown)");
    EXPECT_EQ(CC_PropertyTable::DECLARE(FIRST + 1, "Card", "card"), XCode::OK);
}

TEST(CC_PropertyKey, WithoutMemoryNoNameIsDeclared)
{
    constexpr unsigned int ID = CC_PropertyId::FIRST_OF_MODULES + 30;
    std::string const name(100, 'n');
    std::string const shortName = name + "-short";
    XCode result;
    EXPECT_EQ(3U, WITH_EACH_ALLOCATION_FAILING(
                      [&] { result = CC_PropertyTable::DECLARE(ID, name.c_str(), shortName.c_str()); },
                      [&]
                      {
                          EXPECT_EQ(result, XCode::NO_ELEMENT);
                          EXPECT_EQ(CC_PropertyTable::FIND(ID), nullptr);
                      }));
    EXPECT_EQ(result, XCode::OK);
}

TEST(CC_PropertyKey, ModulesIdsCrossWithAllGroupsAndWithNoneOfTheLibrarys)
{
    CC_PropertyContainer from;
    ASSERT_TRUE(from.set(CIRCUIT, 17).isOk());
    for (unsigned int const mask : {0x100U, 0x200U, 0x400U, 0x800U, 0x1000U})
    {
        CC_PropertyContainer to;
        EXPECT_EQ(to.set(from, mask), XCode::OK);
        EXPECT_TRUE(to.isEmpty()) << std::hex << mask;
    }
    CC_PropertyContainer to;
    EXPECT_EQ(to.set(from), XCode::OK);
    EXPECT_EQ(to.get(CIRCUIT), 17U);
    for (unsigned int i = 0; i < CC_PropertyTable::NUMBER_OF_IDS; ++i)
        EXPECT_EQ(CC_PropertyTable::GET_ROW(i).id & 0x8000U, 0U);
}
