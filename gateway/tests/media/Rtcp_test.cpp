#include "MediaFixture.h"
#include "media/rtp/RtpReception.h"

namespace
{
std::vector<unsigned char> const SPEECH(160, 0x55);
constexpr long long MILLISECOND = 1000000;

class Rtcp : public MediaFixture
{
protected:
    Rtcp()
    {
        call = makeCallOfTheSameLoop();
        join(a, *call, {PCMA});
        join(b, *call, {PCMA});
    }
    /// Speech from a to b for a while: what b's far side then was last reported.
    std::optional<RtcpPacket> report(unsigned int milliseconds, FarEnd& about)
    {
        std::optional<RtcpPacket> last;
        for (unsigned int passed = 0; passed < milliseconds; passed += 20)
        {
            a.far.say(SPEECH);
            pass(20);
            while (std::optional<RtcpPacket> const heard = about.hearRtcp(about.next.source))
                last = heard;
            source = b.far.hear()->header.source;
        }
        return last;
    }

    TYPtr<CallMedia> call;
    Side a;
    Side b;
    std::uint32_t source = 0; // ours towards b
};
} // namespace

TEST_F(Rtcp, WhoIsSentToGetsSenderReportsOfOurOwnStream)
{
    std::optional<RtcpPacket> const heard = report(12000, b.far);
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->sender, source);
    ASSERT_TRUE(heard->senderInfo.has_value());
    EXPECT_GT(heard->senderInfo->packets, 100u);
    EXPECT_EQ(heard->senderInfo->octets, heard->senderInfo->packets * 160);
    EXPECT_FALSE(heard->report.has_value()); // nothing came from there
}

TEST_F(Rtcp, WhoSendsGetsReceiverReportsWithLossAndHighestNumber)
{
    report(4000, a.far);
    a.far.next.sequence = static_cast<std::uint16_t>(a.far.next.sequence + 10); // ten get lost
    std::optional<RtcpPacket> const heard = report(12000, a.far);
    ASSERT_TRUE(heard.has_value());
    EXPECT_FALSE(heard->senderInfo.has_value());
    ASSERT_TRUE(heard->report.has_value());
    EXPECT_EQ(heard->report->source, a.far.next.source);
    EXPECT_EQ(heard->report->lost, 10);
    EXPECT_GT(heard->report->highest, 65536u); // it began at 65500
    EXPECT_EQ(askQuality(a).lostPackets, 10u);
}

TEST_F(Rtcp, ReportsComeAboutEveryFiveSecondsAndNotForBothAtOnce)
{
    unsigned int ofA = 0;
    unsigned int ofB = 0;
    for (unsigned int i = 0; i < 60000 / 20; ++i)
    {
        pass(20);
        while (a.far.hearRtcp())
            ++ofA;
        while (b.far.hearRtcp())
            ++ofB;
    }
    EXPECT_GE(ofA, 8u);
    EXPECT_LE(ofA, 24u);
    EXPECT_GE(ofB, 8u);
    EXPECT_LE(ofB, 24u);
}

TEST_F(Rtcp, ReportsEndHereAndAreNotHandedThrough)
{
    RtcpPacket packet;
    packet.sender = a.far.next.source;
    a.far.sendRtcp(packet);
    turn();
    EXPECT_FALSE(b.far.hearRtcp().has_value());
}

TEST_F(Rtcp, TheRoundTripIsMeasuredAtBothEnds)
{
    RtcpPacket theirs;
    theirs.sender = a.far.next.source;
    theirs.senderInfo = RtcpSenderInfo{0x1111222233334444, 0, 0, 0};
    a.far.say(SPEECH);
    a.far.sendRtcp(theirs);
    turn();
    b.far.say(SPEECH); // so that a is sent to and gets sender reports
    std::optional<RtcpPacket> ours;
    unsigned int waited = 0;
    for (; !ours; waited += 20)
    {
        pass(20);
        ours = a.far.hearRtcp(a.far.next.source);
    }
    ASSERT_TRUE(ours->senderInfo && ours->report);
    EXPECT_EQ(ours->report->lastReport, 0x22223333u);
    EXPECT_NEAR(ours->report->delay / 65.536, waited, 1);

    pass(140); // there and back, of which the far side kept it for 100
    RtcpPacket answer;
    answer.sender = a.far.next.source;
    answer.report =
        RtcpReport{ours->sender, 0, 7, 1000, 80, static_cast<std::uint32_t>(ours->senderInfo->time >> 16), 6554};
    a.far.sendRtcp(answer);
    turn();
    MediaQuality const quality = askQuality(a);
    ASSERT_TRUE(quality.roundTripTime.has_value());
    EXPECT_NEAR(*quality.roundTripTime, 40, 1);
    EXPECT_EQ(quality.farLostPackets, 7u);
    EXPECT_EQ(quality.farJitter, 10u);
}

