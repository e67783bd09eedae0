#include "MediaFixture.h"
#include "Sound.h"
#include "media/codec/VoiceCodec.h"
#include "media/file/CallRecording.h"

#include <filesystem>
#include <fstream>
#include <sys/stat.h>
#include <unistd.h>

namespace
{
/// A media layer that keeps what is said, in a folder that goes with the test.
class KeptCall : public MediaFixture
{
protected:
    KeptCall()
    {
        std::filesystem::create_directory(folder);
        open(folder);
    }
    ~KeptCall() override
    {
        layer.reset();
        std::filesystem::remove_all(folder);
    }

    void open(std::string const& where)
    {
        MediaOptions options = OPTIONS();
        options.recordings = where;
        layer = std::make_unique<MediaLayer>(options, signalling);
        layer->setRecordingFailure([this](std::string const& path, std::string const& reason)
                                   { failures.push_back(path + ": " + reason); });
    }

    /// The side joins as the caller.
    void dial(Side& side, CallMedia& media, std::initializer_list<MG_Rtp::ECodec::Type> codecs)
    {
        side.leg = media.addLeg(side.far.getRtp().host, side, CallMedia::Part::CALLER);
        ASSERT_NE(side.leg, nullptr);
        side.far.setPeer(side.leg->getLocalRtp());
        side.leg->describe(DESCRIBE(side.far, codecs));
        turn();
    }
    /// A tone of so many frames in A-law or mu-law; each side says its own at the same time.
    struct Speaker
    {
        Side& side;
        double frequency;
        MG_Rtp::ECodec::Type codec = PCMA;
    };
    void talk(std::vector<Speaker> const& speakers, unsigned int frames)
    {
        for (unsigned int i = 0; i < frames; ++i)
        {
            for (Speaker const& speaker : speakers)
                say(speaker, i);
            pass(20);
        }
    }
    static void say(Speaker const& speaker, unsigned int frame)
    {
        std::vector<short> const sound = Sound::SINE(speaker.frequency, 8000, (frame + 1) * FRAME, LOUD);
        std::vector<unsigned char> payload(VoiceEncoder::MOST_OCTETS);
        std::unique_ptr<VoiceEncoder> const encoder = VoiceCodec::MAKE_ENCODER(speaker.codec, 8000);
        payload.resize(encoder->encode(std::span(sound).subspan(frame * FRAME), payload));
        speaker.side.far.next.type = static_cast<unsigned char>(speaker.codec);
        speaker.side.far.say(payload);
    }

