#include "sip/endpoint/SipInterface.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "media/context/MediaAddress.h"
#include "platform/eventloop/TYEvent.h"
#include "properties/CC_Cause.h"
#include "properties/CC_PropertyUnsigned.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipFocus.h"
#include "sip/endpoint/SipRules.h"
#include "sip/message/SipAddress.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipCause.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipPropertyId.h"
#include "sip/stack/SipListener.h"
#include "sip/stack/SipStack.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <cstring>
#include <new>
#include <stdexcept>

#include <tuple>

namespace
{
constexpr char const* ALLOW = "INVITE, ACK, CANCEL, BYE, OPTIONS, UPDATE, PRACK, REFER, NOTIFY, INFO";
constexpr char const* ALLOW_OF_REGISTRAR =
    "INVITE, ACK, CANCEL, BYE, OPTIONS, UPDATE, PRACK, REFER, NOTIFY, INFO, REGISTER";
constexpr char const* SUPPORTED = "100rel, replaces, timer";
constexpr char const* SUPPORTED_BY_REGISTRAR = "100rel, replaces, timer, path";
constexpr char const* RETRY_AFTER_SECONDS = "5";

/// Where the transaction's request came from.
InternetAddress SOURCE_OF(nta_incoming_t* transaction)
{
    SipHeldMessage const message(nta_incoming_getrequest(transaction));
    return AddressRange::ADDRESS_OF(msg_addr(message.get())->su_sa);
}

template <class Header>
std::size_t OCTETS_IN(su_home_t* home, Header const* header)
{
    constexpr std::size_t LONGEST_NAME = 11; // "Call-ID: " and the line's end
    char const* const text = sip_header_as_string(home, reinterpret_cast<sip_header_t const*>(header));
    return LONGEST_NAME + (text != nullptr ? std::strlen(text) : 0);
}

/// At most, without headers of its own: what it has of the request, and what the stack adds to that.
std::size_t OCTETS_OF_ANSWER(sip_t const* request)
{
    constexpr std::size_t ADDED = 150; // the status, a tag, where it came from, the length of no body
    SipHome const home(su_home_create());
    std::size_t octets = ADDED + OCTETS_IN(home.get(), request->sip_from) + OCTETS_IN(home.get(), request->sip_to) +
                         OCTETS_IN(home.get(), request->sip_call_id) + OCTETS_IN(home.get(), request->sip_cseq);
    for (sip_via_t const* via = request->sip_via; via != nullptr; via = via->v_next)
        octets += OCTETS_IN(home.get(), via);
    return octets;
}

std::optional<SipCredentials> CREDENTIALS_OF(SipConfiguration const& configuration)
{
    if (configuration.user.empty())
        return std::nullopt;
    return SipCredentials(configuration.name, configuration.user, configuration.passwords);
}
} // namespace

SipInterface::SipInterface(SipEnvironment& environment, SipConfiguration const& configuration)
    : CC_Provider(configuration.name.c_str(), "sip")
    , m_environment(environment)
    , m_configuration(configuration)
    , m_name(configuration.name.c_str())
    , m_mediaAddress(MediaAddress::OF(configuration.mediaAddress, 0).host)
    , m_home(su_home_create())
    , m_allow(sip_allow_make(m_home.get(), configuration.isRegistrar ? ALLOW_OF_REGISTRAR : ALLOW))
    , m_supported(sip_supported_make(m_home.get(), configuration.isRegistrar ? SUPPORTED_BY_REGISTRAR : SUPPORTED))
    , m_guard(configuration)
    , m_requestRate(configuration.name, configuration.maxRequestsPerSource)
    , m_tls(configuration.listensOnTls ? std::make_unique<SipTls>(configuration.name, configuration.tls) : nullptr)
    , m_resolver(configuration.resolver)
    , m_agent(SipListener::MAKE_AGENT(environment.stack, configuration,
                                      {m_guard, m_tls.get(), m_resolver.getFile(), environment.host.capture != nullptr},
                                      HANDLE_MESSAGE, this))
    , m_sender(m_agent.get(), CREDENTIALS_OF(configuration))
    , m_peers(m_configuration, m_agent.get(), m_sender)
{
    for (SipWay::Way const way : {SipWay::UDP, SipWay::TCP, SipWay::TLS, SipWay::SIPS})
    {
        std::string const uri = SipAddress::MAKE_URI("gateway", configuration.getAddress(way), way);
        m_contacts[way] = SipAddress::MAKE_NAME_ADDR({}, uri);
        m_focuses[way] = m_contacts[way] + ";isfocus";
    }
    if (configuration.authenticates)
        m_authentication.emplace(configuration.name, configuration.realm, configuration.algorithms,
                                 configuration.passwords);
    if (configuration.isRegistrar)
        m_registrar = std::make_unique<SipRegistrar>(m_configuration);
    environment.interfaces.push_back(this);
    m_cleanUpEvent = new TYEvent(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::LOW, CLEAN_UP, this);
    if (!configuration.conference.empty())
        m_conference = std::make_unique<SipFocus>(*this);
    if (configuration.registers)
        m_registration =
            std::make_unique<SipRegistration>(m_configuration, m_agent.get(), m_sender, [this] { tellOfEnd(); });
}

