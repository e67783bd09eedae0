#include "MediaFixture.h"
#include "media/rtp/TelephoneEventReceiver.h"
#include "media/rtp/TelephoneEventSender.h"

namespace
{
std::vector<unsigned char> const SPEECH(160, 0x55);

std::vector<unsigned char> EVENT(unsigned char event, bool isEnd, std::uint16_t duration)
{
    std::vector<unsigned char> octets(TelephoneEvent::LENGTH);
    TelephoneEvent{event, isEnd, 10, duration}.write(octets.data());
    return octets;
}

class TelephoneEvents : public MediaFixture
{
protected:
    TelephoneEvents()
    {
        call = makeCallOfTheSameLoop();
        MediaDescription description = DESCRIBE(a.far, {PCMA});
        description.telephoneEvent = {101, 101};
        join(a, *call, description);
        description = DESCRIBE(b.far, {PCMA});
        description.telephoneEvent = {101, 96};
        join(b, *call, description);
    }
    /// The packets of a key held for 100 ms, as senders send them.
    void key(FarEnd& far, unsigned char event, unsigned int ends = 3)
    {
        RtpHeader header = far.next;
        header.type = 101;
        header.marker = true;
        for (std::uint16_t duration = 160; duration <= 800; duration = static_cast<std::uint16_t>(duration + 160))
        {
            far.send(header, EVENT(event, false, duration));
            ++header.sequence;
            header.marker = false;
        }
        for (unsigned int end = 0; end < ends; ++end, ++header.sequence)
            far.send(header, EVENT(event, true, 800));
        far.next.sequence = header.sequence;
        far.next.timestamp += 800;
        turn();
    }

    TYPtr<CallMedia> call;
    Side a;
    Side b;
};
} // namespace

TEST_F(TelephoneEvents, ADigitIsToldOnceAtItsEnd)
{
    key(a.far, 5);
    EXPECT_EQ(a.told, "5100 ");
    key(a.far, 11);
    EXPECT_EQ(a.told, "5100 #100 ");
    EXPECT_EQ(b.told, "");
}

TEST_F(TelephoneEvents, TheSameDigitTwiceIsToldTwice)
{
    key(a.far, 7);
    key(a.far, 7);
    EXPECT_EQ(a.told, "7100 7100 ");
}

TEST_F(TelephoneEvents, ADigitWhoseEndsAreLostIsToldAllTheSame)
{
    key(a.far, 1, 0);
    EXPECT_EQ(a.told, "");
    pass(2000);
    EXPECT_EQ(a.told, "1100 ");
    key(a.far, 2, 0);
    key(a.far, 3);
    EXPECT_EQ(a.told, "1100 2100 3100 ");
}

TEST_F(TelephoneEvents, WhatIsNoDigitIsNotToldAsOne)
{
    key(a.far, 32); // answer tone of a fax machine
    EXPECT_EQ(a.told, "");
    key(a.far, 16);
    EXPECT_EQ(a.told, "F100 ");
}

TEST_F(TelephoneEvents, RelayedDigitsKeepTheirTimestampAndTheirThreeEnds)
{
    a.far.say(SPEECH);
    turn();
    std::uint32_t const before = b.far.hear()->header.timestamp;
    key(a.far, 5);
    std::vector<FarEnd::Received> const heard = b.far.hearAll();
    ASSERT_EQ(heard.size(), 8u);
    unsigned int ends = 0;
    for (FarEnd::Received const& received : heard)
    {
        EXPECT_EQ(received.header.timestamp, before + 160);
        EXPECT_EQ(received.header.type, 96); // as that side numbers them
        ends += received.payload[1] >> 7;
    }
    EXPECT_EQ(ends, 3u);
    EXPECT_TRUE(heard[0].header.marker);
    EXPECT_FALSE(heard[1].header.marker);
    a.far.say(SPEECH);
    turn();
    EXPECT_EQ(b.far.hear()->header.timestamp, before + 960);
}

TEST_F(TelephoneEvents, SentDigitsHaveTheTimestampOfTheirStartAndThreeEnds)
{
    a.far.say(SPEECH);
    turn();
    RtpHeader const before = b.far.hear()->header;
    pass(20);
    b.leg->sendDigit('9', 100);
    turn();
    pass(400);
    std::vector<FarEnd::Received> const heard = b.far.hearAll();
    ASSERT_EQ(heard.size(), 7u); // 20, 40, 60, 80, 100 ms and the end twice more
    std::vector<unsigned int> durations;
    unsigned int ends = 0;
    for (std::size_t i = 0; i < heard.size(); ++i)
    {
        TelephoneEvent event;
        ASSERT_TRUE(event.read(heard[i].payload));
        EXPECT_EQ(event.event, 9);
        EXPECT_EQ(heard[i].header.type, 96);
        EXPECT_EQ(heard[i].header.marker, i == 0);
        EXPECT_EQ(heard[i].header.timestamp, before.timestamp + 320);
        EXPECT_EQ(heard[i].header.sequence, static_cast<std::uint16_t>(before.sequence + 1 + i));
        EXPECT_EQ(heard[i].header.source, before.source);
        durations.push_back(event.duration);
        ends += event.isEnd;
    }
    EXPECT_EQ(durations, (std::vector<unsigned int>{160, 320, 480, 640, 800, 800, 800}));
    EXPECT_EQ(ends, 3u);
}

