#pragma once

#include "platform/base/XCode.h"

#include <cstring>
#include <new>
#include <type_traits>

/// An array of plain values whose first INLINE ones need no memory of their own.
///
/// For lists that are nearly always short: the legs of a call, the observers of a leg. Positions stay valid when the
/// array grows, so a walk by index survives what happens during it.
template <class T, unsigned int INLINE>
class TYSmallVector
{
    static_assert(std::is_trivially_copyable_v<T>);
    static_assert(INLINE > 0, "growing doubles the capacity");

public:
    TYSmallVector() = default;
    ~TYSmallVector() { release(); }
    TYSmallVector(TYSmallVector const&) = delete;
    TYSmallVector& operator=(TYSmallVector const&) = delete;

    /// The number of values.
    unsigned int getSize() const { return m_size; }
    /// REQUIRES: index < getSize() @{
    T const& operator[](unsigned int index) const { return m_values[index]; }
    T& operator[](unsigned int index) { return m_values[index]; }
    /// @}

    /// OK, or NO_ELEMENT when memory is out; the array is then unchanged.
    XCode append(T const& value)
    {
        T const appended = value; // which may be one of the values that growing frees
        if (m_size == m_capacity)
        {
            T* const larger = new (std::nothrow) T[2 * m_capacity];
            if (larger == nullptr)
                return XCode::NO_ELEMENT;
            std::memcpy(static_cast<void*>(larger), m_values, m_size * sizeof(T));
            release();
            m_values = larger;
            m_capacity *= 2;
        }
        m_values[m_size++] = appended;
        return XCode::OK;
    }

    /// REQUIRES: index < getSize(). Later values move one place down.
    void remove(unsigned int index)
    {
        --m_size;
        std::memmove(static_cast<void*>(m_values + index), m_values + index + 1, (m_size - index) * sizeof(T));
    }

    /// For walks in the order of the values. Appending and removing end them. @{
    T const* begin() const { return m_values; }
    T const* end() const { return m_values + m_size; }
    /// @}

private:
    void release()
    {
        if (m_values != m_inline)
            delete[] m_values;
    }

    T m_inline[INLINE];
    T* m_values = m_inline;
    unsigned int m_size = 0;
    unsigned int m_capacity = INLINE;
};
