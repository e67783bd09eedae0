#pragma once

#include <string>
#include <string_view>

/// A message of the ISDN user part that came with one of SIP (RFC 3204), as it stands: nobody here reads it. A plain
/// value.
struct SipIsup
{
    std::string type; ///< "application/isup;version=itu-t92+", with its parameters as they stand
    std::string body; ///< octets; empty: none

    static bool IS_TYPE(std::string_view contentType); ///< and one that can be handed on
    bool isEmpty() const { return body.empty(); }

    // --- as the text of a property, which has no octets that are none of a text
    std::string getText() const;
    static SipIsup OF_TEXT(std::string_view text); ///< empty for one that is none
};
