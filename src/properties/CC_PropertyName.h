#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"

/// To which side of a call a set of properties belongs.
enum CC_PropertyContainerType : int
{
    CC_PCT_CALLING = 0,
    CC_PCT_CALLED = 1,
    CC_PCT_GENERAL = 2 ///< to the call as a whole
};

/// The prefix by which a full property name says to which side it belongs: "calling-", "called-", or the empty text for
/// the general container. ERROR::INVALID for any other number.
CC_EXPORT char const* CC_PROPERTY_CONTAINER_TYPE_NAME(CC_PropertyContainerType type);

/// Splits a full name into the container's prefix and the property's short name.
///
///     SPLIT_PROPERTY_NAME(prefix, name, "called-pi"); // "called-" and "pi"
///     SPLIT_PROPERTY_NAME(prefix, name, "hops");      // "" and "hops"
///
/// Either result may be the full name's own object. Throws std::bad_alloc when memory is out.
CC_EXPORT void SPLIT_PROPERTY_NAME(String& prefix, String& name, String const& fullName);

/// The CC_PropertyContainerType that a full name addresses, -1 for the empty name. A name without a known prefix
/// addresses the general container; whether the property exists is not asked.
CC_EXPORT int GET_PROPERTY_TYPE(String const& fullName);
