#pragma once

#include "properties/CC_PropertyKeys.h"

#include <cstddef>
#include <type_traits>

/// A list of property classes.
template <class... Property>
struct CC_PropertyClassList
{
    /// How many they are.
    static constexpr std::size_t SIZE = sizeof...(Property);

    /// Calls `function.operator()<Property>()` for each, in order.
    template <class Function>
    static constexpr void FOR_EACH(Function const& function)
    {
        (function.template operator()<Property>(), ...);
    }
    /// The place of the class in the list, from 0.
    template <class Wanted>
    static constexpr std::size_t PLACE_OF()
    {
        std::size_t place = 0;
        bool isFound = false;
        ((isFound = isFound || std::is_same_v<Wanted, Property>, place += isFound ? 0 : 1), ...);
        return place;
    }
};

/// The library's own value classes. Recordings name a class by its place here: append, never insert.
using CC_PropertyClasses =
    CC_PropertyClassList<CC_PropertyBoolean, CC_PropertyCallLegState, CC_PropertyCallProgressTone, CC_PropertyCallType,
                         CC_PropertyCause, CC_PropertyCharge, CC_PropertyCodec, CC_PropertyCodecNegotiating,
                         CC_PropertyCodecs, CC_PropertyContextId, CC_PropertyInformationTransferCapability,
                         CC_PropertyIpAddress, CC_PropertyNumberingPlan, CC_PropertyParametrizedString,
                         CC_PropertyPresentationIndicator, CC_PropertyQoS, CC_PropertyRedirectingReason,
                         CC_PropertyScreeningIndicator, CC_PropertyString, CC_PropertyTariff, CC_PropertyTypeOfNumber,
                         CC_PropertyUnsigned, CC_PropertyWaitForMessage>;
