#pragma once

#include "properties/CC_PropertyClass.h"

#include <type_traits>

/// A property class whose value is one field, default-initialised (0, false, empty) unless it is given.
///
///     class CC_EXPORT CC_PropertyTypeOfNumber : public CC_PropertyValue<CC_PropertyTypeOfNumber, QTypeOfNumber>
///     {
///     public:
///         static constexpr char const* TYPE_NAME = "Type-Of-Number";
///         static TypeId s_typeId;
///         using CC_PropertyValue::CC_PropertyValue;
///         String& getValueString(String& out) const override;
///     };
template <class Derived, class Value>
class CC_EXPORT CC_PropertyValue : public CC_PropertyClass<Derived>
{
public:
    /// Small values are handed over by value, others by reference.
    using Argument = std::conditional_t<std::is_scalar_v<Value>, Value, Value const&>;

    using CC_PropertyClass<Derived>::CC_PropertyClass;
    /// A copy of the value: std::bad_alloc when it needs memory that is out.
    CC_PropertyValue(unsigned int id, Argument value) : CC_PropertyClass<Derived>(id), m_value(value) {}

    /// A reference, where it is one, holds as long as the property.
    Argument getValue() const { return m_value; }
    /// A copy of the value: std::bad_alloc when it needs memory that is out.
    void setValue(Argument value) { m_value = value; }
    bool hasSameValue(CC_PropertyValue const& other) const { return m_value == other.m_value; }

private:
    Value m_value{};
};
