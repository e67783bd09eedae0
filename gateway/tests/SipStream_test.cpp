#include "sip/dialog/SipStream.h"

#include <gtest/gtest.h>

#include <string>

namespace
{
using Codec = MG_Rtp::ECodec;

std::string SESSION(std::string const& media, std::string const& attributes = {})
{
    return "v=0\r\no=them 7 8 IN IP4 192.0.2.1\r\ns=-\r\nc=IN IP4 192.0.2.1\r\nt=0 0\r\n" + attributes + media;
}

SipStream STREAM(std::string const& media) { return SipStream::READ(SESSION(media)).value_or(SipStream{}); }

SipStream OURS(std::vector<SipStream::Format> formats)
{
    SipStream ours;
    ours.rtp = MediaAddress::OF("198.51.100.9", 30000);
    ours.formats = std::move(formats);
    ours.events = {{8000, 101}};
    return ours;
}

bool HAS(std::string const& text, std::string const& line) { return text.find(line + "\r\n") != std::string::npos; }
} // namespace

TEST(SipStreamRead, HasCodecsInTheirOrderAndTheEventsBesideThem)
{
    auto const stream = SipStream::READ(
        SESSION("m=audio 4000 RTP/AVP 111 8 77 100 13\r\na=rtpmap:111 opus/48000/2\r\na=rtpmap:77 X-UNHEARD/8000\r\n"
                "a=rtpmap:100 telephone-event/8000\r\na=ptime:40\r\n"));
    ASSERT_TRUE(stream.has_value());
    EXPECT_EQ(stream->formats, (std::vector<SipStream::Format>{{Codec::OPUS, 111}, {Codec::PCMA, 8}}));
    EXPECT_EQ(stream->events, (std::vector<SipStream::Events>{{8000, 100}}));
    EXPECT_EQ(stream->rtp, MediaAddress::OF("192.0.2.1", 4000));
    EXPECT_EQ(stream->period, 40u);
}

TEST(SipStreamRead, APayloadTypeNamedTwiceHasOneMeaning)
{
    SipStream const stream = STREAM("m=audio 4000 RTP/AVP 9 0 9 100 100\r\na=rtpmap:9 PCMA/8000\r\n"
                                    "a=rtpmap:100 telephone-event/8000\r\na=rtpmap:100 opus/48000/2\r\n");
    EXPECT_EQ(stream.formats, (std::vector<SipStream::Format>{{Codec::PCMA, 9}, {Codec::PCMU, 0}, {Codec::OPUS, 100}}));
    EXPECT_EQ(stream.events, std::vector<SipStream::Events>());
}

TEST(SipStreamRead, IsTheFirstVoiceThatIsNotRefused)
{
    SipStream const stream = STREAM(
        "m=video 5000 RTP/AVP 31\r\nm=audio 0 RTP/AVP 8\r\nm=audio 4002 RTP/AVP 0\r\nm=audio 4004 RTP/AVP 8\r\n");
    EXPECT_EQ(stream.place, 2u);
    EXPECT_EQ(stream.rtp.port, 4002);
    EXPECT_EQ(stream.streams.size(), 4u);
}

TEST(SipStreamRead, NeedsOne)
{
    for (char const* const none : {"m=video 4000 RTP/AVP 31\r\n", "m=audio 0 RTP/AVP 8\r\n", ""})
        EXPECT_FALSE(SipStream::READ(SESSION(none)).has_value()) << none;
    EXPECT_FALSE(SipStream::READ("nonsense").has_value());
}

TEST(SipStreamRead, ItsDirectionMayBeTheSessionsOrAnAddressOfNobody)
{
    auto const modeOf = [](std::string const& description) { return SipStream::READ(description)->mode; };
    std::string const voice = "m=audio 4000 RTP/AVP 8\r\n";
    EXPECT_EQ(modeOf(SESSION(voice)), VoipCodecAndMode::SEND_RECEIVE);
    EXPECT_EQ(modeOf(SESSION(voice + "a=recvonly\r\n")), VoipCodecAndMode::RECEIVE_ONLY);
    EXPECT_EQ(modeOf(SESSION(voice, "a=inactive\r\n")), VoipCodecAndMode::INACTIVE);
    EXPECT_EQ(modeOf(SESSION(voice + "c=IN IP4 0.0.0.0\r\n")), VoipCodecAndMode::SEND_ONLY);
}

