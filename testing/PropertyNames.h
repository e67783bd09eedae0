#pragma once

#include <string>

class CC_Flags;
class CC_PropertyContainer;

/// The long name of a property id; an id without a name is printed as "0x400220".
std::string PROPERTY_NAME(unsigned int id);

/// The names of the ids that are set, in ascending order of the ids: "Network, State". Empty for none.
///
///     EXPECT_EQ(PROPERTY_NAMES(event.getFlags()), "Cause, State");
std::string PROPERTY_NAMES(CC_Flags const& flags);

/// The names of the properties, in the container's order.
std::string PROPERTY_NAMES(CC_PropertyContainer const& properties);

/// Each property with its value, in the container's order: "Network: pstn, State: ALERTING".
std::string PROPERTY_VALUES(CC_PropertyContainer const& properties);
