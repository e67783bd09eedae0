// Two signalling modules hold a call: one dials, the other accepts, rings, answers and hangs up.
#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/CallControl.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include <cstdio>
#include <tuple>
using Properties = CC_PropertyContainer;
using State = CC_PropertyCallLegState;
using Number = unsigned int;

struct Module : CC_Provider, CC_Endpoint, CC_CallAdapterObserver // one line only, so the module is its own endpoint
{
    explicit Module(char const* name) : CC_Provider(name, ""), CC_Endpoint(nullptr, nullptr), m_name(name)
    {
        std::ignore = CallControl::ADD_PROVIDER("SWITCH", m_name, *this);
        std::ignore = m_adapter.setup("line 1", *this, this);
    }
    XCode dial(CC_Call& call, String const&, String const& number, Properties const& offered) override
    {
        std::printf("%s: a call to %s\n", m_name.c_str(), number.c_str());
        return offer(call, number, offered);
    }
    XCode handleOffer(CC_Call& call, String const&, Properties const&) override { return m_adapter.accept(call, {}); }
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const&) override
    {
        if (auto const* peer = State::FROM(adapter.getPeerProperty(CC_PropertyId::STATE)))
            std::printf("%s: peer %s\n", m_name.c_str(), State::STATE_NAME(peer->getState()));
    }
    void notifyPeerSynchronousService(CC_CallAdapter&, CC_Service&) override {}
    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_name; }
    ProviderType getProviderType() const override { return USER_DEFINED_INTERFACE; }
    InfoContainer& getInfo(InfoContainer& i, Number, Number, Number, Number, String const&) const override { return i; }

    String m_name;
    CC_CallAdapter m_adapter;
};

int main()
{
    TYEventLoop loop;
    CallControl::SET_CC_EVENT_LOOP(&loop);
    std::ignore = CallControl::CREATE_CONTEXT("SWITCH");
    Module sip("sip"), isdn("isdn");
    if (!sip.m_adapter.dial("SWITCH", "isdn", "4989123", {}, {}, {}, nullptr).isOk())
        return 1;
    loop.runTurn(); // tells each side what the other has become
    for (auto const state : {State::ALERTING, State::CONNECTED})
        std::ignore = isdn.m_adapter.setOwnProperty(State(CC_PropertyId::STATE, state)), loop.runTurn();
    for (Module* module : {&isdn, &sip}) // drop releases a side: the other hears of it, and the last one ends the call
        module->m_adapter.drop(QCause::NORMAL_CALL_CLEARING, 0), loop.runTurn();
    std::printf("calls left: %u\n", CallControl::GET_NUMBER_OF_CALLS());
}
