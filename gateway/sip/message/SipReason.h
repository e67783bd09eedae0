#pragma once

#include <string>
#include <string_view>

/// What the Reason header (RFC 3326) of one message says, of the two protocols that a gateway knows. A plain value.
///
///     SipReason const reason = SipReason::PARSE("SIP;cause=200;text=\"Call completed elsewhere\", Q.850;cause=16");
///     reason.q850Cause; // 16
struct SipReason
{
    unsigned int q850Cause = 0; ///< 1 to 127; 0: none was given
    unsigned int sipCode = 0;   ///< 100 to 699; 0: none was given
    std::string text;           ///< of the first value that has one, unescaped

    /// Reads a header's value, which may hold several reasons. Of each protocol the first usable one counts; what is
    /// malformed or unknown is passed over.
    static SipReason PARSE(std::string_view value);
    /// The text as it may stand between the quotes of a quoted string: quotes and backslashes escaped, control
    /// characters (a line break would end the header) as blanks.
    static std::string ESCAPE(std::string_view text);
    /// A quoted string without its quotes and escapes, any other text as it is; control characters as blanks.
    static std::string UNQUOTE(std::string_view text);
};
