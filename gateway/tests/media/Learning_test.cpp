#include "MediaFixture.h"
#include "media/rtp/RtpLatch.h"

namespace
{
std::vector<unsigned char> const SPEECH(160, 0x55);

/// A far side behind an address translator: its packets come from elsewhere than it says.
class Learning : public MediaFixture
{
protected:
    void connect()
    {
        call = makeCallOfTheSameLoop();
        join(a, *call, {PCMA});
        join(b, *call, {PCMA});
        outside.setPeer(b.leg->getLocalRtp());
        stranger.setPeer(b.leg->getLocalRtp());
    }
    /// Who of b's possible places hears what a says: 'd' described, 'o' outside, 's' the stranger.
    std::string whoHears()
    {
        a.far.say(SPEECH);
        turn();
        std::string all;
        all += b.far.hear() ? "d" : "";
        all += outside.hear() ? "o" : "";
        all += stranger.hear() ? "s" : "";
        return all;
    }
    bool isHeard(FarEnd& from)
    {
        from.say(SPEECH);
        turn();
        return !a.far.hearAll().empty();
    }

    TYPtr<CallMedia> call;
    Side a;
    Side b;
    FarEnd outside;
    FarEnd stranger;
};
} // namespace

TEST_F(Learning, SpeechGoesWhereSignallingSaidUntilSomethingComes)
{
    connect();
    EXPECT_EQ(whoHears(), "d");
}

TEST_F(Learning, SpeechGoesToWhereItComesFrom)
{
    connect();
    EXPECT_TRUE(isHeard(outside));
    EXPECT_EQ(whoHears(), "o");
}

TEST_F(Learning, AStrangerChangesNothingOnceTheAddressHasSettled)
{
    connect();
    EXPECT_TRUE(isHeard(outside));
    pass(2020);
    EXPECT_TRUE(isHeard(outside));
    EXPECT_FALSE(isHeard(stranger));
    EXPECT_FALSE(isHeard(b.far)); // also the described one comes too late
    EXPECT_EQ(whoHears(), "o");
    EXPECT_EQ(askQuality(b).strayPackets, 2u);
}

TEST_F(Learning, AStrangerDoesNotWinTheWindowEither)
{
    connect();
    EXPECT_TRUE(isHeard(outside));
    EXPECT_FALSE(isHeard(stranger));
    EXPECT_EQ(whoHears(), "o");
}

TEST_F(Learning, TheDescribedAddressTakesItsPlaceBackWithinTheWindow)
{
    connect();
    EXPECT_TRUE(isHeard(stranger));
    pass(1900);
    EXPECT_TRUE(isHeard(b.far));
    EXPECT_FALSE(isHeard(stranger));
    EXPECT_EQ(whoHears(), "d");
}

TEST_F(Learning, SayingTheSameAgainKeepsWhatWasLearned)
{
    connect();
    EXPECT_TRUE(isHeard(outside));
    pass(2020);
    EXPECT_TRUE(isHeard(outside));
    b.leg->setMode(VoipCodecAndMode::SEND_ONLY);
    b.leg->setMode(VoipCodecAndMode::SEND_RECEIVE);
    turn();
    EXPECT_FALSE(isHeard(stranger));
    EXPECT_EQ(whoHears(), "o");
}

TEST_F(Learning, AnotherDescribedAddressIsLearnedAnew)
{
    connect();
    EXPECT_TRUE(isHeard(b.far));
    b.leg->describe(DESCRIBE(outside, {PCMA}));
    turn();
    EXPECT_EQ(whoHears(), "o");
    EXPECT_TRUE(isHeard(outside));
    EXPECT_FALSE(isHeard(b.far));
}

TEST_F(Learning, WhoSaysNothingOfItselfIsFoundByItsFirstPacket)
{
    call = makeCallOfTheSameLoop();
    join(a, *call, {PCMA});
    MediaDescription description = DESCRIBE(b.far, {PCMA});
    description.rtp = MediaAddress::OF("0.0.0.0", 4000);
    join(b, *call, description);
    EXPECT_EQ(whoHears(), "");
    EXPECT_TRUE(isHeard(b.far));
    EXPECT_EQ(whoHears(), "d");
}

TEST_F(Learning, WhatIsNoSpeechTeachesNothing)
{
    connect();
    stranger.sendRaw({0x80, 8, 1});
    stranger.send({false, 77, 1, 1, 1}, SPEECH); // a payload type that nobody agreed on
    turn();
    EXPECT_EQ(whoHears(), "d");
    EXPECT_TRUE(isHeard(outside));
    EXPECT_EQ(whoHears(), "o");
}
