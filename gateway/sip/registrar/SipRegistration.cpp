#include "sip/registrar/SipRegistration.h"

#include "callcontrol/CallControl.h"
#include "sip/message/SipAddress.h"

#include <sofia-sip/su_uniqueid.h>
#include <spdlog/spdlog.h>

#include <algorithm>
#include <cstdlib>
#include <new>
#include <utility>

namespace
{
constexpr unsigned long LONGEST = 86400;        // seconds; a provider that wants more may ask for it again
constexpr unsigned int LONGEST_WAIT = 1800;     // seconds (RFC 5626, 4.5)
constexpr unsigned int PATIENCE_AT_THE_END = 8; // times T1

/// "sip:4989123@provider.example"
std::string ADDRESS_OF_RECORD(SipConfiguration const& configuration)
{
    return "sip:" + SipAddress::ESCAPE_USER(configuration.user) + "@" + configuration.domain;
}

/// Where a domain is named that is not the peer's own address, the peer is on the way there.
std::string ROUTE_TO(SipConfiguration const& configuration)
{
    std::string const uri = SipAddress::MAKE_URI({}, configuration.peer, configuration.getWayTo(configuration.peer));
    return configuration.domain == configuration.peer.text() ? std::string() : "<" + uri + ";lr>";
}

/// Of the registrar.
std::string URI_OF(SipConfiguration const& configuration)
{
    switch (configuration.way)
    {
    case SipWay::TCP:
        return "sip:" + configuration.domain + ";transport=tcp";
    case SipWay::TLS:
        return "sip:" + configuration.domain + ";transport=tls";
    case SipWay::SIPS:
        return "sips:" + configuration.domain;
    default:
        return "sip:" + configuration.domain;
    }
}

bool IS_SAME(url_t const* one, char const* other)
{
    url_t* const parsed = url_make(nullptr, other);
    bool const result = parsed != nullptr && url_cmp(one, parsed) == 0;
    su_free(nullptr, parsed);
    return result;
}
} // namespace

SipRegistration::SipRegistration(SipConfiguration const& configuration, nta_agent_t* agent, SipSender& sender,
                                 std::function<void()> onOver)
    : m_configuration(configuration)
    , m_sender(sender)
    , m_onOver(std::move(onOver))
    , m_uri(URI_OF(configuration))
    , m_route(ROUTE_TO(configuration))
    , m_contact(
          SipAddress::MAKE_URI(configuration.user, configuration.getAddress(configuration.way), configuration.way))
    , m_timer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_TIMER, this)
    , m_expires(configuration.registerExpires)
{
    std::string const self = "<" + ADDRESS_OF_RECORD(configuration) + ">";
    m_leg.reset(nta_leg_tcreate(agent, nullptr, nullptr, SIPTAG_FROM_STR(self.c_str()), SIPTAG_TO_STR(self.c_str()),
                                TAG_END()));
    if (m_leg == nullptr || nta_leg_tag(m_leg.get(), nullptr) == nullptr)
        throw std::bad_alloc();
}

SipRegistration::~SipRegistration() { forgetRequest(); }

void SipRegistration::start() { m_timer.start(0); }

/// What is registered is taken back; nobody waits long for that.
void SipRegistration::end()
{
    bool const wasBound = isBound() || m_request != nullptr;
    m_timer.stop();
    forgetRequest();
    if (m_state == ENDING || m_state == OVER)
        return;
    m_state = wasBound ? ENDING : OVER;
    if (!wasBound)
        return;
    m_timer.start(PATIENCE_AT_THE_END * m_configuration.t1);
    send(0);
}

void SipRegistration::send(unsigned int seconds)
{
    std::string const contact = "<" + m_contact + ">";
    std::string const expires = std::to_string(seconds);
    forgetRequest();
    ++m_sent;
    m_challenges = 0;
    m_request = m_sender.send(
        m_leg.get(), HANDLE_RESPONSE, asMagic(), SIP_METHOD_REGISTER, URL_STRING_MAKE(m_uri.c_str()),
        TAG_IF(!m_route.empty(), SIPTAG_ROUTE_STR(m_route.c_str())), SIPTAG_CONTACT_STR(contact.c_str()),
        SIPTAG_EXPIRES_STR(expires.c_str()), SIPTAG_SUPPORTED_STR("path"), SIPTAG_MAX_FORWARDS_STR("70"), TAG_END());
    if (m_request == nullptr)
        take(503, nullptr);
}

int SipRegistration::HANDLE_RESPONSE(SipEndpoint* registration, nta_outgoing_t* request, sip_t const* response)
try
{
    if (response == nullptr || response->sip_status->st_status >= 200)
        reinterpret_cast<SipRegistration*>(registration)->onResponse(request, response);
    return 0;
}
catch (std::bad_alloc const&)
{
    reinterpret_cast<SipRegistration*>(registration)->take(503, nullptr);
    return 0;
}

void SipRegistration::onResponse(nta_outgoing_t* request, sip_t const* response)
{
    unsigned int const status = response != nullptr ? static_cast<unsigned int>(response->sip_status->st_status)
                                                    : static_cast<unsigned int>(nta_outgoing_status(request));
    if (nta_outgoing_t* const again =
            m_sender.sendAgain(request, response, m_leg.get(), HANDLE_RESPONSE, asMagic(), m_challenges))
        m_request = again;
    else
        take(status, response);
}

