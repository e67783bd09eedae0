#pragma once

#include "platform/base/XCode.h"
#include "properties/CC_Property.h"
#include "properties/CC_PropertyTable.h"

#include <concepts>
#include <new>
#include <type_traits>
#include <utility>

/// Whether what is given can stand for a value: truth values and numbers do not stand for each other.
template <class Given, class Value>
concept CC_PropertyValueFrom = std::is_convertible_v<Given, Value> &&
    (!std::is_arithmetic_v<Value> || (std::is_arithmetic_v<std::remove_cvref_t<Given>> &&
                                      std::same_as<std::remove_cvref_t<Given>, bool> == std::same_as<Value, bool>));

/// What a property is asked for first: its value, state, cause, tone, content or context; itself when it has none of
/// these.
template <class Property>
decltype(auto) CC_PROPERTY_VALUE(Property const& property)
{
    if constexpr (requires { property.getValue(); })
        return property.getValue();
    else if constexpr (requires { property.getState(); })
        return property.getState();
    else if constexpr (requires { property.getCause(); })
        return property.getCause();
    else if constexpr (requires { property.getTone(); })
        return property.getTone();
    else if constexpr (requires { property.getContent(); })
        return property.getContent();
    else if constexpr (requires { property.getContext(); })
        return property.getContext();
    else
        return (property);
}

/// A property that was looked up by its key, or none. It belongs to whoever was asked, and lives as `get` there says.
///
///     if (adapter.getPeer(Key::STATE) == CC_PropertyCallLegState::CONNECTED)
///         ...
///     if (auto const cause = adapter.getPeer(Key::CAUSE))
///         print(cause->getCause(), cause->getSipCode());
template <class Property>
class CC_FoundProperty
{
public:
    /// Of what the property is asked for first.
    using Value = std::remove_cvref_t<decltype(CC_PROPERTY_VALUE(std::declval<Property const&>()))>;

    /// Null: none.
    explicit CC_FoundProperty(Property const* property) : m_property(property) {}

    /// Whether there is one.
    explicit operator bool() const { return m_property != nullptr; }
    /// Null for none.
    Property const* get() const { return m_property; }
    /// REQUIRES: there is one. @{
    Property const& operator*() const { return *m_property; }
    Property const* operator->() const { return m_property; }
    /// @}
    /// A copy of the value, `fallback` for none. Throws std::bad_alloc when a copy needs memory and it is out.
    template <class Fallback>
    requires CC_PropertyValueFrom<Fallback const&, Value> Value getValueOr(Fallback const& fallback)
    const { return m_property != nullptr ? Value(CC_PROPERTY_VALUE(*m_property)) : static_cast<Value>(fallback); }

    /// Whether there is one with that value.
    template <class Given>
    requires CC_PropertyValueFrom<Given const&, Value>
    friend bool operator==(CC_FoundProperty const& found, Given const& value)
    {
        return found.m_property != nullptr && CC_PROPERTY_VALUE(*found.m_property) == static_cast<Value>(value);
    }

private:
    Property const* m_property;
};

/// A property id that knows the class of its properties. Those of the library stand in CC_PropertyKeys.h.
///
/// A module makes keys of its own from the ids that are set apart for modules (CC_PropertyId::FIRST_OF_MODULES), and
/// declares their names when it starts, once for the process:
///
///     inline constexpr CC_PropertyKey<CC_PropertyString> TRUNK_GROUP(CC_PropertyId::FIRST_OF_MODULES + 7);
///
///     XCode const result = TRUNK_GROUP.declare("Trunk-Group", "trunk-group");
///     adapter.setOwn(TRUNK_GROUP, "north"); // in dumps: Trunk-Group: north
template <class Property>
class CC_PropertyKey
{
public:
    /// Of what a property of the key is asked for first.
    using Value = typename CC_FoundProperty<Property>::Value;

    /// Nothing looks whether properties of the id are of the class; `in` finds none where they are not.
    constexpr explicit CC_PropertyKey(unsigned int id) : m_id(id) {}

    /// One of CC_PropertyId, or a module's own.
    constexpr unsigned int getId() const { return m_id; }
    /// As CC_PropertyTable::DECLARE.
    XCode declare(char const* longName, char const* shortName) const
    {
        return CC_PropertyTable::DECLARE(m_id, longName, shortName);
    }

    /// The property as one of the key's class; none if it is null or of another class.
    CC_FoundProperty<Property> in(CC_Property const* property) const
    {
        return CC_FoundProperty<Property>(Property::FROM(property));
    }
    /// A property of the id, from what the class's constructor takes behind it. Throws std::bad_alloc when the value
    /// needs memory and it is out.
    template <class... Values>
    Property make(Values&&... values) const
    {
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wsign-conversion" // a plain 3 is an int, and the numbers have no sign
        return Property(m_id, std::forward<Values>(values)...);
#pragma GCC diagnostic pop
    }

    /// Whether `make` takes the values; a single one must be of the value's kind.
    template <class... Values>
    static constexpr bool
        TAKES = sizeof...(Values) != 0 && std::constructible_from<Property, unsigned int, Values...> &&
                (sizeof...(Values) != 1 || (CC_PropertyValueFrom<Values, Value> && ...));

    /// Calls `store` with the property that `make` makes; `withoutMemory` when there is none for it.
    template <class Store, class... Values>
    XCode store(Store const& store, XCode withoutMemory, Values&&... values) const
    {
        try
        {
            return store(make(std::forward<Values>(values)...));
        }
        catch (std::bad_alloc const&)
        {
            return withoutMemory;
        }
    }

private:
    unsigned int m_id;
};
