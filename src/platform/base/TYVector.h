#pragma once

#include "platform/base/XCode.h"

#include <cstddef>
#include <new>
#include <stdexcept>
#include <utility>
#include <vector>

/// A growing array of values. Growing reports memory that runs out as an XCode, and the vector remembers it for whoever
/// had somebody else fill it.
template <class T>
class TYVector
{
public:
    TYVector() = default;

    /// The number of values. @{
    std::size_t getSize() const { return m_values.size(); }
    bool isEmpty() const { return m_values.empty(); }
    /// @}
    /// REQUIRES: index < getSize() @{
    T const& operator[](std::size_t index) const { return m_values[index]; }
    T& operator[](std::size_t index) { return m_values[index]; }
    /// @}

    /// OK, or NO_ELEMENT when memory is out; the vector is then unchanged.
    XCode append(T const& value)
    {
        try
        {
            m_values.push_back(value);
            return XCode::OK;
        }
        catch (std::bad_alloc const&)
        {
            return refuse();
        }
    }
    /// Makes room for `size` values: OK, or NO_ELEMENT.
    XCode reserve(std::size_t size)
    {
        try
        {
            m_values.reserve(size);
            return XCode::OK;
        }
        catch (std::bad_alloc const&)
        {
            return refuse();
        }
        catch (std::length_error const&) // more than any memory could hold
        {
            return refuse();
        }
    }
    /// REQUIRES: index < getSize()
    void remove(std::size_t index) { m_values.erase(m_values.begin() + static_cast<std::ptrdiff_t>(index)); }
    /// Ends the values; the memory is kept, and so is what `hasRefused` tells.
    void clear() { m_values.clear(); }

    /// For walks in the order of the values, as of a std::vector, whose rules for changes meanwhile hold. @{
    auto begin() const { return m_values.begin(); }
    auto end() const { return m_values.end(); }
    auto begin() { return m_values.begin(); }
    auto end() { return m_values.end(); }
    /// @}

    /// Whether memory has ever kept the vector from growing, so that something may be missing.
    bool hasRefused() const { return m_hasRefused; }

    /// The same values in the same order; what was refused does not matter.
    friend bool operator==(TYVector const& left, TYVector const& right) { return left.m_values == right.m_values; }

private:
    XCode refuse()
    {
        m_hasRefused = true;
        return XCode::NO_ELEMENT;
    }

    std::vector<T> m_values;
    bool m_hasRefused = false;
};
