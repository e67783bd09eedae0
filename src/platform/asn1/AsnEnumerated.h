#pragma once

#include "platform/asn1/AsnPrimitive.h"
#include "platform/base/NameOf.h"

#include <span>

/// An enumeration on the wire: the number is kept whether or not it has a name. The base of AsnEnumerated.
class CC_EXPORT AsnEnumeratedPrimitive : public AsnIntegerPrimitive
{
public:
    /// Names and numbers, in static memory.
    using Identifiers = std::span<NamedValue<int> const>;

    using AsnIntegerPrimitive::AsnIntegerPrimitive;
    Kind getKind() const override { return Kind::ENUMERATED; }
    /// The ENUMERATED type's identifiers with their numbers, in the order of the type's definition.
    virtual Identifiers getIdentifiers() const = 0;
};

/// An ENUMERATED type over an enumeration of the program. `Enumeration` is a class with the enumeration `Type`, the
/// type's name TYPE_NAME and its `IDENTIFIERS()`, such as Q956::EMultiplier.
///
///     AsnEnumerated<Q956::EScale> m_scale;
///     m_scale = Q956::EScale::ONE_MINUTE;
///     std::puts(Q956::EScale::NAME(m_scale)); // oneMinute
template <class Enumeration>
class CC_EXPORT AsnEnumerated : public AsnClass<AsnEnumerated<Enumeration>, AsnEnumeratedPrimitive>
{
public:
    static constexpr char const* TYPE_NAME = Enumeration::TYPE_NAME;

    AsnEnumerated() : AsnClass<AsnEnumerated, AsnEnumeratedPrimitive>(AsnTag::UNIVERSAL, AsnTag::ENUMERATED) {}
    /// From the program's value, which need not be one of the enumeration's.
    AsnEnumerated& operator=(typename Enumeration::Type value)
    {
        this->setNumber(value);
        return *this;
    }
    /// The value on the wire, be it one of the enumeration's or not.
    operator typename Enumeration::Type() const { return static_cast<typename Enumeration::Type>(this->getNumber()); }
    AsnEnumeratedPrimitive::Identifiers getIdentifiers() const override { return Enumeration::IDENTIFIERS(); }
};
