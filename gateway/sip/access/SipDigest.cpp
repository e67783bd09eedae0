#include "sip/access/SipDigest.h"

#include "sip/message/SipText.h"

#include <array>
#include <initializer_list>
#include <new>
#include <openssl/crypto.h>
#include <openssl/evp.h>
#include <openssl/hmac.h>
#include <openssl/rand.h>
#include <vector>

namespace
{
struct Named
{
    char const* name;
    EVP_MD const* (*hash)();
    std::size_t length; // hexadecimal digits
};

std::array<Named, 3> const ALGORITHMS{
    {{"MD5", EVP_md5, 32}, {"SHA-256", EVP_sha256, 64}, {"SHA-512-256", EVP_sha512_256, 64}}};

std::string HEXADECIMAL(unsigned char const* octets, std::size_t number)
{
    constexpr char const* DIGITS = "0123456789abcdef";
    std::string text;
    text.reserve(2 * number);
    for (std::size_t i = 0; i < number; ++i)
        text.append(1, DIGITS[octets[i] >> 4]).append(1, DIGITS[octets[i] & 0xf]);
    return text;
}

std::string JOIN(std::initializer_list<std::string_view> parts)
{
    std::string text;
    for (std::string_view const part : parts)
        text.append(text.empty() ? "" : ":").append(part);
    return text;
}
} // namespace

std::optional<SipDigest::Algorithm> SipDigest::NAMED(std::string_view name)
{
    if (name.empty())
        return MD5;
    for (Algorithm const algorithm : {MD5, SHA_256, SHA_512_256})
        if (SipText::EQUALS_IGNORING_CASE(name, NAME(algorithm)))
            return algorithm;
    return std::nullopt;
}

char const* SipDigest::NAME(Algorithm algorithm) { return ALGORITHMS[algorithm].name; }

std::size_t SipDigest::LENGTH(Algorithm algorithm) { return ALGORITHMS[algorithm].length; }

std::string SipDigest::HASH(Algorithm algorithm, std::string_view text)
{
    std::array<unsigned char, EVP_MAX_MD_SIZE> hash = {};
    unsigned int length = 0;
    if (EVP_Digest(text.data(), text.size(), hash.data(), &length, ALGORITHMS[algorithm].hash(), nullptr) != 1)
        throw std::bad_alloc();
    return HEXADECIMAL(hash.data(), length);
}

std::string SipDigest::SECRET(Algorithm algorithm, std::string_view user, std::string_view realm,
                              std::string_view password)
{
    return HASH(algorithm, JOIN({user, realm, password}));
}

std::string SipDigest::RESPONSE(std::string_view secret, Question const& question)
{
    std::string asked = JOIN({question.method, question.uri});
    if (question.quality == "auth-int")
        asked += ":" + HASH(question.algorithm, question.body);
    std::string const what = HASH(question.algorithm, asked);
    return HASH(question.algorithm, question.quality.empty() ? JOIN({secret, question.nonce, what})
                                                             : JOIN({secret, question.nonce, question.count,
                                                                     question.clientNonce, question.quality, what}));
}

std::string SipDigest::SEAL(std::string_view key, std::string_view text)
{
    std::array<unsigned char, EVP_MAX_MD_SIZE> seal = {};
    unsigned int length = 0;
    if (HMAC(EVP_sha256(), key.data(), static_cast<int>(key.size()),
             reinterpret_cast<unsigned char const*>(text.data()), text.size(), seal.data(), &length) == nullptr)
        throw std::bad_alloc();
    return HEXADECIMAL(seal.data(), length);
}

bool SipDigest::ARE_EQUAL(std::string_view one, std::string_view other)
{
    return one.size() == other.size() && CRYPTO_memcmp(one.data(), other.data(), one.size()) == 0;
}

std::string SipDigest::RANDOM(std::size_t octets)
{
    std::vector<unsigned char> random(octets);
    if (RAND_bytes(random.data(), static_cast<int>(octets)) != 1)
        throw std::bad_alloc();
    return HEXADECIMAL(random.data(), octets);
}