    struct Kept
    {
        std::vector<short> left;
        std::vector<short> right;
    };
    static Kept READ(std::string const& path)
    {
        std::ifstream file(path, std::ios::binary);
        std::string const octets{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
        Kept kept;
        EXPECT_GE(octets.size(), 44u) << path;
        EXPECT_EQ(octets.compare(0, 4, "RIFF"), 0);
        EXPECT_EQ(octets.size(), 44u + static_cast<unsigned char>(octets[40]) +
                                     256u * static_cast<unsigned char>(octets[41]) +
                                     65536u * static_cast<unsigned char>(octets[42]));
        EXPECT_EQ(octets[22], 2) << "channels";
        for (std::size_t at = 44; at + 4 <= octets.size(); at += 4)
        {
            kept.left.push_back(SAMPLE(octets, at));
            kept.right.push_back(SAMPLE(octets, at + 2));
        }
        return kept;
    }
    static short SAMPLE(std::string const& octets, std::size_t at)
    {
        return static_cast<short>(static_cast<unsigned char>(octets[at]) | octets[at + 1] << 8);
    }
    /// How loud that frequency is once all have begun to speak.
    static double HEARD(std::vector<short> const& channel, double frequency)
    {
        std::size_t const settled = std::min<std::size_t>(10 * FRAME, channel.size());
        return Sound::AMPLITUDE(std::span(channel).subspan(settled, 20 * FRAME), frequency, 8000);
    }
    std::size_t countFiles() const
    {
        return static_cast<std::size_t>(std::distance(std::filesystem::directory_iterator(folder), {}));
    }

    static constexpr std::size_t FRAME = CallRecording::FRAME;
    static constexpr double LOUD = 8000;

    std::string const folder = (std::filesystem::temp_directory_path() / ("kept." + std::to_string(getpid()))).string();
    std::vector<std::string> failures;
    Side alice;
    Side bob;
    Side carol;
};
} // namespace

TEST_F(KeptCall, EachOfTwoPartiesIsHeardInAChannelOfHerOwn)
{
    TYPtr<CallMedia> call = makeCall();
    std::string const path = call->getRecording();
    dial(alice, *call, {PCMA});
    join(bob, *call, {PCMA});
    talk({{alice, 400}, {bob, 1000}}, 40);
    EXPECT_EQ(bob.far.hearAll().size(), 40u) << "what is relayed goes its way";
    alice.leg.reset();
    bob.leg.reset();
    call.set(nullptr);
    turn();
    layer->writeRecordings();

    EXPECT_EQ(path.compare(0, folder.size() + 1, folder + "/"), 0) << path;
    Kept const kept = READ(path);
    EXPECT_NEAR(static_cast<double>(kept.left.size()), 40.0 * FRAME, 5.0 * FRAME);
    EXPECT_NEAR(HEARD(kept.left, 400), LOUD, 400);
    EXPECT_NEAR(HEARD(kept.right, 1000), LOUD, 400);
    EXPECT_LT(HEARD(kept.left, 1000), 100);
    EXPECT_LT(HEARD(kept.right, 400), 100);
    EXPECT_TRUE(failures.empty()) << failures[0];
}

TEST_F(KeptCall, WhatIsTranscodedIsKeptToo)
{
    TYPtr<CallMedia> call = makeCall();
    dial(alice, *call, {PCMA});
    join(bob, *call, {PCMU});
    talk({{alice, 400}, {bob, 1000, PCMU}}, 40);
    EXPECT_GT(bob.far.hearAll().size(), 30u);
    layer->writeRecordings();
    Kept const kept = READ(call->getRecording());
    EXPECT_NEAR(HEARD(kept.left, 400), LOUD, 400);
    EXPECT_NEAR(HEARD(kept.right, 1000), LOUD, 400);
}

TEST_F(KeptCall, AllOthersOfAConferenceAreHeardInTheRightChannel)
{
    TYPtr<CallMedia> call = makeCall();
    dial(alice, *call, {PCMA});
    join(bob, *call, {PCMA});
    join(carol, *call, {PCMA});
    talk({{alice, 400}, {bob, 1000}, {carol, 1500}}, 40);
    layer->writeRecordings();
    Kept const kept = READ(call->getRecording());
    EXPECT_NEAR(HEARD(kept.left, 400), LOUD, 400);
    EXPECT_NEAR(HEARD(kept.right, 1000), LOUD, 400);
    EXPECT_NEAR(HEARD(kept.right, 1500), LOUD, 400);
    EXPECT_LT(HEARD(kept.right, 400), 100);
}

TEST_F(KeptCall, TheLeftChannelStaysTheCallersWhenSheHasGone)
{
    TYPtr<CallMedia> call = makeCall();
    dial(alice, *call, {PCMA});
    join(bob, *call, {PCMA});
    join(carol, *call, {PCMA});
    alice.leg.reset();
    turn();
    talk({{bob, 1000}, {carol, 1500}}, 40);
    layer->writeRecordings();
    Kept const kept = READ(call->getRecording());
    EXPECT_LT(HEARD(kept.left, 1000), 100);
    EXPECT_NEAR(HEARD(kept.right, 1000), LOUD, 400);
    EXPECT_NEAR(HEARD(kept.right, 1500), LOUD, 400);
}

TEST_F(KeptCall, WhoIsTransferredIsKeptInTheOtherCallsFile)
{
    TYPtr<CallMedia> first = makeCall(); // of two loops
    TYPtr<CallMedia> second = makeCall();
    dial(alice, *first, {PCMA});
    join(bob, *second, {PCMA});
    alice.leg->moveTo(*second);
    turn();
    talk({{alice, 400}, {bob, 1000}}, 40);
    layer->writeRecordings();
    Kept const kept = READ(second->getRecording());
    EXPECT_NEAR(HEARD(kept.left, 400), LOUD, 400);
    EXPECT_NEAR(HEARD(kept.right, 1000), LOUD, 400);
    EXPECT_EQ(countFiles(), 1u);
}

TEST_F(KeptCall, ACallInWhichNobodySpeaksLeavesNoFile)
{
    {
        TYPtr<CallMedia> call = makeCall();
        dial(alice, *call, {PCMA});
        join(bob, *call, {PCMA});
        pass(200);
        layer->writeRecordings();
        alice.leg.reset();
        bob.leg.reset();
    }
    turn();
    layer->writeRecordings();
    EXPECT_EQ(countFiles(), 0u);
    EXPECT_TRUE(failures.empty());
}

TEST_F(KeptCall, AFileIsItsOwnersAloneAndWholeWhileTheCallGoesOn)
{
    TYPtr<CallMedia> call = makeCall();
    dial(alice, *call, {PCMA});
    talk({{alice, 400}}, 30);
    layer->writeRecordings();
    struct stat status = {};
    ASSERT_EQ(stat(call->getRecording().c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777u, 0600u);
    EXPECT_GT(READ(call->getRecording()).left.size(), 20 * FRAME);
}

TEST_F(KeptCall, AFolderThatHasGoneIsToldOnceAndTheCallGoesOn)
{
    std::filesystem::remove_all(folder);
    TYPtr<CallMedia> call = makeCall();
    dial(alice, *call, {PCMA});
    join(bob, *call, {PCMA});
    talk({{alice, 400}}, 10);
    layer->writeRecordings();
    talk({{alice, 400}}, 10);
    layer->writeRecordings();
    EXPECT_EQ(failures, (std::vector<std::string>{call->getRecording() + ": No such file or directory"}));
    EXPECT_EQ(bob.far.hearAll().size(), 20u);
}

TEST_F(KeptCall, ADiskThatIsTooSlowIsToldWhenTheCallIsOver)
{
    TYPtr<CallMedia> call = makeCall();
    std::string const path = call->getRecording();
    dial(alice, *call, {PCMA});
    talk({{alice, 400}}, CallRecording::MOST_WAITING + 50);
    layer->writeRecordings();
    EXPECT_TRUE(failures.empty());
    alice.leg.reset();
    call.set(nullptr);
    turn();
    layer->writeRecordings();
    EXPECT_EQ(failures, (std::vector<std::string>{path + ": the disk was too slow, there are gaps"}));
    EXPECT_EQ(READ(path).left.size(), CallRecording::MOST_WAITING * FRAME);
}

TEST_F(KeptCall, WhatWaitsIsWrittenWhenTheLayerEnds)
{
    TYPtr<CallMedia> call = makeCall();
    dial(alice, *call, {PCMA});
    talk({{alice, 400}}, 30);
    layer.reset();
    EXPECT_GT(READ(call->getRecording()).left.size(), 20 * FRAME);
}

TEST_F(KeptCall, WithoutAFolderNothingIsKept)
{
    open("");
    TYPtr<CallMedia> call = makeCall();
    EXPECT_EQ(call->getRecording(), "");
    dial(alice, *call, {PCMA});
    talk({{alice, 400}}, 5);
    layer->writeRecordings();
    EXPECT_EQ(countFiles(), 0u);
}

TEST(CallRecordingThreads, WhatOneThreadPutsAnotherOneWritesInOrder)
{
    CallRecording recording("somewhere");
    std::thread speaker(
        [&recording]
        {
            std::array<short, CallRecording::FRAME> left{};
            std::array<short, CallRecording::FRAME> right{};
            for (short i = 0; i < 2000; ++i)
            {
                left.fill(i);
                right.fill(static_cast<short>(-i));
                recording.put(left, right);
            }
            recording.end();
        });
    unsigned int taken = 0;
    short last = -1;
    for (bool isOver = false; !isOver;)
    {
        isOver = recording.isOver();
        while (CallRecording::Frame const* const frame = recording.take())
        {
            EXPECT_GT(frame->front(), last);
            EXPECT_EQ(frame->back(), -frame->front());
            last = frame->front();
            ++taken;
        }
    }
    speaker.join();
    EXPECT_EQ(taken + recording.getLost(), 2000u);
}