SipInterface::~SipInterface()
{
    std::erase(m_environment.interfaces, this);
    m_endpoints.clear();
    m_conference.reset();
    m_cleanUpEvent->destroy();
}

void SipInterface::follow(SipConfiguration const& configuration)
{
    auto const passwords = m_configuration.passwords; // which others share
    m_configuration = configuration;
    m_configuration.passwords = passwords;
    m_requestRate.setLimit(configuration.maxRequestsPerSource);
}

XCode SipInterface::dial(CC_Call& call, String const&, String const& destination,
                         CC_PropertyContainer const& offerProperties)
{
    auto const* const number =
        dynamic_cast<CC_PropertyUnsigned const*>(call.getProperties().get(SipPropertyId::CALL_NUMBER));
    try
    {
        SipEndpoint& endpoint = makeEndpoint(number != nullptr ? static_cast<unsigned int>(number->getValue()) : 0);
        XCode const result = endpoint.offer(call, destination, offerProperties);
        if (!result.isOk())
            finish(endpoint);
        return result;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

InfoContainer& SipInterface::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                     unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    String text;
    text.format("%s, listening on %s, peer %s, %zu endpoints", m_name.c_str(), m_configuration.listen.text().c_str(),
                m_configuration.peer.text().c_str(), m_endpoints.size());
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "SIP Interface", text);
    return info;
}

int SipInterface::handleRequest(nta_leg_t*, nta_incoming_t* transaction, sip_t const* request)
{
    try
    {
        return onRequest(transaction, request);
    }
    catch (std::bad_alloc const&)
    {
        return 503;
    }
}

int SipInterface::HANDLE_MESSAGE(SipInterface* interface, nta_agent_t*, msg_t* message, sip_t* sip)
{
    interface->onMessage(message, sip);
    return 0;
}

/// A message that the stack knows nothing of becomes a transaction here, and not before it is known that there is room:
/// a refusal without one is sent once and forgotten, where the stack would repeat that of a transaction until the ACK.
void SipInterface::onMessage(msg_t* message, sip_t* sip)
{
    bool const isRequest = sip->sip_request != nullptr && sip->sip_request->rq_method != sip_method_ack;
    if (!isRequest)
    {
        nta_msg_discard(m_agent.get(), message);
        return;
    }
    bool const isOfDialog = sip->sip_to->a_tag != nullptr; // of none that is here
    bool const isNewCall = sip->sip_request->rq_method == sip_method_invite && !isOfDialog;
    if (!isNewCall && !isWithinRate(message, sip))
        return;
    bool const isEmergency = isNewCall && isEmergencyCall(sip);
    if (m_authentication && !authenticate(message, sip, isEmergency))
        return;
    if (isNewCall && !isEmergency && !admits(AddressRange::ADDRESS_OF(msg_addr(message)->su_sa)))
    {
        nta_msg_treply(m_agent.get(), message, SIP_503_SERVICE_UNAVAILABLE, SIPTAG_RETRY_AFTER_STR(RETRY_AFTER_SECONDS),
                       TAG_END());
        return;
    }
    if (isOfDialog || sip->sip_request->rq_method == sip_method_cancel)
    {
        nta_msg_treply(m_agent.get(), message, SIP_481_NO_TRANSACTION, TAG_END());
        return;
    }
    nta_incoming_t* const transaction = nta_incoming_create(m_agent.get(), nullptr, message, sip, TAG_END());
    if (transaction == nullptr)
        return;
    int const status = handleRequest(nullptr, transaction, sip);
    if (status == 0)
        return;
    nta_incoming_treply(transaction, status, nullptr, TAG_END()); // nothing if it was answered finally
    nta_incoming_destroy(transaction);
}

