#pragma once

#include "callcontrol/provider/CC_Provider.h"
#include "platform/base/IpAddress.h"
#include "sip/SipConfiguration.h"
#include "sip/access/SipAuthentication.h"
#include "sip/access/SipPeers.h"
#include "sip/access/SipReflection.h"
#include "sip/access/SipRequestRate.h"
#include "sip/access/SipSender.h"
#include "sip/endpoint/SipEnvironment.h"
#include "sip/endpoint/SipRequestHandler.h"
#include "sip/registrar/SipRegistrar.h"
#include "sip/registrar/SipRegistration.h"
#include "sip/stack/SipGuard.h"
#include "sip/stack/SipHandles.h"
#include "sip/stack/SipResolver.h"
#include "sip/stack/SipTls.h"

#include <array>
#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

class SipEndpoint;
class SipFocus;
class TYEvent;
struct SipCause;

/// One SIP interface: listens on one address, on UDP, TCP, TLS or several of these, and sends its calls to one peer. A
/// provider of call control under the interface's name.
///
/// Makes one endpoint per call leg and owns it until both the SIP dialog and the leg are done. Owned by the SIP module;
/// belongs to the thread of the stack's loop, which is also that of the call-control loop.
///
///     SipInterface interface(environment, configuration);
///     std::ignore = CallControl::ADD_PROVIDER("", interface.getName(), interface);
class SipInterface : public CC_Provider, public SipRequestHandler
{
public:
    /// Throws std::runtime_error with the reason when the address cannot be listened on.
    SipInterface(SipEnvironment& environment, SipConfiguration const& configuration);
    ~SipInterface() override; ///< ends what is still up without a word to the peers

    // --- CC_Provider
    XCode dial(CC_Call& call, String const& providerName, String const& destination,
               CC_PropertyContainer const& offerProperties) override;
    ProviderType getProviderType() const override { return USER_DEFINED_INTERFACE; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// Requests outside of dialogs: new calls above all.
    int handleRequest(nta_leg_t* leg, nta_incoming_t* transaction, sip_t const* request) override;

    String const& getName() const { return m_name; }
    SipConfiguration const& getConfiguration() const { return m_configuration; }
    /// Takes over what may change while calls are up; `configuration` differs in nothing else. The passwords stay.
    void follow(SipConfiguration const& configuration);
    SipEnvironment& getEnvironment() const { return m_environment; }
    nta_agent_t* getAgent() const { return m_agent.get(); }
    /// Where the peer reaches us, for what goes that way.
    std::string const& getContact(SipWay::Way way) const { return m_contacts[way]; }
    /// The same for what belongs to a conference (RFC 4579, 4).
    std::string const& getFocusContact(SipWay::Way way) const { return m_focuses[way]; }
    /// The methods that we take. @{
    sip_allow_t const* getAllow() const { return m_allow; }
    sip_supported_t const* getSupported() const { return m_supported; }
    /// @}
    SipSender& getSender() { return m_sender; }
    SipSender const& getSender() const { return m_sender; }
    /// Null where the interface asks nobody.
    SipAuthentication const* getAuthentication() const { return m_authentication ? &*m_authentication : nullptr; }
    SipGuard const& getGuard() const { return m_guard; }
    SipRequestRate const& getRequestRate() const { return m_requestRate; }
    /// Null where the interface has no TLS. @{
    SipTls* getTls() { return m_tls.get(); }
    SipTls const* getTls() const { return m_tls.get(); }
    /// @}
    /// Where media come in; of use only if the environment relays them.
    IpAddress const& getMediaAddress() const { return m_mediaAddress; }
    /// A registration that is being taken back among them.
    std::size_t getNumberOfEndpoints() const
    {
        return m_endpoints.size() + (m_registration != nullptr && m_registration->isEnding() ? 1 : 0);
    }
    /// Null where nobody can register.
    SipRegistrar const* getRegistrar() const { return m_registrar.get(); }
    /// Null where the interface does not register.
    SipRegistration* getRegistration() const { return m_registration.get(); }

    /// Answers a method that nobody here handles: 405 or 501 with Allow; 0 for one that is handled.
    int refuseMethod(nta_incoming_t* transaction, sip_t const* request) const;
    int answerOptions(nta_incoming_t* transaction) const;
    /// The endpoint with that dialog, on whatever interface, in whatever state; null when there is none.
    SipEndpoint* findDialog(sip_replaces_t const* replaces) const;
    /// A peer that answers with 503 and Retry-After is left alone for that time, and calls that nobody else takes get
    /// 503. The caller is not told the time: it would send us no call at all, also none for other peers. @{
    SipPeers& getPeers() { return m_peers; }
    SipPeers const& getPeers() const { return m_peers; }
    /// @}
    /// Clears every call of this interface: BYE, CANCEL or a final answer with the cause.
    void clearCalls(SipCause const& cause);
    /// Clears those of one call alone; false: there are none.
    bool clearCall(unsigned long long serial, SipCause const& cause);
    /// The endpoint is done; it is destroyed in the loop's next turn.
    void finish(SipEndpoint& endpoint);

private:
    static int HANDLE_MESSAGE(SipInterface* interface, nta_agent_t* agent, msg_t* message, sip_t* sip);
    void onMessage(msg_t* message, sip_t* sip);
    bool isWithinRate(msg_t* message, sip_t const* sip);
    bool isEmergencyCall(sip_t const* invite) const;
    bool authenticate(msg_t* message, sip_t const* sip, bool isEmergency);
    bool mayAnswer(msg_t* message, sip_t const* sip, InternetAddress const& source, std::size_t octetsMore);
    int onRequest(nta_incoming_t* transaction, sip_t const* request);
    int receiveInvite(nta_incoming_t* transaction, sip_t const* request);
    int receiveReplacing(nta_incoming_t* transaction, sip_t const* request);
    int checkInvite(nta_incoming_t* transaction, sip_t const* request) const;
    int refuseUnrouted(nta_incoming_t* transaction, unsigned int callNumber, std::string const& number, QCause why);
    bool admits(InternetAddress const& source);
    SipEndpoint& makeEndpoint(unsigned int callNumber, InternetAddress const* source = nullptr);
    static void CLEAN_UP(void* interface);
    void cleanUp();
    void tellOfEnd();

    SipEnvironment& m_environment;
    SipConfiguration m_configuration;
    String m_name;
    IpAddress m_mediaAddress;
    using Contacts = std::array<std::string, SipWay::NUMBER>; // by the way
    Contacts m_contacts;
    Contacts m_focuses;
    SipHome m_home;
    sip_allow_t* m_allow; // the home's
    sip_supported_t* m_supported;
    SipGuard m_guard;
    std::optional<SipAuthentication> m_authentication;
    SipReflection m_reflection;
    SipRequestRate m_requestRate;
    std::unique_ptr<SipTls> m_tls; // null: none
    SipResolver m_resolver;
    SipAgent m_agent;
    SipSender m_sender;
    SipPeers m_peers;
    std::unique_ptr<SipRegistrar> m_registrar;
    std::unique_ptr<SipRegistration> m_registration;
    std::string m_knownUser; // of the request that is being looked at

    TYEvent* m_cleanUpEvent = nullptr;
    struct Owned
    {
        std::unique_ptr<SipEndpoint> endpoint;
        std::optional<InternetAddress> source; // of a call that came in
    };
    std::unordered_map<SipEndpoint*, Owned> m_endpoints;
    std::vector<SipEndpoint*> m_finished;
    std::unique_ptr<SipFocus> m_conference; // null: none
};
