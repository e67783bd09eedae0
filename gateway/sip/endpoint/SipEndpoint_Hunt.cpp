// The called side: to whom the INVITE goes, and to whom next when that one does not take the call.
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipAddress.h"
#include "sip/message/SipPropertyId.h"

#include <utility>

/// False: the caller asks for TLS on every hop (RFC 5630, 5.3), which this one has not, nor have registered contacts;
/// the call is over.
bool SipEndpoint::findWay(CC_PropertyContainer const& offerProperties)
{
    m_way = m_interface.getConfiguration().way;
    if (offerProperties.get(SipPropertyId::SECURED) == nullptr)
        return true;
    if (SipWay::IS_SECURED(m_way) && m_contacts.empty())
    {
        m_way = SipWay::SIPS;
        return true;
    }
    m_dialog = SipDialogState::OVER;
    leaveCall({QCause::BEARER_CAPABILITY_NOT_PRESENTLY_AVAILABLE, 480, {}});
    return false;
}

/// Where a user of the interface's realm has registered. False: he has not, or there is nobody of that name, and the
/// call is over.
bool SipEndpoint::findContacts(std::string const& user)
{
    SipRegistrar const* const registrar = m_interface.getRegistrar();
    if (registrar == nullptr)
        return true;
    m_contacts = registrar->find(user);
    bool const hasPeer = m_interface.getConfiguration().hasPeer();
    if (!m_contacts.empty() || (hasPeer && !registrar->hasUser(user)))
        return true;
    m_dialog = SipDialogState::OVER;
    if (registrar->hasUser(user))
        leaveCall({QCause::SUBSCRIBER_ABSENT, 480, {}});
    else
        leaveCall({QCause::UNALLOCATED_NUMBER, 404, {}});
    return false;
}

/// False: no peer takes calls now, and the call is over.
bool SipEndpoint::findPeer()
{
    if (!m_contacts.empty())
        return true;
    m_peers = m_interface.getPeers().choose();
    if (!m_peers.empty())
    {
        m_interface.getPeers().noteCall(m_peers.front());
        return true;
    }
    m_dialog = SipDialogState::OVER;
    leaveCall({QCause::TEMPORARY_FAILURE, 503, {}});
    return false;
}

SocketAddress const& SipEndpoint::getPeerAddress() const { return m_interface.getPeers().getAddress(m_peers.front()); }

/// At the peer that is being tried.
std::string SipEndpoint::makePeerUri(std::string_view user) const
{
    SocketAddress const& peer = getPeerAddress();
    return SipAddress::MAKE_URI(user, peer,
                                m_way == SipWay::SIPS ? m_way : m_interface.getConfiguration().getWayTo(peer));
}

bool SipEndpoint::tryAnother(unsigned int status, sip_t const* response)
{
    bool const isOurs = response == nullptr || nta_sip_is_internal(response); // the stack's word for a peer's silence
    if (m_dialog != SipDialogState::INVITE_SENT)
        return false;
    if (!m_contacts.empty())
        return tryNextContact(status);
    if (!isOurs && status == 503 && response->sip_retry_after != nullptr)
        m_interface.getPeers().leaveAlone(m_peers.front(), response->sip_retry_after->af_delta);
    return (isOurs || status == 503 || status == 408) && tryNextPeer();
}

/// Another peer, when one of them does not take the call or is not there (RFC 3263, 4.3). Whether there is one; a call
/// that has rung, or whose caller has heard something, rings nowhere else.
bool SipEndpoint::tryNextPeer()
{
    m_interface.getPeers().noteFailure(m_peers.front());
    if (m_peers.size() < 2 || m_hasRung || m_hasEarlyMedia || !m_forks.empty())
        return false;
    m_peers.erase(m_peers.begin());
    m_interface.getPeers().noteCall(m_peers.front());
    m_inviteUri = makePeerUri(m_called.getUser());
    m_invite.forget();
    m_negotiation.fail();
    return startInvite();
}

/// Another contact of the user, when one of them does not want the call or is not there (RFC 3261, 16.5: one after the
/// other). Whether there is one; a user who has declined it has done so everywhere.
bool SipEndpoint::tryNextContact(unsigned int status)
{
    if (m_contacts.size() < 2 || status >= 600)
        return false;
    m_contacts.erase(m_contacts.begin());
    m_inviteUri = m_contacts.front().uri;
    m_inviteRoute = m_contacts.front().route;
    m_invite.forget();
    m_negotiation.fail();
    return startInvite();
}

void SipEndpoint::noteHeard()
{
    if (std::exchange(m_isUnheard, false))
        m_timer.start(m_interface.getConfiguration().answerTimeout * 1000);
}

/// A peer that is not there is given up for another one. Should it come back meanwhile, its first word gets a CANCEL.
void SipEndpoint::onCalledTimer()
{
    if (!std::exchange(m_isUnheard, false) || m_dialog != SipDialogState::INVITE_SENT)
    {
        onAnswerTimeout();
        return;
    }
    trace("the peer says nothing");
    nta_outgoing_bind(m_invite.transaction, nullptr, nullptr);
    nta_outgoing_tcancel(m_invite.transaction, nullptr, nullptr, TAG_END());
    if (!tryNextPeer())
        clear({QCause::NETWORK_OUT_OF_ORDER, 503, {}});
}
