#include "sip/message/SipDiversion.h"

#include "adapters/CC_CallAdapterE164.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyPresentationIndicator.h"
#include "properties/CC_PropertyRedirectingReason.h"
#include "properties/CC_PropertyScreeningIndicator.h"
#include "properties/CC_PropertyUnsigned.h"
#include "sip/message/SipAddress.h"
#include "sip/message/SipParty.h"
#include "sip/message/SipPrivacy.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipReason.h"
#include "sip/message/SipText.h"

#include <algorithm>
#include <vector>

using namespace SipProperty;

namespace
{
using SipText::IS_ONE_OF;
using Reason = QReasonForRedirection;
using Redirection = SipDiversion::Redirection;

struct ReasonRow
{
    Reason reason;
    unsigned int cause;
    char const* text;
};

// of several rows with one reason, cause or text the first is taken
constexpr ReasonRow REASONS[] = {
    {Reason::UNKNOWN, 404, "unknown"},
    {Reason::FORWARDING_BUSY, 486, "user-busy"},
    {Reason::FORWARDING_NO_REPLY, 408, "no-answer"},
    {Reason::FORWARDING_UNCONDITIONAL, 302, "unconditional"},
    {Reason::CALL_DEFLECTION, 480, "deflection"}, // at once
    {Reason::CALL_DEFLECTION, 487, "deflection"}, // while alerting
    {Reason::OUT_OF_ORDER, 503, "out-of-service"},
    {Reason::OUT_OF_ORDER, 503, "unavailable"},
};

constexpr unsigned int MOST_REDIRECTIONS = 100; // a counter above is nonsense, nor do we send one

template <class Matches>
ReasonRow const* FIND(Matches matches)
{
    auto const* const found = std::find_if(std::begin(REASONS), std::end(REASONS), matches);
    return found != std::end(REASONS) ? found : nullptr;
}

/// Whatever asks for privacy withholds, also for the name alone and in words that we do not know.
bool IS_WITHHELD(SipNameAddr const& address)
{
    return IS_ANONYMOUS(address) || !IS_ONE_OF(address.getParameter("privacy"), {"", "off"}) ||
           !IS_ONE_OF(address.getUriHeader("Privacy"), {"", "none"});
}

Redirection REDIRECTION_BY(SipNameAddr const& address, Reason reason)
{
    SipParty const party = SipParty::OF(address);
    return {party.getUser(), party.name, reason};
}

SipDiversion READ_DIVERSION(sip_t const* invite)
{
    SipDiversion diversion;
    std::vector<SipNameAddr> const addresses = SipNameAddr::READ(invite, "Diversion");
    for (auto address = addresses.rbegin(); address != addresses.rend(); ++address) // the latest stands first
        diversion.add(REDIRECTION_BY(*address, SipDiversion::REASON_OF_TEXT(address->getParameter("reason"))),
                      std::max(1u, SipText::NUMBER(address->getParameter("counter"), 1, MOST_REDIRECTIONS)),
                      IS_WITHHELD(*address));
    if (!addresses.empty() && IS_ONE_OF(addresses.front().getParameter("screen"), {"yes"}))
        diversion.screening = QScreeningIndicator::USER_PROVIDED_PASSED;
    return diversion;
}

/// Why the call went on from an address of History-Info to the next; UNSPECIFIED if it was not redirected.
Reason REASON_BETWEEN(SipNameAddr const& from, SipNameAddr const& to)
{
    unsigned int const cause = SipText::NUMBER(to.getUriParameter("cause"), 100, 699);
    return SipDiversion::REASON_OF_CAUSE(cause != 0 ? cause : SipReason::PARSE(from.getUriHeader("Reason")).sipCode);
}

SipDiversion READ_HISTORY(sip_t const* invite)
{
    SipDiversion history;
    bool const isPrivate = SipPrivacy::RESTRICTS_HISTORY(invite);
    std::vector<SipNameAddr> const addresses = SipNameAddr::READ(invite, "History-Info");
    for (std::size_t i = 0; i + 1 < addresses.size(); ++i)
        if (Reason const reason = REASON_BETWEEN(addresses[i], addresses[i + 1]); reason != Reason::UNSPECIFIED)
            history.add(REDIRECTION_BY(addresses[i], reason), 1, isPrivate || IS_WITHHELD(addresses[i]));
    return history;
}

std::string URI_OF(Redirection const& redirection, SocketAddress const& own)
{
    return redirection.number.empty() ? UNAVAILABLE_URI : SipAddress::MAKE_URI(redirection.number, own, SipWay::UDP);
}

/// For the URI of the address to which the call went on.
std::string CAUSE_BY(Redirection const& redirection)
{
    return ";cause=" + std::to_string(SipDiversion::CAUSE_OF_REASON(redirection.reason));
}
} // namespace

QReasonForRedirection SipDiversion::REASON_OF_CAUSE(unsigned int cause)
{
    ReasonRow const* const row = FIND([&](ReasonRow const& candidate) { return candidate.cause == cause; });
    return row != nullptr ? row->reason : Reason::UNSPECIFIED;
}

QReasonForRedirection SipDiversion::REASON_OF_TEXT(std::string_view text)
{
    ReasonRow const* const row = FIND([&](ReasonRow const& candidate) { return IS_ONE_OF(text, {candidate.text}); });
    return row != nullptr ? row->reason : Reason::UNKNOWN;
}

