// Digits that are keyed in during the call: INFO on the wire, or what the media tell; user input on the leg.
#include "services/CC_ServiceUserInput.h"
#include "sip/endpoint/SipEndpoint.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipAdvice.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipDigits.h"
#include "sip/message/SipProperty.h"

#include <utility>

using namespace SipProperty;

namespace
{
constexpr std::size_t MOST_WAITING = 64; // digits that our peer has not taken yet
}

int SipEndpoint::onInfo(nta_incoming_t* transaction, sip_t const* request)
{
    if (!m_isInCall)
        return 481;
    if (request->sip_payload == nullptr || request->sip_content_type == nullptr)
        return 200; // asks whether we are here
    char const* const type = request->sip_content_type->c_type;
    if (SipAdvice::IS_TYPE(type) && m_interface.getConfiguration().charges == SipConfiguration::Charges::TAKE)
        return onChargeInfo(transaction, request);
    if (!SipDigits::IS_TYPE(type))
    {
        nta_incoming_treply(transaction, SIP_415_UNSUPPORTED_MEDIA,
                            SIPTAG_ACCEPT_STR("application/dtmf-relay, application/dtmf"), TAG_END());
        return 415;
    }
    std::optional<SipDigits> const digits = SipDigits::READ(type, SipBody::PAYLOAD_OF(request));
    if (!digits)
        return 400;
    trace("<- INFO " + digits->digits + ", -> 200");
    CC_ServiceUserInput input(STRING(digits->digits), digits->duration);
    m_adapter.invokeSynchronousService(input);
    return 200;
}

void SipEndpoint::onDigit(char digit, unsigned int milliseconds)
{
    handle(
        [&]
        {
            trace(std::string("heard digit ") + digit);
            CC_ServiceUserInput input(STRING(std::string(1, digit)), milliseconds);
            m_adapter.invokeSynchronousService(input);
        });
}

/// One after the other, for INFOs may overtake each other.
void SipEndpoint::onUserInput(CC_ServiceUserInput const& input)
{
    if (takeDigits(input))
        return;
    for (char const digit : input.getInput().view())
        if (!m_session.sendDigit(digit, input.getDuration()) && m_digits.size() < MOST_WAITING)
            m_digits.emplace_back(digit, input.getDuration());
    sendInfo();
}

void SipEndpoint::sendInfo()
{
    if (m_info != nullptr || m_dialog != SipDialogState::UP)
        return;
    if (!m_digits.empty())
        sendDigit();
    else if (!m_charge.empty())
        sendCharge();
}

void SipEndpoint::sendDigit()
{
    auto const [digit, duration] = m_digits.front();
    m_digits.erase(m_digits.begin());
    trace(std::string("-> INFO ") + digit);
    std::string const body = SipDigits::WRITE(digit, duration);
    m_info = m_interface.getSender().send(m_leg, HANDLE_INFO_RESPONSE, this, SIP_METHOD_INFO, nullptr,
                                          SIPTAG_CONTENT_TYPE_STR("application/dtmf-relay"),
                                          SIPTAG_PAYLOAD_STR(body.c_str()), TAG_END());
}

int SipEndpoint::HANDLE_INFO_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response)
{
    int const status = response != nullptr ? response->sip_status->st_status : nta_outgoing_status(transaction);
    if (status < 200)
        return 0;
    if (endpoint->authenticate(endpoint->m_info, response, endpoint->m_leg, HANDLE_INFO_RESPONSE))
        return 0;
    nta_outgoing_destroy(std::exchange(endpoint->m_info, nullptr));
    if (status >= 300)
        endpoint->m_digits.clear(); // it takes none
    endpoint->handle([&] { endpoint->sendInfo(); });
    return 0;
}
