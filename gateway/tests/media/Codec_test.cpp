#include "Sound.h"
#include "media/codec/JitterBuffer.h"
#include "media/codec/VoiceReceiver.h"
#include "media/codec/VoiceSender.h"

#include <gtest/gtest.h>

namespace
{
using ECodec = MG_Rtp::ECodec;

/// What comes out of a codec of what went in, frame by frame of 20 ms.
std::vector<short> THROUGH(ECodec::Type codec, unsigned int rate, std::vector<short> const& sound)
{
    std::unique_ptr<VoiceEncoder> const encoder = VoiceCodec::MAKE_ENCODER(codec, rate);
    std::unique_ptr<VoiceDecoder> const decoder = VoiceCodec::MAKE_DECODER(codec, rate);
    std::vector<short> out;
    std::vector<short> decoded(VoiceDecoder::MOST_SAMPLES);
    std::vector<unsigned char> payload(VoiceEncoder::MOST_OCTETS);
    std::size_t const frame = codec == ECodec::L16_MONO ? rate / 100 : rate / 50;
    for (std::size_t at = 0; at + frame <= sound.size(); at += frame)
    {
        std::size_t const length = encoder->encode(std::span(sound).subspan(at, frame), payload);
        std::size_t const count = decoder->decode(std::span(payload).first(length), decoded);
        out.insert(out.end(), decoded.begin(), decoded.begin() + static_cast<std::ptrdiff_t>(count));
    }
    return out;
}

double SNR(std::vector<short> const& original, std::vector<short> const& copy, unsigned int rate)
{
    std::size_t const delay =
        Sound::DELAY(std::span(original).first(rate / 4), std::span(copy).first(rate / 4), rate / 50);
    return Sound::SEGMENTAL_SNR(original, std::span(copy).subspan(delay), rate);
}

/// A stream of packets of 20 ms of A-law, put and taken as a test says.
class Buffer : public testing::Test
{
protected:
    void put(int sequence)
    {
        RtpHeader header;
        header.sequence = static_cast<std::uint16_t>(sequence);
        header.source = 1;
        unsigned char const mark[] = {static_cast<unsigned char>(sequence)};
        buffer.put(header, ECodec::PCMA, mark);
    }
    /// The packet's number; 'L' lost, '-' empty.
    std::string next()
    {
        JitterBuffer::Slot const* slot = nullptr;
        JitterBuffer::Result const result = buffer.next(slot);
        return result == JitterBuffer::LOST    ? "L"
               : result == JitterBuffer::EMPTY ? "-"
                                               : std::to_string(slot->payload[0]);
    }

    std::string next(unsigned int times)
    {
        std::string all;
        for (unsigned int i = 0; i < times; ++i)
            all += next();
        return all;
    }

    JitterBuffer buffer;
};
} // namespace

TEST(VoiceCodec, SpeechComesThroughEachCodecAsItShould)
{
    struct Case
    {
        ECodec::Type codec;
        unsigned int rate;
        double least; // dB
    };
    for (Case const& one : {Case{ECodec::PCMA, 8000, 30},
                            {ECodec::PCMU, 8000, 30},
                            {ECodec::G722, 16000, 15},
                            {ECodec::L16_MONO, 44100, 34.9},
                            {ECodec::OPUS, 48000, 3},
                            {ECodec::OPUS, 8000, 3}})
    {
        std::vector<short> const sound = Sound::VOICE(one.rate, one.rate * 2);
        EXPECT_GE(SNR(sound, THROUGH(one.codec, one.rate, sound), one.rate), one.least)
            << ECodec::NAME(one.codec) << ' ' << one.rate;
    }
}

TEST(VoiceCodec, WhatIsNotSpokenIsNotMade)
{
    EXPECT_FALSE(VoiceCodec::IS_SPOKEN(ECodec::G729));
    EXPECT_EQ(VoiceCodec::MAKE_DECODER(ECodec::G729, 8000), nullptr);
    EXPECT_EQ(VoiceCodec::MAKE_ENCODER(ECodec::NONE, 8000), nullptr);
}

TEST(VoiceCodec, PayloadsThatAreNoneGiveNothing)
{
    std::vector<short> samples(VoiceDecoder::MOST_SAMPLES);
    std::vector<unsigned char> const garbage(VoiceDecoder::MOST_SAMPLES + 1, 0xff);
    for (ECodec::Type const codec : {ECodec::PCMA, ECodec::G722, ECodec::L16_MONO, ECodec::OPUS})
    {
        EXPECT_EQ(VoiceCodec::MAKE_DECODER(codec, 8000)->decode({}, samples), 0u);
        EXPECT_EQ(VoiceCodec::MAKE_DECODER(codec, 8000)->decode(garbage, samples), 0u) << ECodec::NAME(codec);
    }
}

