#pragma once

#include "callcontrol/provider/CC_Provider.h"
#include "isdn/IsdnConfiguration.h"
#include "isdn/endpoint/IsdnChannels.h"
#include "isdn/endpoint/IsdnEnvironment.h"
#include "isdn/link/IsdnLink.h"
#include "platform/signalling/QCause.h"

#include <memory>
#include <unordered_map>
#include <vector>

class IsdnEndpoint;
class TYEvent;

/// One primary-rate line: a provider of call control under the interface's name, the link with its calls, and the B
/// channels.
///
/// Makes one endpoint per call leg and owns it until both the call on the wire and the leg are done. Owned by the
/// module; belongs to the call-control loop's thread.
///
///     IsdnSocketLine line(configuration.line);
///     IsdnInterface interface(environment, configuration, line);
///     std::ignore = CallControl::ADD_PROVIDER("", interface.getName(), interface);
///     interface.open();
class IsdnInterface : public CC_Provider, private IsdnLinkObserver
{
public:
    /// The line must outlive it. Throws std::bad_alloc.
    IsdnInterface(IsdnEnvironment& environment, IsdnConfiguration const& configuration, IsdnLine& line);
    ~IsdnInterface() override; ///< ends what is still up without a word to the far side

    void open() { m_link.open(); }

    // --- CC_Provider
    XCode dial(CC_Call& call, String const& providerName, String const& destination,
               CC_PropertyContainer const& offerProperties) override;
    ProviderType getProviderType() const override { return USER_DEFINED_INTERFACE; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    String const& getName() const { return m_name; }
    IsdnConfiguration const& getConfiguration() const { return m_configuration; }
    IsdnEnvironment& getEnvironment() const { return m_environment; }
    IsdnLink& getLink() { return m_link; }
    IsdnLink const& getLink() const { return m_link; }
    IsdnChannels& getChannels() { return m_channels; }
    std::size_t getNumberOfEndpoints() const { return m_endpoints.size(); }

    /// Events of that call on the wire go to the endpoint, until it is forgotten. @{
    void know(q931_call* call, IsdnEndpoint& endpoint);
    void forget(q931_call* call) { m_calls.erase(call); }
    /// @}
    /// On the user's side a call of ours that the network has not answered yet gives way to one of the network's on
    /// the same channel (Q.931, 5.7): whether it did.
    bool yieldChannel(unsigned int timeslot);
    /// Clears every call of this interface.
    void clearCalls(QCause cause);
    /// Those of one call alone; false: there are none.
    bool clearCall(unsigned long long serial, QCause cause);
    /// The endpoint is done; it is destroyed in the loop's next turn.
    void finish(IsdnEndpoint& endpoint);

private:
    // --- IsdnLinkObserver
    void onLinkChange(bool isUp) override;
    void onNewLine() override { clearCalls(QCause::DESTINATION_OUT_OF_ORDER); }
    void onLinkQuiet() override;
    void onLinkEvent(pri_event& event) override;

    void onRing(pri_event_ring& ring);
    void onRestart(int channel);
    void onFacility(pri_event_facility const& facility);
    bool join(q931_call* one, q931_call* other);
    void refuseNew(pri_event_ring const& ring, QCause cause);
    void refuse(q931_call* call, QCause cause);
    IsdnEndpoint& makeEndpoint(unsigned int callNumber);
    static void CLEAN_UP(void* interface);
    void cleanUp();

    IsdnEnvironment& m_environment;
    IsdnConfiguration m_configuration;
    String m_name;
    IsdnChannels m_channels;
    IsdnLink m_link;
    TYEvent* m_cleanUpEvent = nullptr;
    std::unordered_map<IsdnEndpoint*, std::unique_ptr<IsdnEndpoint>> m_endpoints;
    std::unordered_map<q931_call*, IsdnEndpoint*> m_calls;
    std::vector<IsdnEndpoint*> m_finished;
};
