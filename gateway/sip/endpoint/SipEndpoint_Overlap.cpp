// Numbers that come digit by digit (RFC 3578): several INVITEs of one Call-ID and From, each with more digits than the
// one before.
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyKeys.h"
#include "services/CC_ServiceUserInput.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipProperty.h"

#include <algorithm>
#include <tuple>
#include <utility>

using namespace SipProperty;

namespace
{
constexpr std::size_t LONGEST_NUMBER = 40; // digits, all that come one by one
constexpr std::string_view DIGITS_OF_NUMBERS = "0123456789*#ABCD";
constexpr unsigned int ADDRESS_INCOMPLETE = 484;
} // namespace

bool SipEndpoint::isOverlapping() const
{
    return m_interface.getConfiguration().overlap == SipConfiguration::Overlap::INVITE;
}

// --- the calling side ------------------------------------------------------------------------------------------------

/// Another INVITE of the call that is being dialled. One that asks for another route, or for another session, is a call
/// of its own, in place of this one.
int SipEndpoint::onMoreDigits(nta_incoming_t* transaction, sip_t const* request)
{
    std::string const number = SipIdentity::READ_CALLED(request).getUser();
    std::string const known = m_called.getUser();
    trace("<- INVITE to " + number);
    bool const isDialling = m_dialog == SipDialogState::INVITE_RECEIVED && m_provisional == 0 && m_isInCall;
    if (!isDialling || number.size() <= known.size() || !number.starts_with(known) || number.size() > LONGEST_NUMBER)
    {
        trace("-> 484");
        return ADDRESS_INCOMPLETE; // the number was complete, or is shorter than what there is
    }
    m_routes.leave(); // else a limit of one call would be reached
    RouteHunt const routes = m_interface.getEnvironment().host.findRoutes(
        m_interface.getConfiguration().name, number, m_caller.party.getUser(), m_callNumber, m_user);
    std::string const digits = number.substr(known.size());
    bool const isSameRoute = !routes.isEmpty() && routes.getProvider() == m_routes.getProvider() &&
                             routes.getNumber() == m_routes.getNumber() + digits;
    if (!isSameRoute || SESSION_OF(request) != m_firstOffer || request->sip_contact == nullptr ||
        !SipBody::READ(request, m_interface.getConfiguration().carriesIsup).isUnderstood())
    {
        clear({QCause::INVALID_NUMBER_FORMAT, ADDRESS_INCOMPLETE, {}});
        return m_interface.handleRequest(nullptr, transaction, request);
    }
    m_routes = routes;
    return joinDigits(transaction, request, digits);
}

int SipEndpoint::joinDigits(nta_incoming_t* transaction, sip_t const* request, std::string const& digits)
{
    answerFinally(ADDRESS_INCOMPLETE, {});
    m_formerLegs.push_back(std::exchange(m_leg, nullptr)); // the stack is in the middle of one of them
    if (!makeServerDialog(transaction, request))
    {
        m_dialog = SipDialogState::OVER;
        leaveCall({QCause::RESOURCE_UNAVAILABLE, 503, {}});
        return 503;
    }
    nta_incoming_treply(transaction, SIP_100_TRYING, TAG_END());
    trace("-> 100");
    m_called = SipIdentity::READ_CALLED(request);
    awaitDigits();
    auto const* const state = getPeer<CC_PropertyCallLegState>(CC_PropertyId::STATE);
    if (state != nullptr && state->getState() == CC_PropertyCallLegState::ADDRESS_INCOMPLETE &&
        !m_adapter.getPeerSupportsOverlapReceiving())
        m_hadPeer = false; // the adapter dials anew, and the new peer is not there at once
    CC_ServiceUserInput input(STRING(digits));
    m_adapter.invokeSynchronousService(input);
    return 0;
}

/// Until the number is taken as it is.
void SipEndpoint::awaitDigits() { m_offerTimer.start(m_interface.getConfiguration().digitTimeout * 1000); }

/// No further INVITE has come.
void SipEndpoint::onDialledOn()
{
    trace("no further digit comes");
    std::ignore = m_adapter.setOwnSupportsOverlapSending(false); // who waits for the whole number has it now
    auto const* const state = getPeer<CC_PropertyCallLegState>(CC_PropertyId::STATE);
    if (state != nullptr && state->getState() == CC_PropertyCallLegState::ADDRESS_INCOMPLETE &&
        m_adapter.getPeerSupportsOverlapReceiving())
        clear({QCause::INVALID_NUMBER_FORMAT, ADDRESS_INCOMPLETE, {}});
}

// --- the called side -------------------------------------------------------------------------------------------------

/// Only who says so; a call of another kind has all its digits.
bool SipEndpoint::isPeerDialling() const
{
    auto const* const sends = getPeer<CC_PropertyBoolean>(CC_PropertyId::SUPPORTS_OVERLAP_SENDING);
    return sends != nullptr && sends->getValue();
}