TEST(Resampler, KeepsFrequencyAndLoudness)
{
    for (auto const& [from, to] : {std::pair{8000u, 16000u}, {16000u, 8000u}, {8000u, 48000u}, {44100u, 16000u}})
    {
        Resampler resampler(from, to);
        std::vector<short> out(to);
        std::size_t const count = resampler.convert(Sound::SINE(1000, from, from), out);
        EXPECT_NEAR(static_cast<double>(count), to, to / 100.0);
        EXPECT_NEAR(Sound::AMPLITUDE(std::span(out).subspan(to / 4, to / 2), 1000, to), 8000, 100) << from << ' ' << to;
    }
}

TEST_F(Buffer, WaitsAMomentAndThenGivesInOrder)
{
    put(1);
    EXPECT_EQ(next(), "-");
    put(2);
    EXPECT_EQ(next(), "1");
    put(4);
    put(3);
    EXPECT_EQ(next(4), "234-");
}

TEST_F(Buffer, OneThatIsMissingIsLostWhenALaterOneIsThere)
{
    put(1);
    next();
    put(3);
    EXPECT_EQ(next(3), "1L3");
}

TEST_F(Buffer, OneThatComesTooLateMakesTheNextWaitLonger)
{
    put(1);
    next();
    put(3);
    EXPECT_EQ(next(2), "1L");
    put(2);
    EXPECT_EQ(buffer.getLate(), 1u);
    EXPECT_EQ(next(2), "-3");
}

TEST_F(Buffer, DelayFollowsTheJitterDownAgain)
{
    for (int sequence = 0; sequence < 6; ++sequence)
        put(sequence);
    int sequence = 6;
    for (; sequence < 2000; ++sequence)
    {
        next();
        put(sequence % 65536);
    }
    EXPECT_LE(buffer.getDepth(), 2u);
    EXPECT_GE(buffer.getDropped(), 4u);
}

TEST_F(Buffer, ABurstThatIsTooDeepIsCutShort)
{
    for (int sequence = 0; sequence < 30; ++sequence)
        put(sequence);
    next();
    EXPECT_LE(buffer.getDepth(), 10u);
}

TEST_F(Buffer, ANewStreamBeginsAnew)
{
    put(1);
    put(2);
    EXPECT_EQ(next(), "1");
    put(20000);
    put(20001);
    EXPECT_EQ(next(), std::to_string(20000 % 256));
}

TEST(VoiceReceiver, ALossIsFilledAndNotSilent)
{
    std::unique_ptr<VoiceEncoder> const encoder = VoiceCodec::MAKE_ENCODER(ECodec::PCMA, 8000);
    std::vector<short> const sound = Sound::SINE(200, 8000, 8000);
    VoiceReceiver receiver(8000);
    std::vector<short> heard;
    std::vector<short> frame(160);
    std::vector<unsigned char> payload(160);
    RtpHeader header;
    for (unsigned int i = 0; i < 50; ++i, ++header.sequence)
    {
        encoder->encode(std::span(sound).subspan(i * 160, 160), payload);
        if (i != 25)
            receiver.put(header, ECodec::PCMA, payload);
        receiver.take(frame);
        heard.insert(heard.end(), frame.begin(), frame.end());
    }
    for (std::size_t at = 10 * 160; at < 49 * 160; at += 160)
        EXPECT_GT(Sound::AMPLITUDE(std::span(heard).subspan(at, 160), 200, 8000), 4000) << at / 160;
}

TEST(VoiceReceiver, APauseBecomesSilence)
{
    VoiceReceiver receiver(8000);
    std::vector<unsigned char> const payload(160, 0x10);
    std::vector<short> frame(160);
    RtpHeader header;
    for (; header.sequence < 5; ++header.sequence)
    {
        receiver.put(header, ECodec::PCMA, payload);
        receiver.take(frame);
    }
    unsigned int frames = 0;
    while (receiver.take(frame) && frames < 20)
        ++frames;
    EXPECT_LE(frames, 5u);
    EXPECT_EQ(frame, std::vector<short>(160, 0));
}

TEST(VoiceSender, PeriodsAreConverted)
{
    for (unsigned int const period : {10u, 20u, 30u, 60u})
    {
        VoiceSender sender(8000, {ECodec::PCMU, period});
        std::size_t octets = 0;
        for (unsigned int frame = 0; frame < 6; ++frame)
        {
            sender.add(std::vector<short>(160));
            for (std::span<unsigned char const> payload = sender.take(); !payload.empty(); payload = sender.take())
            {
                EXPECT_EQ(payload.size(), period * 8);
                octets += payload.size();
            }
        }
        EXPECT_EQ(octets, 960u);
    }
}
