#include "properties/CC_PropertyCodecs.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>

namespace
{
VoipCodecListSet SET_OF(MG_Rtp::ECodec::Type both, MG_Rtp::ECodec::Type sendOnly)
{
    VoipCodecListSet codecs;
    EXPECT_TRUE(codecs.getList(VoipCodecListSet::SEND_RECEIVE).append(VoipCodec(both, 20)).isOk());
    EXPECT_TRUE(codecs.getList(VoipCodecListSet::SEND_ONLY).append(VoipCodec(sendOnly)).isOk());
    return codecs;
}
} // namespace

TEST(CC_PropertyCodecs, PrintsAndComparesAllThreeLists)
{
    VoipCodecListSet const codecs = SET_OF(MG_Rtp::ECodec::PCMA, MG_Rtp::ECodec::GSM);
    CC_PropertyCodecs property(CC_PropertyId::SUPPORTED_CODECS, codecs);
    EXPECT_EQ("PCMA 20ms; send-only: GSM", VALUE_OF(property));
    EXPECT_TRUE(property.getValue() == codecs);
    EXPECT_TRUE(property.isEqual(CC_PropertyCodecs(CC_PropertyId::SUPPORTED_CODECS, codecs)));
    EXPECT_FALSE(property.isEqual(
        CC_PropertyCodecs(CC_PropertyId::SUPPORTED_CODECS, SET_OF(MG_Rtp::ECodec::PCMA, MG_Rtp::ECodec::G722))));
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "PCMA 20ms"));
    EXPECT_EQ("", VALUE_OF(CC_PropertyCodecs(CC_PropertyId::SUPPORTED_CODECS)));
}

TEST(CC_PropertyCodecs, AnAssignmentThatLacksMemoryHalfWayChangesNothing)
{
    CC_PropertyCodecs const source(CC_PropertyId::SUPPORTED_CODECS, SET_OF(MG_Rtp::ECodec::PCMA, MG_Rtp::ECodec::GSM));
    CC_PropertyCodecs target(CC_PropertyId::SUPPORTED_CODECS, SET_OF(MG_Rtp::ECodec::PCMU, MG_Rtp::ECodec::G722));
    unsigned long const failures = WITH_EACH_ALLOCATION_FAILING(
        [&] { target.assign(source); }, [&] { EXPECT_EQ("PCMU 20ms; send-only: G722", VALUE_OF(target)); });
    EXPECT_EQ(2U, failures); // the two lists that are not empty
    EXPECT_TRUE(target.isEqual(source));
}