TEST(SipStreamWrite, SaysWhereWeListenAndWhatWeTake)
{
    std::string const text = OURS({{Codec::PCMA, 8}, {Codec::OPUS, 96}, {Codec::G729, 18}}).write({4711, 2});
    EXPECT_TRUE(HAS(text, "o=gateway 4711 2 IN IP4 198.51.100.9")) << text;
    EXPECT_TRUE(HAS(text, "c=IN IP4 198.51.100.9")) << text;
    EXPECT_TRUE(HAS(text, "m=audio 30000 RTP/AVP 8 96 18 101")) << text;
    EXPECT_TRUE(HAS(text, "a=rtpmap:96 opus/48000/2")) << text;
    EXPECT_TRUE(HAS(text, "a=fmtp:18 annexb=no")) << text;
    EXPECT_TRUE(HAS(text, "a=rtpmap:101 telephone-event/8000")) << text;
    EXPECT_TRUE(HAS(text, "a=ptime:20")) << text;
    EXPECT_TRUE(HAS(text, "a=sendrecv")) << text;
}

TEST(SipStreamWrite, AReplyHasTheStreamsOfWhatItRepliesTo)
{
    SipStream reply =
        STREAM("m=video 5000 RTP/AVP 31\r\nm=audio 4002 RTP/AVP 0\r\na=ptime:30\r\nm=application 9 TCP/BFCP *\r\n")
            .getReply();
    reply.rtp = MediaAddress::OF("2001:db8::1", 30000);
    reply.formats = {{Codec::PCMU, 0}};
    reply.mode = VoipCodecAndMode::RECEIVE_ONLY;
    std::string const text = reply.write({1, 1});
    EXPECT_NE(text.find("m=video 0 RTP/AVP 31\r\nm=audio 30000 RTP/AVP 0\r\n"), std::string::npos) << text;
    EXPECT_NE(text.find("a=ptime:30\r\na=recvonly\r\nm=application 0 "), std::string::npos) << text;
    EXPECT_TRUE(HAS(text, "c=IN IP6 2001:db8::1")) << text;
}

TEST(SipStreamTypes, StayForWhatHasOneAndAreFreeForWhatHasNot)
{
    SipStream const stream = STREAM("m=audio 4000 RTP/AVP 96 101 8\r\na=rtpmap:96 telephone-event/48000\r\n"
                                    "a=rtpmap:101 opus/48000/2\r\n");
    EXPECT_EQ(stream.getType(Codec::OPUS), 101);
    EXPECT_EQ(stream.getType(Codec::PCMU), 0);
    EXPECT_EQ(stream.getType(Codec::ILBC), 97);
    EXPECT_EQ(stream.getEventsType(48000), 96);
    EXPECT_EQ(stream.getEventsType(8000), 102);
}

TEST(SipStreamAgreed, HasTheFormatsOfBothInTheFarSidesOrderWithTheNumbersOfEach)
{
    MediaDescription const agreed = SipStream::AGREED(
        OURS({{Codec::PCMA, 8}, {Codec::PCMU, 0}, {Codec::OPUS, 96}}),
        STREAM("m=audio 4000 RTP/AVP 111 8 100\r\na=rtpmap:111 opus/48000/2\r\na=rtpmap:100 telephone-event/8000\r\n"
               "a=ptime:40\r\n"));
    EXPECT_EQ(agreed.rtp, MediaAddress::OF("192.0.2.1", 4000));
    ASSERT_EQ(agreed.formats.getSize(), 2u);
    MediaFormat const& first = *agreed.formats.begin();
    EXPECT_EQ(first.codec, VoipCodec(Codec::OPUS, 40));
    EXPECT_EQ(first.types, (MediaPayloadTypes{96, 111}));
    EXPECT_EQ(agreed.formats.find(Codec::PCMA)->types, (MediaPayloadTypes{8, 8}));
    EXPECT_EQ(agreed.telephoneEvent, (MediaPayloadTypes{101, 100}));
    EXPECT_EQ(agreed.mode, VoipCodecAndMode::SEND_RECEIVE);
}

TEST(SipStreamAgreed, TheEventsAreThoseOfTheVoicesClock)
{
    SipStream ours = OURS({{Codec::OPUS, 96}});
    ours.events.push_back({48000, 102});
    SipStream const far = STREAM("m=audio 4000 RTP/AVP 96 97 98\r\na=rtpmap:96 opus/48000/2\r\n"
                                 "a=rtpmap:97 telephone-event/8000\r\na=rtpmap:98 telephone-event/48000\r\n");
    EXPECT_EQ(SipStream::AGREED(ours, far).telephoneEvent, (MediaPayloadTypes{102, 98}));
    ours.events.pop_back();
    EXPECT_EQ(SipStream::AGREED(ours, far).telephoneEvent, (MediaPayloadTypes{101, 97}));
}

