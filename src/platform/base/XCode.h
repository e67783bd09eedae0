#pragma once

#include "platform/base/NameOf.h"

#include <iosfwd>

/// The result of an operation that can fail: a small value, returned and never thrown.
///
/// Value 0 is success, any other value an error. Ask `isOk()`; compare with the named values below when the kind of
/// failure matters.
///
///     XCode const result = call.setProperty(property);
///     if (!result.isOk())
///         return result;
///
/// It says its name, to a log (`getName()`), to a stream and so in a test that fails: "REFUSED".
class [[nodiscard]] XCode
{
public:
    constexpr XCode() = default;
    /// For results that come as numbers; named results are written by their names.
    constexpr explicit XCode(unsigned int value) : m_value(value) {}

    /// Whether it is 0, and the number itself. @{
    constexpr bool isOk() const { return m_value == 0; }
    constexpr unsigned int getValue() const { return m_value; }
    /// @}
    /// The name of the constant below, or ERROR::INVALID for any other value.
    constexpr char const* getName() const { return NAME(*this); }
    /// As `getName`.
    static constexpr char const* NAME(XCode result);
    /// The same number.
    friend constexpr bool operator==(XCode, XCode) = default;

    static XCode const OK;         ///< 0: done
    static XCode const NO_ELEMENT; ///< 0x40000001: no element could be had (memory, a list that refuses, no call)
    static XCode const ABSENT;     ///< 0x40000003: the call leg or call that the operation needs is absent
    static XCode const REFUSED;    ///< 0x40000004: already present, wrong state, or an argument that is not taken
    static XCode const FAILURE;    ///< 0x7fffffff: not found, or any other failure

private:
    unsigned int m_value = 0;
};

inline constexpr XCode XCode::OK{0};
inline constexpr XCode XCode::NO_ELEMENT{0x40000001};
inline constexpr XCode XCode::ABSENT{0x40000003};
inline constexpr XCode XCode::REFUSED{0x40000004};
inline constexpr XCode XCode::FAILURE{0x7fffffff};

constexpr char const* XCode::NAME(XCode result)
{
    constexpr NamedValue<XCode> NAMES[] = {
        {OK, "OK"}, {NO_ELEMENT, "NO_ELEMENT"}, {ABSENT, "ABSENT"}, {REFUSED, "REFUSED"}, {FAILURE, "FAILURE"}};
    return NAME_OF(NAMES, result);
}

/// The name, with the value behind it where that is not one of the named ones: "(invalid) 5".
template <class Traits>
std::basic_ostream<char, Traits>& operator<<(std::basic_ostream<char, Traits>& stream, XCode result)
{
    stream << result.getName();
    return result.getName() == ERROR::INVALID ? stream << ' ' << result.getValue() : stream;
}
