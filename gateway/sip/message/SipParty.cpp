#include "sip/message/SipParty.h"

#include "adapters/CC_CallAdapterE164.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyNumberingPlan.h"
#include "properties/CC_PropertyPresentationIndicator.h"
#include "properties/CC_PropertyScreeningIndicator.h"
#include "properties/CC_PropertyTypeOfNumber.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipService.h"
#include "sip/message/SipText.h"

using namespace SipProperty;

namespace
{
constexpr std::size_t LONGEST_E164 = 15; // digits
constexpr std::string_view DIGITS = "0123456789";
constexpr std::string_view SEPARATORS = "-.()";

bool HAS_ONLY(std::string_view text, std::string_view allowed)
{
    return text.find_first_not_of(allowed) == std::string_view::npos;
}

/// The digits of "+49-89 ...", empty for all else.
std::string INTERNATIONAL_DIGITS(std::string_view number)
{
    if (!number.starts_with('+'))
        return {};
    std::string digits(number.substr(1));
    std::erase_if(digits, [](char c) { return SEPARATORS.find(c) != std::string_view::npos; });
    return HAS_ONLY(digits, DIGITS) && digits.size() <= LONGEST_E164 ? digits : std::string();
}

/// Without the parameters that may follow a number in a user part, but not a name.
std::string_view WITHOUT_PARAMETERS(std::string_view user)
{
    std::string_view const number = user.substr(0, user.find(';'));
    bool const isNumber = HAS_ONLY(number, "+*#0123456789-.()") && !number.empty();
    return isNumber ? number : user;
}

bool IS_UNAVAILABLE(SipNameAddr const& address)
{
    return SipText::EQUALS_IGNORING_CASE(address.user, "unavailable") ||
           SipText::EQUALS_IGNORING_CASE(address.host, "unknown.invalid");
}

template <class Property>
auto VALUE_OF(CC_PropertyContainer const& properties, unsigned int id)
{
    auto const* const property = dynamic_cast<Property const*>(properties.get(id));
    return property != nullptr ? property->getValue() : Property(id).getValue();
}
} // namespace

bool IS_ANONYMOUS(SipNameAddr const& address)
{
    return SipText::EQUALS_IGNORING_CASE(address.user, "anonymous") ||
           SipText::EQUALS_IGNORING_CASE(address.host, "anonymous.invalid");
}

SipParty SipParty::OF(SipNameAddr const& address)
{
    if (IS_ANONYMOUS(address))
        return {}; // its name is none either
    SipParty party = OF_USER(IS_UNAVAILABLE(address) ? std::string_view() : address.user);
    party.name = address.name;
    return party;
}

SipParty SipParty::OF_USER(std::string_view user)
{
    SipParty party;
    std::string_view const number = WITHOUT_PARAMETERS(user);
    party.number = INTERNATIONAL_DIGITS(number);
    if (party.number.empty())
    {
        party.number = number;
        return party;
    }
    party.type = QTypeOfNumber::INTERNATIONAL;
    party.plan = QNumberingPlan::ISDN;
    return party;
}

SipParty SipParty::OF_URI(url_t const& uri)
{
    std::string const service = SipService::READ(uri);
    return OF_USER(service.empty() ? SipNameAddr::OF(nullptr, uri, nullptr).user : service);
}

std::string SipParty::getUser() const
{
    bool const needsPlus = type == QTypeOfNumber::INTERNATIONAL && !number.empty() && number.front() != '+';
    return (needsPlus ? "+" : "") + number;
}

bool SipParty::isAsserted() const
{
    return screening == QScreeningIndicator::NETWORK_PROVIDED || screening == QScreeningIndicator::USER_PROVIDED_PASSED;
}

std::string SipParty::getText() const
{
    return (name.empty() ? "" : "\"" + name + "\" ") + getUser() + (number.empty() ? "(" : " (") +
           QPRESENTATION_INDICATOR_NAME(presentation) + ", " + QSCREENING_INDICATOR_NAME(screening) + ")";
}

void SipParty::addTo(CC_PropertyContainer& properties) const
{
    using namespace CC_PropertyId;
    ADD_TEXT(properties, E164_NUMBER, number);
    ADD(properties, CC_PropertyTypeOfNumber(TYPE_OF_NUMBER, type));
    ADD(properties, CC_PropertyNumberingPlan(NUMBERING_PLAN, plan));
    ADD(properties, CC_PropertyPresentationIndicator(PRESENTATION_INDICATOR, presentation));
    ADD(properties, CC_PropertyScreeningIndicator(SCREENING_INDICATOR, screening));
    ADD_TEXT(properties, NAME, name);
}

void SipParty::addAsSecondTo(CC_PropertyContainer& properties) const
{
    using namespace CC_PropertyId;
    ADD_TEXT(properties, SECOND_E164_NUMBER, number);
    ADD(properties, CC_PropertyTypeOfNumber(SECOND_TYPE_OF_NUMBER, type));
    ADD(properties, CC_PropertyNumberingPlan(SECOND_NUMBERING_PLAN, plan));
    ADD(properties, CC_PropertyPresentationIndicator(SECOND_PRESENTATION_INDICATOR, presentation));
    ADD(properties, CC_PropertyScreeningIndicator(SECOND_SCREENING_INDICATOR, screening));
}

SipParty SipParty::OF_OFFER(CC_PropertyContainer const& properties)
{
    SipParty party;
    party.number = TEXT_OF(VALUE_OF<CC_PropertyString>(properties, CC_PropertyId::E164_NUMBER));
    party.type = VALUE_OF<CC_PropertyTypeOfNumber>(properties, CC_PropertyId::TYPE_OF_NUMBER);
    party.plan = VALUE_OF<CC_PropertyNumberingPlan>(properties, CC_PropertyId::NUMBERING_PLAN);
    party.name = TEXT_OF(VALUE_OF<CC_PropertyString>(properties, CC_PropertyId::NAME));
    return party;
}

SipParty SipParty::OF_PEER(CC_CallAdapterE164 const& adapter)
{
    SipParty party;
    party.number = TEXT_OF(adapter.getPeerE164());
    party.type = adapter.getPeerTypeOfNumber();
    party.plan = adapter.getPeerNumberingPlan();
    party.presentation = adapter.getPeerPresentationIndicator(QPresentationIndicator::ALLOWED);
    party.screening = adapter.getPeerScreeningIndicator(QScreeningIndicator::USER_PROVIDED_NOT_SCREENED);
    party.name = TEXT_OF(adapter.getPeerName());
    return party;
}

SipParty SipParty::SECOND_OF_PEER(CC_CallAdapterE164 const& adapter)
{
    SipParty party;
    party.number = TEXT_OF(adapter.getPeerSecondE164());
    party.type = adapter.getPeerSecondTypeOfNumber();
    party.plan = adapter.getPeerSecondNumberingPlan();
    party.presentation = adapter.getPeerSecondPresentationIndicator(QPresentationIndicator::ALLOWED);
    party.screening = adapter.getPeerSecondScreeningIndicator(QScreeningIndicator::USER_PROVIDED_NOT_SCREENED);
    return party;
}
