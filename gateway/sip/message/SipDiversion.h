#pragma once

#include "configuration/SocketAddress.h"
#include "platform/signalling/QPresentationIndicator.h"
#include "platform/signalling/QReasonForRedirection.h"
#include "platform/signalling/QScreeningIndicator.h"
#include "sip/stack/Sofia.h"

#include <string>
#include <string_view>

class CC_CallAdapterE164;
class CC_PropertyContainer;

/// Who redirected a call before it came here, and why: the headers Diversion (RFC 5806) and History-Info (RFC 7044)
/// to redirecting properties, and back. A plain value.
///
/// Call control knows the first and the last redirection, how many there were (up to 100 count), and one indicator for
/// all: those between are lost, and one that is withheld, be it the name alone, withholds all. It has no type for these
/// numbers, so an international one keeps its "+".
///
/// In History-Info an address was redirected if the cause (RFC 4458) in the URI of the next, or the Reason in its own
/// URI, is one of the table below. Where both headers are there, History-Info says who and why, if it tells of a
/// redirection at all, and the higher of the two numbers counts. What is malformed counts as absent.
struct SipDiversion
{
    struct Redirection
    {
        std::string number; ///< may be withheld: empty
        std::string name;
        QReasonForRedirection reason = QReasonForRedirection::UNKNOWN;
    };

    unsigned int count = 0;
    Redirection first; ///< by the number that the caller wanted
    Redirection last;  ///< the same when there was but one
    QPresentationIndicator presentation = QPresentationIndicator::ALLOWED;
    QScreeningIndicator screening = QScreeningIndicator::USER_PROVIDED_NOT_SCREENED;

    static SipDiversion READ(sip_t const* invite);
    bool isRestricted() const { return presentation == QPresentationIndicator::RESTRICTED; }
    /// The one after those so far, and how many it stands for.
    void add(Redirection const& next, unsigned int times, bool isWithheld);
    /// The lines Diversion and History-Info, each with its line break, for an INVITE to `calledUri`; empty when the
    /// call was not redirected.
    std::string getHeaders(SocketAddress const& own, std::string const& calledUri) const;

    // --- as properties; without memory for one of them the call goes on without it
    void addTo(CC_PropertyContainer& properties) const;
    static SipDiversion OF_PEER(CC_CallAdapterE164 const& adapter);

    /// Of RFC 4458 and RFC 5806, one row a reason; what they tell apart and Q.931 does not shares a reason. Unlisted:
    /// UNSPECIFIED for a cause, UNKNOWN for a text.
    static QReasonForRedirection REASON_OF_CAUSE(unsigned int cause);
    static QReasonForRedirection REASON_OF_TEXT(std::string_view text);
    static unsigned int CAUSE_OF_REASON(QReasonForRedirection reason);
    static char const* TEXT_OF_REASON(QReasonForRedirection reason);

private:
    std::string getDiversion(Redirection const& redirection, unsigned int counter, SocketAddress const& own) const;
    std::string getHistory(Redirection const& redirection, std::string const& cause, SocketAddress const& own) const;
};
