#include "properties/CC_PropertyWaitForMessage.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyId.h"

#include <gtest/gtest.h>
#include <string>

namespace
{
using Wait = CC_PropertyWaitForMessage;

Wait PROPERTY_OF(int state, int messageType = 0)
{
    return Wait(CC_PropertyId::WAIT_FOR_MESSAGE, static_cast<Wait::State>(state),
                static_cast<Wait::MessageType>(messageType));
}

std::string APPENDED_TO(String text, Wait const& property) { return property.getValueString(text).c_str(); }
} // namespace

TEST(CC_PropertyWaitForMessage, EveryStateHasItsText)
{
    EXPECT_EQ("Not Capable", APPENDED_TO("", PROPERTY_OF(0)));
    EXPECT_EQ("Idle", APPENDED_TO("", PROPERTY_OF(1, 1)));
    EXPECT_EQ("WaitForMessage ( Undefined )", APPENDED_TO("", PROPERTY_OF(2)));
    EXPECT_EQ("WaitForMessage ( Prack )", APPENDED_TO("", PROPERTY_OF(2, 1)));
    EXPECT_EQ("WaitForMessage ( <invalid> )", APPENDED_TO("", PROPERTY_OF(2, 5)));
    EXPECT_EQ("MessageArrived ( Prack )", APPENDED_TO("", PROPERTY_OF(3, 1)));
    EXPECT_EQ(ERROR::INVALID, APPENDED_TO("", PROPERTY_OF(4)));
    EXPECT_EQ("Not Capable", APPENDED_TO("", Wait(CC_PropertyId::WAIT_FOR_MESSAGE)));
}

TEST(CC_PropertyWaitForMessage, EveryMessageTypeHasItsName)
{
    EXPECT_STREQ("Undefined", Wait::NAME(Wait::UNDEFINED));
    EXPECT_STREQ("Prack", Wait::NAME(Wait::PRACK));
    EXPECT_STREQ("<invalid>", Wait::NAME(static_cast<Wait::MessageType>(2)));
}

// intended: most classes replace what stands in the text
TEST(CC_PropertyWaitForMessage, AppendsToWhatStandsInTheText)
{
    EXPECT_EQ("xNot Capable", APPENDED_TO("x", PROPERTY_OF(0)));
    EXPECT_EQ("xIdle", APPENDED_TO("x", PROPERTY_OF(1)));
    EXPECT_EQ("xWaitForMessage ( Prack )", APPENDED_TO("x", PROPERTY_OF(2, 1)));
    EXPECT_EQ("xMessageArrived ( Prack )", APPENDED_TO("x", PROPERTY_OF(3, 1)));
    EXPECT_EQ(std::string("x").append(ERROR::INVALID), APPENDED_TO("x", PROPERTY_OF(4)));
}

TEST(CC_PropertyWaitForMessage, ComparesStateAndMessageType)
{
    Wait property = PROPERTY_OF(Wait::WAIT_FOR_MESSAGE, Wait::PRACK);
    EXPECT_TRUE(property.isEqual(PROPERTY_OF(Wait::WAIT_FOR_MESSAGE, Wait::PRACK)));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF(Wait::WAIT_FOR_MESSAGE)));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF(Wait::MESSAGE_ARRIVED, Wait::PRACK)));
    property.setState(Wait::IDLE);
    property.setMessageType(Wait::UNDEFINED);
    EXPECT_EQ(Wait::IDLE, property.getState());
    EXPECT_EQ(Wait::UNDEFINED, property.getMessageType());
}

TEST(CC_PropertyWaitForMessage, TakesNoText)
{
    Wait property = PROPERTY_OF(Wait::IDLE);
    String error;
    EXPECT_EQ(XCode::FAILURE, property.setValueString(error, "Idle"));
    EXPECT_STREQ("Invalid value", error.c_str());
}
