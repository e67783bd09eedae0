#include "isdn/element/IsdnSubaddress.h"

#include "properties/CC_PropertyTable.h"

#include <algorithm>
#include <cctype>
#include <charconv>

namespace
{
constexpr std::string_view HEX_DIGITS = "0123456789abcdef";
constexpr std::size_t MOST_OCTETS = 20; // octets behind octet 3
constexpr int NSAP = 0;
constexpr int USER_SPECIFIED = 2;
constexpr int TYPE_OF_SHIFT = 4;
constexpr int TYPE_OF_MASK = 0x07;
constexpr int IS_ODD = 0x08;

void ADD_OCTET(std::string& text, unsigned int octet)
{
    (text += HEX_DIGITS[octet >> 4 & 0x0f]) += HEX_DIGITS[octet & 0x0f];
}
} // namespace

std::string IsdnSubaddress::OF(pri_party_subaddress const& subaddress)
{
    std::string text;
    if (subaddress.valid == 0)
        return text;
    ADD_OCTET(text, static_cast<unsigned int>((subaddress.type & TYPE_OF_MASK) << TYPE_OF_SHIFT |
                                              (subaddress.odd_even_indicator != 0 ? IS_ODD : 0)));
    auto const length = std::min(static_cast<std::size_t>(std::max(subaddress.length, 0)), MOST_OCTETS);
    for (std::size_t i = 0; i < length; ++i)
        ADD_OCTET(text, subaddress.data[i]);
    return text;
}

pri_party_subaddress IsdnSubaddress::TO_WIRE(std::string_view text)
{
    pri_party_subaddress subaddress = {};
    if (text.size() < 4 || text.size() % 2 != 0 || text.size() > 2 * (MOST_OCTETS + 1) ||
        !std::all_of(text.begin(), text.end(), [](unsigned char c) { return std::isxdigit(c) != 0; }))
        return subaddress;
    unsigned int octet3 = 0;
    std::from_chars(text.data(), text.data() + 2, octet3, 16);
    subaddress.type = static_cast<int>(octet3) >> TYPE_OF_SHIFT & TYPE_OF_MASK;
    subaddress.odd_even_indicator = (octet3 & IS_ODD) != 0 ? 1 : 0;
    if (subaddress.type != NSAP && subaddress.type != USER_SPECIFIED)
        return subaddress;
    for (text.remove_prefix(2); !text.empty(); text.remove_prefix(2))
        std::from_chars(text.data(), text.data() + 2, subaddress.data[subaddress.length++], 16);
    subaddress.valid = 1;
    return subaddress;
}

XCode IsdnSubaddress::DECLARE()
{
    if (CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(PROPERTY);
        row != nullptr && row->longName != nullptr)
        return XCode::OK;
    return CC_PropertyTable::DECLARE(PROPERTY, "Subaddress", "subaddress");
}
