// Sessions that are refreshed, expire or last too long (RFC 4028).
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"

#include <algorithm>
#include <strings.h>
#include <utility>

namespace
{
constexpr unsigned long LONGEST = 1000000; // seconds; what is more is as good as no limit
constexpr unsigned int BUSY = 1000;        // milliseconds until a refresh that something else delays

SipSessionTimer::Seen READ_TIMER(sip_t const* message)
{
    SipSessionTimer::Seen seen;
    if (sip_session_expires_t const* const expires = message->sip_session_expires)
    {
        seen.interval = static_cast<unsigned int>(std::min(expires->x_delta, LONGEST));
        if (expires->x_refresher != nullptr)
            seen.refresher = strcasecmp(expires->x_refresher, "uas") == 0 ? SipSessionTimer::UAS : SipSessionTimer::UAC;
    }
    if (message->sip_min_se != nullptr)
        seen.least = static_cast<unsigned int>(std::min(message->sip_min_se->min_delta, LONGEST));
    seen.isSupported =
        sip_has_feature(message->sip_supported, "timer") || sip_has_feature(message->sip_require, "timer");
    return seen;
}

/// Whether the last response has come over the network: one that the stack made up has no source.
bool IS_FROM_PEER(nta_outgoing_t* transaction)
{
    SipHeldMessage const response(nta_outgoing_getresponse(transaction));
    return response != nullptr && msg_addr(response.get())->su_sa.sa_family != AF_UNSPEC;
}
} // namespace

/// 0, or 422 which was sent.
int SipEndpoint::takeTimer(nta_incoming_t* transaction, sip_t const* request)
{
    if (m_sessionTimer.takeRequest(READ_TIMER(request)))
        return 0;
    nta_incoming_treply(transaction, SIP_422_SESSION_TIMER_TOO_SMALL,
                        SIPTAG_HEADER_STR(m_sessionTimer.getMinimum().c_str()), TAG_END());
    return 422;
}

void SipEndpoint::takeTimerOfAnswer(sip_t const* response)
{
    m_sessionTimer.takeResponse(READ_TIMER(response));
    startSessionTimer();
}

bool SipEndpoint::raiseTimer(sip_t const* response)
{
    return response != nullptr && m_sessionTimer.raise(READ_TIMER(response).least);
}

void SipEndpoint::startSessionTimer()
{
    if (m_sessionTimer.getInterval() != 0)
        m_refreshTimer.start(m_sessionTimer.getDelay());
}

void SipEndpoint::ON_REFRESH_TIMER(void* endpoint)
{
    auto& self = *static_cast<SipEndpoint*>(endpoint);
    self.handle([&] { self.onRefreshTimer(); });
}

void SipEndpoint::onRefreshTimer()
{
    if (m_dialog != SipDialogState::UP)
        return;
    if (!m_sessionTimer.isOurs())
    {
        trace("the session has expired");
        clear({QCause::RECOVERY_ON_TIMER_EXPIRY, 0, {}});
    }
    else if (m_isOffering || m_offerReceived != nullptr || m_lateAck != nullptr || m_isOfferWaiting)
        m_refreshTimer.start(BUSY);
    else
        refresh();
}

/// An UPDATE without a description; a re-INVITE with the one that the peer has already, where there is no UPDATE.
void SipEndpoint::refresh()
{
    m_isRefresh = true;
    startOffer(m_allowsUpdate ? std::string() : m_ownSession, true);
}

/// What the peer answers shows that it is there, but 481; what the stack answers in its place (503, when the network
/// gives the message back) may pass until the session expires.
void SipEndpoint::onRefreshed(unsigned int status, sip_t const* response)
{
    bool const isInvite = nta_outgoing_method(m_reinvite.transaction) == sip_method_invite;
    m_isOffering = m_isRefresh = false;
    if (status < 300 && isInvite)
        acknowledge(m_reinvite, {});
    if (isInvite)
        m_negotiation.fail(); // as it was
    if (status < 300)
        m_sessionTimer.takeResponse(READ_TIMER(response));
    else if (status == 408 || status == 481 || (!IS_FROM_PEER(m_reinvite.transaction) && m_sessionTimer.miss()))
    {
        clear({QCause::RECOVERY_ON_TIMER_EXPIRY, status, {}});
        return;
    }
    else if (status == 422)
        raiseTimer(response);
    startSessionTimer();
    sendWaitingOffer();
}

void SipEndpoint::ON_LENGTH_TIMER(void* endpoint)
{
    auto& self = *static_cast<SipEndpoint*>(endpoint);
    self.handle(
        [&]
        {
            self.trace("the call has lasted as long as calls may");
            self.clear({QCause::NORMAL_UNSPECIFIED, 0, {}});
        });
}
