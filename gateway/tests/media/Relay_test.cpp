#include "MediaFixture.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyId.h"
#include "testing/FailingAllocator.h"

#include <random>

namespace
{
std::vector<unsigned char> RANDOM_OCTETS(std::mt19937& random, std::size_t length)
{
    std::vector<unsigned char> octets(length);
    for (unsigned char& octet : octets)
        octet = static_cast<unsigned char>(random());
    return octets;
}
std::vector<unsigned char> const SPEECH(160, 0x55);

class Relay : public MediaFixture
{
protected:
    /// Two legs of a call that both speak A-law.
    void connect()
    {
        call = makeCallOfTheSameLoop();
        join(a, *call, {PCMA});
        join(b, *call, {PCMA});
    }
    /// What the other side hears of one packet of `from`.
    std::optional<FarEnd::Received> pass(Side& from, Side& to)
    {
        from.far.say(SPEECH);
        turn();
        return to.far.hear();
    }
    using MediaFixture::pass;

    TYPtr<CallMedia> call;
    Side a;
    Side b;
};
} // namespace

TEST_F(Relay, WhatOneSideSendsTheOtherGetsBitForBit)
{
    connect();
    std::mt19937 random(1);
    std::vector<std::vector<unsigned char>> sent;
    std::vector<FarEnd::Received> heard;
    for (unsigned int i = 0; i < 200; ++i)
    {
        sent.push_back(RANDOM_OCTETS(random, i == 0 ? 0 : random() % 1400));
        std::optional<FarEnd::Received> received = (a.far.say(sent.back()), turn(), b.far.hear());
        ASSERT_TRUE(received.has_value());
        heard.push_back(std::move(*received));
    }
    for (std::size_t i = 0; i < sent.size(); ++i)
    {
        EXPECT_EQ(heard[i].payload, sent[i]) << i;
        EXPECT_EQ(heard[i].header.type, PCMA);
        EXPECT_EQ(heard[i].header.marker, i == 0);
        EXPECT_EQ(heard[i].header.source, heard[0].header.source);
        EXPECT_EQ(heard[i].header.sequence, static_cast<std::uint16_t>(heard[0].header.sequence + i));
        EXPECT_EQ(heard[i].header.timestamp, heard[0].header.timestamp + 160 * i);
    }
    EXPECT_NE(heard[0].header.source, a.far.next.source); // our own source
}

TEST_F(Relay, BothWaysAtOnceAndInBursts)
{
    connect();
    for (unsigned int i = 0; i < 40; ++i) // more than a batch holds
    {
        a.far.say({1, static_cast<unsigned char>(i)});
        b.far.say({2, static_cast<unsigned char>(i)});
    }
    turn();
    std::vector<FarEnd::Received> const heardByA = a.far.hearAll();
    std::vector<FarEnd::Received> const heardByB = b.far.hearAll();
    ASSERT_EQ(heardByA.size(), 40u);
    ASSERT_EQ(heardByB.size(), 40u);
    for (unsigned char i = 0; i < 40; ++i)
    {
        EXPECT_EQ(heardByA[i].payload, (std::vector<unsigned char>{2, i}));
        EXPECT_EQ(heardByB[i].payload, (std::vector<unsigned char>{1, i}));
    }
}

TEST_F(Relay, BetweenVersion6AndVersion4)
{
    Side six("::1");
    call = makeCallOfTheSameLoop();
    join(six, *call, {PCMA});
    join(b, *call, {PCMA});
    EXPECT_EQ(six.leg->getLocalRtp().host.getVersion(), 6u);
    EXPECT_TRUE(pass(six, b).has_value());
    EXPECT_TRUE(pass(b, six).has_value());
}

TEST_F(Relay, EachSideNumbersPayloadsAsItAnnounced)
{
    call = makeCallOfTheSameLoop();
    MediaDescription ofA = DESCRIBE(a.far, {});
    MediaDescription ofB = DESCRIBE(b.far, {});
    ofA.formats.add({VoipCodec(OPUS), {96, 111}});
    ofB.formats.add({VoipCodec(OPUS), {107, 120}});
    join(a, *call, ofA);
    join(b, *call, ofB);
    a.far.next.type = 96;
    std::optional<FarEnd::Received> const heard = pass(a, b);
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->header.type, 120);
}

TEST_F(Relay, GapsAndDisorderComeThrough)
{
    connect();
    RtpHeader header{false, PCMA, 10, 1000, 7};
    for (int const sequence : {10, 11, 14, 13, 13, 15})
    {
        header.sequence = static_cast<std::uint16_t>(sequence);
        a.far.send(header, {});
    }
    turn();
    std::vector<int> steps;
    std::vector<FarEnd::Received> const heard = b.far.hearAll();
    for (FarEnd::Received const& received : heard)
        steps.push_back(static_cast<std::int16_t>(received.header.sequence - heard[0].header.sequence));
    EXPECT_EQ(steps, (std::vector<int>{0, 1, 4, 3, 3, 5}));
}

