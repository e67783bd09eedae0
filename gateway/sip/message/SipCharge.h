#pragma once

#include "properties/CC_PropertyCharge.h"

#include <optional>
#include <string>
#include <string_view>

/// What a call costs as SIP tells it (3GPP TS 24.647; SipAdvice): the elements aoc-d, during the call, and aoc-e, at
/// its end, are the property Charge.
///
///     <aoc xmlns="http://uri.etsi.org/ngn/params/xml/simservs/aoc">
///       <aoc-d>
///         <charging-info>subtotal</charging-info>
///         <recorded-charges>
///           <recorded-currency-units>
///             <currency-id>EUR</currency-id>     units: UNIT
///             <currency-amount>1.25</currency-amount>
///           </recorded-currency-units>           or <free-charge/>, <not-available/>
///         </recorded-charges>
///         <billing-id>normal-charging</billing-id>
///       </aoc-d>
///     </aoc>
///
/// Units of several types are told as their sum. What the property does not hold is passed over.
namespace SipCharge
{
using Charge = CC_PropertyCharge::Charge;

/// Nothing for what is no such body, has no charge, or has one out of the property's range. An amount with more than
/// three decimals, or that is too large for those that it has, is rounded. Throws std::bad_alloc.
std::optional<Charge> READ(std::string_view body);
/// Whether it is the final one.
bool IS_TOTAL(Charge const& charge);
std::string WRITE(Charge const& charge);
} // namespace SipCharge
