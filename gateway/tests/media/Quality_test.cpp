#include "MediaFixture.h"
#include "media/quality/EModel.h"

namespace
{
std::vector<unsigned char> const SPEECH(160, 0x55);

class Quality : public MediaFixture
{
protected:
    void connect(MG_Rtp::ECodec::Type codec)
    {
        call = makeCallOfTheSameLoop();
        join(a, *call, {codec});
        join(b, *call, {codec});
        a.far.next.type = static_cast<unsigned char>(codec);
    }

    TYPtr<CallMedia> call;
    Side a;
    Side b;
};
} // namespace

TEST(EModel, ScoresAreThoseOfTheRecommendation)
{
    EXPECT_NEAR(EModel::SCORE_OF_RATING(93.2), 4.41, 0.005); // G.107: the default values
    EXPECT_NEAR(EModel::SCORE_OF_RATING(90), 4.34, 0.005);   // annex B, table B.1
    EXPECT_NEAR(EModel::SCORE_OF_RATING(80), 4.03, 0.01);
    EXPECT_NEAR(EModel::SCORE_OF_RATING(70), 3.60, 0.005);
    EXPECT_NEAR(EModel::SCORE_OF_RATING(60), 3.10, 0.005);
    EXPECT_NEAR(EModel::SCORE_OF_RATING(50), 2.58, 0.005);
    EXPECT_EQ(EModel::SCORE_OF_RATING(-5), 1);
    EXPECT_EQ(EModel::SCORE_OF_RATING(100), 4.5);
    EXPECT_GE(EModel::SCORE_OF_RATING(3), 1); // the formula alone would be below
}

TEST(EModel, LossAndDelayImpair)
{
    EXPECT_EQ(EModel::SCORE(PCMA, 0, 0), 441u);
    EXPECT_EQ(EModel::SCORE(PCMA, 0, 100), 441u);
    EXPECT_LT(EModel::SCORE(PCMA, 0, 400), 400u);
    EXPECT_LT(EModel::SCORE(PCMA, 5, 0), 410u);
    EXPECT_LT(EModel::SCORE(PCMA, 50, 0), 200u);
    EXPECT_LT(EModel::SCORE(G729, 0, 0), 420u);
    EXPECT_EQ(EModel::SCORE(PCMA, 100, 1000), 100u);
}

TEST(EModel, WithoutPublishedFiguresThereIsNoScore)
{
    EXPECT_EQ(EModel::SCORE(OPUS, 0, 0), std::nullopt);
    EXPECT_EQ(EModel::SCORE(G722, 0, 0), std::nullopt);
}

TEST_F(Quality, NothingMeasuredIsNotZero)
{
    connect(PCMA);
    MediaQuality const quality = askQuality(a);
    EXPECT_EQ(quality.receivedPackets, 0u);
    EXPECT_EQ(quality.lostPackets, std::nullopt);
    EXPECT_EQ(quality.jitter, std::nullopt);
    EXPECT_EQ(quality.meanOpinionScore, std::nullopt);
}

TEST_F(Quality, IsOfWhatIsReceivedSoFar)
{
    connect(PCMA);
    for (unsigned int i = 0; i < 100; ++i)
    {
        a.far.next.sequence = static_cast<std::uint16_t>(a.far.next.sequence + (i % 10 == 5 ? 1 : 0)); // one in eleven
        a.far.say(SPEECH);
        pass(20);
    }
    MediaQuality const quality = askQuality(a);
    EXPECT_EQ(quality.receivedPackets, 100u);
    EXPECT_EQ(quality.receivedOctets, 16000u);
    EXPECT_EQ(quality.lostPackets, 10u);
    EXPECT_EQ(quality.jitter, 0u); // measured, and even
    ASSERT_TRUE(quality.meanOpinionScore.has_value());
    EXPECT_EQ(quality.meanOpinionScore, EModel::SCORE(PCMA, 100 * 10 / 110.0, 0));
    EXPECT_EQ(askQuality(b).sentPackets, 100u);
    EXPECT_EQ(b.leg->getQuality(), b.quality);
}

TEST_F(Quality, CanBeReadAtOnceWhileSomethingComes)
{
    connect(PCMA);
    EXPECT_EQ(a.leg->getQuality().receivedPackets, 0u) << "nothing has come";
    for (unsigned int i = 0; i < 20; ++i)
    {
        a.far.say(SPEECH);
        pass(20);
    }
    MediaQuality const quality = a.leg->getQuality();
    EXPECT_GE(quality.receivedPackets, 15u);
    EXPECT_EQ(quality.receivedPackets * SPEECH.size(), quality.receivedOctets);
    EXPECT_EQ(quality.lostPackets, 0u);
    EXPECT_TRUE(quality.meanOpinionScore.has_value());
    EXPECT_GE(b.leg->getQuality().sentPackets, 15u);
}

TEST_F(Quality, IsToldEveryFiveSecondsUnasked)
{
    connect(PCMA);
    a.far.say(SPEECH);
    pass(6000);
    EXPECT_EQ(a.quality.receivedPackets, 1u);
    a.far.say(SPEECH);
    pass(5100);
    EXPECT_EQ(a.quality.receivedPackets, 2u);
}

TEST_F(Quality, ACodecWithoutFiguresHasNoScore)
{
    connect(OPUS);
    a.far.next.type = 113;
    a.far.say(SPEECH);
    turn();
    MediaQuality const quality = askQuality(a);
    EXPECT_EQ(quality.receivedPackets, 1u);
    EXPECT_EQ(quality.meanOpinionScore, std::nullopt);
}
