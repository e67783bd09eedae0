// A call that the called side's peer sends elsewhere: the calling side dials again, or its peer does.
#include "platform/media/MG_IContext.h"
#include "properties/CC_Cause.h"
#include "properties/CC_PropertyParametrizedString.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipAddress.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <optional>
#include <tuple>

namespace
{
constexpr std::size_t MOST_FOLLOWED = 5;
} // namespace

/// The called side: what the response is to come to, for the other side.
void SipEndpoint::tellRedirection(sip_t const* response)
{
    using Redirections = SipConfiguration::Redirections;
    Redirections const mode = m_interface.getConfiguration().redirections;
    if (mode == Redirections::REFUSE || !m_isInCall)
        return;
    std::optional<SipRedirection> redirection = SipRedirection::READ(response, m_hasRung);
    if (!redirection)
        return;
    redirection->from.number = m_called.getUser();
    redirection->isHandedOn = mode == Redirections::HAND_ON;
    redirection->interface = m_interface.getConfiguration().name;
    CC_PropertyContainer own;
    SipProperty::ADD(own, redirection->getProperty());
    std::ignore = writeOwn(own); // without memory the call fails as if nobody had said where to
}

/// The calling side: whether the call goes on, or our peer was told where to. One that it hears already does not.
bool SipEndpoint::goElsewhere(SipCause const& cause)
{
    auto const* const property = getPeer<CC_PropertyParametrizedString>(SipPropertyId::REDIRECTION);
    if (property == nullptr || !m_isCalling || m_dialog != SipDialogState::INVITE_RECEIVED || m_hasEarlyMedia ||
        m_fork != 0 || m_dialFailure != QCause::NONE || isOverlapping())
        return false;
    SipRedirection const redirection = SipRedirection::OF(property->getContent());
    if (redirection.isHandedOn)
        handOn(redirection, cause);
    else
        follow(redirection, cause);
    return true;
}

/// By the routes of who sends it there, as if he had called. Nobody is asked twice, nor more than a few.
void SipEndpoint::follow(SipRedirection const& redirection, SipCause const& cause)
{
    bool const wasThere =
        redirection.number == redirection.from.number ||
        std::any_of(m_redirections.begin(), m_redirections.end(),
                    [&](SipRedirection const& before) { return before.from.number == redirection.number; });
    m_redirections.push_back(redirection);
    if (wasThere || m_redirections.size() > MOST_FOLLOWED)
    {
        spdlog::info("call {} {} is redirected in a loop, or too often", m_callNumber, getName().view());
        clear({QCause::EXCHANGE_ROUTING_ERROR, 0, {}});
        return;
    }
    m_routes.leave();
    m_routes = m_interface.getEnvironment().host.findRoutes(redirection.interface, redirection.number,
                                                            redirection.from.number, m_callNumber);
    if (m_routes.isEmpty())
    {
        clear({m_routes.getRefusal(), 0, {}});
        return;
    }
    m_called = SipParty::OF_USER(redirection.number);
    dialAgain(cause, "redirected");
}

void SipEndpoint::handOn(SipRedirection const& redirection, SipCause const& cause)
{
    if (advance(SipDialogState::END) == SipDialogState::REJECT)
        answerMoved(redirection, cause);
    leaveCall(cause);
}

/// The number is at ours, which is all that our peer is to know.
void SipEndpoint::answerMoved(SipRedirection const& redirection, SipCause const& cause)
{
    SipConfiguration const& configuration = m_interface.getConfiguration();
    std::string const uri = SipAddress::MAKE_URI(redirection.number, configuration.getAddress(m_way), m_way);
    std::string const why = std::to_string(SipDiversion::CAUSE_OF_REASON(redirection.from.reason));
    std::string const contact = "<" + uri + ";cause=" + why + ">";
    SipDiversion diversion;
    diversion.add(redirection.from, 1, redirection.isWithheld);
    bool const isTold = configuration.isTrusted || !redirection.isWithheld;
    std::string const headers = isTold ? diversion.getHeaders(configuration.getAddress(), uri) : std::string();
    std::string const reason = cause.getReasonHeader(false);
    trace("-> 302 to " + redirection.number);
    nta_incoming_treply(m_transaction, SIP_302_MOVED_TEMPORARILY, SIPTAG_CONTACT_STR(contact.c_str()),
                        TAG_IF(!reason.empty(), SIPTAG_REASON_STR(reason.c_str())),
                        TAG_IF(!headers.empty(), SIPTAG_HEADER_STR(headers.c_str())), TAG_END());
    forgetTransaction();
}

/// With a new leg in another call, but the same media, and as if the INVITE had just come.
void SipEndpoint::dialAgain(SipCause const& cause, char const* why)
{
    TYPtr<MG_IContext> const media(m_adapter.getDatapathContext());
    trace(std::string("did  drop, State=RELEASED: ") + why);
    spdlog::debug("call {} {} goes on to {} after cause {} ({})", m_callNumber, getName().view(),
                  m_routes.getProvider(), static_cast<int>(cause.cause), CAUSE_SHORT_NAME(cause.cause));
    m_hadPeer = false;
    m_carried.clear(); // the leg's
    m_adapter.drop(cause.cause, 0);
    SipHeldMessage const request(nta_incoming_getrequest(m_transaction));
    if (!dial(sip_object(request.get()), media.get()).isOk())
        clear({QCause::NETWORK_OUT_OF_ORDER, 0, {}});
}
