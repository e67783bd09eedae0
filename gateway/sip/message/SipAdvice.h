#pragma once

#include "platform/asn1/Q956.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// What the bodies of advice of charge (3GPP TS 24.647) have in common: application/vnd.etsi.aoc+xml, an element aoc
/// with aoc-s (SipTariff), aoc-d or aoc-e (SipCharge) in it, and how these write money.
namespace SipAdvice
{
inline constexpr char const* TYPE = "application/vnd.etsi.aoc+xml";
inline constexpr char const* NAMESPACE = "http://uri.etsi.org/ngn/params/xml/simservs/aoc";

/// Whether it is that type, whatever the case of its letters; parameters are not part of it.
bool IS_TYPE(std::string_view contentType);

/// An element of such a body: the names from aoc down to its own ("?": of another namespace), and its text without
/// blanks around it, no more than 64 octets.
struct Element
{
    std::vector<std::string> path;
    std::string text;

    std::string const& getName() const { return path.back(); }
    bool isBelow(std::string_view ancestor) const;
};
/// In the order in which they begin; none of what is no such body. Throws std::bad_alloc.
std::vector<Element> READ(std::string_view body);
/// A body with that content of aoc.
std::string WRITE(std::string const& advice);

/// False for what is none, or out of the range of Q.956. An amount with more than three decimals, or that is too large
/// for those that it has, is rounded. @{
bool READ_AMOUNT(std::string_view text, Q956::Amount& amount);
bool READ_CURRENCY(std::string_view text, Q956::Currency& currency);
/// @}
/// Whole ones.
std::optional<int> READ_UNITS(std::string_view text);

/// @{ XML.
std::string ELEMENT(std::string_view name, std::string const& content);
std::string ESCAPE(std::string_view text);
std::string AMOUNT_TEXT(Q956::Amount const& amount);
/// currency-id and currency-amount.
std::string PRICE_TEXT(Q956::Currency const& currency, Q956::Amount const& amount);
/// @}
} // namespace SipAdvice