TEST_F(Rtcp, WithoutReportsThereIsNoRoundTripRatherThanZero)
{
    a.far.say(SPEECH);
    turn();
    MediaQuality const quality = askQuality(a);
    EXPECT_EQ(quality.roundTripTime, std::nullopt);
    EXPECT_EQ(quality.farLostPackets, std::nullopt);
    EXPECT_EQ(quality.lostPackets, 0u);
}

TEST_F(Rtcp, ALegThatEndsSaysBye)
{
    a.leg.reset();
    turn();
    std::optional<RtcpPacket> const heard = a.far.hearRtcp();
    ASSERT_TRUE(heard.has_value());
    EXPECT_TRUE(heard->isBye);
}

TEST_F(Rtcp, AfterAByeTheNextStreamLosesNothing)
{
    a.far.say(SPEECH);
    RtcpPacket bye;
    bye.sender = a.far.next.source;
    bye.isBye = true;
    a.far.sendRtcp(bye);
    turn();
    a.far.next.sequence = static_cast<std::uint16_t>(a.far.next.sequence + 500);
    a.far.say(SPEECH);
    turn();
    EXPECT_EQ(askQuality(a).lostPackets, 0u);
}

TEST_F(Rtcp, MultiplexedReportsTravelOnThePortOfSpeech)
{
    MediaDescription description = DESCRIBE(b.far, {PCMA});
    description.isRtcpMultiplexed = true;
    b.leg->describe(description);
    RtcpPacket packet;
    packet.sender = b.far.next.source;
    std::array<unsigned char, RtcpPacket::LONGEST> octets;
    std::size_t const length = packet.write(octets, 1);
    b.far.sendRaw({octets.begin(), octets.begin() + static_cast<std::ptrdiff_t>(length)});
    turn();
    MediaQuality const quality = askQuality(b);
    EXPECT_EQ(quality.malformedPackets + quality.unknownPackets, 0u);
    b.leg.reset();
    turn();
    EXPECT_FALSE(b.far.hearRtcp().has_value());
    EXPECT_TRUE(b.far.hear().has_value()); // version 2 is all that the two have in common
}

TEST_F(Rtcp, MalformedReportsAreCounted)
{
    a.far.sendRtcpRaw({0x80, 201, 0});
    a.far.sendRtcpRaw({0x81, 201, 0, 1, 0, 0, 0, 1}); // a report that is not there
    a.far.sendRtcpRaw({0x80, 201, 0, 9, 0, 0, 0, 1}); // longer than it is
    a.far.sendRtcpRaw({0x40, 201, 0, 1, 0, 0, 0, 1}); // version 1
    a.far.sendRtcpRaw({0xa0, 201, 0, 1, 0, 0, 0, 9}); // more padding than packet
    a.far.sendRtcpRaw({0x80, 8, 0, 1, 0, 0, 0, 9});   // RTP
    a.far.sendRtcpRaw({0x85, 203, 0, 1, 0, 0, 0, 1}); // five leave, one is named
    turn();
    EXPECT_EQ(askQuality(a).malformedPackets, 7u);
}

TEST_F(Rtcp, SilenceIsToldOnceAndItsEndToo)
{
    a.far.say(SPEECH);
    turn();
    b.far.say(SPEECH);
    pass(19000);
    EXPECT_EQ(a.told, "");
    pass(2000);
    EXPECT_EQ(a.told.substr(0, 9), "silence20");
    pass(60000);
    EXPECT_EQ(std::count(a.told.begin(), a.told.end(), ' '), 1);
    a.far.say(SPEECH);
    turn();
    EXPECT_EQ(a.told.substr(10), "speech ");
}

