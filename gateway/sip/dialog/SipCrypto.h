#pragma once

#include "media/context/MediaDescription.h"

#include <optional>
#include <string>
#include <string_view>

/// The key of one direction of a stream, as "a=crypto" of a session description carries it (RFC 4568). A plain value.
///
///     std::optional<SipCrypto> const theirs = SipCrypto::READ("1 AES_CM_128_HMAC_SHA1_80 inline:...");
///     SipCrypto const ours = SipCrypto::MAKE(theirs->tag, theirs->suite);
struct SipCrypto
{
    unsigned int tag = 0;
    MediaKeys::Suite suite = MediaKeys::NONE;
    MediaKeys::Key key{};

    /// The attribute's value; nothing for a suite that we do not speak, several keys, a key with an identifier, or a
    /// parameter of the session that would change what is secured.
    static std::optional<SipCrypto> READ(std::string_view value);
    /// With a key of its own, that nobody can guess. Throws std::bad_alloc when the system has no random numbers.
    static SipCrypto MAKE(unsigned int tag, MediaKeys::Suite suite);
    std::string write() const;

    friend bool operator==(SipCrypto const&, SipCrypto const&) = default;
};