/// A number that may grow is waited for, unless our peer takes it digit by digit.
bool SipEndpoint::beginNumber()
{
    m_isNumberOpen = m_contacts.empty() && isPeerDialling();
    if (!m_isNumberOpen || isOverlapping())
        return inviteNumber();
    m_timer.start(m_interface.getConfiguration().digitTimeout * 1000);
    return true;
}

/// Whether they belong to the number.
bool SipEndpoint::takeDigits(CC_ServiceUserInput const& input)
{
    if (!m_isNumberOpen)
        return false;
    std::string digits(input.getInput().view());
    std::erase_if(digits, [](char c) { return DIGITS_OF_NUMBERS.find(c) == std::string_view::npos; });
    if (digits.empty() || m_called.number.size() + digits.size() > LONGEST_NUMBER)
        return true;
    m_called.number += digits;
    std::ignore = m_adapter.setOwnE164(STRING(m_called.number));
    if (m_dialog == SipDialogState::NONE)
        m_timer.start(m_interface.getConfiguration().digitTimeout * 1000);
    else if (!inviteAgain())
        clear({QCause::NETWORK_OUT_OF_ORDER, 503, {}});
    return true;
}

/// The INVITE before is not cancelled: that could overtake the new one, and end the call (RFC 3578, 3.4).
bool SipEndpoint::inviteAgain()
{
    if (m_invite.transaction == nullptr)
        std::ignore = m_adapter.setOwn(Key::STATE, CC_PropertyCallLegState::TRYING);
    m_attempts.push_back({std::exchange(m_invite, {}), m_leg});
    forgetForks();
    m_forks.clear();
    m_negotiation = SipOfferAnswer();
    return inviteNumber();
}

/// A leg that goes on with the Call-ID, the tag and the numbering of the one before, if there is one.
nta_leg_t* SipEndpoint::makeClientLeg(std::string const& from, std::string const& to)
{
    if (m_leg == nullptr)
        return nta_leg_tcreate(m_interface.getAgent(), HANDLE, this, SIPTAG_FROM_STR(from.c_str()),
                               SIPTAG_TO_STR(to.c_str()), TAG_END());
    SipHome const home(su_home_create());
    sip_replaces_t const* const dialog = nta_leg_make_replaces(m_leg, home.get(), 0);
    if (dialog == nullptr)
        return nullptr;
    return nta_leg_tcreate(
        m_interface.getAgent(), HANDLE, this, SIPTAG_CALL_ID(sip_call_id_make(home.get(), dialog->rp_call_id)),
        SIPTAG_FROM_STR(from.c_str()), SIPTAG_TO_STR(to.c_str()),
        SIPTAG_CSEQ(sip_cseq_create(home.get(), nta_leg_get_seq(m_leg), SIP_METHOD_INVITE)), TAG_END());
}

/// Our peer wants more digits (484), and there may be some.
bool SipEndpoint::awaitMoreDigits(unsigned int status)
{
    if (status != ADDRESS_INCOMPLETE || !m_isNumberOpen || m_dialog != SipDialogState::INVITE_SENT)
        return false;
    trace("<- 484");
    m_invite.forget();
    m_negotiation.fail();
    std::ignore = m_adapter.setOwn(Key::STATE, CC_PropertyCallLegState::ADDRESS_INCOMPLETE);
    m_timer.start(m_interface.getConfiguration().digitTimeout * 1000);
    return true;
}

/// The other side has no more digits, or none has come for so long.
void SipEndpoint::endNumber()
{
    m_isNumberOpen = false;
    if (m_dialog == SipDialogState::NONE)
    {
        if (!inviteNumber())
            clear({QCause::NETWORK_OUT_OF_ORDER, 503, {}});
    }
    else if (m_dialog == SipDialogState::INVITE_SENT && m_invite.transaction == nullptr)
        clear({QCause::INVALID_NUMBER_FORMAT, ADDRESS_INCOMPLETE, {}});
}

/// Whether the response is to an INVITE with fewer digits, and done with. One that says that its number is complete
/// makes that INVITE the call's.
bool SipEndpoint::isOfAttempt(nta_outgoing_t* transaction, int status)
{
    auto const found =
        std::find_if(m_attempts.begin(), m_attempts.end(),
                     [&](Attempt const& attempt) { return attempt.invitation.transaction == transaction; });
    if (found == m_attempts.end() || transaction == nullptr)
        return false;
    if (status > 100 && status < 300)
    {
        trace("an INVITE with fewer digits is taken");
        std::swap(found->invitation, m_invite);
        std::swap(found->leg, m_leg);
        return false;
    }
    if (status >= 300)
    {
        trace("<- " + std::to_string(status) + " to an INVITE with fewer digits");
        found->invitation.forget();
    }
    return true;
}

/// One INVITE is the call's, or none: the others end.
void SipEndpoint::endAttempts()
{
    m_isNumberOpen = false;
    for (Attempt& attempt : m_attempts)
    {
        nta_outgoing_tcancel(attempt.invitation.transaction, nullptr, nullptr, TAG_END());
        attempt.invitation.forget(); // the stack ends by itself what is answered all the same
        if (attempt.leg != nullptr)
            nta_leg_destroy(attempt.leg);
    }
    m_attempts.clear();
}
