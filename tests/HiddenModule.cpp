#include "HiddenModule.h"

#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyValue.h"
#include "services/CC_ServiceUserInput.h"

#include <tuple>

namespace
{
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

class Module final : public HiddenModule,
                     public CC_Provider,
                     public CC_Endpoint,
                     public CC_CallAdapterObserver,
                     public CC_CallLegObserver
{
public:
    Module() : CC_Provider("hidden", ""), CC_Endpoint(nullptr, nullptr), m_name("hidden")
    {
        std::ignore = m_adapter.setup("line", *this, this);
    }

    CC_Provider& getProvider() override { return *this; }
    std::string takeStory() override { return std::exchange(m_story, std::string()); }
    unsigned int getTypeIdOfString() const override { return CC_PropertyString::TYPE_ID(); }
    unsigned int getTypeIdOfState() const override { return CC_PropertyCallLegState::TYPE_ID(); }
    unsigned int getTypeOfUserInput() const override { return CC_ServiceUserInput::TYPE(); }
    unsigned int getTypeIdOfOwnClass() const override { return PropertyTrunk::TYPE_ID(); }
    void hangUp() override { m_adapter.drop(QCause::NORMAL_CALL_CLEARING, 0); }

    XCode dial(CC_Call& call, String const&, String const& number, CC_PropertyContainer const& offered) override
    {
        return offer(call, number, offered);
    }
    XCode handleOffer(CC_Call& call, String const& number, CC_PropertyContainer const& offered) override
    {
        auto const* const name = dynamic_cast<CC_PropertyString const*>(offered.get(CC_PropertyId::NAME));
        tell(std::string("offer ") + number.c_str() + " from " + (name != nullptr ? name->getValue().c_str() : "?"));
        CC_PropertyContainer own;
        std::ignore = own.set(PropertyTrunk(OWN_ID, 7));
        XCode const accepted = m_adapter.accept(call, own);
        return call.addCallLegObserver(this).isOk() ? accepted : XCode::FAILURE;
    }
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) override
    {
        auto const* const state =
            dynamic_cast<CC_PropertyCallLegState const*>(adapter.getPeerProperty(CC_PropertyId::STATE));
        if (flags.get(CC_PropertyId::STATE) && state != nullptr && state->isOfType(CC_PropertyCallLegState::TYPE_ID()))
            tell(std::string("peer ") + CC_PropertyCallLegState::STATE_NAME(state->getState()));
    }
    void notifyPeerSynchronousService(CC_CallAdapter&, CC_Service& service) override
    {
        if (service.isOfType(CC_ServiceUserInput::TYPE()))
            tell(std::string("digits ") + static_cast<CC_ServiceUserInput const&>(service).getInput().c_str());
    }
    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const&) override {}
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) override {}
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override
    {
        if (dynamic_cast<CC_EvCallLegPropertyChanged const&>(event).getFlags().get(CC_PropertyId::DISPLAY))
            tell("display");
    }
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event) override
    {
        tell(dynamic_cast<CC_EvCallLegSynchronousService const&>(event).getService()->getInfo().c_str());
    }
    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_name; }
    ProviderType getProviderType() const override { return USER_DEFINED_SERVICE; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }

private:
    void tell(std::string const& what) { m_story += (m_story.empty() ? "" : ", ") + what; }

    String m_name;
    std::string m_story;
    CC_CallAdapter m_adapter;
};
} // namespace

extern "C" CC_EXPORT HiddenModule* makeHiddenModule() { return new Module; }