unsigned int SipDiversion::CAUSE_OF_REASON(QReasonForRedirection reason)
{
    ReasonRow const* const row = FIND([&](ReasonRow const& candidate) { return candidate.reason == reason; });
    return row != nullptr ? row->cause : CAUSE_OF_REASON(Reason::UNKNOWN);
}

char const* SipDiversion::TEXT_OF_REASON(QReasonForRedirection reason)
{
    ReasonRow const* const row = FIND([&](ReasonRow const& candidate) { return candidate.reason == reason; });
    return row != nullptr ? row->text : TEXT_OF_REASON(Reason::UNKNOWN);
}

SipDiversion SipDiversion::READ(sip_t const* invite)
{
    SipDiversion diversion = READ_DIVERSION(invite);
    if (SipDiversion history = READ_HISTORY(invite); history.count > 0)
    {
        history.count = std::max(history.count, diversion.count);
        history.screening = diversion.screening;
        if (diversion.isRestricted())
            history.presentation = diversion.presentation;
        diversion = history;
    }
    return diversion;
}

void SipDiversion::add(Redirection const& next, unsigned int times, bool isWithheld)
{
    if (count == 0)
        first = next;
    last = next;
    count = std::min(count + times, MOST_REDIRECTIONS);
    if (isWithheld)
        presentation = QPresentationIndicator::RESTRICTED;
}

std::string SipDiversion::getHeaders(SocketAddress const& own, std::string const& calledUri) const
{
    if (count == 0)
        return {};
    std::string diversion = getDiversion(last, 1, own);
    std::string history = getHistory(count == 1 ? last : first, {}, own) + ";index=1, ";
    if (count > 1)
    {
        diversion += ", " + getDiversion(first, count - 1, own);
        history += getHistory(last, CAUSE_BY(first), own) + ";index=1.1, ";
    }
    history += "<" + calledUri + CAUSE_BY(last) + ">;index=" + (count == 1 ? "1.1" : "1.1.1");
    return "Diversion: " + diversion + "\r\nHistory-Info: " + history + "\r\n";
}

std::string SipDiversion::getDiversion(Redirection const& redirection, unsigned int counter,
                                       SocketAddress const& own) const
{
    bool const isScreened =
        screening == QScreeningIndicator::USER_PROVIDED_PASSED || screening == QScreeningIndicator::NETWORK_PROVIDED;
    return SipAddress::MAKE_NAME_ADDR(redirection.name, URI_OF(redirection, own)) +
           ";reason=" + TEXT_OF_REASON(redirection.reason) + ";counter=" + std::to_string(counter) +
           ";privacy=" + (isRestricted() ? "full" : "off") + ";screen=" + (isScreened ? "yes" : "no");
}

std::string SipDiversion::getHistory(Redirection const& redirection, std::string const& cause,
                                     SocketAddress const& own) const
{
    return SipAddress::MAKE_NAME_ADDR(redirection.name,
                                      URI_OF(redirection, own) + cause + (isRestricted() ? "?Privacy=history" : ""));
}

void SipDiversion::addTo(CC_PropertyContainer& properties) const
{
    using namespace CC_PropertyId;
    if (count == 0)
        return;
    ADD_TEXT(properties, REDIRECTING_E164_NUMBER, last.number);
    ADD_TEXT(properties, REDIRECTING_NAME, last.name);
    ADD(properties, CC_PropertyRedirectingReason(REDIRECTING_REASON, last.reason));
    ADD_TEXT(properties, REDIRECTING_FIRST_E164_NUMBER, first.number);
    ADD_TEXT(properties, REDIRECTING_FIRST_NAME, first.name);
    ADD(properties, CC_PropertyRedirectingReason(REDIRECTING_FIRST_REASON, first.reason));
    ADD(properties, CC_PropertyUnsigned(REDIRECTING_COUNTER, count));
    ADD(properties, CC_PropertyPresentationIndicator(DIVERSION_PRESENTATION_INDICATOR, presentation));
    ADD(properties, CC_PropertyScreeningIndicator(DIVERSION_SCREENING_INDICATOR, screening));
}

SipDiversion SipDiversion::OF_PEER(CC_CallAdapterE164 const& adapter)
{
    SipDiversion diversion;
    diversion.last = {TEXT_OF(adapter.getPeerRedirectingE164()), TEXT_OF(adapter.getPeerRedirectingName()),
                      adapter.getPeerRedirectingReason()};
    diversion.first = {TEXT_OF(adapter.getPeerRedirectingFirstE164()), TEXT_OF(adapter.getPeerRedirectingFirstName()),
                       adapter.getPeerRedirectingFirstReason()};
    diversion.presentation = adapter.getPeerDiversionPresentationIndicator();
    diversion.screening = adapter.getPeerDiversionScreeningIndicator();
    // a module that counts nothing but names a number has redirected once
    unsigned long long const least = diversion.last.number.empty() ? 0 : 1;
    diversion.count = static_cast<unsigned int>(
        std::clamp<unsigned long long>(adapter.getPeerRedirectingCounter(), least, MOST_REDIRECTIONS));
    return diversion;
}
