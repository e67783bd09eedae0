#include "IsdnTestLoop.h"
#include "isdn/line/IsdnSocketLine.h"
#include "isdn/line/IsdnSocketListener.h"
#include "isdn/link/IsdnLink.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace
{
using Lines = std::vector<std::string>;

/// One side of a link, which notes what it is told and gives the calls back that the far side clears.
struct Side final : IsdnLinkObserver
{
    Side(IsdnLine& line, IsdnLink::Options const& options, TYEventLoop& loop, SignallingLoop& watch)
        : link(line, options, loop, watch, *this)
    {
        link.open();
    }
    void onLinkChange(bool isUp) override { told.push_back(isUp ? "up" : "down"); }
    void onLinkQuiet() override { ++numberOfRests; }
    void onLinkEvent(pri_event& event) override
    {
        std::string text = pri_event2str(event.e) + std::string(" ");
        text = text.substr(std::string("PRI_EVENT_").size());
        switch (event.e)
        {
        case PRI_EVENT_RING:
            call = event.ring.call;
            channel = event.ring.channel;
            text += event.ring.callednum + std::string(event.ring.complete != 0 ? "." : "");
            break;
        case PRI_EVENT_INFO_RECEIVED:
            text += event.ring.callednum;
            break;
        case PRI_EVENT_HANGUP:
        case PRI_EVENT_HANGUP_REQ:
        case PRI_EVENT_HANGUP_ACK:
        {
            text += std::to_string(event.hangup.cause);
            int const cause = event.hangup.cause;
            bool const isRequest = event.e == PRI_EVENT_HANGUP_REQ;
            q931_call* const ended = event.hangup.call;
            link.ask([&](pri* stack) { return pri_hangup(stack, ended, isRequest ? cause : -1); });
            break;
        }
        case PRI_EVENT_FACILITY:
            for (int i = 0; i < event.facility.subcmds->counter_subcmd; ++i)
                if (event.facility.subcmds->subcmd[i].cmd == PRI_SUBCMD_AOC_D)
                    text += "AOC-D " +
                            std::to_string(event.facility.subcmds->subcmd[i].u.aoc_d.recorded.unit.item[0].number);
            break;
        default:
            break;
        }
        told.push_back(text);
    }
    bool has(std::string const& text) const { return std::find(told.begin(), told.end(), text) != told.end(); }

    Lines told;
    q931_call* call = nullptr;
    int channel = 0;
    unsigned int numberOfRests = 0;
    IsdnLink link;
};

struct IsdnLinkTest : testing::Test
{
    IsdnLinkTest()
    {
        user.isNetwork = false;
        network.isNetwork = true;
        for (IsdnLink::Options* const options : {&user, &network})
            options->timers.t200 = 50;
    }

    void connect()
    {
        auto ends = IsdnWires::MAKE();
        near = std::make_unique<IsdnSocketLine>(std::move(ends->first));
        far = std::make_unique<IsdnSocketLine>(std::move(ends->second));
        a = std::make_unique<Side>(*near, user, loop, watch);
        b = std::make_unique<Side>(*far, network, loop, watch);
    }
    bool waitFor(Side& side, std::string const& text)
    {
        return watch.runUntil([&] { return side.has(text); });
    }
    void setUp(Side& from, char const* number, bool isComplete)
    {
        pri_sr* const request = pri_sr_new();
        std::string called = number;
        pri_sr_set_channel(request, 1, 0, 0);
        pri_sr_set_bearer(request, PRI_TRANS_CAP_SPEECH, PRI_LAYER_1_ALAW);
        pri_sr_set_called(request, called.data(), PRI_NATIONAL_ISDN, isComplete);
        EXPECT_EQ(from.link.ask(
                      [&](pri* stack)
                      {
                          from.call = pri_new_call(stack);
                          return pri_setup(stack, from.call, request);
                      }),
                  0);
        pri_sr_free(request);
    }
    void bringUp()
    {
        connect();
        ASSERT_TRUE(waitFor(*a, "up") && waitFor(*b, "up"));
    }
    void answer()
    {
        setUp(*a, "4989", true);
        ASSERT_TRUE(waitFor(*b, "RING 4989."));
        b->link.ask([&](pri* stack) { return pri_answer(stack, b->call, b->channel, 0); });
        ASSERT_TRUE(waitFor(*a, "ANSWER "));
    }

    TYEventLoop loop;
    IsdnTestLoop watch{loop};
    IsdnLink::Options user, network;
    std::unique_ptr<IsdnSocketLine> near, far;
    std::unique_ptr<Side> a, b;
};
} // namespace

