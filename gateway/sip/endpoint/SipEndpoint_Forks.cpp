// The called side: several parties behind a proxy, each of which is a dialog of its own.
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"

#include "properties/CC_PropertyUnsigned.h"

#include <algorithm>
#include <string>
#include <utility>

using namespace SipProperty;

// Several parties may answer what a proxy has forked: the first 200 wins (RFC 3261, 13.2.2.4). Any other gets its ACK
// and a BYE from the stack, which hands us nothing more of it.

/// Null for a response that is of no dialog.
SipEndpoint::Fork* SipEndpoint::findFork(sip_t const* response)
{
    if (response->sip_to == nullptr || response->sip_to->a_tag == nullptr)
        return nullptr;
    std::string_view const tag = response->sip_to->a_tag;
    auto const found = std::find_if(m_forks.begin(), m_forks.end(), [&](Fork const& fork) { return fork.tag == tag; });
    return found != m_forks.end() ? &*found : &m_forks.emplace_back(Fork{std::string(tag)});
}

/// Sends the PRACK (RFC 3262), in the party's own dialog. False for a response that is repeated or comes before its
/// turn: it is to be passed over.
bool SipEndpoint::acceptReliably(Fork& fork, sip_t const* response)
{
    auto const sequence = static_cast<unsigned int>(response->sip_rseq->rs_response);
    if (fork.sequence != 0 && sequence != fork.sequence + 1)
        return false;
    if (fork.leg == nullptr)
        fork.leg = nta_leg_tcreate(m_interface.getAgent(), HANDLE, this, SIPTAG_CALL_ID(response->sip_call_id),
                                   SIPTAG_FROM(response->sip_from), SIPTAG_TO(response->sip_to),
                                   SIPTAG_CSEQ(response->sip_cseq), TAG_END());
    if (fork.leg == nullptr)
        return false;
    routeAsClient(fork.leg, m_invite.transaction, response);
    noteAllow(response);
    std::string const acknowledged = std::to_string(sequence) + " " + std::to_string(m_invite.sequence) + " INVITE";
    trace("-> PRACK");
    if (!m_interface.getSender().sendAlone(fork.leg, SIP_METHOD_PRACK, SIPTAG_RACK_STR(acknowledged.c_str()),
                                           TAG_END()))
        return false;
    fork.sequence = sequence;
    return true;
}

void SipEndpoint::forgetForks()
{
    for (Fork& fork : m_forks)
        if (fork.leg != nullptr)
            nta_leg_destroy(std::exchange(fork.leg, nullptr));
}

/// Tells the other side whose news comes with it, when that is not whose the last one was.
void SipEndpoint::addFork(CC_PropertyContainer& own, Fork const* fork)
{
    if (fork == nullptr)
        return;
    auto const number = static_cast<unsigned int>(fork - m_forks.data());
    if (number != std::exchange(m_fork, number))
        ADD(own, CC_PropertyUnsigned(SipPropertyId::FORK, number));
}
