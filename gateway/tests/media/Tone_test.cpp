#include "MediaFixture.h"
#include "Sound.h"
#include "media/codec/VoiceCodec.h"
#include "media/tone/CauseTone.h"
#include "media/tone/DtmfDetector.h"
#include "media/tone/ToneTable.h"

namespace
{
using ETone = MG_Tones::ECallProgressTone;

class Tones : public MediaFixture
{
protected:
    void connect(std::initializer_list<MG_Rtp::ECodec::Type> codecs = {PCMA})
    {
        call = makeCallOfTheSameLoop();
        join(a, *call, codecs);
        join(b, *call, codecs);
    }
    static std::vector<short> DECODE(std::vector<FarEnd::Received> const& packets)
    {
        std::unique_ptr<VoiceDecoder> const decoder = VoiceCodec::MAKE_DECODER(PCMA, 8000);
        std::vector<short> decoded(VoiceDecoder::MOST_SAMPLES);
        std::vector<short> all;
        for (FarEnd::Received const& received : packets)
        {
            std::size_t const count = decoder->decode(received.payload, decoded);
            all.insert(all.end(), decoded.begin(), decoded.begin() + static_cast<std::ptrdiff_t>(count));
        }
        return all;
    }
    /// Keys a digit of the far side's in as sound, and the silence behind it.
    void keySound(Side& from, char digit, unsigned int packets)
    {
        Tone const& tone = DtmfDetector::SOUND_OF(TelephoneEvent::EVENT_OF(digit));
        ToneGenerator generator(tone);
        std::unique_ptr<VoiceEncoder> const encoder = VoiceCodec::MAKE_ENCODER(PCMA, 8000);
        for (unsigned int packet = 0; packet < packets + 5; ++packet)
        {
            std::vector<short> frame(160);
            if (packet < packets)
                generator.make(frame, 8000);
            std::vector<unsigned char> payload(160);
            encoder->encode(frame, payload);
            from.far.say(payload);
            pass(20);
        }
    }

    TYPtr<CallMedia> call;
    Side a;
    Side b;
};

ToneTable READ(std::string const& country)
{
    ToneTable table;
    std::string error;
    EXPECT_TRUE(table.read(ToneTable::BUILT_IN(), country, error)) << error;
    return table;
}
} // namespace

TEST(ToneTable, HasTenCountriesWithTheTonesThatEachHas)
{
    for (char const* const country : {"at", "ch", "de", "es", "fr", "gb", "it", "jp", "nl", "us"})
    {
        ToneTable const table = READ(country);
        for (ETone::Type const tone : {ETone::DIAL, ETone::RINGING, ETone::BUSY, ETone::CONGESTION})
            EXPECT_NE(table.find(tone), nullptr) << country << ' ' << ETone::NAME(tone);
        EXPECT_EQ(table.find(ETone::NONE), nullptr);
    }
    EXPECT_EQ(READ("de").find(ETone::PAY), nullptr);
}

TEST(ToneTable, SaysWhatItCannotRead)
{
    struct Case
    {
        char const* text;
        char const* error;
    };
    for (Case const& one : {Case{"[fr]\nbusy = [\"440\"]", "no tones of de"},
                            {"[de]\nbuzzy = [\"440\"]", "de.buzzy is no tone"},
                            {"[de]\nbusy = [\"440/\"]", "de.busy is no tone"},
                            {"[de]\nbusy = [\"440+440+440+440+440\"]", "de.busy is no tone"},
                            {"[de]\nbusy = [\"4400\"]", "de.busy is no tone"},
                            {"[de]\nbusy = [\"440/0\"]", "de.busy is no tone"},
                            {"[de]\nbusy = [\"...\"]", "de.busy is no tone"},
                            {"[de]\nbusy = []", "de.busy is no tone"},
                            {"[de]\nbusy = 440", "de.busy is no tone"}})
    {
        ToneTable table;
        std::string error;
        EXPECT_FALSE(table.read(one.text, "de", error)) << one.text;
        EXPECT_EQ(error, one.error);
    }
    std::string error;
    EXPECT_FALSE(ToneTable().read("[de", "de", error));
    EXPECT_NE(error, "");
}

