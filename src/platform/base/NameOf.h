#pragma once

#include <cstddef>

namespace ERROR
{
/// What a name function returns for a value that has no name.
inline constexpr char const* INVALID = "(invalid)";
} // namespace ERROR

/// One row of a table of values and their names.
template <class Value>
struct NamedValue
{
    /// The value, and its name in static memory. @{
    Value value;
    char const* name;
    /// @}
};

/// The name of `value` in `table`, or `otherwise`. Tables are short, so the search is linear.
template <class Value, std::size_t SIZE>
constexpr char const* NAME_OF(NamedValue<Value> const (&table)[SIZE], Value value,
                              char const* otherwise = ERROR::INVALID)
{
    for (NamedValue<Value> const& row : table)
        if (row.value == value)
            return row.name;
    return otherwise;
}
