#pragma once

#include "properties/CC_PropertyTariff.h"

#include <optional>
#include <string>
#include <string_view>

/// What a call will be charged at as SIP tells it (3GPP TS 24.647; SipAdvice): the element aoc-s is the property
/// Tariff.
///
///     <aoc-s>
///       <charged-items>                      or <special-arrangement>3</special-arrangement>
///         <basic>                            basic communication; communication-attempt, communication-setup, services
///           <price-time>
///             <currency-id>EUR</currency-id> <currency-amount>0.05</currency-amount>
///             <length-time-unit> <time-unit>1</time-unit> <scale>one-minute</scale> </length-time-unit>
///             <charging-type>step-function</charging-type>
///             <granularity> as length-time-unit, may be absent </granularity>
///           </price-time>                    or <flat-rate> currency-id, currency-amount </flat-rate>,
///         </basic>                           <special-code>3</special-code>, <free-charge/>, <not-available/>
///       </charged-items>
///     </aoc-s>
///
/// There is no rate by volume, which is told as not available, and no item for user-to-user information, which is left
/// out.
namespace SipTariff
{
using Tariff = CC_PropertyTariff::Tariff;

/// Nothing for what is no such body, has no tariff, or has one out of the property's range. Throws std::bad_alloc.
std::optional<Tariff> READ(std::string_view body);
std::string WRITE(Tariff const& tariff);
} // namespace SipTariff
