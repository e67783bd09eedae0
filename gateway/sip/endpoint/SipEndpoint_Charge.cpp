// What the call costs (3GPP TS 24.647): the property Charge on the leg, told in INFO while the call is up, in BYE and
// in its answer, and the property Tariff, told in the answers to INVITE and in INFO.
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyKeys.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipAdvice.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipCharge.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipTariff.h"

#include <spdlog/spdlog.h>

#include <tuple>
#include <utility>

namespace
{
constexpr unsigned int CHARGE_PATIENCE = 1000; // milliseconds that a BYE's answer waits for what the call has cost
} // namespace

/// Whether answers to that INVITE may have more than a session description in them.
void SipEndpoint::noteAccept(sip_t const* request)
{
    for (sip_accept_t const* accept = request->sip_accept; accept != nullptr; accept = accept->ac_next)
        m_takesTariff = m_takesTariff || (accept->ac_type != nullptr && SipAdvice::IS_TYPE(accept->ac_type));
}

/// Whether the body was one; what it tells is the other side's to tell.
bool SipEndpoint::takeCharge(sip_t const* request)
{
    bool const isAdvice = request->sip_payload != nullptr && request->sip_content_type != nullptr &&
                          SipAdvice::IS_TYPE(request->sip_content_type->c_type);
    if (!isAdvice || m_interface.getConfiguration().charges != SipConfiguration::Charges::TAKE)
        return true;
    bool const isTaken = takeAdvice(SipBody::PAYLOAD_OF(request));
    if (!isTaken)
    {
        trace("<- a charge that is none");
        spdlog::info("call {} {}: the peer's charge cannot be read", m_callNumber, getName().view());
    }
    return isTaken;
}

bool SipEndpoint::takeAdvice(std::string const& body)
{
    std::optional<SipCharge::Charge> const charge = SipCharge::READ(body);
    std::optional<SipTariff::Tariff> const tariff = SipTariff::READ(body);
    CC_PropertyContainer own;
    if (charge)
        SipProperty::ADD(own, CC_PropertyCharge(CC_PropertyId::CHARGE, *charge));
    if (tariff)
        SipProperty::ADD(own, CC_PropertyTariff(CC_PropertyId::TARIFF, *tariff));
    if (!own.isEmpty())
        trace("<- " + TEXT_OF(own));
    if (!own.isEmpty() && m_isInCall)
        std::ignore = m_adapter.setOwnProperties(own); // without memory the next one may fit
    return charge || tariff;
}

/// What cannot be read does not stop the call.
void SipEndpoint::addTariff(CC_PropertyContainer& own, sip_t const* response)
{
    if (m_interface.getConfiguration().charges != SipConfiguration::Charges::TAKE)
        return;
    std::string const body = SipBody::READ(response).advice;
    if (std::optional<SipTariff::Tariff> const tariff = SipTariff::READ(body))
        SipProperty::ADD(own, CC_PropertyTariff(CC_PropertyId::TARIFF, *tariff));
    else if (!body.empty())
        spdlog::info("call {} {}: the peer's tariff cannot be read", m_callNumber, getName().view());
}

int SipEndpoint::onChargeInfo(nta_incoming_t* transaction, sip_t const* request)
{
    if (takeCharge(request))
        return 200;
    nta_incoming_treply(transaction, 400, "Bad Advice of Charge", TAG_END());
    return 400;
}

bool SipEndpoint::tellsCharges() const
{
    return m_interface.getConfiguration().charges == SipConfiguration::Charges::TELL;
}

/// Empty: it is not known, or not to be told.
std::string SipEndpoint::getTariff() const
{
    auto const* const tariff = tellsCharges() && m_isInCall ? m_adapter.getPeerTariff() : nullptr;
    return tariff != nullptr ? SipTariff::WRITE(*tariff) : std::string();
}

/// For a response to the INVITE; each one has it, since a provisional one may be lost.
std::string SipEndpoint::getTariffForAnswer()
{
    std::string tariff = m_takesTariff ? getTariff() : std::string();
    if (!tariff.empty())
        m_tariff = tariff;
    return tariff;
}

