// What the call costs (3GPP TS 24.647): told in INFO while it is up and in BYE, as the property Charge on the leg.
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyId.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipCharge.h"

#include <spdlog/spdlog.h>

#include <tuple>
#include <utility>

/// Whether the body was one; its charge is the other side's to tell.
bool SipEndpoint::takeCharge(sip_t const* request)
{
    bool const isCharge = request->sip_payload != nullptr && request->sip_content_type != nullptr &&
                          SipCharge::IS_TYPE(request->sip_content_type->c_type);
    if (!isCharge || m_interface.getConfiguration().charges != SipConfiguration::Charges::TAKE)
        return true;
    std::optional<SipCharge::Charge> const charge = SipCharge::READ(SipBody::PAYLOAD_OF(request));
    trace(charge ? "<- " + TEXT_OF(CC_PropertyCharge(CC_PropertyId::CHARGE, *charge)) : "<- a charge that is none");
    if (charge && m_isInCall)
        std::ignore = m_adapter.setOwnCharge(*charge); // without memory the next one may fit
    if (!charge)
        spdlog::info("call {} {}: the peer's charge cannot be read", m_callNumber, getName().view());
    return charge.has_value();
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

/// The final one waits for the BYE.
void SipEndpoint::followCharge(CC_Flags const& flags)
{
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

/// What is overtaken by a newer charge is not sent.
void SipEndpoint::sendCharge()
{
    std::string const body = std::exchange(m_charge, {});
    trace("-> INFO with a charge");
    m_info = m_interface.getSender().send(m_leg, HANDLE_INFO_RESPONSE, this, SIP_METHOD_INFO, nullptr,
                                          SIPTAG_CONTENT_TYPE_STR(SipCharge::TYPE), SIPTAG_PAYLOAD_STR(body.c_str()),
                                          TAG_END());
}
