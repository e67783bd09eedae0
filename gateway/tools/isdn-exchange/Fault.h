#pragma once

#include <cstddef>
#include <span>
#include <string>
#include <vector>

/// What is wrong with one message of a call: an element with other octets or another length than it has, or that nobody
/// expects there, or another type of message. A plain value.
///
///     Fault const fault{.message = 0x07, .element = 0x18, .octets = {0xa9, 0x83, 0x90}}; // CONNECT says channel 16
///     frame = fault.apply(frame);
struct Fault
{
    static constexpr int NONE = -1;

    int message = NONE; ///< the type of the message (Q.931, 4.4) in which it is
    int element = NONE; ///< the element's identifier (Q.931, 4.5), less than 0x80; NONE: it is the message's own type
    std::vector<unsigned char> octets; ///< what the element has instead; with NONE the message's type
    int length = NONE;                 ///< of the element as it is told; NONE: the right one

    /// Throws std::runtime_error: `octets` in hexadecimal digits, "a9 83 90".
    static std::vector<unsigned char> OCTETS_OF(std::string const& text);
    /// The frame (Q.921) with the fault, if it bears such a message; else as it is.
    std::vector<unsigned char> apply(std::span<unsigned char const> frame) const;
    /// The call reference of a frame with a message, without the flag, and whether its sender began the call; false: it
    /// bears none.
    static bool READ_REFERENCE(std::span<unsigned char const> frame, int& reference, bool& isOfOriginator);
};