TEST(ToneGenerator, SoundsAndIsSilentAsTheToneSays)
{
    ToneTable const table = READ("de");
    ToneGenerator generator(*table.find(ETone::BUSY));
    std::vector<short> second(8000);
    EXPECT_TRUE(generator.make(second, 8000));
    std::span<short const> const sound(second);
    EXPECT_NEAR(Sound::AMPLITUDE(sound.first(3840), 425, 8000), 5827, 100);
    EXPECT_EQ(Sound::AMPLITUDE(sound.subspan(3840, 3840), 425, 8000), 0);
    EXPECT_GT(Sound::AMPLITUDE(sound.subspan(7680), 425, 8000), 3000);
}

TEST(ToneGenerator, OneThatIsToEndEnds)
{
    ToneTable const table = READ("us");
    ToneGenerator generator(*table.find(ETone::CONFIRMATION));
    std::vector<short> half(4000);
    EXPECT_TRUE(generator.make(half, 8000));
    EXPECT_FALSE(generator.make(half, 8000));
    ToneGenerator recall(*table.find(ETone::RECALL_DIAL));
    for (unsigned int i = 0; i < 10; ++i)
        EXPECT_TRUE(recall.make(half, 8000));
    EXPECT_NEAR(Sound::AMPLITUDE(half, 440, 8000), 2914, 100);
}

TEST_F(Tones, AToneTakesThePlaceOfSpeechAndGivesItBack)
{
    connect();
    std::vector<unsigned char> const speech(33, 1);
    a.far.say(speech);
    turn();
    RtpHeader const before = b.far.hear()->header;
    b.leg->playTone(ETone::DIAL);
    turn();
    std::vector<FarEnd::Received> heard;
    for (unsigned int i = 0; i < 50; ++i)
    {
        a.far.say(speech);
        pass(20);
        for (FarEnd::Received& received : b.far.hearAll())
            heard.push_back(std::move(received));
    }
    ASSERT_EQ(heard.size(), 50u);
    EXPECT_NEAR(Sound::AMPLITUDE(DECODE(heard), 425, 8000), 5827, 150);
    EXPECT_TRUE(heard[0].header.marker);
    EXPECT_EQ(heard[49].header.timestamp, heard[0].header.timestamp + 49 * 160);
    EXPECT_EQ(heard[0].header.sequence, static_cast<std::uint16_t>(before.sequence + 1));
    b.leg->playTone(ETone::NONE);
    turn();
    a.far.say(speech);
    pass(20);
    std::optional<FarEnd::Received> const after = b.far.hear();
    ASSERT_TRUE(after.has_value());
    EXPECT_EQ(after->payload, speech);
    EXPECT_EQ(after->header.source, before.source);
    EXPECT_EQ(after->header.sequence, static_cast<std::uint16_t>(before.sequence + 51));
    EXPECT_TRUE(a.far.hearAll().empty()); // the tone is for one side
}

TEST_F(Tones, AToneIsPlayedToALegThatIsAlone)
{
    call = makeCallOfTheSameLoop();
    join(a, *call, {PCMA});
    a.leg->playTone(ETone::RINGING);
    pass(1000);
    std::vector<short> const heard = DECODE(a.far.hearAll());
    ASSERT_GE(heard.size(), 6400u);
    EXPECT_NEAR(Sound::AMPLITUDE(std::span(heard).first(6400), 425, 8000), 5827, 150);
}

TEST_F(Tones, WithACodecThatWeDoNotSpeakThereIsNone)
{
    connect({G729});
    b.leg->playTone(ETone::DIAL);
    pass(200);
    EXPECT_TRUE(b.far.hearAll().empty());
}