/// Else it is done with. Who sends datagrams sends them again, of a connection nothing gets lost.
bool SipInterface::isWithinRate(msg_t* message, sip_t const* sip)
try
{
    if (m_requestRate.admit(AddressRange::ADDRESS_OF(msg_addr(message)->su_sa)))
        return true;
    if (SipRules::WAY_OF(sip) == SipWay::UDP)
        nta_msg_discard(m_agent.get(), message);
    else
        nta_msg_treply(m_agent.get(), message, SIP_503_SERVICE_UNAVAILABLE, SIPTAG_RETRY_AFTER_STR(RETRY_AFTER_SECONDS),
                       TAG_END());
    return false;
}
catch (std::bad_alloc const&)
{
    nta_msg_discard(m_agent.get(), message);
    return false;
}

/// What it costs where there is no such number is a look at a flag.
bool SipInterface::isEmergencyCall(sip_t const* invite) const
try
{
    GatewayHost const& host = m_environment.host;
    return host.routing.hasEmergency() &&
           host.isEmergency(m_configuration.name, SipIdentity::READ_CALLED(invite).getUser());
}
catch (std::bad_alloc const&)
{
    return false;
}

/// Whether the sender is known; else the message is done with. A CANCEL cannot be asked for (RFC 3261, 22.1), and one
/// that comes here finds nothing to cancel.
bool SipInterface::authenticate(msg_t* message, sip_t const* sip, bool isEmergency)
try
{
    InternetAddress const source = AddressRange::ADDRESS_OF(msg_addr(message)->su_sa);
    if (sip->sip_request->rq_method == sip_method_cancel)
        return mayAnswer(message, sip, source, 0);
    SipAuthentication::Decision const decision = m_authentication->check(sip, source, isEmergency);
    if (decision.isReached)
        m_reflection.noteReached(source);
    if (decision.verdict == SipAuthentication::ASK && mayAnswer(message, sip, source, decision.challenge.size()))
        nta_msg_treply(m_agent.get(), message, SIP_401_UNAUTHORIZED, SIPTAG_HEADER_STR(decision.challenge.c_str()),
                       TAG_END());
    else if (decision.verdict == SipAuthentication::REFUSE) // who knows a nonce is no made-up address
        nta_msg_treply(m_agent.get(), message, 400, "Credentials For Another URI", TAG_END());
    else if (decision.verdict == SipAuthentication::IGNORE)
        nta_msg_discard(m_agent.get(), message);
    m_knownUser = decision.user;
    return decision.verdict == SipAuthentication::ACCEPTED;
}
catch (std::bad_alloc const&)
{
    nta_msg_discard(m_agent.get(), message);
    return false;
}

/// Otherwise it is done with: its source may be made up. Who has a connection has shown that it is not.
bool SipInterface::mayAnswer(msg_t* message, sip_t const* sip, InternetAddress const& source, std::size_t octetsMore)
{
    bool const isDatagram = SipRules::WAY_OF(sip) == SipWay::UDP;
    if (!isDatagram || m_reflection.admit(source, msg_size(message), OCTETS_OF_ANSWER(sip) + octetsMore))
        return true;
    nta_msg_discard(m_agent.get(), message);
    return false;
}

int SipInterface::onRequest(nta_incoming_t* transaction, sip_t const* request)
{
    sip_method_t const method = request->sip_request->rq_method;
    if (int const refused = refuseMethod(transaction, request); refused != 0)
        return refused;
    if (int const refused = SipRules::CHECK(transaction, request, m_supported); refused != 0)
        return refused;
    if (method == sip_method_options)
        return answerOptions(transaction);
    if (method == sip_method_register && m_registrar != nullptr)
        return m_registrar->receive(transaction, request, m_knownUser);
    return method == sip_method_invite ? receiveInvite(transaction, request) : 481;
}

