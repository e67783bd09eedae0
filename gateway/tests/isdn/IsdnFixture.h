#pragma once

#include "IsdnFarSide.h"
#include "IsdnTestLoop.h"
#include "callcontrol/CallControl.h"
#include "isdn/endpoint/IsdnInterface.h"
#include "isdn/line/IsdnSocketLine.h"
#include "properties/CC_PropertyKeys.h"
#include "testing/CallControlFixture.h"
#include "testing/FakeModule.h"

#include <gtest/gtest.h>
#include <spdlog/spdlog.h>

#include <memory>
#include <vector>

/// An ISDN interface between the other side of call control and a far side of the line, on one thread.
struct IsdnFixture : testing::Test, CallControlFixture
{
    static constexpr char const* NAME = "isdn";

    explicit IsdnFixture(bool isNetwork = false)
    {
        spdlog::set_level(spdlog::level::off);
        configuration.name = NAME;
        configuration.isNetwork = isNetwork;
        configuration.timers.t200 = 50;
        farOptions.isNetwork = !isNetwork;
        farOptions.timers.t200 = 50;
    }
    ~IsdnFixture() override
    {
        if (interface != nullptr)
            CallControl::REMOVE_PROVIDER("", NAME);
    }

    void open()
    {
        auto ends = IsdnWires::MAKE();
        near = std::make_unique<IsdnSocketLine>(std::move(ends->first));
        far = std::make_unique<IsdnSocketLine>(std::move(ends->second));
        interface = std::make_unique<IsdnInterface>(environment, configuration, *near);
        EXPECT_TRUE(CallControl::ADD_PROVIDER("", NAME, *interface).isOk());
        interface->open();
        side = std::make_unique<IsdnFarSide>(*far, farOptions, loop, watch);
        EXPECT_TRUE(watch.runUntil([&] { return interface->getLink().isUp() && side->getLink().isUp(); }));
        side->take();
    }
    bool waitFor(std::string const& text)
    {
        bool const isTold = watch.runUntil([&] { return side->has(text); }, std::chrono::seconds(3));
        EXPECT_TRUE(isTold) << text << ", but " << testing::PrintToString(side->told);
        return isTold;
    }
    bool waitForPeer(std::string const& state)
    {
        bool const isSo = watch.runUntil([&] { return other.getPeerState() == state; }, std::chrono::seconds(3));
        EXPECT_TRUE(isSo) << state << ", but " << other.getPeerState();
        return isSo;
    }
    void settle() { watch.settle(); }
    /// Nothing is left of the calls.
    void expectNothingLeft()
    {
        EXPECT_TRUE(watch.runUntil([&] { return interface->getNumberOfEndpoints() == 0; }, std::chrono::seconds(3)));
        EXPECT_EQ(interface->getChannels().getNumberOfFree(), configuration.channels.count());
    }

    TYEventLoop& loop = *CallControl::GET_CC_EVENT_LOOP();
    IsdnTestLoop watch{loop};
    std::vector<Route> routes{{NAME, {}, "other"}}; // to numbers of four digits and more
    unsigned int calls = 0;
    Counters counters;
    DialPlan dialPlan;
    IsdnEnvironment environment{
        watch,
        "SWITCH",
        [this](std::string const&, std::string const& number, std::string const& calling, unsigned int)
        {
            Routing const routing(number.size() >= 4 ? routes : std::vector<Route>());
            return RouteHunt(routing.find({NAME, number, calling}), number);
        },
        [this](std::string const&) { return ++calls; },
        [](std::string const&) { return false; },
        dialPlan,
        counters};
    IsdnConfiguration configuration;
    IsdnLink::Options farOptions;
    std::unique_ptr<IsdnSocketLine> near, far;
    std::unique_ptr<IsdnInterface> interface;
    std::unique_ptr<IsdnFarSide> side;
    FakeModule other{"other"};
};
