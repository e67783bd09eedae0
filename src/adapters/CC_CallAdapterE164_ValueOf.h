#pragma once

#include "properties/CC_Property.h"

#include <functional>
#include <type_traits>

/// What a class's getter gives: a value, or a reference into the property.
template <class Property, auto GETTER>
using GivenBy = std::invoke_result_t<decltype(GETTER), Property const&>;

/// The value of a property of that class; `absent` when it is absent or of another class.
///
///     VALUE_OF<CC_PropertyString>(getOwnProperty(CC_PropertyId::NAME), String::s_empty)
template <class Property, auto GETTER = &Property::getValue>
GivenBy<Property, GETTER> VALUE_OF(CC_Property const* property, std::type_identity_t<GivenBy<Property, GETTER>> absent)
{
    Property const* const typed = Property::FROM(property);
    return typed != nullptr ? std::invoke(GETTER, *typed) : absent;
}

/// A temporary would end before the reference to it is used.
template <class Property, auto GETTER = &Property::getValue>
requires std::is_reference_v<GivenBy<Property, GETTER>> GivenBy<Property, GETTER>
VALUE_OF(CC_Property const* property, std::remove_reference_t<GivenBy<Property, GETTER>>&& absent)
= delete;

/// The same for small values, with 0 or false for what is absent.
template <class Property, auto GETTER = &Property::getValue>
requires std::is_scalar_v<GivenBy<Property, GETTER>> GivenBy<Property, GETTER> VALUE_OF(CC_Property const* property)
{
    return VALUE_OF<Property, GETTER>(property, GivenBy<Property, GETTER>());
}

/// The value of a property of that class where it stands; null when it is absent or of another class.
template <class Property>
auto POINTER_TO(CC_Property const* property) -> decltype(&Property::FROM(property)->getValue())
{
    Property const* const typed = Property::FROM(property);
    return typed != nullptr ? &typed->getValue() : nullptr;
}