void SipRegistration::take(unsigned int status, sip_t const* response)
{
    if (m_state == ENDING)
        finish();
    else if (unsigned int const seconds =
                 status < 300 && response != nullptr ? GRANTED(response, m_contact.c_str(), m_expires) : 0;
             seconds != 0)
        onRegistered(seconds);
    else if (status == 423 && askForLonger(response))
        send(m_expires);
    else
        onFailed(status, response);
}

void SipRegistration::onRegistered(unsigned int seconds)
{
    if (std::exchange(m_failures, 0) != 0 || m_boundUntil.seconds == 0)
        spdlog::info("interface {}: registered as {} for {} s", m_configuration.name,
                     ADDRESS_OF_RECORD(m_configuration), seconds);
    forgetRequest();
    m_state = REGISTERED;
    m_wasTooBrief = false;
    m_boundUntil = TY::Time::NOW(TY::Time::MONOTONIC);
    m_boundUntil.seconds += static_cast<decltype(m_boundUntil.seconds)>(seconds);
    m_timer.start(REFRESH_AFTER(seconds));
}

/// Once in a row: a registrar that then wants even more is at odds with itself.
bool SipRegistration::askForLonger(sip_t const* response)
{
    if (response == nullptr || response->sip_min_expires == nullptr || std::exchange(m_wasTooBrief, true))
        return false;
    m_expires = static_cast<unsigned int>(std::clamp<unsigned long>(response->sip_min_expires->me_delta, 1, LONGEST));
    return true;
}

void SipRegistration::onFailed(unsigned int status, sip_t const* response)
{
    ++m_failed;
    unsigned int wait = WAIT_AFTER(++m_failures, m_configuration.registerRetry);
    if (response != nullptr && response->sip_retry_after != nullptr)
        wait = static_cast<unsigned int>(
            std::clamp<unsigned long>(response->sip_retry_after->af_delta, wait, LONGEST_WAIT));
    if (m_failures == 1) // and no line for each that follows
        spdlog::warn("interface {}: not registered as {}: {}, the next try is in {} s", m_configuration.name,
                     ADDRESS_OF_RECORD(m_configuration), status, wait);
    forgetRequest();
    m_wasTooBrief = false;
    m_state = WAITING;
    // not all of those whom a failure has thrown out are to come back at once
    m_timer.start(wait * 500 + static_cast<unsigned int>(su_randint(0, static_cast<int>(wait) * 500)));
}

void SipRegistration::ON_TIMER(void* registration)
{
    auto& self = *static_cast<SipRegistration*>(registration);
    try
    {
        self.onTimer();
    }
    catch (std::bad_alloc const&)
    {
        self.take(503, nullptr);
    }
}

void SipRegistration::onTimer()
{
    if (m_state == ENDING)
    {
        finish();
        return;
    }
    m_state = TRYING;
    send(m_expires);
}

void SipRegistration::forgetRequest()
{
    if (m_request == nullptr)
        return;
    nta_outgoing_bind(m_request, nullptr, nullptr);
    nta_outgoing_destroy(std::exchange(m_request, nullptr));
}

void SipRegistration::finish()
{
    m_timer.stop();
    forgetRequest();
    m_state = OVER;
    if (m_onOver)
        m_onOver();
}

bool SipRegistration::isBound() const
{
    return m_boundUntil.seconds != 0 && TY::Time::NOW(TY::Time::MONOTONIC).seconds < m_boundUntil.seconds;
}

long long SipRegistration::getSecondsLeft() const
{
    return isBound() ? static_cast<long long>(m_boundUntil.seconds) -
                           static_cast<long long>(TY::Time::NOW(TY::Time::MONOTONIC).seconds)
                     : 0;
}

std::string SipRegistration::describe() const
{
    std::string const state = isBound() ? fmt::format("for {} s", getSecondsLeft()) : "not";
    return fmt::format("interface {}: registered {} as {}, {} requests, {} failures\n", m_configuration.name, state,
                       ADDRESS_OF_RECORD(m_configuration), m_sent, m_failed);
}

// --- the rules -------------------------------------------------------------------------------------------------------

unsigned int SipRegistration::GRANTED(sip_t const* response, char const* contact, unsigned int asked)
{
    for (sip_contact_t const* header = response->sip_contact; header != nullptr; header = header->m_next)
    {
        if (!IS_SAME(header->m_url, contact))
            continue;
        unsigned long seconds = response->sip_expires != nullptr ? response->sip_expires->ex_delta : asked;
        if (header->m_expires != nullptr)
            seconds = std::strtoul(header->m_expires, nullptr, 10);
        return static_cast<unsigned int>(std::min(seconds, LONGEST));
    }
    return 0;
}

unsigned int SipRegistration::WAIT_AFTER(unsigned int failures, unsigned int first)
{
    unsigned int wait = first;
    for (unsigned int i = 1; i < failures && wait < LONGEST_WAIT; ++i)
        wait *= 2;
    return std::min(wait, LONGEST_WAIT);
}
