#pragma once

#include <optional>
#include <string>
#include <string_view>

/// The arithmetic of digest authentication (RFC 7616, with RFC 8760 for SIP). Nothing here keeps anything.
namespace SipDigest
{
enum Algorithm : unsigned char
{
    MD5,
    SHA_256,
    SHA_512_256
};

/// As challenges name them, in any case; an empty name is MD5's. Nothing for one that is not served.
std::optional<Algorithm> NAMED(std::string_view name);
char const* NAME(Algorithm algorithm);
/// How many hexadecimal digits a hash of it has.
std::size_t LENGTH(Algorithm algorithm);

/// In lower-case hexadecimal digits. Throws std::bad_alloc also where the library that computes it refuses.
std::string HASH(Algorithm algorithm, std::string_view text);
/// What stands for a password in files: its user's and realm's.
std::string SECRET(Algorithm algorithm, std::string_view user, std::string_view realm, std::string_view password);

/// What goes into a response beside the secret; all as it stands in the header, without its quotes.
struct Question
{
    Algorithm algorithm = MD5;
    std::string_view method;
    std::string_view uri;
    std::string_view nonce;
    std::string_view quality; ///< of protection: "auth", "auth-int", or empty as before RFC 2617
    std::string_view count;   ///< eight hexadecimal digits; of use with a quality
    std::string_view clientNonce;
    std::string_view body; ///< of use with "auth-int"
};
std::string RESPONSE(std::string_view secret, Question const& question);

/// That only who has the key can write below the text (HMAC, SHA-256).
std::string SEAL(std::string_view key, std::string_view text);
/// Takes as long whatever is in them.
bool ARE_EQUAL(std::string_view one, std::string_view other);
/// So many octets that nobody can guess, as hexadecimal digits.
std::string RANDOM(std::size_t octets);
} // namespace SipDigest
