#include "sip/message/SipRedirection.h"

#include "sip/message/SipParty.h"
#include "sip/message/SipPrivacy.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"
#include "sip/message/SipReason.h"
#include "sip/message/SipText.h"

#include <cstdlib>
#include <new>

namespace
{
constexpr unsigned int MULTIPLE_CHOICES = 300;
constexpr unsigned int MOVED_TEMPORARILY = 302;
constexpr std::size_t LONGEST_NUMBER = 128;

using Content = CC_PropertyParametrizedString::ParametrizedString;

SipNameAddr CONTACT_OF(sip_contact_t const& contact)
{
    return SipNameAddr::OF(contact.m_display, *contact.m_url, contact.m_params);
}

double LIKING_OF(sip_contact_t const& contact)
{
    return contact.m_q != nullptr ? std::strtod(contact.m_q, nullptr) : 1;
}

/// Null: none has a number.
sip_contact_t const* BEST_OF(sip_contact_t const* contacts)
{
    sip_contact_t const* best = nullptr;
    for (; contacts != nullptr; contacts = contacts->m_next)
        if (!SipParty::OF(CONTACT_OF(*contacts)).number.empty() &&
            (best == nullptr || LIKING_OF(*contacts) > LIKING_OF(*best)))
            best = contacts;
    return best;
}

QReasonForRedirection REASON_OF(sip_t const* response, SipNameAddr const& contact, bool hasRung)
{
    using Reason = QReasonForRedirection;
    unsigned int const cause = SipText::NUMBER(contact.getUriParameter("cause"), 100, 699);
    if (Reason const reason = SipDiversion::REASON_OF_CAUSE(cause); reason != Reason::UNSPECIFIED)
        return reason;
    if (std::vector<SipNameAddr> const diversions = SipNameAddr::READ(response, "Diversion"); !diversions.empty())
        return SipDiversion::REASON_OF_TEXT(diversions.front().getParameter("reason"));
    return hasRung ? Reason::CALL_DEFLECTION : Reason::FORWARDING_UNCONDITIONAL;
}

void ADD_PARAMETER(Content& content, char const* key, std::string const& value)
{
    if (!content.parameters.append({key, SipProperty::STRING(value)}).isOk())
        throw std::bad_alloc();
}

std::string PARAMETER(Content const& content, char const* key) { return std::string(content.getParameter(key).view()); }
} // namespace

std::optional<SipRedirection> SipRedirection::READ(sip_t const* response, bool hasRung)
{
    auto const status = static_cast<unsigned int>(response->sip_status->st_status);
    sip_contact_t const* const contact = BEST_OF(response->sip_contact);
    if (status < MULTIPLE_CHOICES || status > MOVED_TEMPORARILY || contact == nullptr)
        return std::nullopt;
    SipNameAddr const address = CONTACT_OF(*contact);
    SipRedirection redirection;
    redirection.number = SipParty::OF(address).getUser();
    if (redirection.number.size() > LONGEST_NUMBER)
        return std::nullopt;
    redirection.from.reason = REASON_OF(response, address, hasRung);
    redirection.isWithheld = SipPrivacy::RESTRICTS_SENDER(response) || SipPrivacy::RESTRICTS_HISTORY(response);
    return redirection;
}

CC_PropertyParametrizedString SipRedirection::getProperty() const
{
    Content content(SipProperty::STRING(number));
    ADD_PARAMETER(content, "by", from.number);
    ADD_PARAMETER(content, "cause", std::to_string(SipDiversion::CAUSE_OF_REASON(from.reason)));
    ADD_PARAMETER(content, "withheld", isWithheld ? "yes" : "no");
    ADD_PARAMETER(content, "handed-on", isHandedOn ? "yes" : "no");
    ADD_PARAMETER(content, "interface", interface);
    return {SipPropertyId::REDIRECTION, content};
}

SipRedirection SipRedirection::OF(Content const& content)
{
    SipRedirection redirection;
    redirection.number = content.content.view();
    redirection.from.number = PARAMETER(content, "by");
    redirection.from.reason = SipDiversion::REASON_OF_CAUSE(SipText::NUMBER(PARAMETER(content, "cause"), 100, 699));
    redirection.isWithheld = PARAMETER(content, "withheld") != "no";
    redirection.isHandedOn = PARAMETER(content, "handed-on") == "yes";
    redirection.interface = PARAMETER(content, "interface");
    return redirection;
}
