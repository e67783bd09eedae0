#include "MediaFixture.h"
#include "media/srtp/SrtpSession.h"

namespace
{
std::vector<unsigned char> const SPEECH(160, 0x55);

MediaKeys KEYS(MediaKeys::Suite suite, unsigned char ours, unsigned char theirs)
{
    MediaKeys keys;
    keys.suite = suite;
    keys.send.fill(ours);
    keys.receive.fill(theirs);
    return keys;
}

/// One side speaks SRTP, the other plainly.
class Srtp : public MediaFixture, public testing::WithParamInterface<MediaKeys::Suite>
{
protected:
    Srtp() : far(SrtpSession::MAKE(KEYS(GetParam(), 2, 1)))
    {
        call = makeCallOfTheSameLoop();
        secured = DESCRIBE(a.far, {PCMA});
        secured.keys = KEYS(GetParam(), 1, 2);
        join(a, *call, secured);
        join(b, *call, {PCMA});
    }
    void saySecured(SrtpSession& session)
    {
        std::vector<unsigned char> octets(RtpHeader::LENGTH);
        a.far.next.write(octets.data());
        ++a.far.next.sequence;
        a.far.next.timestamp += 160;
        octets.insert(octets.end(), SPEECH.begin(), SPEECH.end());
        octets.resize(octets.size() + SrtpSession::MOST_GROWTH);
        octets.resize(session.protectRtp(octets.data(), RtpHeader::LENGTH + SPEECH.size()));
        last = octets;
        a.far.sendRaw(octets);
        turn();
    }
    /// What b's packet is to a, opened.
    std::optional<FarEnd::Received> hearSecured()
    {
        std::optional<FarEnd::Received> heard = a.far.hear();
        if (!heard)
            return heard;
        std::vector<unsigned char> octets(RtpHeader::LENGTH);
        heard->header.write(octets.data());
        octets.insert(octets.end(), heard->payload.begin(), heard->payload.end());
        std::size_t const length = far->openRtp(octets.data(), octets.size());
        if (length == 0)
            return std::nullopt;
        heard->payload.assign(octets.begin() + RtpHeader::LENGTH, octets.begin() + static_cast<std::ptrdiff_t>(length));
        return heard;
    }

    TYPtr<CallMedia> call;
    Side a;
    Side b;
    MediaDescription secured;
    std::unique_ptr<SrtpSession> far;
    std::vector<unsigned char> last;
};
} // namespace

TEST_P(Srtp, IsOpenedForTheOneSideAndMadeForTheOther)
{
    saySecured(*far);
    EXPECT_EQ(b.far.hear()->payload, SPEECH);
    b.far.say(SPEECH);
    turn();
    std::optional<FarEnd::Received> const heard = hearSecured();
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->payload, SPEECH);
}

TEST_P(Srtp, PlainForgedAndReplayedPacketsAreRefusedAndCounted)
{
    a.far.say(SPEECH);
    std::unique_ptr<SrtpSession> const forger = SrtpSession::MAKE(KEYS(GetParam(), 3, 3));
    saySecured(*forger);
    EXPECT_FALSE(b.far.hear().has_value());
    saySecured(*far);
    EXPECT_TRUE(b.far.hear().has_value());
    a.far.sendRaw(last);
    turn();
    EXPECT_FALSE(b.far.hear().has_value());
    EXPECT_EQ(askQuality(a).unkeyedPackets, 3u);
}

TEST_P(Srtp, TheRoundsOfTheNumberingSurviveAReinviteWithTheSameKeys)
{
    for (unsigned int i = 0; i < 50; ++i) // from 65500 past the end
        saySecured(*far);
    EXPECT_EQ(b.far.hearAll().size(), 50u);
    secured.mode = VoipCodecAndMode::RECEIVE_ONLY;
    a.leg->describe(secured);
    turn();
    saySecured(*far);
    EXPECT_TRUE(b.far.hear().has_value());
}

TEST_P(Srtp, OtherKeysTakeEffect)
{
    saySecured(*far);
    EXPECT_TRUE(b.far.hear().has_value());
    secured.keys = KEYS(GetParam(), 5, 6);
    a.leg->describe(secured);
    turn();
    saySecured(*far);
    EXPECT_FALSE(b.far.hear().has_value());
    saySecured(*SrtpSession::MAKE(KEYS(GetParam(), 6, 5)));
    EXPECT_TRUE(b.far.hear().has_value());
}

TEST_P(Srtp, ADirectionWhoseKeyStaysGoesOnWhenTheOtherOnesChanges)
{
    for (unsigned int i = 0; i < 50; ++i) // from 65500 past the end
        saySecured(*far);
    EXPECT_EQ(b.far.hearAll().size(), 50u);
    secured.keys = KEYS(GetParam(), 9, 2);
    a.leg->describe(secured);
    turn();
    saySecured(*far);
    EXPECT_TRUE(b.far.hear().has_value());
}

TEST_P(Srtp, ReportsAreSecuredToo)
{
    RtcpPacket packet;
    packet.sender = a.far.next.source;
    std::array<unsigned char, RtcpPacket::LONGEST + SrtpSession::MOST_GROWTH> octets;
    std::size_t const plain = packet.write(std::span(octets).first<RtcpPacket::LONGEST>(), 1);
    a.far.sendRtcpRaw({octets.begin(), octets.begin() + static_cast<std::ptrdiff_t>(plain)});
    turn();
    EXPECT_EQ(askQuality(a).unkeyedPackets, 1u);
    std::size_t const length = far->protectRtcp(octets.data(), plain);
    a.far.sendRtcpRaw({octets.begin(), octets.begin() + static_cast<std::ptrdiff_t>(length)});
    turn();
    MediaQuality const quality = askQuality(a);
    EXPECT_EQ(quality.unkeyedPackets, 1u);
    EXPECT_EQ(quality.malformedPackets, 0u);
    a.leg.reset();
    turn();
    EXPECT_FALSE(a.far.hearRtcp() && a.far.hearRtcp()->isBye); // none in the clear
}

TEST_P(Srtp, TonesAndDigitsAreSecured)
{
    a.leg->playTone(MG_Tones::ECallProgressTone::DIAL);
    turn();
    pass(20);
    std::optional<FarEnd::Received> const heard = hearSecured();
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->payload.size(), 160u);
}

INSTANTIATE_TEST_SUITE_P(Suites, Srtp,
                         testing::Values(MediaKeys::AES_CM_128_HMAC_SHA1_80, MediaKeys::AES_CM_128_HMAC_SHA1_32),
                         [](auto const& suite)
                         { return suite.param == MediaKeys::AES_CM_128_HMAC_SHA1_80 ? "Tag80" : "Tag32"; });
