// A module as one was written for the first release. It is built with that release's headers, run with the present
// library, and not to be changed: it stands for the modules that are out there.
#include "ReleasedModule.h"

#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "platform/eventloop/TYEvent.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyFilter.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyValue.h"
#include "services/CC_ServiceUserInput.h"

#include <memory>
#include <string>
#include <tuple>

namespace
{
constexpr unsigned int TRUNK = 0x4018fe;

/// A property class that the library does not know.
class PropertyTrunk : public CC_PropertyValue<PropertyTrunk, unsigned int>
{
public:
    static constexpr char const* TYPE_NAME = "Trunk";
    static TypeId s_typeId;
    using CC_PropertyValue::CC_PropertyValue;
    String& getValueString(String& out) const override { return out.format("trunk %u", getValue()); }
};
PropertyTrunk::TypeId PropertyTrunk::s_typeId;

/// Shows the module no displays but its own.
class FilterDisplay : public CC_PropertyFilter
{
public:
    CC_PropertyFilter* clone() const override { return new FilterDisplay(*this); }
    XCode apply(CC_PropertyContainer& properties) const override
    {
        return properties.get(CC_PropertyId::DISPLAY) == nullptr
                   ? XCode(XCode::OK)
                   : properties.set(CC_PropertyString(CC_PropertyId::DISPLAY, "filtered"));
    }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }
};

/// Its own member stands behind those of its base, wherever these end.
class Line final : public CC_CallAdapterE164
{
public:
    void hangUp()
    {
        ++m_drops;
        drop(QCause::NORMAL_CALL_CLEARING, 200);
    }
    unsigned int m_drops = 0;
};

class Module final : public CC_Provider, public CC_Endpoint, public CC_CallAdapterObserver, public CC_Context::Observer
{
public:
    Module() : CC_Provider("released", ""), CC_Endpoint(nullptr, nullptr), m_name("released")
    {
        std::ignore = m_filters.addFilter(FilterDisplay());
        setOutputFilterContainer(&m_filters);
        std::ignore = m_line.setup("line", *this, this);
        std::ignore = CallControl::GET_CONTEXT("SWITCH")->addContextObserver(*this);
    }
    ~Module() override
    {
        if (CC_Context* const context = CallControl::GET_CONTEXT("SWITCH"))
            context->removeContextObserver(*this);
        m_turned->destroy();
    }

    XCode place(char const* providerName)
    {
        CC_PropertyContainer own;
        std::ignore = own.set(PropertyTrunk(TRUNK, 7));
        return m_line.dial("SWITCH", providerName, "4989123", "4420791234", QTypeOfNumber::INTERNATIONAL,
                           QNumberingPlan::ISDN, QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED,
                           "Ada", "4989123", QTypeOfNumber::INTERNATIONAL, QNumberingPlan::ISDN, "", true,
                           QInformationTransferCapability::SPEECH, nullptr, &own, nullptr, nullptr);
    }
    void answer()
    {
        std::ignore =
            m_line.setOwnProperty(CC_PropertyCallLegState(CC_PropertyId::STATE, CC_PropertyCallLegState::CONNECTED));
        std::ignore = m_turned->setIfNotPending();
    }
    void hangUp() { m_line.hangUp(); }
    char const* takeStory()
    {
        m_told = std::exchange(m_story, std::string());
        return m_told.c_str();
    }

    XCode dial(CC_Call& call, String const&, String const& number, CC_PropertyContainer const& offered) override
    {
        return offer(call, number, offered);
    }
    XCode handleOffer(CC_Call& call, String const& number, CC_PropertyContainer const& offered) override
    {
        unsigned int known = 0;
        for (CC_Property const& property : offered)
            known += property.getId() == CC_PropertyId::E164_NUMBER ? 1 : 0;
        tell(std::string("offer ") + number.c_str() + " with " + std::to_string(known) + " number");
        return m_line.accept(call, "4989123", QTypeOfNumber::NATIONAL, QNumberingPlan::ISDN,
                             QPresentationIndicator::RESTRICTED, QScreeningIndicator::NETWORK_PROVIDED, "Bert");
    }
    void notifyPeerPropertyChange(CC_CallAdapter&, CC_Flags const& flags) override
    {
        CC_Property const* const state = m_line.getPeerProperty(CC_PropertyId::STATE);
        if (flags.get(CC_PropertyId::STATE) && state != nullptr)
            tell(std::string("peer ") +
                 CC_PropertyCallLegState::STATE_NAME(CC_PropertyCallLegState::FROM(state)->getState()));
        if (flags.get(CC_PropertyId::DISPLAY))
            tell(std::string("display ") + m_line.getPeerDisplay().c_str());
        if (flags.get(CC_PropertyId::NAME))
            tell(std::string("name ") + m_line.getPeerName().c_str());
    }
    void notifyPeerSynchronousService(CC_CallAdapter&, CC_Service& service) override
    {
        if (service.isOfType(CC_ServiceUserInput::TYPE()))
            tell(std::string("digits ") + static_cast<CC_ServiceUserInput const&>(service).getInput().c_str());
    }
    void aboutDestroy(CC_Context&) override {}
    void aboutAddProvider(CC_Context&, String const& name) override { tell(std::string("provider ") + name.c_str()); }
    void aboutRemoveProvider(CC_Context&, String const&) override {}
    void aboutCreateCall(CC_Context&, CC_Call* call) override
    {
        tell("call with " + std::to_string(call->getNumberOfCallLegs()) + " legs");
    }
    void aboutDestroyCall(CC_Context&, CC_Call*) override {}
    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_name; }
    ProviderType getProviderType() const override { return USER_DEFINED_SERVICE; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }

private:
    static void TURNED(void* module) { static_cast<Module*>(module)->tell("turned"); }

    void tell(std::string const& what) { m_story += (m_story.empty() ? "" : ", ") + what; }

    String m_name;
    std::string m_story;
    std::string m_told;
    CC_PropertyFilterContainer m_filters;
    TYEvent* m_turned = new TYEvent(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::HIGH, TURNED, this);
    Line m_line;
};

std::unique_ptr<Module> s_module;

ReleasedModule const INTERFACE = {[] { return static_cast<void*>(static_cast<CC_Provider*>(s_module.get())); },
                                  [](char const* provider) { return unsigned(s_module->place(provider).getValue()); },
                                  [] { s_module->answer(); },
                                  [] { s_module->hangUp(); },
                                  [] { return s_module->takeStory(); },
                                  [] { s_module.reset(); }};
} // namespace

extern "C" __attribute__((visibility("default"))) ReleasedModule const* makeReleasedModule()
{
    s_module = std::make_unique<Module>();
    return &INTERFACE;
}
