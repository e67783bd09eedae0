#include "MediaFixture.h"
#include "Sound.h"
#include "media/codec/VoiceCodec.h"
#include "testing/FailingAllocator.h"

namespace
{
/// Far sides that speak and listen with codecs.
class Transcoding : public MediaFixture
{
protected:
    static unsigned int RATE(MG_Rtp::ECodec::Type codec) { return VoiceCodec::RATE_OF(codec, 48000); }
    static unsigned int CLOCK(MG_Rtp::ECodec::Type codec) { return codec == OPUS ? 48000 : 8000; }
    static unsigned char TYPE(MG_Rtp::ECodec::Type codec)
    {
        return static_cast<unsigned char>(codec < 128 ? codec : codec - 20);
    }

    /// Each packet of 20 ms of `sound` goes from one to the other: what that hears, decoded.
    std::vector<short> talk(Side& from, MG_Rtp::ECodec::Type spoken, std::vector<short> const& sound, Side& to,
                            MG_Rtp::ECodec::Type heard)
    {
        std::unique_ptr<VoiceEncoder> const encoder = VoiceCodec::MAKE_ENCODER(spoken, RATE(spoken));
        std::unique_ptr<VoiceDecoder> const decoder = VoiceCodec::MAKE_DECODER(heard, RATE(heard));
        std::vector<short> decoded(VoiceDecoder::MOST_SAMPLES);
        std::vector<short> all;
        std::vector<unsigned char> payload(VoiceEncoder::MOST_OCTETS);
        std::size_t const frame = RATE(spoken) / 50;
        from.far.next.type = TYPE(spoken);
        for (std::size_t at = 0; at + frame <= sound.size(); at += frame)
        {
            std::size_t const length = encoder->encode(std::span(sound).subspan(at, frame), payload);
            from.far.say({payload.begin(), payload.begin() + static_cast<std::ptrdiff_t>(length)}, CLOCK(spoken) / 50);
            pass(20);
            for (FarEnd::Received const& received : to.far.hearAll())
            {
                EXPECT_EQ(received.header.type, TYPE(heard));
                headers.push_back(received.header);
                std::size_t const count = decoder->decode(received.payload, decoded);
                all.insert(all.end(), decoded.begin(), decoded.begin() + static_cast<std::ptrdiff_t>(count));
            }
        }
        return all;
    }
    /// What a codec alone makes of a sound.
    static std::vector<short> alone(MG_Rtp::ECodec::Type codec, unsigned int rate, std::vector<short> const& sound)
    {
        std::unique_ptr<VoiceEncoder> const encoder = VoiceCodec::MAKE_ENCODER(codec, rate);
        std::unique_ptr<VoiceDecoder> const decoder = VoiceCodec::MAKE_DECODER(codec, rate);
        std::vector<short> decoded(VoiceDecoder::MOST_SAMPLES);
        std::vector<unsigned char> payload(VoiceEncoder::MOST_OCTETS);
        std::vector<short> all;
        for (std::size_t at = 0; at + rate / 50 <= sound.size(); at += rate / 50)
        {
            std::size_t const length = encoder->encode(std::span(sound).subspan(at, rate / 50), payload);
            std::size_t const count = decoder->decode(std::span(payload).first(length), decoded);
            all.insert(all.end(), decoded.begin(), decoded.begin() + static_cast<std::ptrdiff_t>(count));
        }
        return all;
    }
    void connect(std::initializer_list<MG_Rtp::ECodec::Type> ofA, std::initializer_list<MG_Rtp::ECodec::Type> ofB)
    {
        call = makeCallOfTheSameLoop();
        join(a, *call, ofA);
        join(b, *call, ofB);
    }

    TYPtr<CallMedia> call;
    Side a;
    Side b;
    std::vector<RtpHeader> headers; // of what was heard
};

double SNR(std::vector<short> const& original, std::vector<short> const& copy, unsigned int rate)
{
    std::size_t const delay =
        Sound::DELAY(std::span(original).first(rate / 2), std::span(copy).first(rate / 2), rate / 5);
    return Sound::SEGMENTAL_SNR(original, std::span(copy).subspan(delay), rate);
}
} // namespace

