#include "operation/control/ControlCommands.h"

#include "host/EpollLoop.h"
#include "properties/CC_PropertyKeys.h"
#include "recorder/CC_Recorder.h"
#include "testing/CallControlFixture.h"
#include "testing/FakeModule.h"

#include <gtest/gtest.h>
#include <optional>
#include <tuple>

namespace
{
/// A module that only tells whom it knows.
class KnowingModule : public SignallingModule
{
public:
    void open(GatewayHost&) override {}
    unsigned int clearCalls(QCause) override { return 0; }
    std::size_t getNumberOfEndpoints() const override { return 0; }
    std::string describe() const override { return {}; }
    bool clearCall(unsigned long long, QCause) override { return false; }
    std::vector<StateRow> getPeers() const override { return peers; }

    std::vector<StateRow> peers;
};

class NoGateway : public ControlledGateway
{
    void shutDown(std::optional<unsigned int>) override {}
    std::string reload() override { return "no"; }
};

CC_PropertyQoS QUALITY_OF(int opinion, int received, int lost)
{
    CC_QoS quality;
    quality.m_meanOpinionScore = opinion;
    CC_QoS::MediaInfo::RTP& rtp = quality.m_mediaInfo.select(quality.m_mediaInfo.m_rtp);
    auto& statistics = rtp.setPresent(rtp.m_statistics);
    auto& local = statistics.setPresent(statistics.m_local);
    local.m_rxPackets = received;
    local.m_rxPacketsLost = lost;
    return CC_PropertyQoS(CC_PropertyId::QUALITY_OF_SERVICE, quality);
}

/// A call between two of its own.
struct Pair
{
    Pair(std::string const& from, std::string const& to) : caller(from, from.c_str()), callee(to, to.c_str())
    {
        caller.setNumber("4420");
        callee.setNumber("4989123");
        EXPECT_TRUE(caller.dial(callee).isOk());
        std::ignore = callee.become(CC_PropertyCallLegState::CONNECTED);
    }
    FakeModule caller, callee;
};

struct ControlCommandsTest : testing::Test
{
    ControlCommandsTest()
    {
        watch.watch("SWITCH");
        auto module = std::make_unique<KnowingModule>();
        known = module.get();
        modules["known"] = std::move(module);
    }
    std::vector<std::string> ask(std::string const& line)
    {
        ControlAnswer const answer = commands.answer(ControlRequest::PARSE(line), "nobody");
        EXPECT_EQ(answer.error, "");
        return answer.lines;
    }
    std::string complaintTo(std::string const& line)
    {
        return commands.answer(ControlRequest::PARSE(line), "nobody").error;
    }
    /// The interfaces of the calling parties, in the order of the lines.
    std::string order(std::string const& line)
    {
        std::string text;
        for (std::string const& row : ask(line))
            if (std::size_t const parties = row.find("from-"); parties != row.npos)
                text += row.substr(parties + 5, 1);
        return text;
    }

    CallWatch watch; // before the context ends
    CallControlFixture fixture;
    EpollLoop loop;
    GatewayHost host{loop, "SWITCH", Routing({}), Admission(0, 0), CallTrace(0)};
    SignallingModules modules;
    KnowingModule* known = nullptr;
    std::map<std::string, std::string> interfaces;
    CallTracer tracer;
    NoGateway gateway;
    ControlCommands commands{host, modules, interfaces, watch, tracer, nullptr, gateway};
};

TEST_F(ControlCommandsTest, ShowTheCallsFirstThatSoundWorst)
{
    Pair good("from-1", "to-1"), bad("from-2", "to-2"), unknown("from-3", "to-3"), lossy("from-4", "to-4");
    std::ignore = good.caller.say(QUALITY_OF(420, 1000, 0));
    std::ignore = good.callee.say(QUALITY_OF(410, 1000, 1));
    std::ignore = bad.caller.say(QUALITY_OF(430, 3000, 0));
    std::ignore = bad.callee.say(QUALITY_OF(150, 700, 300));
    std::ignore = lossy.caller.say(QUALITY_OF(0, 100, 100)); // of a codec that has no score
    fixture.settle();
    EXPECT_EQ(order("top --sort quality"), "2143");
    EXPECT_EQ(order("top --sort rate").substr(0, 3), "214");
    EXPECT_EQ(order("top --sort rate --rows 1"), "2");
    EXPECT_EQ(order("top"), "1234") << "the oldest first";
    EXPECT_EQ(ask("top").size(), 6u);
    std::vector<std::string> const json = ask("top --sort quality --rows 1 --json");
    ASSERT_EQ(json.size(), 1u);
    EXPECT_NE(json[0].find(R"("state":"answered","packetsPerSecond":3700.000,"lost":0.30000,"opinion":1.50,)"),
              std::string::npos)
        << json[0];
    EXPECT_NE(ask("top --sort quality")[2].find("30.0  1.50  from-2 4420 - to-2 4989123"), std::string::npos);
    EXPECT_EQ(complaintTo("top --sort name"), "--sort wants age, rate or quality");
    EXPECT_EQ(complaintTo("top --rows -1"), "--rows wants a number");
}

TEST_F(ControlCommandsTest, ListWhatModulesKnowInColumns)
{
    EXPECT_TRUE(ask("peers").empty());
    known->peers = {{{"interface", "a"}, {"peer", "192.0.2.1:5060"}, {"state", "up"}},
                    {{"interface", "of a long name"}, {"peer", "x\x1b[2J"}, {"state", "left alone"}}};
    std::vector<std::string> const lines = ask("peers");
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_EQ(lines[0], "interface       peer            state");
    EXPECT_EQ(lines[1], "a               192.0.2.1:5060  up");
    EXPECT_EQ(lines[2].find('\x1b'), std::string::npos) << "what would steer a terminal";
    EXPECT_EQ(ask("peers --json")[0], R"({"interface":"a","peer":"192.0.2.1:5060","state":"up"})");
    EXPECT_TRUE(ask("registrations").empty());
}

TEST_F(ControlCommandsTest, TraceCallsAndNumbers)
{
    Pair call("from-1", "to-1");
    std::string const serial = std::to_string(call.caller.getCall()->getSerial());
    EXPECT_EQ(complaintTo("trace on 4989123"), "nothing is recorded: recording-size is 0");
    ASSERT_TRUE(CC_Recorder::START(65536).isOk());
    ask("trace on 4989123");
    ask("trace on " + serial);
    EXPECT_TRUE(tracer.getNumbers().contains("4989123"));
    EXPECT_TRUE(tracer.getSerials().contains(call.caller.getCall()->getSerial()));
    ask("trace off " + serial);
    ask("trace off 4989123");
    EXPECT_EQ(complaintTo("trace off 4989123"), "4989123 is not traced");
    EXPECT_EQ(complaintTo("trace perhaps 1"),
              "trace wants on or off, and the serial number of a call or the number of a party");
    for (std::size_t i = 0; i < CallTracer::MOST; ++i)
        ask("trace on 49" + std::to_string(i));
    EXPECT_EQ(complaintTo("trace on 50"), "too much is traced already");
    CC_Recorder::CLOSE();
}
} // namespace
