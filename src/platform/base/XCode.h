#pragma once

/// The result of an operation that can fail: a small value, returned and never thrown.
///
/// Value 0 is success, any other value an error. Ask `isOk()`; compare with the named values below when the kind of
/// failure matters.
///
///     XCode const result = call.setProperty(property);
///     if (!result.isOk())
///         return result;
class [[nodiscard]] XCode
{
public:
    constexpr XCode() = default;
    constexpr explicit XCode(unsigned int value) : m_value(value) {}

    constexpr bool isOk() const { return m_value == 0; }
    constexpr unsigned int getValue() const { return m_value; }
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
