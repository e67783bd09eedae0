#pragma once

#include "configuration/DialPlan.h"
#include "configuration/SocketAddress.h"
#include "sip/message/SipParty.h"

#include <optional>
#include <string>

/// Who calls, who is called and who answered: SIP headers to parties, and back.
///
/// The rules are those by which ISUP and SIP interwork (RFC 3398, Q.1912.5). A peer is trusted in the sense of RFC 3325
/// or not: of one that is not P-Asserted-Identity counts as absent, and it gets none of a restricted number.
///
/// - P-Asserted-Identity wins over From and is network-provided, of several addresses the first with an international
///   number. From alone is user-provided, not screened. From beside an asserted number that is another is the second
///   number.
/// - Privacy id, user or header restricts the presentation, and so does an anonymous From unless Privacy is "none". A
///   caller without a number that restricts nothing has its number not available.
/// - Only a number for which the network vouches is asserted to the other side. A restricted one is nowhere else: From
///   is then anonymous.
///
/// What is malformed counts as absent, but a malformed Privacy as id: a number shown by mistake cannot be taken back.
struct SipIdentity
{
    SipParty party;
    SipParty second; ///< no number: there is none

    static SipIdentity READ_CALLER(sip_t const* invite, bool isTrusted = true);
    /// Numbers that came with a prefix become international ones.
    void normalise(DialPlan const& plan);
    /// The number of the Request-URI, or the whole of one that is a service's (RFC 5031); the name of To.
    static SipParty READ_CALLED(sip_t const* invite);
    /// Who is at the other end, by P-Asserted-Identity of a response, with the name of To for want of another; nothing
    /// when nobody is asserted.
    static std::optional<SipParty> READ_CONNECTED(sip_t const* response, bool isTrusted = true);
    /// The name of To; may be empty.
    static std::string READ_NAME_OF_TO(sip_t const* message);

    /// A From for the caller, as a name and an address of ours.
    std::string getFrom(SocketAddress const& own) const;
    /// The lines P-Asserted-Identity and Privacy, as far as there is something to tell, each with its line break.
    static std::string GET_ASSERTED(SipParty const& party, SocketAddress const& own, bool isTrusted = true);
};
