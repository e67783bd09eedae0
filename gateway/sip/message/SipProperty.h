#pragma once

#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyString.h"

#include <string>
#include <tuple>

/// Filling containers of properties. Without memory for one property the call goes on without it.
namespace SipProperty
{
inline String STRING(std::string const& text) { return String(std::string_view(text)); }
inline void ADD(CC_PropertyContainer& properties, CC_Property const& property)
{
    std::ignore = properties.set(property);
}
inline void ADD_TEXT(CC_PropertyContainer& properties, unsigned int id, std::string const& text)
{
    ADD(properties, CC_PropertyString(id, STRING(text)));
}
inline std::string TEXT_OF(String const& text) { return std::string(text.view()); }
} // namespace SipProperty