TEST(SipStreamAgreed, FlowsWhereBothWantItTo)
{
    auto const modeOf = [](VoipCodecAndMode::Mode mode, std::string const& far)
    {
        SipStream ours = OURS({{Codec::PCMA, 8}});
        ours.mode = mode;
        return SipStream::AGREED(ours, STREAM("m=audio 4000 RTP/AVP 8\r\na=" + far + "\r\n")).mode;
    };
    EXPECT_EQ(modeOf(VoipCodecAndMode::SEND_RECEIVE, "sendrecv"), VoipCodecAndMode::SEND_RECEIVE);
    EXPECT_EQ(modeOf(VoipCodecAndMode::SEND_ONLY, "recvonly"), VoipCodecAndMode::SEND_ONLY);
    EXPECT_EQ(modeOf(VoipCodecAndMode::RECEIVE_ONLY, "sendonly"), VoipCodecAndMode::RECEIVE_ONLY);
    EXPECT_EQ(modeOf(VoipCodecAndMode::SEND_RECEIVE, "inactive"), VoipCodecAndMode::INACTIVE);
    EXPECT_EQ(modeOf(VoipCodecAndMode::INACTIVE, "sendrecv"), VoipCodecAndMode::INACTIVE);
}

TEST(SipStreamAgreed, IsNothingWithoutACommonCodec)
{
    EXPECT_EQ(SipStream::AGREED(OURS({{Codec::PCMA, 8}}), STREAM("m=audio 4000 RTP/AVP 0\r\n")).formats.getSize(), 0u);
}

namespace
{
std::string const CRYPTO = "a=crypto:1 AES_CM_128_HMAC_SHA1_80 inline:d0RmdmcmVCspeEc3QGZiNWpVLFJhQX1cfHAwJSoj\r\n";
std::string const PLAIN_VOICE = "m=audio 4000 RTP/AVP 8\r\n";
std::string const SECURED_VOICE = "m=audio 4002 RTP/SAVP 8\r\n" + CRYPTO;
} // namespace

TEST(SipStreamSecured, IsTakenWhereItMayBe)
{
    EXPECT_FALSE(SipStream::READ(SESSION(SECURED_VOICE)).has_value());
    EXPECT_TRUE(SipStream::READ(SESSION(SECURED_VOICE), SipStream::OPTIONAL).has_value());
    EXPECT_TRUE(SipStream::READ(SESSION(SECURED_VOICE), SipStream::SECURED).has_value());
    EXPECT_TRUE(SipStream::READ(SESSION(PLAIN_VOICE + CRYPTO), SipStream::SECURED).has_value());
    EXPECT_TRUE(SipStream::READ(SESSION(PLAIN_VOICE), SipStream::OPTIONAL).has_value());
    EXPECT_FALSE(SipStream::READ(SESSION(PLAIN_VOICE), SipStream::SECURED).has_value());
    EXPECT_FALSE(SipStream::READ(SESSION("m=audio 4002 RTP/SAVP 8\r\n"), SipStream::OPTIONAL).has_value()) << "no key";
    EXPECT_TRUE(SipStream::READ(SESSION(PLAIN_VOICE + CRYPTO))->keys.empty());
}

TEST(SipStreamSecured, WinsOverThePlainOneBesideIt)
{
    EXPECT_EQ(SipStream::READ(SESSION(PLAIN_VOICE + SECURED_VOICE), SipStream::OPTIONAL)->place, 1u);
    EXPECT_EQ(SipStream::READ(SESSION(SECURED_VOICE + PLAIN_VOICE), SipStream::OPTIONAL)->place, 0u);
    EXPECT_EQ(SipStream::READ(SESSION(SECURED_VOICE + PLAIN_VOICE))->place, 1u);
}

TEST(SipStreamSecured, HasTheKeysUnderTheTagOfTheAnswer)
{
    SipStream ours = OURS({{Codec::PCMA, 8}});
    ours.isSecuredProfile = true;
    ours.keys = {SipCrypto::MAKE(1, MediaKeys::AES_CM_128_HMAC_SHA1_80),
                 SipCrypto::MAKE(2, MediaKeys::AES_CM_128_HMAC_SHA1_32)};
    std::string const text = ours.write({1, 1});
    EXPECT_TRUE(HAS(text, "m=audio 30000 RTP/SAVP 8 101")) << text;
    EXPECT_TRUE(HAS(text, "a=crypto:" + ours.keys[1].write())) << text;
    SipStream far = ours;
    far.keys = {SipCrypto::MAKE(2, MediaKeys::AES_CM_128_HMAC_SHA1_32)};
    EXPECT_EQ(SipStream::AGREED(ours, far).keys,
              (MediaKeys{MediaKeys::AES_CM_128_HMAC_SHA1_32, ours.keys[1].key, far.keys[0].key}));
    far.keys[0].suite = MediaKeys::AES_CM_128_HMAC_SHA1_80; // not what that tag was
    EXPECT_EQ(SipStream::AGREED(ours, far).keys, MediaKeys{});
}
