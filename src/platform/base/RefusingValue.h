#pragma once

#include <new>

/// For the containers' tests: a number whose copies can be made to find no memory. Counts its live objects.
class RefusingValue
{
public:
    static inline bool s_isRefusing = false;
    static inline int s_alive = 0;

    explicit RefusingValue(int number) : m_number(number) { ++s_alive; }
    RefusingValue(RefusingValue const& other) : m_number(other.m_number)
    {
        if (s_isRefusing)
            throw std::bad_alloc();
        ++s_alive;
    }
    RefusingValue& operator=(RefusingValue const&) = default;
    ~RefusingValue() { --s_alive; }

    int getNumber() const { return m_number; }
    friend bool operator==(RefusingValue const&, RefusingValue const&) = default;

    /// Copies find no memory while it lives.
    class Guard
    {
    public:
        Guard() { s_isRefusing = true; }
        ~Guard() { s_isRefusing = false; }
        Guard(Guard const&) = delete;
        Guard& operator=(Guard const&) = delete;
    };

private:
    int m_number;
};
