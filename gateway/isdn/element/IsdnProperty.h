#pragma once

#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyString.h"

#include <string>
#include <string_view>
#include <tuple>

/// Filling containers of properties. Without memory for one property the call goes on without it.
namespace IsdnProperty
{
inline String STRING(std::string_view text) { return String(text); }
inline void ADD(CC_PropertyContainer& properties, CC_Property const& property)
{
    std::ignore = properties.set(property);
}
inline void ADD_TEXT(CC_PropertyContainer& properties, unsigned int id, std::string_view text)
{
    ADD(properties, CC_PropertyString(id, STRING(text)));
}
/// The value of a property of that class, as a new one has it where there is none.
template <class Property>
auto VALUE_OF(CC_Property const* property, unsigned int id)
{
    auto const* const typed = dynamic_cast<Property const*>(property);
    return typed != nullptr ? typed->getValue() : Property(id).getValue();
}
} // namespace IsdnProperty