TEST_F(TelephoneEvents, SpeechWaitsWhileADigitGoesOutAndThenGoesOn)
{
    a.far.say(SPEECH);
    turn();
    RtpHeader const before = b.far.hear()->header;
    b.leg->sendDigit('1', 40);
    turn();
    for (unsigned int i = 0; i < 10; ++i)
    {
        a.far.say(SPEECH);
        pass(20);
    }
    std::vector<FarEnd::Received> const heard = b.far.hearAll();
    ASSERT_EQ(heard.size(), 4u + 3u); // two and two more of the digit; with the silence behind it that is 140 ms
    EXPECT_EQ(heard[4].header.type, PCMA);
    EXPECT_TRUE(heard[4].header.marker);
    EXPECT_EQ(heard[4].header.sequence, static_cast<std::uint16_t>(before.sequence + 5));
    EXPECT_EQ(heard[4].header.timestamp, before.timestamp + 8 * 160); // it is taken when 160 ms have passed
}

TEST_F(TelephoneEvents, DigitsWaitForEachOther)
{
    for (char const digit : {'1', '2', 'D', 'x'})
        b.leg->sendDigit(digit, 40);
    pass(600);
    std::string digits;
    for (FarEnd::Received const& received : b.far.hearAll())
    {
        if (received.header.marker)
            digits += TelephoneEvent::DIGIT_OF(received.payload[0]);
    }
    EXPECT_EQ(digits, "12D");
}

TEST_F(TelephoneEvents, WhoTakesNoEventsHearsTheDigitAsSound)
{
    b.leg->describe(DESCRIBE(b.far, {PCMA}));
    turn();
    key(a.far, 5);
    pass(200);
    std::vector<FarEnd::Received> const heard = b.far.hearAll();
    ASSERT_GE(heard.size(), 5u); // 100 ms
    for (FarEnd::Received const& received : heard)
    {
        EXPECT_EQ(received.header.type, PCMA);
        EXPECT_EQ(received.payload.size(), 160u);
    }
}

TEST_F(TelephoneEvents, ShortPayloadsAreMalformed)
{
    a.far.send({true, 101, 1, 1, 1}, {5, 0, 0});
    turn();
    EXPECT_EQ(askQuality(a).malformedPackets, 1u);
    EXPECT_EQ(a.told, "");
}

TEST(TelephoneEventReceiver, ALatePacketOfTheDigitBeforeTellsNothing)
{
    TelephoneEventReceiver receiver;
    RtpHeader const first{true, 101, 1, 1000, 1};
    RtpHeader const second{true, 101, 2, 2000, 1};
    EXPECT_EQ(receiver.receive(first, {1, true, 10, 400}, 8000, 0), (HeardDigit{'1', 50}));
    EXPECT_EQ(receiver.receive(second, {2, false, 10, 160}, 8000, 0), std::nullopt);
    EXPECT_EQ(receiver.receive(first, {1, true, 10, 400}, 8000, 0), std::nullopt);
    EXPECT_EQ(receiver.receive(second, {2, true, 10, 400}, 8000, 0), (HeardDigit{'2', 50}));
}

TEST(TelephoneEventSender, TakesNoMoreThanThirtyTwo)
{
    TelephoneEventSender sender;
    for (unsigned int i = 0; i < 32; ++i)
        EXPECT_TRUE(sender.add('0', 40));
    EXPECT_FALSE(sender.add('0', 40));
    EXPECT_FALSE(TelephoneEventSender().add('F', 40));
}

namespace
{
/// By which way the call says that a digit came, as one asks it that is told of the digit.
struct Asking : MediaObserver
{
    void onDigit(char, unsigned int) override { way = call->getDigitTold(); }

    CallMedia* call = nullptr;
    CallMedia::DigitWay way = CallMedia::NONE;
};
} // namespace

TEST_F(TelephoneEvents, WhoIsToldOfADigitCanAskByWhichWayItCame)
{
    Asking asking;
    asking.call = call.get();
    FarEnd far("127.0.0.1");
    std::unique_ptr<LegMedia> const leg = call->addLeg(far.getRtp().host, asking);
    far.setPeer(leg->getLocalRtp());
    MediaDescription description = DESCRIBE(far, {PCMA});
    description.telephoneEvent = {101, 101};
    leg->describe(description);
    turn();
    key(far, 5);
    EXPECT_EQ(asking.way, CallMedia::EVENT);
    EXPECT_EQ(call->getDigitTold(), CallMedia::NONE) << "nobody is told any more";
}

TEST_F(TelephoneEvents, AreNotMadeToSoundWhereSignallingTellsThem)
{
    b.leg->describe(DESCRIBE(b.far, {PCMA})); // takes no events
    b.leg->setDigitsAside(true);
    turn();
    key(a.far, 5);
    pass(200);
    EXPECT_TRUE(b.far.hearAll().empty());
    b.leg->setDigitsAside(false);
    turn();
    key(a.far, 5);
    pass(200);
    EXPECT_FALSE(b.far.hearAll().empty());
}
