#pragma once

#include "platform/signalling/QCause.h"
#include "properties/CC_PropertyCause.h"

#include <string>
#include <string_view>

/// Why a call ends, as the SIP side sees it: a Q.850 cause with the SIP status and the text that came with it. A plain
/// value; travels between the legs as a CC_PropertyCause.
///
///     SipCause const cause = SipCause::FROM_RESPONSE(486, "Busy Here", reasonHeader);
///     std::ignore = adapter.setOwnProperty(cause.getProperty());
///     ...
///     SipCause const why = SipCause::FROM_PROPERTY(peerCause);
///     nta_incoming_treply(irq, static_cast<int>(why.getFinalStatus()), ...);
struct SipCause
{
    QCause cause = QCause::NORMAL_CALL_CLEARING;
    unsigned int sipCode = 0; ///< 0: none
    std::string text;         ///< the peer's words; may be empty

    /// A final response of 300 and above: the cause of its Reason header, else that of its status.
    static SipCause FROM_RESPONSE(unsigned int status, std::string_view phrase, std::string_view reasonHeader);
    /// BYE or CANCEL: the causes of its Reason header; without one the call ends normally.
    static SipCause FROM_REQUEST(std::string_view reasonHeader);
    /// Null, or a property that carries neither cause nor code: normal clearing.
    static SipCause FROM_PROPERTY(CC_PropertyCause const* property);

    CC_PropertyCause getProperty() const;
    /// The final status, 400 to 699, with which an INVITE that ends for this reason is answered. A status that makes
    /// sense only between its sender and us (a challenge, a redirection) is replaced by that of the cause.
    unsigned int getFinalStatus() const;
    /// The value of the Reason header that tells it: the cause of Q.850, then, in a request (a response carries its own
    /// status), the SIP code.
    std::string getReasonHeader(bool isRequest) const;

    /// The two tables of RFC 3398, sections 7.2.4.1 and 8.2.6.1. An unlisted status counts as the x00 of its class, an
    /// unlisted cause as a failure of the server.
    static QCause CAUSE_OF_STATUS(unsigned int status);
    static unsigned int STATUS_OF_CAUSE(QCause cause);
};