int SipInterface::refuseMethod(nta_incoming_t* transaction, sip_t const* request) const
{
    return nta_check_method(transaction, request, m_allow, SIPTAG_ALLOW(m_allow), TAG_END());
}

/// As an INVITE would be answered: who asks wants to know whether to send calls.
int SipInterface::answerOptions(nta_incoming_t* transaction) const
{
    bool const hasRoom = m_environment.host.takesCallsFrom(m_configuration.name) &&
                         m_environment.host.admission.hasRoom(CallControl::GET_NUMBER_OF_CALLS());
    if (!hasRoom)
        nta_incoming_treply(transaction, SIP_503_SERVICE_UNAVAILABLE, SIPTAG_RETRY_AFTER_STR(RETRY_AFTER_SECONDS),
                            TAG_END());
    else
        nta_incoming_treply(transaction, SIP_200_OK, SIPTAG_ALLOW(m_allow), SIPTAG_SUPPORTED(m_supported),
                            SIPTAG_ACCEPT_STR(SipBody::ACCEPT), SIPTAG_ACCEPT_ENCODING_STR(SipBody::ACCEPT_ENCODING),
                            TAG_END());
    return hasRoom ? 200 : 503;
}

int SipInterface::receiveInvite(nta_incoming_t* transaction, sip_t const* request)
{
    if (int const refused = checkInvite(transaction, request); refused != 0)
        return refused;
    if (request->sip_replaces != nullptr)
        return receiveReplacing(transaction, request);
    std::string const number = SipIdentity::READ_CALLED(request).getUser();
    SipIdentity caller = SipIdentity::READ_CALLER(request, m_configuration.isTrusted);
    caller.normalise(m_environment.host.dialPlan);
    unsigned int const callNumber = ++m_environment.host.lastCallNumber;
    ++m_environment.host.counters.placed;
    bool const isConference = m_conference != nullptr && number == m_configuration.conference;
    RouteHunt const routes = isConference
                                 ? RouteHunt::TO(m_conference->getName().c_str(), number)
                                 : m_environment.host.findRoutes(m_configuration.name, number, caller.party.getUser(),
                                                                 callNumber, m_knownUser);
    if (routes.isEmpty())
        return refuseUnrouted(transaction, callNumber, number, routes.getRefusal());
    if (routes.isEmergency())
        spdlog::warn("call {} {} is an emergency call to '{}'", callNumber, m_configuration.name, number);
    SipEndpoint* endpoint = nullptr;
    try
    {
        InternetAddress const source = SOURCE_OF(transaction);
        endpoint = &makeEndpoint(callNumber, &source);
    }
    catch (std::bad_alloc const&)
    {
        ++m_environment.host.counters.failed;
        return 503;
    }
    return endpoint->receiveInvite(transaction, request, caller, routes, m_knownUser);
}

SipEndpoint* SipInterface::findDialog(sip_replaces_t const* replaces) const
{
    for (SipInterface const* const interface : m_environment.interfaces)
        if (nta_leg_t* const leg = nta_leg_by_replaces(interface->getAgent(), replaces))
            if (auto* const endpoint = dynamic_cast<SipEndpoint*>(nta_leg_magic(leg, HANDLE)))
                return endpoint;
    return nullptr;
}

int SipInterface::receiveReplacing(nta_incoming_t* transaction, sip_t const* request)
{
    SipEndpoint* const replaced = findDialog(request->sip_replaces);
    if (int const refused = replaced != nullptr ? replaced->checkReplaces(*request->sip_replaces) : 481; refused != 0)
        return refused;
    unsigned int const callNumber = ++m_environment.host.lastCallNumber;
    ++m_environment.host.counters.placed;
    InternetAddress const source = SOURCE_OF(transaction);
    return makeEndpoint(callNumber, &source).receiveReplacing(transaction, request, *replaced);
}