TEST_F(Relay, ExtensionsContributorsAndPaddingEndHere)
{
    connect();
    a.far.sendRaw({0xb1, 8,    0, 1, 0, 0, 0, 1, 0, 0, 0, 7, // padding, extension, one contributor
                   9,    9,    9, 9,                         // who
                   0xbe, 0xde, 0, 1, 1, 2, 3, 4,             // one word of extension
                   0xaa, 0xbb, 0, 0, 3});                    // two octets of payload, three of padding
    turn();
    std::optional<FarEnd::Received> const heard = b.far.hear();
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->payload, (std::vector<unsigned char>{0xaa, 0xbb}));
}

TEST_F(Relay, BadPacketsAreDroppedAndCounted)
{
    connect();
    a.far.sendRaw({});
    a.far.sendRaw({0x80});
    a.far.sendRaw(std::vector<unsigned char>(172, 0x40));                 // version 1
    a.far.sendRaw({0x8f, 8, 0, 1, 0, 0, 0, 1, 0, 0, 0, 7, 1, 1, 1, 1});   // contributors that are not there
    a.far.sendRaw({0x90, 8, 0, 1, 0, 0, 0, 1, 0, 0, 0, 7, 0, 0, 0, 200}); // an extension that is not
    a.far.sendRaw({0xa0, 8, 0, 1, 0, 0, 0, 1, 0, 0, 0, 7, 200});          // more padding than packet
    a.far.sendRaw({0xa0, 8, 0, 1, 0, 0, 0, 1, 0, 0, 0, 7, 0});            // padding of no octets
    a.far.sendRaw(std::vector<unsigned char>(1900, 0x80));                // longer than any that passes
    a.far.send({false, 99, 1, 1, 1}, SPEECH);                             // never agreed
    turn();
    EXPECT_TRUE(b.far.hearAll().empty());
    MediaQuality const quality = askQuality(a);
    EXPECT_EQ(quality.malformedPackets, 8u);
    EXPECT_EQ(quality.unknownPackets, 1u);
    EXPECT_EQ(quality.receivedPackets, 0u);
    EXPECT_EQ(quality.lostPackets, std::nullopt);
}

TEST_F(Relay, ACodecThatOnlyOneSideTakesIsNotHandedThrough)
{
    call = makeCallOfTheSameLoop();
    join(a, *call, {PCMA, G729});
    join(b, *call, {PCMA});
    a.far.next.type = G729;
    EXPECT_FALSE(pass(a, b).has_value());
    a.far.next.type = PCMA;
    EXPECT_TRUE(pass(a, b).has_value());
}

TEST_F(Relay, TimestampsGoOnAcrossACodecChangeOfTheSameClock)
{
    call = makeCallOfTheSameLoop();
    join(a, *call, {PCMA, PCMU});
    join(b, *call, {PCMA, PCMU});
    a.far.next.type = PCMA;
    std::uint32_t const before = pass(a, b)->header.timestamp;
    a.far.next.type = PCMU;
    std::optional<FarEnd::Received> const after = pass(a, b);
    EXPECT_EQ(after->header.timestamp, before + 160);
    EXPECT_EQ(after->header.type, PCMU);
    EXPECT_FALSE(after->header.marker);
}

TEST_F(Relay, DirectionsHoldAndResumeWithoutAGapInTheNumbering)
{
    connect();
    MediaAddress const port = b.leg->getLocalRtp();
    RtpHeader const before = pass(a, b)->header;
    b.leg->setMode(VoipCodecAndMode::INACTIVE);
    turn();
    for (unsigned int i = 0; i < 50; ++i) // a second
    {
        EXPECT_FALSE(pass(a, b).has_value());
        pass(20);
    }
    EXPECT_FALSE(pass(b, a).has_value());
    b.leg->setMode(VoipCodecAndMode::SEND_RECEIVE);
    turn();
    EXPECT_EQ(b.leg->getLocalRtp(), port);
    RtpHeader const after = pass(a, b)->header;
    EXPECT_EQ(after.source, before.source);
    EXPECT_EQ(after.sequence, static_cast<std::uint16_t>(before.sequence + 1));
    EXPECT_EQ(after.timestamp, before.timestamp + 8000); // the second that went by
    EXPECT_TRUE(after.marker);
    EXPECT_TRUE(pass(b, a).has_value());
}

TEST_F(Relay, SendOnlyAndReceiveOnlyAreSeenFromUs)
{
    connect();
    b.leg->setMode(VoipCodecAndMode::SEND_ONLY);
    turn();
    EXPECT_TRUE(pass(a, b).has_value());
    EXPECT_FALSE(pass(b, a).has_value());
    b.leg->setMode(VoipCodecAndMode::RECEIVE_ONLY);
    turn();
    EXPECT_FALSE(pass(a, b).has_value());
    EXPECT_TRUE(pass(b, a).has_value());
}

