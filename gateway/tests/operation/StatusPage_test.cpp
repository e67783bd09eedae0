#include "operation/page/StatusPage.h"

#include "host/EpollLoop.h"
#include "operation/record/CallWatch.h"
#include "properties/CC_PropertyKeys.h"
#include "testing/CallControlFixture.h"
#include "testing/FakeModule.h"

#include <deque>
#include <gtest/gtest.h>
#include <memory>
#include <tuple>

namespace
{
class ModuleWithPeers : public SignallingModule
{
public:
    void open(GatewayHost&) override {}
    unsigned int clearCalls(QCause) override { return 0; }
    std::size_t getNumberOfEndpoints() const override { return 0; }
    std::string describe() const override { return {}; }
    bool clearCall(unsigned long long, QCause) override { return false; }
    std::vector<StateRow> getPeers() const override
    {
        return {{{"interface", "trunk"}, {"peer", "<script>\"a\"&'b'\x1b[2J"}, {"state", "called"}}};
    }
};

struct StatusPageTest : testing::Test
{
    StatusPageTest()
    {
        watch.watch("SWITCH");
        modules["sip"] = std::make_unique<ModuleWithPeers>();
    }
    bool has(std::string const& html) const { return page.getText().find(html) != std::string::npos; }

    CallWatch watch; // before the context ends
    CallControlFixture fixture;
    EpollLoop loop;
    GatewayHost host{loop, "SWITCH", Routing({}), Admission(0, 0), CallTrace(0)};
    SignallingModules modules;
    std::map<std::string, std::string> interfaces{{"trunk", "sip"}};
    StatusPage page{host, modules, interfaces, watch};
};

TEST_F(StatusPageTest, TellsWhatTheGatewayIsDoing)
{
    host.counters.placed = 7;
    EXPECT_TRUE(has("<h1>serving, 0 calls up</h1>"));
    EXPECT_TRUE(has("<td>7</td>"));
    EXPECT_TRUE(has("<tr><td>trunk</td><td>sip</td><td>in service</td></tr>"));
    host.blocked.insert("trunk");
    host.isDraining = true;
    EXPECT_TRUE(has("<h1>draining, 0 calls up</h1>"));
    EXPECT_TRUE(has("<tr><td>trunk</td><td>sip</td><td>blocked</td></tr>"));
    host.isEnding = true;
    EXPECT_TRUE(has("<h1>ending, 0 calls up</h1>"));
}

TEST_F(StatusPageTest, ShowsTextOfOthersAsText)
{
    EXPECT_TRUE(has("<td>&lt;script&gt;&quot;a&quot;&amp;")) << page.getText();
    EXPECT_FALSE(has("<script"));
    EXPECT_FALSE(has("\x1b"));
}

TEST_F(StatusPageTest, ShowsTheOldestCallsAndWithholdsNumbers)
{
    FakeModule secret("secret", "trunk");
    FakeModule callee("callee", "office");
    CC_PropertyContainer own, none;
    std::ignore = own.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, "4420"));
    std::ignore = own.set(
        CC_PropertyPresentationIndicator(CC_PropertyId::PRESENTATION_INDICATOR, QPresentationIndicator::RESTRICTED));
    callee.setNumber("4989123");
    EXPECT_TRUE(secret.dial(callee.getName(), "4989123", own, none, none).isOk());
    std::ignore = callee.become(CC_PropertyCallLegState::CONNECTED);
    fixture.settle();
    EXPECT_TRUE(has("<h1>serving, 1 calls up</h1>"));
    EXPECT_TRUE(has("<td>answered</td><td>0</td><td>trunk (withheld) - office 4989123</td>")) << page.getText();
    EXPECT_FALSE(has("4420"));
}
} // namespace
