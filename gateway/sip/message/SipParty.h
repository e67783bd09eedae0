#pragma once

#include "platform/signalling/QNumberingPlan.h"
#include "platform/signalling/QPresentationIndicator.h"
#include "platform/signalling/QScreeningIndicator.h"
#include "platform/signalling/QTypeOfNumber.h"
#include "sip/message/SipNameAddr.h"

#include <string>
#include <string_view>

class CC_CallAdapterE164;
class CC_PropertyContainer;

/// A party as call control knows it: number, indicators and name. A plain value.
///
/// A user part "+" and up to 15 digits, with or without visual separators, is an international number of the ISDN plan,
/// kept as its digits alone; any other is kept as it stands, type and plan unknown. Parameters behind a number
/// ("+4989;phone-context=...") are left out.
struct SipParty
{
    std::string number; ///< empty: none
    QTypeOfNumber type = QTypeOfNumber::UNKNOWN;
    QNumberingPlan plan = QNumberingPlan::UNKNOWN;
    QPresentationIndicator presentation = QPresentationIndicator::ALLOWED;
    QScreeningIndicator screening = QScreeningIndicator::USER_PROVIDED_NOT_SCREENED;
    std::string name;

    /// Number and name of an address; no number for one that stands for "anonymous" or "not known".
    static SipParty OF(SipNameAddr const& address);
    static SipParty OF_USER(std::string_view user);
    /// Whom a request with that URI is for: a number, or the service of an emergency call in its place.
    static SipParty OF_URI(url_t const& uri);
    /// "+4989123" for an international number, any other as it is.
    std::string getUser() const;
    bool isRestricted() const { return presentation == QPresentationIndicator::RESTRICTED; }
    /// The network vouches for the number: it gave it or has verified it.
    bool isAsserted() const;
    /// For the trace: `"Alice" +4420 (Presentation allowed, Network provided)`.
    std::string getText() const;

    // --- as properties; without memory for one of them the call goes on without it
    void addTo(CC_PropertyContainer& properties) const;
    void addAsSecondTo(CC_PropertyContainer& properties) const; ///< the name apart
    static SipParty OF_OFFER(CC_PropertyContainer const& properties);
    static SipParty OF_PEER(CC_CallAdapterE164 const& adapter);
    static SipParty SECOND_OF_PEER(CC_CallAdapterE164 const& adapter);
};

/// The addresses of nobody (RFC 3323), with which a party withholds its number or has none.
bool IS_ANONYMOUS(SipNameAddr const& address);
inline constexpr char const* ANONYMOUS_NAME = "Anonymous";
inline constexpr char const* ANONYMOUS_URI = "sip:anonymous@anonymous.invalid";
inline constexpr char const* UNAVAILABLE_URI = "sip:unavailable@unknown.invalid";