TEST_F(IsdnLinkTest, BothSidesComeUp)
{
    connect();
    EXPECT_FALSE(a->link.isUp());
    EXPECT_TRUE(watch.runUntil([&] { return a->link.isUp() && b->link.isUp(); }));
    EXPECT_EQ(a->told, Lines{"up"});
    EXPECT_EQ(b->told, Lines{"up"});
}

TEST_F(IsdnLinkTest, ACallIsDialledDigitByDigitChargedAndCleared)
{
    bringUp();
    setUp(*a, "49", false);
    ASSERT_TRUE(waitFor(*b, "RING 49"));
    b->link.ask([&](pri* stack) { return pri_need_more_info(stack, b->call, b->channel, 0); });
    ASSERT_TRUE(waitFor(*a, "SETUP_ACK "));
    for (char const digit : {'8', '9'})
        a->link.ask([&](pri* stack) { return pri_information(stack, a->call, digit); });
    ASSERT_TRUE(waitFor(*b, "INFO_RECEIVED 9"));
    b->link.ask([&](pri* stack) { return pri_proceeding(stack, b->call, b->channel, 0); });
    b->link.ask([&](pri* stack) { return pri_acknowledge(stack, b->call, b->channel, 0); });
    b->link.ask([&](pri* stack) { return pri_answer(stack, b->call, b->channel, 0); });
    ASSERT_TRUE(waitFor(*a, "ANSWER "));
    pri_subcmd_aoc_d charge = {};
    charge.charge = PRI_AOC_DE_CHARGE_UNITS;
    charge.recorded.unit.num_items = 1;
    charge.recorded.unit.item[0] = {3, -1};
    EXPECT_EQ(b->link.ask([&](pri* stack) { return pri_aoc_d_send(stack, b->call, &charge); }), 0);
    ASSERT_TRUE(waitFor(*a, "FACILITY AOC-D 3"));
    a->link.ask([&](pri* stack) { return pri_hangup(stack, a->call, 17); });
    EXPECT_TRUE(waitFor(*b, "HANGUP_REQ 17"));
    EXPECT_TRUE(watch.runUntil([&] { return a->told.back().starts_with("HANGUP"); }));
    EXPECT_EQ(a->told,
              (Lines{"up", "SETUP_ACK ", "PROCEEDING ", "RINGING ", "ANSWER ", "FACILITY AOC-D 3", "HANGUP 17"}));
}

TEST_F(IsdnLinkTest, TheFarSideHasHeardAllWhenTheLinkIsQuiet)
{
    bringUp();
    answer();
    ASSERT_TRUE(watch.runUntil([&] { return a->link.isQuiet(); }));
    unsigned int const before = a->numberOfRests;
    constexpr int NUMBER = 200; // more than a window takes, and than there are numbers of frames
    for (int i = 0; i < NUMBER; ++i)
        a->link.ask([&](pri* stack) { return pri_keypad_facility(stack, a->call, "1"); });
    EXPECT_FALSE(a->link.isQuiet());
    ASSERT_TRUE(watch.runUntil([&] { return a->link.isQuiet(); }));
    EXPECT_EQ(std::count(b->told.begin(), b->told.end(), "KEYPAD_DIGIT "), NUMBER);
    EXPECT_EQ(a->numberOfRests, before + 1);
}

TEST_F(IsdnLinkTest, ALinkIsQuietWhenNobodyHearsAnyMore)
{
    user.timers.t200 = 20;
    bringUp();
    answer();
    ASSERT_TRUE(watch.runUntil([&] { return a->link.isQuiet(); }));
    unsigned int const before = a->numberOfRests;
    watch.forget(far->getDescriptor());
    a->link.ask([&](pri* stack) { return pri_keypad_facility(stack, a->call, "1"); });
    EXPECT_FALSE(a->link.isQuiet());
    EXPECT_TRUE(watch.runUntil([&] { return a->numberOfRests > before; })) << "after T200, so often as N200 says";
    EXPECT_FALSE(a->link.isUp());
}