/// By INFO, once the dialog is up: to a peer that takes none in answers, and what is new since.
void SipEndpoint::tellTariff()
{
    if (m_dialog != SipDialogState::UP)
        return;
    if (std::string tariff = getTariff(); !tariff.empty() && tariff != m_tariff)
        m_charge = m_tariff = std::move(tariff);
    sendInfo();
}

/// The final one waits for the BYE.
void SipEndpoint::followCharge(CC_Flags const& flags)
{
    if (flags.get(CC_PropertyId::TARIFF))
        tellTariff();
    auto const* const charge = flags.get(CC_PropertyId::CHARGE) && tellsCharges() ? m_adapter.getPeerCharge() : nullptr;
    if (charge == nullptr || SipCharge::IS_TOTAL(*charge))
        return;
    m_charge = SipCharge::WRITE(*charge);
    sendInfo();
}

/// Of a call that the other side ends; empty: it is not known.
std::string SipEndpoint::getFinalCharge() const
{
    auto const* const charge = tellsCharges() && m_isInCall ? m_adapter.getPeerCharge() : nullptr;
    return charge != nullptr && SipCharge::IS_TOTAL(*charge) ? SipCharge::WRITE(*charge) : std::string();
}

/// Our peer hangs up, and what the call has cost in all is to come: from a peer that has told of costs before.
bool SipEndpoint::awaitsFinalCharge() const
{
    return tellsCharges() && m_isInCall && !m_isTransferring && !isPeerReleased() && getFinalCharge().empty() &&
           (m_adapter.getPeerCharge() != nullptr || m_adapter.getPeerTariff() != nullptr);
}

/// Until the other side has cleared, or for a while, our leg stays in the call, and says that it only waits.
int SipEndpoint::holdBye(nta_incoming_t* transaction, SipCause const& cause)
{
    auto held = std::make_unique<HeldBye>(HeldBye{transaction, cause});
    CC_PropertyContainer own;
    SipProperty::ADD(own, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, false));
    SipProperty::ADD(own, CC_PropertyCallLegState(CC_PropertyId::STATE, CC_PropertyCallLegState::DISCONNECTING));
    std::ignore = own.set(cause.getProperty()); // else it is told when we leave
    trace("did  State=DISCONNECTING, until the charge is known");
    m_heldBye = std::move(held);
    m_timer.start(CHARGE_PATIENCE);
    std::ignore = m_adapter.setOwnProperties(own); // without memory the other side hears of it when we leave
    return 0;
}

/// With the charge, if it has come.
void SipEndpoint::answerHeldBye()
{
    if (m_heldBye == nullptr)
        return;
    nta_incoming_t* const transaction = std::exchange(m_heldBye, {})->transaction;
    std::string charge;
    handle([&] { charge = getFinalCharge(); });
    handle([&] { trace("-> 200 to BYE" + std::string(charge.empty() ? "" : " with a charge")); });
    nta_incoming_treply(transaction, SIP_200_OK, TAG_IF(!charge.empty(), SIPTAG_CONTENT_TYPE_STR(SipAdvice::TYPE)),
                        TAG_IF(!charge.empty(), SIPTAG_PAYLOAD_STR(charge.c_str())), TAG_END());
    nta_incoming_destroy(transaction);
}

/// The other side waits for what the answer to our BYE tells.
bool SipEndpoint::awaitsBill() const
{
    return m_bye != nullptr && m_interface.getConfiguration().charges == SipConfiguration::Charges::TAKE &&
           isPeerWaiting();
}

/// Null: it was not answered.
void SipEndpoint::takeBill(sip_t const* response)
{
    if (!m_isInCall)
        return;
    if (response != nullptr)
        takeCharge(response);
    leaveCall(SipCause::FROM_PROPERTY(dynamic_cast<CC_PropertyCause const*>(m_adapter.getPeerCauseProperty())));
}

/// What is overtaken by a newer charge is not sent.
void SipEndpoint::sendCharge()
{
    std::string const body = std::exchange(m_charge, {});
    trace("-> INFO with a charge");
    m_info = m_interface.getSender().send(m_leg, HANDLE_INFO_RESPONSE, this, SIP_METHOD_INFO, nullptr,
                                          SIPTAG_CONTENT_TYPE_STR(SipAdvice::TYPE), SIPTAG_PAYLOAD_STR(body.c_str()),
                                          TAG_END());
}
