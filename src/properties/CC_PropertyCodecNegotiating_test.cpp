#include "properties/CC_PropertyCodecNegotiating.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyId.h"

#include <gtest/gtest.h>
#include <string>

namespace
{
using Negotiating = CC_PropertyCodecNegotiating;

Negotiating PROPERTY_OF(int state, unsigned int value = 0)
{
    return Negotiating(CC_PropertyId::CODEC_NEGOTIATING, static_cast<Negotiating::State>(state), value);
}

std::string APPENDED_TO(String text, Negotiating const& property) { return property.getValueString(text).c_str(); }
} // namespace

TEST(CC_PropertyCodecNegotiating, EveryStateHasItsText)
{
    EXPECT_EQ("Not Capable", APPENDED_TO("", PROPERTY_OF(0)));
    EXPECT_EQ("Idle", APPENDED_TO("", PROPERTY_OF(1)));
    EXPECT_EQ("Request", APPENDED_TO("", PROPERTY_OF(2, 8)));
    EXPECT_EQ("Negotiated ( 8 )", APPENDED_TO("", PROPERTY_OF(3, 8)));
    EXPECT_EQ("Negotiated ( 4294967295 )", APPENDED_TO("", PROPERTY_OF(3, 0xffffffff)));
    EXPECT_EQ(ERROR::INVALID, APPENDED_TO("", PROPERTY_OF(4)));
    EXPECT_EQ(ERROR::INVALID, APPENDED_TO("", PROPERTY_OF(-1)));
    EXPECT_EQ("Not Capable", APPENDED_TO("", Negotiating(CC_PropertyId::CODEC_NEGOTIATING)));
}

// intended: most classes replace what stands in the text
TEST(CC_PropertyCodecNegotiating, AppendsToWhatStandsInTheText)
{
    EXPECT_EQ("xIdle", APPENDED_TO("x", PROPERTY_OF(Negotiating::IDLE)));
    EXPECT_EQ("xNegotiated ( 8 )", APPENDED_TO("x", PROPERTY_OF(Negotiating::NEGOTIATED, 8)));
    EXPECT_EQ(std::string("x").append(ERROR::INVALID), APPENDED_TO("x", PROPERTY_OF(9)));
}

TEST(CC_PropertyCodecNegotiating, ComparesStateAndValue)
{
    Negotiating property = PROPERTY_OF(Negotiating::NEGOTIATED, 8);
    EXPECT_TRUE(property.isEqual(PROPERTY_OF(Negotiating::NEGOTIATED, 8)));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF(Negotiating::NEGOTIATED, 0)));
    EXPECT_FALSE(property.isEqual(PROPERTY_OF(Negotiating::REQUEST, 8)));
    property.setState(Negotiating::REQUEST);
    property.setNegotiatedValue(9);
    EXPECT_EQ(Negotiating::REQUEST, property.getState());
    EXPECT_EQ(9U, property.getNegotiatedValue());
}

TEST(CC_PropertyCodecNegotiating, TakesNoText)
{
    Negotiating property = PROPERTY_OF(Negotiating::IDLE);
    String error;
    EXPECT_EQ(XCode::FAILURE, property.setValueString(error, "Request"));
    EXPECT_STREQ("Invalid value", error.c_str());
    EXPECT_EQ(Negotiating::IDLE, property.getState());
}
