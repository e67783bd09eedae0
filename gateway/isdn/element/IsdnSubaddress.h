#pragma once

#include "isdn/link/LibPri.h"
#include "platform/base/XCode.h"
#include "properties/CC_PropertyId.h"

#include <string>
#include <string_view>

/// The elements Calling and Called Party Subaddress (Q.931, 4.5.9 and 4.5.11) and Connected Subaddress (Q.951, 5.4.2),
/// as a text: hexadecimal digits of the octets from 3 on, the extension bit of octet 3 being 0. "00" and "504142" are
/// PA and B of an NSAP address as IA5. Empty: none.
namespace IsdnSubaddress
{
/// CC_PropertyString, of a leg or an offer: what lines tell each other; the library has no property of its own for it.
inline constexpr unsigned int PROPERTY = CC_PropertyId::FIRST_OF_MODULES + 0x40;

std::string OF(pri_party_subaddress const& subaddress);
/// What is no such text becomes none.
pri_party_subaddress TO_WIRE(std::string_view text);

/// Declares its name, with which logs and dumps show it from then on: OK, also when it has one already; otherwise as
/// CC_PropertyTable::DECLARE.
XCode DECLARE();
} // namespace IsdnSubaddress
