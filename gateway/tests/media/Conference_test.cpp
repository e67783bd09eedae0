#include "MediaFixture.h"
#include "Sound.h"
#include "media/codec/VoiceCodec.h"
#include "media/mixer/Mixer.h"

namespace
{
std::vector<unsigned char> ENCODE(MG_Rtp::ECodec::Type codec, std::span<short const> sound)
{
    std::vector<unsigned char> payload(VoiceEncoder::MOST_OCTETS);
    payload.resize(VoiceCodec::MAKE_ENCODER(codec, 8000)->encode(sound, payload));
    return payload;
}

class InAConference : public MediaFixture
{
protected:
    void join(unsigned int count)
    {
        call = makeCallOfTheSameLoop();
        for (unsigned int i = 0; i < count; ++i)
        {
            sides.push_back(std::make_unique<Side>());
            MediaFixture::join(*sides.back(), *call, {i % 2 == 0 ? PCMA : PCMU});
        }
    }
    static MG_Rtp::ECodec::Type CODEC(std::size_t side) { return side % 2 == 0 ? PCMA : PCMU; }
    void say(std::size_t side, std::span<short const> frame)
    {
        sides[side]->far.next.type = static_cast<unsigned char>(CODEC(side));
        sides[side]->far.say(ENCODE(CODEC(side), frame));
    }
    /// What has come to a side since it was last asked.
    std::vector<short> heardBy(std::size_t side)
    {
        std::unique_ptr<VoiceDecoder> const decoder = VoiceCodec::MAKE_DECODER(CODEC(side), 8000);
        std::vector<short> decoded(VoiceDecoder::MOST_SAMPLES);
        std::vector<short> all;
        for (FarEnd::Received const& received : sides[side]->far.hearAll())
        {
            std::size_t const count = decoder->decode(received.payload, decoded);
            all.insert(all.end(), decoded.begin(), decoded.begin() + static_cast<std::ptrdiff_t>(count));
        }
        return all;
    }
    /// The amplitude of a frequency in the last tenth of a second.
    static double LEVEL(std::vector<short> const& sound, double frequency)
    {
        return sound.size() < 800 ? -1 : Sound::AMPLITUDE(std::span(sound).last(800), frequency, 8000);
    }

    TYPtr<CallMedia> call;
    std::vector<std::unique_ptr<Side>> sides;
};
} // namespace

TEST_F(InAConference, AToneOfOneReachesExactlyTheOtherTwo)
{
    join(3);
    std::vector<short> const tone = Sound::SINE(440, 8000, 8000);
    for (std::size_t at = 0; at < tone.size(); at += 160)
    {
        say(0, std::span(tone).subspan(at, 160));
        pass(20);
    }
    EXPECT_LT(LEVEL(heardBy(0), 440), 50);
    EXPECT_NEAR(LEVEL(heardBy(1), 440), 8000, 400);
    EXPECT_NEAR(LEVEL(heardBy(2), 440), 8000, 400);
}

TEST_F(InAConference, EachHearsTheOthersAndNotHimself)
{
    join(3);
    double const frequencies[] = {400, 700, 1100};
    std::vector<std::vector<short>> tones;
    for (double const frequency : frequencies)
        tones.push_back(Sound::SINE(frequency, 8000, 8000));
    for (std::size_t at = 0; at < 8000; at += 160)
    {
        for (std::size_t side = 0; side < 3; ++side)
            say(side, std::span(tones[side]).subspan(at, 160));
        pass(20);
    }
    for (std::size_t listener = 0; listener < 3; ++listener)
    {
        std::vector<short> const heard = heardBy(listener);
        for (std::size_t side = 0; side < 3; ++side)
        {
            if (side == listener)
                EXPECT_LT(LEVEL(heard, frequencies[side]), 200) << listener << side;
            else
                EXPECT_NEAR(LEVEL(heard, frequencies[side]), 8000, 500) << listener << side;
        }
    }
}

TEST_F(InAConference, WhenOneLeavesTheOtherTwoAreRelayedOrTranscodedAgain)
{
    join(3);
    sides[1]->leg.reset();
    turn();
    std::vector<unsigned char> const octets(33, 7);
    sides[0]->far.hearAll();
    sides[2]->far.hearAll();
    sides[0]->far.next.type = PCMA;
    sides[0]->far.say(octets);
    turn();
    std::optional<FarEnd::Received> const heard = sides[2]->far.hear();
    ASSERT_TRUE(heard.has_value());
    EXPECT_EQ(heard->payload, octets);
}

TEST_F(InAConference, HeldOnesNeitherSpeakNorHear)
{
    join(3);
    sides[2]->leg->setMode(VoipCodecAndMode::INACTIVE);
    turn();
    std::vector<short> const tone = Sound::SINE(440, 8000, 8000);
    for (std::size_t at = 0; at < tone.size(); at += 160)
    {
        say(2, std::span(tone).subspan(at, 160));
        pass(20);
    }
    EXPECT_LT(LEVEL(heardBy(0), 440), 50);
    EXPECT_TRUE(heardBy(2).empty());
}

TEST(Mixer, OnlyTheLoudestThreeAreHeard)
{
    Mixer mixer;
    mixer.begin(160);
    std::vector<std::vector<short>> said;
    for (std::size_t party = 0; party < 5; ++party)
        said.push_back(
            Sound::SINE(400 + 300.0 * static_cast<double>(party), 8000, 160, party == 1 || party == 3 ? 300 : 3000));
    for (std::vector<short> const& frame : said)
        mixer.add(frame);
    mixer.choose();
    std::vector<short> heard(160);
    EXPECT_TRUE(mixer.get(1, heard));
    for (std::size_t i = 0; i < 160; ++i)
        EXPECT_EQ(heard[i], said[0][i] + said[2][i] + said[4][i]);
    EXPECT_TRUE(mixer.get(2, heard));
    for (std::size_t i = 0; i < 160; ++i)
        EXPECT_EQ(heard[i], said[0][i] + said[4][i]);
}

TEST(Mixer, WhatIsTooLoudIsCutOffAndDoesNotTurnOver)
{
    Mixer mixer;
    mixer.begin(1);
    std::vector<short> const loud{32000};
    std::vector<short> const low{-32000};
    mixer.add(loud);
    mixer.add(loud);
    mixer.add(low);
    mixer.choose();
    std::vector<short> heard(1);
    mixer.get(2, heard);
    EXPECT_EQ(heard[0], 32767);
}

TEST(Mixer, WhoIsAloneHearsNobodyAndTheThirtyThirdIsNotHeard)
{
    Mixer mixer;
    std::vector<short> const frame(10, 100);
    std::vector<short> heard(10);
    mixer.begin(10);
    mixer.add(frame);
    mixer.add({});
    mixer.choose();
    EXPECT_FALSE(mixer.get(0, heard));
    EXPECT_TRUE(mixer.get(1, heard));
    mixer.begin(10);
    for (unsigned int party = 0; party < 32; ++party)
        mixer.add({});
    mixer.add(frame);
    mixer.choose();
    EXPECT_FALSE(mixer.get(0, heard));
}
