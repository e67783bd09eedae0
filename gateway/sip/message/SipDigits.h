#pragma once

#include <optional>
#include <string>
#include <string_view>

/// Digits that come in an INFO, as two kinds of bodies have them: "application/dtmf-relay" (lines "Signal=5" and
/// "Duration=160") and "application/dtmf" ("5"). Neither is a standard; RFC 6086 tells how INFO was used so. A plain
/// value.
///
///     std::optional<SipDigits> const digits = SipDigits::READ("application/dtmf-relay",
///     "Signal=5\r\nDuration=160\r\n");
struct SipDigits
{
    std::string digits;        ///< of "0" to "9", "*", "#", "A" to "D"; a flash of the hook is "!"
    unsigned int duration = 0; ///< milliseconds, at most 60000; 0: it is not told

    /// Whether it is one of the two, whatever the case of its letters.
    static bool IS_TYPE(std::string_view contentType);
    /// Nothing for a body that has no digit. 10 and 11 stand for "*" and "#", 12 to 15 for "A" to "D", 16 for the flash
    /// (RFC 4733, 3.2).
    static std::optional<SipDigits> READ(std::string_view contentType, std::string_view body);
    /// A body of application/dtmf-relay for one digit; a duration of 0 is written as that of a short key press.
    static std::string WRITE(char digit, unsigned int duration);
};
