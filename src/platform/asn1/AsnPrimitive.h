#pragma once

#include "platform/asn1/AsnClass.h"

/// A type without components. This class itself has contents of no octets, which makes it the NULL type when built with
/// that type's tag; the classes below have contents.
///
///     AsnPrimitive const notAvailable(AsnTag::UNIVERSAL, AsnTag::NULL_TYPE); // flags 0x10000000, number 5
class CC_EXPORT AsnPrimitive : public AsnSyntax
{
public:
    /// `flags`: the class of the type's tag, AsnTag::UNIVERSAL for the types of the language.
    AsnPrimitive(unsigned int flags, unsigned int number) : m_tag(flags, number) {}

    AsnSyntax* clone() const override;
    AsnSyntax* createNew() const override;
    void reset() noexcept override {}
    void take(AsnSyntax& same) noexcept override { *this = static_cast<AsnPrimitive&>(same); }
    Kind getKind() const override { return Kind::NULL_VALUE; }
    char const* getTypeName() const override { return nullptr; }
    char const* getConstraint() const override { return ""; }
    AsnTag getTag() const override { return m_tag; }

protected:
    bool hasSameValue(AsnSyntax const& same) const override { return getTag() == same.getTag(); }
    bool encodeContents(AsnEncoder&) const override { return true; }
    bool decodeContents(AsnDecoder& decoder, AsnElement const& element) override;

private:
    AsnTag m_tag;
};

/// The NULL type's value, of which there is one.
class CC_EXPORT AsnNullWrapper : public AsnPrimitive
{
public:
    using AsnPrimitive::AsnPrimitive;
};

/// The IA5String type's value: a text of octets below 128, NUL among them.
class CC_EXPORT AsnIA5StringWrapper : public AsnPrimitive
{
public:
    using AsnPrimitive::AsnPrimitive;
    /// Octets of 128 and above are refused only when it is encoded.
    AsnIA5StringWrapper& operator=(String const& text)
    {
        m_text = text;
        return *this;
    }
    /// The text, which may contain NUL octets.
    String const& get() const { return m_text; }

    Kind getKind() const override { return Kind::IA5_STRING; }

protected:
    bool hasSameValue(AsnSyntax const& same) const override;
    bool encodeContents(AsnEncoder& encoder) const override;
    bool decodeContents(AsnDecoder& decoder, AsnElement const& element) override;

private:
    bool appendSegment(AsnDecoder& decoder, AsnElement const& element);

    String m_text;
};

/// A whole number on the wire: 32 bits signed. The base of AsnPrimitiveNativeWithTag and AsnEnumerated.
class CC_EXPORT AsnIntegerPrimitive : public AsnPrimitive
{
public:
    using AsnPrimitive::AsnPrimitive;
    /// The number as it stands on the wire, two's complement of 32 bits. @{
    int getNumber() const { return m_number; }
    void setNumber(int number) { m_number = number; }
    /// @}

    Kind getKind() const override { return Kind::INTEGER; }

protected:
    bool hasSameValue(AsnSyntax const& same) const override;
    bool encodeContents(AsnEncoder& encoder) const override;
    bool decodeContents(AsnDecoder& decoder, AsnElement const& element) override;

private:
    int m_number = 0;
};

/// A primitive of the class `Wrapper` that bears the tag of its type.
///
///     AsnPrimitiveDerivedWithTag<AsnNullWrapper, 268435456, 5> m_freeOfCharge; // NULL
template <class Wrapper, unsigned int FLAGS, unsigned int NUMBER>
class CC_EXPORT AsnPrimitiveDerivedWithTag
    : public AsnClass<AsnPrimitiveDerivedWithTag<Wrapper, FLAGS, NUMBER>, Wrapper>
{
public:
    AsnPrimitiveDerivedWithTag() : AsnClass<AsnPrimitiveDerivedWithTag, Wrapper>(FLAGS, NUMBER) {}
    using Wrapper::operator=;
};

/// A number of the program's own type that bears the tag of its ASN.1 type. A value past 31 bits travels as its bit
/// pattern, thus as a negative number.
///
///     AsnInteger m_codecChanges;
///     m_codecChanges = 2;
///     int const changes = m_codecChanges;
template <class Native, unsigned int FLAGS, unsigned int NUMBER>
class CC_EXPORT AsnPrimitiveNativeWithTag
    : public AsnClass<AsnPrimitiveNativeWithTag<Native, FLAGS, NUMBER>, AsnIntegerPrimitive>
{
    static_assert(sizeof(Native) <= sizeof(int), "the wire number has 32 bits");

public:
    AsnPrimitiveNativeWithTag() : AsnClass<AsnPrimitiveNativeWithTag, AsnIntegerPrimitive>(FLAGS, NUMBER) {}
    /// To the wire's 32 bits, bit for bit.
    AsnPrimitiveNativeWithTag& operator=(Native value)
    {
        this->setNumber(static_cast<int>(value));
        return *this;
    }
    /// From the wire's 32 bits, bit for bit.
    operator Native() const { return static_cast<Native>(this->getNumber()); }
};

/// The NULL type.
using AsnNull = AsnPrimitiveDerivedWithTag<AsnNullWrapper, AsnTag::UNIVERSAL, AsnTag::NULL_TYPE>;
/// The IA5String type.
using AsnIA5String = AsnPrimitiveDerivedWithTag<AsnIA5StringWrapper, AsnTag::UNIVERSAL, AsnTag::IA5_STRING>;
/// The INTEGER type, as far as 32 bits go.
using AsnInteger = AsnPrimitiveNativeWithTag<int, AsnTag::UNIVERSAL, AsnTag::INTEGER>;
