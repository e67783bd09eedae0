#pragma once

#include "platform/asn1/AsnNotation.h"
#include "platform/asn1/AsnSyntax.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

// What the tests of the ASN.1 types share.

/// The octets that hexadecimal digits spell; blanks may stand between them.
inline std::vector<unsigned char> OCTETS(std::string_view hex)
{
    std::vector<unsigned char> octets;
    std::string digits;
    for (char const letter : hex)
        if (letter != ' ')
            digits.push_back(letter);
    for (std::size_t i = 0; i + 1 < digits.size(); i += 2)
        octets.push_back(static_cast<unsigned char>(std::stoi(digits.substr(i, 2), nullptr, 16)));
    return octets;
}

/// The value's encoding in hexadecimal, or "REFUSED " and the text for a value that has none.
inline std::string HEX(AsnSyntax const& value)
{
    AsnOctets octets;
    String error;
    XCode const result = value.encode(octets, error);
    if (!result.isOk())
    {
        EXPECT_EQ(XCode::REFUSED, result);
        return std::string("REFUSED ") + error.c_str();
    }
    std::string hex;
    for (unsigned char const octet : octets)
    {
        char digits[3];
        std::snprintf(digits, sizeof digits, "%02X", static_cast<unsigned int>(octet));
        hex += digits;
    }
    return hex;
}

/// The value in value notation.
inline std::string PRINT(AsnSyntax const& value)
{
    String text;
    EXPECT_TRUE(AsnNotation::VALUE_OF(value, text).isOk());
    return text.c_str();
}

/// Decodes into the value; the error text, empty when it succeeds. On an error the value must stay what it was.
inline std::string DECODE(AsnSyntax& value, std::string_view hex)
{
    std::unique_ptr<AsnSyntax> const before(value.clone());
    std::vector<unsigned char> const octets = OCTETS(hex);
    String error;
    XCode const result = value.decode(octets.data(), octets.size(), error);
    if (result.isOk())
        return "";
    EXPECT_EQ(XCode::FAILURE, result);
    EXPECT_TRUE(value.isEqual(*before)) << hex;
    EXPECT_FALSE(error.isEmpty());
    return error.c_str();
}
