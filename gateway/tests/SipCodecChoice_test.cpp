#include "sip/dialog/SipCodecChoice.h"

#include <gtest/gtest.h>

namespace
{
using namespace SipCodecChoice;
using E = MG_Rtp::ECodec;

Codecs const OWN{E::PCMA, E::PCMU, E::G729, E::OPUS};
} // namespace

TEST(SipCodecChoiceForOffer, HasFirstWhatIsRelayedThenWhatIsTranscoded)
{
    EXPECT_EQ(FOR_OFFER(OWN, {E::NONE, {E::OPUS, E::G729}}), (Codecs{E::G729, E::OPUS, E::PCMA, E::PCMU}));
}

TEST(SipCodecChoiceForOffer, WhatIsSpokenAcrossComesFirst)
{
    EXPECT_EQ(FOR_OFFER(OWN, {E::OPUS, {E::PCMU, E::OPUS}}), (Codecs{E::OPUS, E::PCMU, E::PCMA}));
    EXPECT_EQ(FOR_OFFER(OWN, {E::PCMU, {}}), (Codecs{E::PCMU, E::PCMA, E::OPUS}));
}

TEST(SipCodecChoiceForOffer, LeavesOutWhatNobodyCouldMakeOfWhatIsSaidAcross)
{
    EXPECT_EQ(FOR_OFFER(OWN, {E::NONE, {E::G729}}), Codecs{E::G729});
    EXPECT_EQ(FOR_OFFER(OWN, {E::NONE, {E::PCMA}}), (Codecs{E::PCMA, E::PCMU, E::OPUS})) << "G.729 is not spoken here";
    EXPECT_EQ(FOR_OFFER(OWN, {E::NONE, {E::G723}}), Codecs{});
}

TEST(SipCodecChoiceForOffer, IsWhatIsSpokenHereAsLongAsNothingIsKnown)
{
    EXPECT_EQ(FOR_OFFER(OWN, {}), (Codecs{E::PCMA, E::PCMU, E::OPUS}));
}

TEST(SipCodecChoiceForAnswer, RelaysIfItCan)
{
    EXPECT_EQ(FOR_ANSWER({E::PCMA, E::OPUS}, {E::OPUS, {E::PCMA, E::OPUS}}), E::OPUS);
    EXPECT_EQ(FOR_ANSWER({E::PCMA, E::G729}, {E::G729, {}}), E::G729);
    EXPECT_EQ(FOR_ANSWER({E::PCMA, E::PCMU}, {E::NONE, {E::PCMU}}), E::PCMU) << "nothing is agreed on across yet";
}

TEST(SipCodecChoiceForAnswer, ElseTranscodes)
{
    EXPECT_EQ(FOR_ANSWER({E::G729, E::PCMU, E::PCMA}, {E::OPUS, {E::OPUS}}), E::PCMU);
    EXPECT_EQ(FOR_ANSWER({E::G729, E::PCMU}, {E::NONE, {E::OPUS}}), E::PCMU);
    EXPECT_EQ(FOR_ANSWER({E::G729, E::PCMU}, {}), E::PCMU);
}

TEST(SipCodecChoiceForAnswer, ElseFails)
{
    EXPECT_EQ(FOR_ANSWER({E::G729}, {E::PCMA, {E::PCMA}}), E::NONE);
    EXPECT_EQ(FOR_ANSWER({E::PCMA}, {E::G729, {E::G729, E::PCMA}}), E::NONE);
    EXPECT_EQ(FOR_ANSWER({}, {E::PCMA, {}}), E::NONE);
}

TEST(SipCodecChoiceCompatible, IsTheSameOrWhatIsSpokenHere)
{
    EXPECT_TRUE(ARE_COMPATIBLE(E::G729, E::G729));
    EXPECT_TRUE(ARE_COMPATIBLE(E::PCMA, E::OPUS));
    EXPECT_FALSE(ARE_COMPATIBLE(E::PCMA, E::G729));
}

// What is no speech (RFC 4040) is offered to nobody unless the other side carries it, and never made of speech.

TEST(SipCodecChoiceClearChannel, IsRelayedOrNothing)
{
    Codecs const own{E::CLEARMODE, E::PCMA};
    EXPECT_EQ(FOR_OFFER(own, {E::CLEARMODE, {E::CLEARMODE}}), Codecs{E::CLEARMODE});
    EXPECT_EQ(FOR_OFFER(own, {E::PCMA, {E::PCMA}}), Codecs{E::PCMA});
    EXPECT_EQ(FOR_OFFER({E::PCMA}, {E::CLEARMODE, {E::CLEARMODE}}), Codecs{});
    EXPECT_EQ(FOR_ANSWER({E::PCMA, E::CLEARMODE}, {E::CLEARMODE, {E::CLEARMODE}}), E::CLEARMODE);
    EXPECT_EQ(FOR_ANSWER({E::PCMA}, {E::CLEARMODE, {E::CLEARMODE}}), E::NONE);
}

TEST(SipCodecChoiceClearChannel, IsWhatTheCallCarriesWhenItIsLikedBest)
{
    EXPECT_EQ(CAPABILITY_OF({E::CLEARMODE, E::PCMA}), QInformationTransferCapability::UNRESTRICTED_DIGITAL);
    EXPECT_EQ(CAPABILITY_OF({E::PCMA, E::CLEARMODE}), QInformationTransferCapability::SPEECH);
    EXPECT_EQ(CAPABILITY_OF({}), QInformationTransferCapability::SPEECH);
}
