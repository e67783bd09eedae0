#pragma once

#include "platform/base/Export.h"

/// The tag of an ASN.1 type: its class and its number in one word, the class in the uppermost four bits.
///
///     constexpr AsnTag null(AsnTag::UNIVERSAL, 5);
///     constexpr AsnTag second(AsnTag::CONTEXT, 2); // [2]
class CC_EXPORT AsnTag
{
public:
    /// The four classes, as flags. @{
    static constexpr unsigned int UNIVERSAL = 0x10000000;
    static constexpr unsigned int APPLICATION = 0x20000000;
    static constexpr unsigned int CONTEXT = 0x40000000;
    static constexpr unsigned int PRIVATE = 0x80000000;
    /// @}
    /// The highest number that a tag has room for.
    static constexpr unsigned int MAX_NUMBER = 0x0fffffff;

    /// The numbers of the universal types that the runtime knows. @{
    static constexpr unsigned int INTEGER = 2;
    static constexpr unsigned int OCTET_STRING = 4;
    static constexpr unsigned int NULL_TYPE = 5;
    static constexpr unsigned int ENUMERATED = 10;
    static constexpr unsigned int SEQUENCE = 16;
    static constexpr unsigned int IA5_STRING = 22;
    /// @}

    constexpr AsnTag() = default; ///< no tag, as a choice has none
    /// REQUIRES: flags is one of the four classes, number <= MAX_NUMBER
    constexpr AsnTag(unsigned int flags, unsigned int number) : m_value(flags | number) {}

    /// Class and number; of no tag both are 0. @{
    constexpr bool isNone() const { return m_value == 0; }
    constexpr unsigned int getFlags() const { return m_value & ~MAX_NUMBER; }
    constexpr unsigned int getNumber() const { return m_value & MAX_NUMBER; }
    friend constexpr bool operator==(AsnTag, AsnTag) = default;
    /// @}

private:
    unsigned int m_value = 0;
};
