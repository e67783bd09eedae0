#include "sip/dialog/SipCrypto.h"

#include "sip/message/SipText.h"

#include <new>
#include <sofia-sip/base64.h>
#include <sys/random.h>

namespace
{
constexpr unsigned int MOST_TAG = 999999999; // RFC 4568, 9.1
constexpr std::string_view INLINE = "inline:";
constexpr std::size_t ENCODED = MediaKeys::LENGTH / 3 * 4;

MediaKeys::Suite SUITE_OF(std::string_view name)
{
    if (SipText::EQUALS_IGNORING_CASE(name, "AES_CM_128_HMAC_SHA1_80"))
        return MediaKeys::AES_CM_128_HMAC_SHA1_80;
    if (SipText::EQUALS_IGNORING_CASE(name, "AES_CM_128_HMAC_SHA1_32"))
        return MediaKeys::AES_CM_128_HMAC_SHA1_32;
    return MediaKeys::NONE;
}

char const* NAME_OF(MediaKeys::Suite suite)
{
    return suite == MediaKeys::AES_CM_128_HMAC_SHA1_32 ? "AES_CM_128_HMAC_SHA1_32" : "AES_CM_128_HMAC_SHA1_80";
}

/// "inline:KEY" with or without a lifetime ("|2^20"), which is longer than any call.
bool READ_KEY(std::string_view parameters, MediaKeys::Key& key)
{
    if (parameters.size() < INLINE.size() ||
        !SipText::EQUALS_IGNORING_CASE(parameters.substr(0, INLINE.size()), INLINE))
        return false;
    std::string_view rest = parameters.substr(INLINE.size());
    if (rest.find(';') != std::string_view::npos || rest.find(':') != std::string_view::npos)
        return false; // another key; a key's identifier
    std::string const encoded(SipText::CUT(rest, '|'));
    return encoded.size() == ENCODED &&
           base64_d(reinterpret_cast<char*>(key.data()), MediaKeys::LENGTH, encoded.c_str()) == MediaKeys::LENGTH;
}
} // namespace

std::optional<SipCrypto> SipCrypto::READ(std::string_view value)
{
    SipCrypto crypto;
    std::string_view rest = SipText::TRIM(value);
    crypto.tag = SipText::NUMBER(SipText::CUT(rest, ' '), 1, MOST_TAG);
    crypto.suite = SUITE_OF(SipText::CUT(rest, ' '));
    bool const hasKey = READ_KEY(SipText::CUT(rest, ' '), crypto.key);
    if (crypto.tag == 0 || crypto.suite == MediaKeys::NONE || !hasKey)
        return std::nullopt;
    while (!rest.empty()) // but how far numbers may lie apart changes nothing
        if (std::string_view const parameter = SipText::CUT(rest, ' ');
            !parameter.empty() && !SipText::EQUALS_IGNORING_CASE(parameter.substr(0, 4), "WSH="))
            return std::nullopt;
    return crypto;
}

SipCrypto SipCrypto::MAKE(unsigned int tag, MediaKeys::Suite suite)
{
    SipCrypto crypto{tag, suite, {}};
    if (getrandom(crypto.key.data(), crypto.key.size(), 0) != static_cast<ssize_t>(crypto.key.size()))
        throw std::bad_alloc();
    return crypto;
}

std::string SipCrypto::write() const
{
    char encoded[ENCODED + 1] = {};
    MediaKeys::Key copy = key; // the encoder takes what it does not change
    base64_e(encoded, sizeof encoded, copy.data(), copy.size());
    return std::to_string(tag) + " " + NAME_OF(suite) + " inline:" + encoded;
}
