#include "isdn/element/IsdnRedirection.h"

#include "adapters/CC_CallAdapterE164.h"
#include "isdn/element/IsdnProperty.h"
#include "properties/CC_PropertyKeys.h"

#include <algorithm>
#include <iterator>

using namespace IsdnProperty;

namespace
{
using Reason = QReasonForRedirection;

struct Row
{
    int code;
    Reason reason;
};

// of several rows with one reason or code the first is taken
constexpr Row REASONS[] = {
    {PRI_REDIR_UNKNOWN, Reason::UNKNOWN},
    {PRI_REDIR_FORWARD_ON_BUSY, Reason::FORWARDING_BUSY},
    {PRI_REDIR_FORWARD_ON_NO_REPLY, Reason::FORWARDING_NO_REPLY},
    {PRI_REDIR_DEFLECTION, Reason::CALL_DEFLECTION},
    {4, Reason::CALL_DEFLECTION}, // Q.931
    {PRI_REDIR_DTE_OUT_OF_ORDER, Reason::OUT_OF_ORDER},
    {PRI_REDIR_FORWARDED_BY_DTE, Reason::FORWARDING_BY_CALLED},
    {PRI_REDIR_UNCONDITIONAL, Reason::FORWARDING_UNCONDITIONAL},
};

IsdnParty PARTY_OF(String const& number, String const& name)
{
    IsdnParty party = IsdnParty::OF_TEXT(number.view());
    party.name = name.view();
    return party;
}
} // namespace

QReasonForRedirection IsdnRedirection::REASON_OF(int reason)
{
    auto const* const row =
        std::find_if(std::begin(REASONS), std::end(REASONS), [&](Row const& one) { return one.code == reason; });
    return row != std::end(REASONS) ? row->reason : Reason::UNKNOWN;
}

int IsdnRedirection::CODE_OF(QReasonForRedirection reason)
{
    auto const* const row =
        std::find_if(std::begin(REASONS), std::end(REASONS), [&](Row const& one) { return one.reason == reason; });
    return row != std::end(REASONS) ? row->code : PRI_REDIR_UNKNOWN;
}

IsdnRedirection IsdnRedirection::OF(pri_party_redirecting const& redirecting)
{
    IsdnRedirection result;
    bool const isRedirected = redirecting.count > 0 || redirecting.from.number.valid != 0;
    if (!isRedirected)
        return result;
    result.last = IsdnParty::OF(redirecting.from);
    result.reason = REASON_OF(redirecting.reason);
    bool const hasFirst = redirecting.orig_called.number.valid != 0;
    result.first = hasFirst ? IsdnParty::OF(redirecting.orig_called) : result.last;
    result.firstReason = hasFirst ? REASON_OF(redirecting.orig_reason) : result.reason;
    result.count = std::clamp(redirecting.count, 1, MOST);
    return result;
}

IsdnRedirection IsdnRedirection::normalised(DialPlan const& plan) const
{
    IsdnRedirection redirection = *this;
    redirection.last = last.normalised(plan);
    redirection.first = first.normalised(plan);
    return redirection;
}

IsdnRedirection IsdnRedirection::OF_PEER(CC_CallAdapterE164 const& adapter)
{
    IsdnRedirection result;
    result.count = static_cast<int>(std::min<unsigned long long>(adapter.getPeerRedirectingCounter(), MOST));
    bool const isRedirected = result.count > 0 || !adapter.getPeerRedirectingE164().isEmpty();
    if (!isRedirected)
        return result;
    result.count = std::max(result.count, 1);
    result.last = PARTY_OF(adapter.getPeerRedirectingE164(), adapter.getPeerRedirectingName());
    result.first = PARTY_OF(adapter.getPeerRedirectingFirstE164(), adapter.getPeerRedirectingFirstName());
    result.reason = adapter.getPeerRedirectingReason();
    result.firstReason = adapter.getPeerRedirectingFirstReason();
    for (IsdnParty* const party : {&result.last, &result.first})
    {
        party->presentation = adapter.getPeerDiversionPresentationIndicator();
        party->screening = adapter.getPeerDiversionScreeningIndicator();
    }
    return result;
}

pri_party_redirecting IsdnRedirection::getRedirecting() const
{
    pri_party_redirecting redirecting = {};
    redirecting.from = last.getId();
    redirecting.reason = CODE_OF(reason);
    redirecting.count = count;
    if (count > 1)
    {
        redirecting.orig_called = first.getId();
        redirecting.orig_reason = CODE_OF(firstReason);
    }
    return redirecting;
}

void IsdnRedirection::addTo(CC_PropertyContainer& properties) const
{
    using namespace CC_PropertyId;
    if (count == 0)
        return;
    ADD_TEXT(properties, REDIRECTING_E164_NUMBER, last.getText());
    ADD_TEXT(properties, REDIRECTING_NAME, last.name);
    ADD(properties, CC_PropertyRedirectingReason(REDIRECTING_REASON, reason));
    ADD_TEXT(properties, REDIRECTING_FIRST_E164_NUMBER, first.getText());
    ADD_TEXT(properties, REDIRECTING_FIRST_NAME, first.name);
    ADD(properties, CC_PropertyRedirectingReason(REDIRECTING_FIRST_REASON, firstReason));
    ADD(properties, CC_PropertyUnsigned(REDIRECTING_COUNTER, static_cast<unsigned int>(count)));
    ADD(properties, CC_PropertyPresentationIndicator(DIVERSION_PRESENTATION_INDICATOR, last.presentation));
    ADD(properties, CC_PropertyScreeningIndicator(DIVERSION_SCREENING_INDICATOR, last.screening));
}