int SipInterface::refuseUnrouted(nta_incoming_t* transaction, unsigned int callNumber, std::string const& number,
                                 QCause why)
{
    bool const isFull = why != QCause::NO_ROUTE_TO_DESTINATION;
    bool const isBeginning = !isFull && m_configuration.overlap == SipConfiguration::Overlap::INVITE &&
                             m_environment.host.isBeginning(m_configuration.name, number);
    SipCause const cause =
        isBeginning ? SipCause{QCause::INVALID_NUMBER_FORMAT, 484, {}} : SipCause{why, isFull ? 503u : 404u, {}};
    ++m_environment.host.counters.failed;
    spdlog::info("call {} {} refused: no route to '{}'{}, cause {} ({}), SIP {}", callNumber, m_configuration.name,
                 number, isFull ? " has room" : "", static_cast<int>(cause.cause), CAUSE_SHORT_NAME(cause.cause),
                 cause.sipCode);
    nta_incoming_treply(transaction, static_cast<int>(cause.sipCode), nullptr,
                        SIPTAG_REASON_STR(cause.getReasonHeader(false).c_str()), TAG_END());
    return static_cast<int>(cause.sipCode);
}

/// What keeps an INVITE from being a call, whatever it asks for.
int SipInterface::checkInvite(nta_incoming_t* transaction, sip_t const* request) const
{
    if (request->sip_contact == nullptr || request->sip_contact->m_url->url_type == url_any)
    {
        nta_incoming_treply(transaction, 400, "Missing Contact Header", TAG_END());
        return 400;
    }
    return SipRules::CHECK_BODY(transaction, request, m_configuration.carriesIsup);
}

bool SipInterface::admits(InternetAddress const& source)
{
    if (m_environment.host.takesCallsFrom(m_configuration.name) &&
        m_environment.host.admission.admit(CallControl::GET_NUMBER_OF_CALLS(), source))
        return true;
    ++m_environment.host.counters.refused;
    spdlog::debug("interface {}: a call is refused, {}", m_configuration.name,
                  m_environment.host.takesCallsFrom(m_configuration.name) ? "too many calls" : "none are taken now");
    return false;
}

void SipInterface::clearCalls(SipCause const& cause)
{
    for (auto const& [endpoint, owned] : m_endpoints)
        endpoint->clear(cause);
}

bool SipInterface::clearCall(unsigned long long serial, SipCause const& cause)
{
    bool isHere = false;
    for (auto const& [endpoint, owned] : m_endpoints)
        if (endpoint->isInCall(serial))
        {
            endpoint->clear(cause);
            isHere = true;
        }
    return isHere;
}

SipEndpoint& SipInterface::makeEndpoint(unsigned int callNumber, InternetAddress const* source)
{
    if (m_finished.capacity() <= m_endpoints.size()) // so that an end needs no memory
        m_finished.reserve(2 * (m_endpoints.size() + 1));
    auto owner = std::make_unique<SipEndpoint>(*this, callNumber);
    SipEndpoint& endpoint = *owner;
    Owned& owned = m_endpoints[&endpoint];
    owned.endpoint = std::move(owner);
    if (source != nullptr)
    {
        m_environment.host.admission.begin(*source);
        owned.source = *source;
    }
    return endpoint;
}

void SipInterface::finish(SipEndpoint& endpoint)
{
    m_finished.push_back(&endpoint);
    std::ignore = m_cleanUpEvent->setIfNotPending(); // refused only once it is destroyed, with the interface
}

void SipInterface::CLEAN_UP(void* interface) { static_cast<SipInterface*>(interface)->cleanUp(); }

void SipInterface::cleanUp()
{
    for (std::size_t i = 0; i < m_finished.size(); ++i) // ending one may finish another
    {
        auto const found = m_endpoints.find(m_finished[i]);
        if (found == m_endpoints.end())
            continue;
        if (found->second.source)
            m_environment.host.admission.end(*found->second.source);
        m_endpoints.erase(found);
    }
    m_finished.clear();
    tellOfEnd();
}

void SipInterface::tellOfEnd()
{
    if (m_environment.host.onEndpointGone)
        m_environment.host.onEndpointGone();
}