TEST_F(Tones, ASoundIsPlayedOnceOrAgainAndAgain)
{
    connect({PCMA});
    auto const sound =
        std::make_shared<RecordedSound const>(RecordedSound{16000, Sound::SINE(500, 16000, 8000)}); // 0.5 s
    b.leg->playSound(sound);
    pass(2000);
    std::vector<short> heard = DECODE(b.far.hearAll());
    EXPECT_NEAR(static_cast<double>(heard.size()), 4000, 200);
    EXPECT_NEAR(Sound::AMPLITUDE(std::span(heard).subspan(800, 1600), 500, 8000), 8000, 300);
    a.far.say({1});
    turn();
    EXPECT_TRUE(b.far.hear().has_value()); // speech again
    b.leg->playSound(sound, true);
    pass(3000);
    heard = DECODE(b.far.hearAll());
    EXPECT_NEAR(static_cast<double>(heard.size()), 24000, 400);
    EXPECT_NEAR(Sound::AMPLITUDE(std::span(heard).last(1600), 500, 8000), 8000, 300);
    b.leg->playSound(nullptr);
    turn();
    pass(100);
    EXPECT_TRUE(b.far.hearAll().empty());
}

TEST_F(Tones, AToneThatTheCountryDoesNotHaveIsNone)
{
    connect();
    b.leg->playTone(ETone::PAY);
    turn();
    a.far.say({1});
    turn();
    EXPECT_TRUE(b.far.hear().has_value());
}

TEST_F(Tones, DigitsInSpeechAreToldWhereThatIsAskedFor)
{
    connect();
    keySound(a, '5', 5);
    EXPECT_EQ(a.told, "");
    a.leg->detectDigits(true);
    turn();
    for (char const digit : {'1', '5', '*', 'D', '0'})
        keySound(a, digit, 5);
    EXPECT_EQ(a.told, "10 50 *0 D0 00 ");
    EXPECT_EQ(b.told, "");
}

TEST_F(Tones, VoiceIsTakenForNoDigit)
{
    connect();
    a.leg->detectDigits(true);
    turn();
    std::vector<short> const voice = Sound::VOICE(8000, 80000);
    std::unique_ptr<VoiceEncoder> const encoder = VoiceCodec::MAKE_ENCODER(PCMA, 8000);
    std::vector<unsigned char> payload(160);
    for (std::size_t at = 0; at < voice.size(); at += 160)
    {
        encoder->encode(std::span(voice).subspan(at, 160), payload);
        a.far.say(payload);
        turn();
    }
    EXPECT_EQ(a.told, "");
}

TEST_F(Tones, WithoutTelephoneEventsADigitGoesOutAsSound)
{
    connect();
    b.leg->sendDigit('6', 100);
    pass(300);
    std::vector<short> const heard = DECODE(b.far.hearAll());
    ASSERT_GE(heard.size(), 800u);
    EXPECT_GT(Sound::AMPLITUDE(std::span(heard).first(800), 770, 8000), 2000);
    EXPECT_GT(Sound::AMPLITUDE(std::span(heard).first(800), 1477, 8000), 2000);
    EXPECT_LT(Sound::AMPLITUDE(std::span(heard).first(800), 1209, 8000), 300);
}

TEST(CauseTone, TellsWhyACallFails)
{
    using Tone = MG_Tones::ECallProgressTone;
    EXPECT_EQ(CauseTone::OF(QCause::USER_BUSY), Tone::BUSY);
    EXPECT_EQ(CauseTone::OF(QCause::SWITCHING_EQUIPMENT_CONGESTION), Tone::CONGESTION);
    EXPECT_EQ(CauseTone::OF(QCause::NO_CIRCUIT_CHANNEL_AVAILABLE), Tone::CONGESTION);
    EXPECT_EQ(CauseTone::OF(QCause::UNALLOCATED_NUMBER), Tone::SPECIAL_INFORMATION);
    EXPECT_EQ(CauseTone::OF(QCause::NORMAL_CALL_CLEARING), Tone::NONE);
    EXPECT_EQ(CauseTone::OF(QCause::NO_ANSWER_FROM_USER), Tone::NONE) << "he has heard it ring";
}
