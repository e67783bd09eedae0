#pragma once

#include "sip/stack/Sofia.h"

#include <string>
#include <string_view>
#include <vector>

/// Header lines that cross the gateway from one SIP side of a call to the other, beyond what has a property of its own:
///
///     Alert-Info, Call-Info, Subject, Priority (RFC 3261), Session-ID (RFC 7989), Geolocation and Geolocation-Routing
///     (RFC 6442); among peers that are trusted P-Early-Media (RFC 5009) and P-Charging-Vector (RFC 7315) as well
///
/// and what an interface's configuration lists. Every other header stays on its side. Each side judges by itself: what
/// it lets in from its peer, and what it lets out of what the other side has let in. A peer that is not trusted gets of
/// a party that withholds who it is only lines which cannot tell that.
///
/// The text that crosses is whole lines, each with its line break, of at most MOST_LINES and MOST_OCTETS; a line that
/// is longer than LONGEST_LINE, or does not fit any more, is left out.
namespace SipCarriedHeaders
{
inline constexpr std::size_t MOST_LINES = 16;
inline constexpr std::size_t LONGEST_LINE = 1024; ///< octets, with its line break
inline constexpr std::size_t MOST_OCTETS = 4096;

/// Of an interface.
struct Rules
{
    std::vector<std::string> const& listed; ///< names of headers besides those above
    bool isTrusted;                         ///< its peers, in the sense of RFC 3325
};

enum Message
{
    REQUEST,
    RESPONSE
};

/// Of a message that was received; empty: none. Throws std::bad_alloc.
std::string READ(sip_t const* message, Rules const& rules);
/// What of `lines` goes into a message to the peer; what is no header line is left out. Throws std::bad_alloc.
std::string FOR_PEER(std::string_view lines, Rules const& rules, Message message, bool isRestricted);
/// Whether a configuration may list it: the name of a header that the gateway neither makes itself nor obeys, nor one
/// that says who somebody is, which is for properties alone.
bool IS_LISTABLE(std::string_view name);
} // namespace SipCarriedHeaders