TEST_F(Transcoding, FromOneLawToTheOtherIsNearlyAsGoodAsTheCodecAlone)
{
    connect({PCMA}, {PCMU});
    std::vector<short> const sound = Sound::VOICE(8000, 16000);
    std::vector<short> const heard = talk(a, PCMA, sound, b, PCMU);
    EXPECT_GE(SNR(sound, heard, 8000), SNR(sound, alone(PCMU, 8000, sound), 8000) - 3.5); // twice the same noise
    EXPECT_GE(heard.size(), 15000u);
}

TEST_F(Transcoding, FromWidebandToOpusKeepsTheWideBand)
{
    connect({G722}, {OPUS});
    std::vector<short> const heard = talk(a, G722, Sound::SINE(5000, 16000, 32000), b, OPUS);
    ASSERT_GE(heard.size(), 80000u);
    EXPECT_GT(Sound::AMPLITUDE(std::span(heard).subspan(40000, 4800), 5000, 48000), 5000);
}

TEST_F(Transcoding, FromOpusToALawIsAboutAsGoodAsOpusAlone)
{
    connect({OPUS}, {PCMA});
    std::vector<short> const sound = Sound::VOICE(48000, 96000);
    std::vector<short> const reference = Sound::VOICE(8000, 16000);
    std::vector<short> const heard = talk(a, OPUS, sound, b, PCMA);
    ASSERT_GE(heard.size(), 15000u);
    EXPECT_GE(SNR(reference, heard, 8000), SNR(reference, alone(OPUS, 8000, reference), 8000) - 1);
    std::vector<short> const tone = talk(a, OPUS, Sound::SINE(700, 48000, 48000), b, PCMA);
    EXPECT_NEAR(Sound::AMPLITUDE(std::span(tone).subspan(4000, 1600), 700, 8000), 8000, 1500);
}

TEST_F(Transcoding, NumbersOurOwnStreamEvenly)
{
    connect({PCMA}, {OPUS});
    talk(a, PCMA, Sound::VOICE(8000, 8000), b, OPUS);
    ASSERT_GE(headers.size(), 45u);
    for (std::size_t i = 1; i < headers.size(); ++i)
    {
        EXPECT_EQ(headers[i].sequence, static_cast<std::uint16_t>(headers[0].sequence + i));
        EXPECT_EQ(headers[i].timestamp, headers[0].timestamp + 960 * i);
        EXPECT_FALSE(headers[i].marker);
    }
    EXPECT_TRUE(headers[0].marker);
}

TEST_F(Transcoding, G722CountsEightThousand)
{
    connect({PCMA}, {G722});
    talk(a, PCMA, Sound::VOICE(8000, 8000), b, G722);
    ASSERT_GE(headers.size(), 45u);
    EXPECT_EQ(headers[10].timestamp, headers[0].timestamp + 1600);
}

TEST_F(Transcoding, AfterAPauseTheMarkerBeginsTheTalkSpurtAndTimeHasGoneOn)
{
    connect({PCMA}, {PCMU});
    talk(a, PCMA, Sound::VOICE(8000, 8000), b, PCMU);
    pass(2000); // the far side says nothing
    EXPECT_LE(b.far.hearAll().size(), 5u);
    headers.clear();
    talk(a, PCMA, Sound::VOICE(8000, 8000), b, PCMU);
    ASSERT_FALSE(headers.empty());
    EXPECT_TRUE(headers[0].marker);
    EXPECT_FALSE(headers[1].marker);
}

TEST_F(Transcoding, APeriodIsConvertedOnTheWay)
{
    call = makeCallOfTheSameLoop();
    join(a, *call, {PCMA});
    MediaDescription description = DESCRIBE(b.far, {});
    description.formats.add({VoipCodec(PCMU, 40), {0, 0}});
    join(b, *call, description);
    talk(a, PCMA, Sound::VOICE(8000, 8000), b, PCMU);
    ASSERT_GE(headers.size(), 20u);
    EXPECT_LE(headers.size(), 25u);
    EXPECT_EQ(headers[1].timestamp, headers[0].timestamp + 320);
}

TEST_F(Transcoding, TheCodecInCommonIsRelayedAllTheSame)
{
    connect({PCMA, G722}, {PCMA});
    std::vector<unsigned char> const octets(160, 0x12);
    a.far.next.type = PCMA;
    a.far.say(octets);
    turn();
    EXPECT_EQ(b.far.hear()->payload, octets);
    EXPECT_GE(talk(a, G722, Sound::VOICE(16000, 16000), b, PCMA).size(), 7000u); // the other one is transcoded
}

