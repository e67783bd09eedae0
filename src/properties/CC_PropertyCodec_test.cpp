#include "properties/CC_PropertyCodec.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

TEST(CC_PropertyCodec, PrintsAndComparesCodecAndMode)
{
    VoipCodec const codec(MG_Rtp::ECodec::PCMA, 20);
    CC_PropertyCodec property(CC_PropertyId::CURRENT_CODEC, VoipCodecAndMode(codec));
    CC_PropertyCodec const held(CC_PropertyId::CURRENT_CODEC, VoipCodecAndMode(codec, VoipCodecAndMode::SEND_ONLY));
    EXPECT_EQ("PCMA 20ms", VALUE_OF(property));
    EXPECT_EQ("PCMA 20ms send-only", VALUE_OF(held));
    EXPECT_FALSE(property.isEqual(held));
    EXPECT_TRUE(property.isEqual(CC_PropertyCodec(CC_PropertyId::CURRENT_CODEC, VoipCodecAndMode(codec))));
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "PCMA 20ms"));
}

TEST(CC_PropertyCodec, WithoutACodecTheTextIsEmpty)
{
    EXPECT_EQ("", VALUE_OF(CC_PropertyCodec(CC_PropertyId::CURRENT_CODEC)));
}