TEST(IsdnWindowTest, WhatIsSentAgainIsCountedOnce)
{
    using Octets = std::vector<unsigned char>;
    auto const information = [](unsigned int number) {
        return Octets{0, 1, static_cast<unsigned char>(2 * number), 0};
    };
    auto const ready = [](unsigned int number) { return Octets{0, 1, 1, static_cast<unsigned char>(2 * number)}; };
    IsdnWindow window;
    for (unsigned int number = 0; number < 300; ++number)
    {
        window.onSent(information(number % 128));
        EXPECT_FALSE(window.isClear()) << number;
        if (number % 3 != 2)
            continue;
        window.onSent(information((number - 1) % 128)); // again
        window.onReceived(ready(number % 128));
        EXPECT_FALSE(window.isClear()) << number;
        window.onReceived(ready((number + 1) % 128));
        EXPECT_TRUE(window.isClear()) << number;
    }
    window.onSent(information(44));
    window.onSent(Octets{0, 1, 0x7f}); // SABME
    EXPECT_TRUE(window.isClear());
    window.onSent(information(0));
    window.onReceived(Octets{0, 1, 0, 2});
    EXPECT_TRUE(window.isClear()) << "an I frame acknowledges as well";
    window.onReceived(Octets{0, 1});
    window.onSent(Octets{});
    EXPECT_TRUE(window.isClear()) << "what is no frame says nothing";
}

TEST_F(IsdnLinkTest, WhoGoesTakesTheLinkDown)
{
    user.timers.t203 = 100;
    bringUp();
    b.reset();
    EXPECT_TRUE(waitFor(*a, "down"));
    EXPECT_FALSE(a->link.isUp());
    EXPECT_FALSE(near->isOpen());
}

TEST_F(IsdnLinkTest, ACallOutlastsTheLinkForT309)
{
    user.timers.t203 = 100;
    user.timers.t309 = 300;
    bringUp();
    answer();
    b.reset();
    ASSERT_TRUE(waitFor(*a, "down"));
    EXPECT_FALSE(a->has("HANGUP 27")) << "not before T309";
    EXPECT_TRUE(waitFor(*a, "HANGUP 27"));
}

TEST_F(IsdnLinkTest, ACallThatIsNotUpEndsWithTheLink)
{
    user.timers.t203 = 100;
    user.timers.t309 = 60000;
    bringUp();
    setUp(*a, "4989", true);
    ASSERT_TRUE(waitFor(*b, "RING 4989."));
    b->link.ask([&](pri* stack) { return pri_proceeding(stack, b->call, b->channel, 0); });
    ASSERT_TRUE(waitFor(*a, "PROCEEDING "));
    b.reset();
    EXPECT_TRUE(waitFor(*a, "down"));
    EXPECT_TRUE(waitFor(*a, "HANGUP 27"));
}

TEST_F(IsdnLinkTest, ALinkComesBackWhenTheFarSideDoes)
{
    std::string const path = testing::TempDir() + "link" + std::to_string(getpid());
    user.timers.reopening = 20;
    user.timers.t203 = 100;
    near = std::make_unique<IsdnSocketLine>(path);
    a = std::make_unique<Side>(*near, user, loop, watch);
    for (unsigned int round = 0; round < 3; ++round)
    {
        IsdnSocketListener listener;
        ASSERT_TRUE(listener.open(path));
        std::optional<IsdnWires> wires;
        ASSERT_TRUE(watch.runUntil([&] { return (wires = listener.accept()).has_value(); }));
        far = std::make_unique<IsdnSocketLine>(std::move(*wires));
        b = std::make_unique<Side>(*far, network, loop, watch);
        EXPECT_TRUE(watch.runUntil([&] { return a->link.isUp() && b->link.isUp(); })) << round;
        b.reset();
        ASSERT_TRUE(watch.runUntil([&] { return !a->link.isUp(); }));
    }
}