TEST_F(Relay, ATransferKeepsPortsSourceAndNumbering)
{
    connect();
    RtpHeader const before = pass(a, b)->header;
    pass(100);

    Side c;
    TYPtr<CallMedia> const other = makeCallOfTheSameLoop();
    join(c, *other, {PCMA});
    MediaAddress const port = b.leg->getLocalRtp();
    b.leg->moveTo(*other);
    turn();
    EXPECT_FALSE(pass(a, b).has_value());
    std::optional<FarEnd::Received> const heard = pass(c, b);
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->from, port);
    EXPECT_EQ(heard->header.source, before.source);
    EXPECT_EQ(heard->header.sequence, static_cast<std::uint16_t>(before.sequence + 1));
    EXPECT_EQ(heard->header.timestamp, before.timestamp + 800);
    EXPECT_TRUE(heard->header.marker);
    EXPECT_TRUE(pass(b, c).has_value());
}

TEST_F(Relay, ATransferIntoACallOfAnotherThreadLosesNoOrder)
{
    connect();
    RtpHeader const before = pass(a, b)->header;
    TYPtr<CallMedia> const sibling = makeCall(); // of the first loop
    TYPtr<CallMedia> const other = makeCall();   // of the second
    Side c;
    join(c, *other, {PCMA});

    b.leg->moveTo(*other);
    b.leg->setMode(VoipCodecAndMode::INACTIVE); // at once, while the leg is on its way
    b.leg->moveTo(*sibling);
    b.leg->moveTo(*other);
    b.leg->setMode(VoipCodecAndMode::SEND_ONLY);
    turn();
    std::optional<FarEnd::Received> const heard = pass(c, b);
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->header.source, before.source);
    EXPECT_EQ(heard->header.sequence, static_cast<std::uint16_t>(before.sequence + 1));
    EXPECT_FALSE(pass(b, c).has_value());
    EXPECT_FALSE(pass(a, b).has_value());
    b.leg.reset();
    turn();
    EXPECT_EQ(layer->getLoop(0).getNumberOfLegs() + layer->getLoop(1).getNumberOfLegs(), 2u);
}

TEST_F(Relay, TheFarSideBeginsAnewAndOursGoesOn)
{
    connect();
    RtpHeader const before = pass(a, b)->header;
    pass(20);
    a.far.next = {false, PCMA, 4711, 99, 0xabcdef};
    RtpHeader const after = pass(a, b)->header;
    EXPECT_EQ(after.source, before.source);
    EXPECT_EQ(after.sequence, static_cast<std::uint16_t>(before.sequence + 1));
    EXPECT_EQ(after.timestamp, before.timestamp + 160);
    EXPECT_TRUE(after.marker);
    EXPECT_EQ(askQuality(a).lostPackets, 0u);
}

TEST_F(Relay, PacketsTakeNoMemory)
{
    connect();
    for (unsigned int i = 0; i < 30; ++i)
    {
        a.far.say(SPEECH);
        b.far.say(SPEECH);
    }
    b.far.send({false, 99, 1, 1, 1}, SPEECH);
    RtcpPacket packet;
    packet.sender = 1;
    a.far.sendRtcp(packet);
    FailingAllocator::failNth(0);
    while (layer->getLoop(0).turn(0))
    {
    }
    FailingAllocator::stop();
    EXPECT_EQ(FailingAllocator::count(), 0u);
    EXPECT_EQ(b.far.hearAll().size(), 30u);
}

TEST_F(Relay, ALegAloneIsDeafAndDumb)
{
    call = makeCallOfTheSameLoop();
    join(a, *call, {PCMA});
    a.far.say(SPEECH);
    turn();
    EXPECT_FALSE(a.far.hear().has_value());
    EXPECT_EQ(askQuality(a).receivedPackets, 1u);
}

TEST_F(Relay, TheContextOfACallsPropertyIsWhereItsLegsMeet)
{
    CallControl::SET_MG_CONTEXT_REPOSITORY(layer->getContexts());
    CallControl::SET_MG_TERMINATION_REPOSITORY(layer->getTerminations());
    {
        CC_PropertyContextId const property(CC_PropertyId::CONTEXT); // as each call gets one
        CallMedia* const context = CallMedia::OF(property.getContext());
        ASSERT_NE(context, nullptr);
        join(a, *context, {PCMA});
        join(b, *context, {PCMA});
    }
    EXPECT_TRUE(pass(a, b).has_value()); // a context lives as long as its legs
    a.leg.reset();
    b.leg.reset();
    EXPECT_EQ(CallMedia::s_numberOfInstances, 0u);
    CallControl::SET_MG_CONTEXT_REPOSITORY(nullptr);
    CallControl::SET_MG_TERMINATION_REPOSITORY(nullptr);
}

TEST_F(Relay, LegsAndContextsMayOutliveTheLayer)
{
    connect();
    layer.reset();
    b.leg->setMode(VoipCodecAndMode::INACTIVE);
    b.leg->moveTo(*call);
    b.leg->askQuality();
    EXPECT_EQ(call->addLeg(a.far.getRtp().host, a), nullptr);
    b.leg.reset();
    call.set(nullptr);
    EXPECT_EQ(CallMedia::s_numberOfInstances, 1u); // that of the other leg
    a.leg.reset();
    EXPECT_EQ(CallMedia::s_numberOfInstances, 0u);
}
