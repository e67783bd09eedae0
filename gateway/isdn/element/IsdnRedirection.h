#pragma once

#include "isdn/element/IsdnParty.h"
#include "platform/signalling/QReasonForRedirection.h"

/// How a call was redirected before it came here: the element Redirecting Number (Q.931, 4.6.7; EN 300 207-1, 7.2) and
/// what the diversion services tell beside it (DivertingLegInformation2 of EN 300 207-1). A plain value.
struct IsdnRedirection
{
    static constexpr int MOST = 100; ///< redirections; a count above is nonsense

    IsdnParty last;  ///< who redirected it here
    IsdnParty first; ///< whom the caller called
    QReasonForRedirection reason = QReasonForRedirection::UNSPECIFIED;
    QReasonForRedirection firstReason = QReasonForRedirection::UNSPECIFIED;
    int count = 0; ///< 0: it was not

    static IsdnRedirection OF(pri_party_redirecting const& redirecting);
    /// With its numbers as IsdnParty::normalised has them.
    IsdnRedirection normalised(DialPlan const& plan) const;
    static IsdnRedirection OF_PEER(CC_CallAdapterE164 const& adapter);
    pri_party_redirecting getRedirecting() const;
    /// Nothing when there is none.
    void addTo(CC_PropertyContainer& properties) const;

    /// The stack numbers deflection 3 where Q.931 says 4 (octet 3b), and so it puts 3 on the wire; the others are the
    /// standard's. @{
    static QReasonForRedirection REASON_OF(int reason);
    static int CODE_OF(QReasonForRedirection reason);
    /// @}

    friend bool operator==(IsdnRedirection const&, IsdnRedirection const&) = default;
};
