// A signalling module of a third party: one line an interface. The first one calls the second one, which answers.
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "configuration/ConfigurationSection.h"
#include "host/EpollLoop.h"
#include "host/GatewayHost.h"
#include "host/SignallingModule.h"
#include "testing/FakeModule.h"

#include <tuple>

namespace
{
class FakesModule : public SignallingModule
{
public:
    FakesModule(Configuration const&, std::vector<ConfigurationSection> const& interfaces)
    {
        for (ConfigurationSection const& interface : interfaces)
        {
            interface.allow({"name", "loop"});
            m_names.push_back(interface.neededText("name"));
            if (interface.has("loop"))
                m_loop = std::make_unique<EpollLoop>();
        }
    }

    SignallingLoop* getLoop() override { return m_loop.get(); }
    void open(GatewayHost& host) override
    {
        m_host = &host;
        for (std::string const& name : m_names)
            m_lines.push_back(std::make_unique<FakeModule>(name));
        if (m_lines.size() < 2)
            return;
        std::ignore = m_lines[0]->dial(*m_lines[1]);
        std::ignore = m_lines[1]->become(FakeModule::State::CONNECTED);
    }
    unsigned int clearCalls(QCause cause) override
    {
        for (auto const& line : m_lines)
            line->hangUp(cause);
        m_host->onEndpointGone();
        return 0;
    }
    std::size_t getNumberOfEndpoints() const override
    {
        std::size_t number = 0;
        for (auto const& line : m_lines)
            number += line->getCall() != nullptr ? 1 : 0;
        return number;
    }
    bool clearCall(unsigned long long serial, QCause cause) override
    {
        bool isHere = false;
        for (auto const& line : m_lines)
            if (line->getCall() != nullptr && line->getCall()->getSerial() == serial)
            {
                line->hangUp(cause);
                isHere = true;
            }
        return isHere;
    }
    std::string describe() const override
    {
        std::string text;
        for (auto const& line : m_lines)
            text += "fake " + std::string(line->getName().view()) + " sees " + line->getPeerState() + "\n";
        return text;
    }

private:
    std::unique_ptr<EpollLoop> m_loop;
    std::vector<std::string> m_names;
    std::vector<std::unique_ptr<FakeModule>> m_lines;
    GatewayHost* m_host = nullptr;
};
} // namespace

CALLCONTROL_GATEWAY_MODULE(FakesModule)