TEST_F(Rtcp, WhoIsNotToSendIsNotMissed)
{
    a.leg->setMode(VoipCodecAndMode::SEND_ONLY);
    pass(60000);
    EXPECT_EQ(a.told, "");
    a.leg->setMode(VoipCodecAndMode::SEND_RECEIVE); // from now on it is
    pass(19000);
    EXPECT_EQ(a.told, "");
    pass(2000);
    EXPECT_NE(a.told, "");
}

TEST(RtpReception, JitterIsThatOfTheStandardsExample)
{
    RtpReception reception;
    RtpHeader header{false, 8, 0, 0, 1};
    long long now = 0;
    for (unsigned int i = 0; i < 1000; ++i, ++header.sequence, header.timestamp += 160)
        reception.count(header, 8000, now += (i % 2 == 0 ? 15 : 25) * MILLISECOND); // 10 ms apart from evenness
    EXPECT_NEAR(*reception.getJitterMilliseconds(), 5, 1);
    EXPECT_EQ(reception.getLost(), 0);
}

TEST(RtpReception, CountsRoundsOfTheNumberingAndDuplicates)
{
    RtpReception reception;
    RtpHeader header{false, 8, 65534, 0, 1};
    for (unsigned int i = 0; i < 4; ++i, ++header.sequence)
        reception.count(header, 8000, 0);
    EXPECT_EQ(reception.getHighest(), 65537u);
    reception.count(header, 8000, 0);
    reception.count(header, 8000, 0);
    EXPECT_EQ(reception.getLost(), -1);
    EXPECT_EQ(reception.getTotalLost(), 0u);
}

TEST(RtpReception, TheFractionIsThatSinceTheReportBefore)
{
    RtpReception reception;
    RtpHeader header{false, 8, 0, 0, 1};
    for (unsigned int i = 0; i < 100; ++i, ++header.sequence)
    {
        if (i % 4 != 1)
            reception.count(header, 8000, 0);
    }
    EXPECT_EQ(reception.takeFractionLost(), 64);
    reception.count(header, 8000, 0);
    EXPECT_EQ(reception.takeFractionLost(), 0);
    EXPECT_EQ(reception.getLost(), 25);
}

TEST(RtpReception, WithoutPacketsNothingIsKnown)
{
    EXPECT_EQ(RtpReception().getTotalLost(), std::nullopt);
    EXPECT_EQ(RtpReception().getJitterMilliseconds(), std::nullopt);
}

namespace
{
struct Listener : Side
{
    void onReport(MediaReport const& report) override
    {
        (report.from == far.getRtcp() ? came : went).push_back(report);
    }

    std::vector<MediaReport> came;
    std::vector<MediaReport> went;
};
} // namespace

TEST_F(MediaFixture, ReportsAreToldAsTheyComeAndGoWhereThatIsWanted)
{
    MediaOptions options = OPTIONS();
    options.tellsReports = true;
    layer = std::make_unique<MediaLayer>(options, signalling);
    TYPtr<CallMedia> const call = makeCallOfTheSameLoop();
    Listener a;
    join(a, *call, {PCMA});
    pass(8000);
    ASSERT_FALSE(a.went.empty());
    EXPECT_EQ(a.went.front().from, a.leg->getLocalRtcp());
    EXPECT_EQ(a.went.front().to, a.far.getRtcp());
    EXPECT_TRUE(a.came.empty());

    RtcpPacket packet;
    packet.sender = 4711;
    a.far.sendRtcp(packet);
    pass(20);
    ASSERT_EQ(a.came.size(), 1u);
    EXPECT_EQ(a.came.front().packet.sender, 4711u);
    EXPECT_EQ(a.came.front().to, a.leg->getLocalRtcp());
}

TEST_F(MediaFixture, ReportsAreNotToldWhereNobodyAsked)
{
    TYPtr<CallMedia> const call = makeCallOfTheSameLoop();
    Listener a;
    join(a, *call, {PCMA});
    pass(8000);
    EXPECT_TRUE(a.went.empty());
}
