#include "FarEnd.h"
#include "media/context/CallMedia.h"
#include "media/context/MediaLayer.h"
#include "platform/eventloop/TYEventLoop.h"

#include <gtest/gtest.h>
#include <poll.h>

namespace
{
constexpr int PATIENCE = 10000; // ms; far longer than anything here takes

/// The media layer on threads of its own, and this thread as signalling's.
class MediaThreads : public testing::Test, protected MediaObserver
{
protected:
    MediaThreads() : layer(OPTIONS(), signalling) { layer.start(); }

    static MediaOptions OPTIONS()
    {
        MediaOptions options;
        options.threads = 3;
        options.firstPort = 8000;
        options.lastPort = 11999;
        options.reportInterval = 100;
        return options;
    }
    void onDigit(char digit, unsigned int) override { told += digit; }
    void onQuality(MediaQuality const&) override { ++qualities; }

    TYPtr<CallMedia> makeCall()
    {
        TYPtr<MG_IContext> context;
        EXPECT_TRUE(layer.getContexts()->createContext(context).isOk());
        return TYPtr<CallMedia>(CallMedia::OF(context.get()));
    }
    std::unique_ptr<LegMedia> join(CallMedia& call, FarEnd& far)
    {
        std::unique_ptr<LegMedia> leg = call.addLeg(far.getRtp().host, *this);
        far.setPeer(leg->getLocalRtp());
        MediaDescription description;
        description.rtp = far.getRtp();
        description.telephoneEvent = {101, 101};
        description.formats.add({VoipCodec(MG_Rtp::ECodec::PCMA, 20), {8, 8}});
        leg->describe(description);
        return leg;
    }
    /// Says something until it is heard at the other end: orders take effect when the datapath comes to them.
    void speak(FarEnd& from, FarEnd& to)
    {
        bool isHeard = false;
        for (int tries = 0; tries < PATIENCE / 10 && !isHeard; ++tries)
        {
            from.say({1, 2, 3});
            isHeard = to.isReadable(10) && to.hear().has_value();
        }
        EXPECT_TRUE(isHeard);
    }
    /// Turns signalling's loop until `condition()`.
    template <class Condition>
    void turnUntil(Condition&& condition)
    {
        pollfd descriptor{signalling.getPollFd(), POLLIN, 0};
        for (int tries = 0; tries < 1000 && !condition(); ++tries)
        {
            poll(&descriptor, 1, PATIENCE / 100);
            signalling.runTurn();
        }
        EXPECT_TRUE(condition());
    }

    TYEventLoop signalling;
    MediaLayer layer;
    std::string told;
    unsigned int qualities = 0;
};
} // namespace

TEST_F(MediaThreads, CallsOnSeveralThreadsAreHeardAndTellTheirDigits)
{
    FarEnd ends[8];
    std::vector<TYPtr<CallMedia>> calls;
    std::vector<std::unique_ptr<LegMedia>> legs;
    for (unsigned int i = 0; i < 8; ++i)
    {
        if (i % 2 == 0)
            calls.push_back(makeCall());
        legs.push_back(join(*calls.back(), ends[i]));
    }
    for (unsigned int i = 0; i < 8; ++i)
        speak(ends[i], ends[i ^ 1]);
    ends[3].send({true, 101, 1, 1, 1}, {7, 0x80, 1, 0x40});
    turnUntil([this] { return told == "7"; });
    for (std::unique_ptr<LegMedia> const& leg : legs)
        leg->askQuality();
    turnUntil([this] { return qualities >= 8; });
}

TEST_F(MediaThreads, LegsMoveBetweenThreadsWhileTheySpeak)
{
    FarEnd a, b, c;
    TYPtr<CallMedia> const first = makeCall();
    TYPtr<CallMedia> const second = makeCall();
    std::unique_ptr<LegMedia> const legA = join(*first, a);
    std::unique_ptr<LegMedia> const legB = join(*first, b);
    std::unique_ptr<LegMedia> const legC = join(*second, c);
    speak(a, b);
    for (unsigned int i = 0; i < 20; ++i)
    {
        a.say({1});
        c.say({1});
        legB->moveTo(i % 2 == 0 ? *second : *first);
        legB->setMode(i % 3 == 0 ? VoipCodecAndMode::INACTIVE : VoipCodecAndMode::SEND_RECEIVE);
    }
    legB->setMode(VoipCodecAndMode::SEND_RECEIVE);
    b.hearAll();
    speak(a, b);
}

TEST_F(MediaThreads, LegsComeAndGoWhileOthersSpeak)
{
    FarEnd a, b, c;
    TYPtr<CallMedia> const call = makeCall();
    std::unique_ptr<LegMedia> const legA = join(*call, a);
    std::unique_ptr<LegMedia> const legB = join(*call, b);
    for (unsigned int i = 0; i < 50; ++i)
    {
        std::unique_ptr<LegMedia> const other = join(*makeCall(), c);
        a.say({1});
        c.say({1});
        other->sendDigit('1');
        other->askQuality();
        signalling.runTurn();
    }
    b.hearAll();
    speak(a, b);
}
