// Both sides of a call are on one interface: call control asks one of them to step back. Where the peers transfer by
// themselves, ours is sent to the other side's, and the gateway leaves the call.
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/endpoint/SipServiceDialog.h"
#include "sip/message/SipAddress.h"
#include "sip/stack/SipHandles.h"

#include <utility>

/// It is asked for again in every clean-up of the call; one REFER is enough.
void SipEndpoint::onPushBack()
{
    if (std::exchange(m_isPushedBack, true))
        return;
    if (m_interface.getConfiguration().transfersOnWire)
        stepBack();
    else
        trace("told to step back, not taken");
}

/// Now, or when the ACK has come.
void SipEndpoint::stepBack()
{
    if (!m_isPushedBack || m_hasSteppedBack || m_dialog != SipDialogState::UP || !m_isInCall || m_refer != nullptr ||
        m_isTransferring || m_isReferring || !m_interface.getConfiguration().transfersOnWire)
        return;
    SipServiceDialog other;
    m_adapter.invokeSynchronousService(other);
    if (other.target.empty())
        return;
    m_hasSteppedBack = true;
    std::string const target = "<" + other.target + "?" + other.headers + ">";
    std::string const self = SipAddress::MAKE_URI("gateway", m_interface.getConfiguration().getAddress(m_way), m_way);
    trace("-> REFER to " + target);
    m_refer = m_interface.getSender().send(
        m_leg, HANDLE_REFER_RESPONSE, this, SIP_METHOD_REFER, nullptr, SIPTAG_REFER_TO_STR(target.c_str()),
        SIPTAG_REFERRED_BY_STR(("<" + self + ">").c_str()), SIPTAG_CONTACT_STR(getContact()), TAG_END());
}

/// For the other side's peer. If there is no dialog yet, we step back instead, once there is one: either of the two
/// will do.
void SipEndpoint::tellDialog(SipServiceDialog& service)
{
    bool const isUp = m_dialog == SipDialogState::UP || m_dialog == SipDialogState::ANSWERED;
    m_isPushedBack = m_isPushedBack || !isUp;
    SipHome const home(su_home_create());
    sip_contact_t const* target = nullptr;
    sip_replaces_t* const replaces = isUp ? nta_leg_make_replaces(m_leg, home.get(), 0) : nullptr;
    if (replaces == nullptr || nta_leg_get_route(m_leg, nullptr, &target) < 0 || target == nullptr)
        return;
    url_t uri = *target->m_url;
    uri.url_headers = nullptr;
    char const* const text = url_as_string(home.get(), &uri);
    char const* const headers = sip_headers_as_url_query(home.get(), SIPTAG_REPLACES(replaces), TAG_END());
    if (text == nullptr || headers == nullptr)
        return;
    service.target = text;
    service.headers = headers;
}
