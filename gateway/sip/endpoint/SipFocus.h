#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "platform/eventloop/TYTimer.h"

#include <memory>
#include <vector>

class SipInterface;

/// The conference of an interface (RFC 4579): who calls its number comes in, and who is in may ask by REFER for others
/// to be called in. It has a leg without media, which the call of the first party keeps as long as anybody is there;
/// the others' legs are moved into that call, where the media layer mixes.
///
/// A provider of call control under the name of its interface and "/conference". Owned by the interface, on its thread.
class SipFocus : public CC_Provider, public CC_Endpoint, public CC_CallAdapterObserver
{
public:
    static constexpr unsigned int MOST_PARTIES = 32;

    explicit SipFocus(SipInterface& interface);
    ~SipFocus() override;

    // --- CC_Provider
    XCode dial(CC_Call& call, String const& providerName, String const& destination,
               CC_PropertyContainer const& offerProperties) override;
    ProviderType getProviderType() const override { return INTERNAL_SERVICE; }

    // --- CC_Endpoint; the dump is that of both
    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_name; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;
    XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties) override;

    // --- CC_CallAdapterObserver
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;

private:
    using Leg = std::unique_ptr<CC_CallAdapterE164>;

    Leg makeLeg();
    static void ON_TIMER(void* focus);
    void takeIn();
    bool join(CC_CallAdapterE164& from);
    bool isEmpty() const;
    unsigned int getNumberOfParties() const;
    void callIn(String const& number);
    void followCalled();
    void tell(QCause cause);

    SipInterface& m_interface;
    String m_name;
    TYTimer m_timer;          // somebody waits, or nobody is left
    std::vector<Leg> m_doors; // of those who have called and are not in yet
    Leg m_called;             // towards somebody who is called in
    bool m_hasRung = false;   // he was seen
    Leg m_room;
};