TEST_F(Transcoding, AReinviteBringsTheTwoTogether)
{
    connect({PCMA}, {PCMU});
    talk(a, PCMA, Sound::VOICE(8000, 4000), b, PCMU);
    RtpHeader const before = headers.back();
    b.leg->describe(DESCRIBE(b.far, {PCMA}));
    turn();
    a.far.say(std::vector<unsigned char>(33, 1)); // no codec's packet: relayed
    pass(20);
    std::optional<FarEnd::Received> const heard = b.far.hear();
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->payload.size(), 33u);
    EXPECT_EQ(heard->header.sequence, static_cast<std::uint16_t>(before.sequence + 1));
    EXPECT_EQ(heard->header.source, before.source);
    EXPECT_GT(static_cast<std::int32_t>(heard->header.timestamp - before.timestamp), 0);
}

TEST_F(Transcoding, LongPacketsAreOneTalkSpurt)
{
    call = makeCallOfTheSameLoop();
    join(a, *call, {PCMA});
    MediaDescription description = DESCRIBE(b.far, {});
    description.formats.add({VoipCodec(PCMU, 60), {0, 0}});
    join(b, *call, description);
    talk(a, PCMA, Sound::VOICE(8000, 16000), b, PCMU);
    ASSERT_GE(headers.size(), 30u);
    for (std::size_t i = 1; i < headers.size(); ++i)
    {
        EXPECT_FALSE(headers[i].marker);
        EXPECT_EQ(headers[i].timestamp, headers[0].timestamp + 480 * i);
    }
}

TEST_F(Transcoding, ADigitIsMadeAnewAmongTranscodedSpeech)
{
    call = makeCallOfTheSameLoop();
    MediaDescription description = DESCRIBE(a.far, {PCMA});
    description.telephoneEvent = {101, 101};
    join(a, *call, description);
    description = DESCRIBE(b.far, {PCMU});
    description.telephoneEvent = {96, 96};
    join(b, *call, description);
    talk(a, PCMA, Sound::VOICE(8000, 4000), b, PCMU);
    RtpHeader event = a.far.next;
    event.type = 101;
    for (unsigned char packet = 1; packet <= 8; ++packet, ++event.sequence)
    {
        unsigned char const duration = static_cast<unsigned char>(std::min<int>(packet, 5));
        a.far.send(event, {5, static_cast<unsigned char>(packet > 5 ? 0x8a : 0x0a), duration, 0}); // 32 ms each
        pass(20);
    }
    pass(400);
    EXPECT_EQ(a.told, "5160 ");
    std::vector<std::uint32_t> timestamps;
    unsigned int ends = 0;
    for (FarEnd::Received const& received : b.far.hearAll())
    {
        if (received.header.type != 96)
            continue;
        timestamps.push_back(received.header.timestamp);
        ends += received.payload[1] >> 7;
    }
    EXPECT_EQ(ends, 3u);
    EXPECT_EQ(timestamps, std::vector<std::uint32_t>(10, timestamps.at(0))); // 160 ms, and the end twice more
}

TEST_F(Transcoding, TicksThatCameMuchTooLateAreNotAllMadeUpFor)
{
    connect({PCMA}, {PCMA});
    a.leg->playTone(MG_Tones::ECallProgressTone::DIAL);
    pass(100);
    a.far.hearAll();
    clock.advance(1000);
    turn();
    EXPECT_EQ(a.far.hearAll().size(), 4u); // the one that is due, and three
    EXPECT_EQ(layer->getLoop(0).getCounters().skippedTicks, 46u);
    pass(100);
    EXPECT_EQ(a.far.hearAll().size(), 5u);
}

TEST_F(Transcoding, TakesNoMemoryOnceItRuns)
{
    connect({PCMA}, {G722});
    talk(a, PCMA, Sound::VOICE(8000, 8000), b, G722);
    a.far.say(std::vector<unsigned char>(160, 0x55));
    clock.advance(20);
    FailingAllocator::failNth(0);
    layer->getLoop(0).turn(0);
    layer->getLoop(0).getEvents().runTurn();
    FailingAllocator::stop();
    EXPECT_EQ(FailingAllocator::count(), 0u);
    EXPECT_EQ(b.far.hearAll().size(), 1u);
}
