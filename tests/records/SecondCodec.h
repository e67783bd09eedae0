#pragma once

#include "platform/asn1/AsnComposite.h"
#include "platform/asn1/AsnSequenceOf.h"

#include <libtasn1.h>
#include <string>
#include <vector>

/// GNU libtasn1 over the records' module: a codec that shares no line with ours. It reads the module's text itself and
/// knows our values only by the names of their parts.
///
///     SecondCodec codec(RECORDS_MODULE);
///     std::vector<unsigned char> const octets = codec.encode("Charge", charge);
///     EXPECT_EQ("", codec.compare("Charge", octets, charge));
class SecondCodec
{
public:
    explicit SecondCodec(char const* modulePath);
    ~SecondCodec();
    SecondCodec(SecondCodec const&) = delete;
    SecondCodec& operator=(SecondCodec const&) = delete;

    /// Why the module was not taken; empty when it was.
    std::string const& getError() const { return m_error; }
    /// The value as the other codec encodes it; nothing, and `getError`, when it refuses.
    std::vector<unsigned char> encode(char const* type, AsnSyntax const& value);
    /// Where the value that the other codec decodes differs from `expected`; empty when they are equal.
    std::string compare(char const* type, std::vector<unsigned char> const& octets, AsnSyntax const& expected);

private:
    asn1_node m_module = nullptr;
    std::string m_error;
};
