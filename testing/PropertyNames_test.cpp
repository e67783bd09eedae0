#include "testing/PropertyNames.h"

#include "properties/CC_Flags.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"

#include <gtest/gtest.h>

TEST(PropertyNames, AnEmptySetIsAnEmptyText)
{
    EXPECT_EQ(PROPERTY_NAMES(CC_Flags()), "");
    EXPECT_EQ(PROPERTY_NAMES(CC_PropertyContainer::EMPTY()), "");
    EXPECT_EQ(PROPERTY_VALUES(CC_PropertyContainer::EMPTY()), "");
}

TEST(PropertyNames, FlagsComeInTheOrderOfTheIds)
{
    CC_Flags flags;
    EXPECT_TRUE(flags.set(CC_PropertyId::STATE, true).isOk());
    EXPECT_TRUE(flags.set(CC_PropertyId::NETWORK, true).isOk());
    EXPECT_TRUE(flags.set(CC_PropertyId::CAUSE, true).isOk());
    EXPECT_EQ(PROPERTY_NAMES(flags), "Network, Cause, State");
}

TEST(PropertyNames, AnIdWithoutANameIsANumber)
{
    EXPECT_EQ(PROPERTY_NAME(CC_PropertyId::UNNAMED_BOOLEAN), "0x400220");
    EXPECT_EQ(PROPERTY_NAME(CC_PropertyId::E164_NUMBER), "E164-Number");
}

TEST(PropertyNames, AContainerKeepsItsOrder)
{
    CC_PropertyContainer properties;
    EXPECT_TRUE(
        properties.set(CC_PropertyCallLegState(CC_PropertyId::STATE, CC_PropertyCallLegState::ALERTING)).isOk());
    EXPECT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NETWORK, "pstn")).isOk());
    EXPECT_EQ(PROPERTY_NAMES(properties), "State, Network");
    EXPECT_EQ(PROPERTY_VALUES(properties), "State: ALERTING, Network: pstn");
}
