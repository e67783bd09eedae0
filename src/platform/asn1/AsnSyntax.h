#pragma once

#include "platform/asn1/AsnEncoder.h"
#include "platform/asn1/AsnTag.h"
#include "platform/base/String.h"
#include "platform/base/XCode.h"

#include <cstddef>

class AsnDecoder;
struct AsnElement;

/// A value of an ASN.1 type: the base of all types of the runtime.
///
/// A type of a module is a class: a primitive (AsnPrimitive and its kin, AsnEnumerated), an AsnSequence or ASN_CHOICE
/// with its components as members, or an AsnSequenceOf. Its objects are plain values: copied, compared, owned by
/// whoever holds them, used by one thread at a time. They encode themselves in DER and decode BER; either sets a text
/// that names the field, and for bad input the octet, when it fails.
///
///     Q956::Amount amount;
///     amount.m_currencyAmount = 1234;
///     amount.m_multiplier = Q956::EMultiplier::ONE_HUNDREDTH;
///     AsnOctets octets;
///     String error;
///     if (!amount.encode(octets, error).isOk())   // 30 07 81 02 04 D2 82 01 01
///         std::puts(error.c_str());
///
/// To see what a value is made of without knowing its class (a printer, a generator of test values), ask `getKind` and
/// cast to AsnIntegerPrimitive, AsnEnumeratedPrimitive, AsnIA5StringWrapper, AsnComposite or AsnList.
class CC_EXPORT AsnSyntax
{
public:
    /// What a value is made of, with the class to which it may then be cast.
    enum class Kind : unsigned char
    {
        NULL_VALUE,  ///< AsnPrimitive
        INTEGER,     ///< AsnIntegerPrimitive
        ENUMERATED,  ///< AsnEnumeratedPrimitive
        IA5_STRING,  ///< AsnIA5StringWrapper
        SEQUENCE,    ///< AsnSequence, which is an AsnComposite
        CHOICE,      ///< ASN_CHOICE, which is an AsnComposite
        SEQUENCE_OF, ///< AsnList
    };

    virtual ~AsnSyntax() = default;
    /// A copy, owned by the caller; null when memory is out.
    virtual AsnSyntax* clone() const = 0;
    /// An object of the same class with its initial value, owned by the caller; null when memory is out.
    virtual AsnSyntax* createNew() const = 0;
    /// Back to the initial value: 0, empty, nothing selected, no optional component present.
    virtual void reset() noexcept = 0;
    /// Takes the value out of `same`. REQUIRES: `same` is of the same class
    virtual void take(AsnSyntax& same) noexcept = 0;
    /// The same for all objects of a class.
    virtual Kind getKind() const = 0;
    /// The name that the type bears in its module, null for a type that is written out where it is used.
    virtual char const* getTypeName() const = 0;
    /// What stands behind the type in its definition ("(0..16777215)"), empty for most. The codec does not check it.
    virtual char const* getConstraint() const = 0;
    /// The type's own tag; none for a choice.
    virtual AsnTag getTag() const = 0;

    /// Whether `other` is of the same class and has the same value: the same optional components present, the same
    /// alternative selected, and what is present and selected equal. What is not does not matter.
    bool isEqual(AsnSyntax const& other) const;
    /// As `isEqual`.
    friend bool operator==(AsnSyntax const& left, AsnSyntax const& right) { return left.isEqual(right); }

    /// Replaces `out` by the value's DER octets. OK; REFUSED when the value has no encoding (a choice without a
    /// selection, a text that is not IA5); NO_ELEMENT when memory is out. Unless it is OK, `out` is unchanged and
    /// `error` says what is wrong with which field, as far as memory allows.
    XCode encode(AsnOctets& out, String& error) const;
    /// Takes over the value that `length` octets hold in BER. OK; FAILURE when they are not one whole value of this
    /// type; NO_ELEMENT when memory is out. Unless it is OK, this value is unchanged and `error` says which field and
    /// which octet (the first is octet 0) are wrong, as far as memory allows.
    ///
    /// An INTEGER beyond 32 bits signed is an error; an ENUMERATED number without a name is kept.
    XCode decode(unsigned char const* octets, std::size_t length, String& error);

    // What encoder and decoder call; each returns false after setting the error text, and throws std::bad_alloc.

    /// Writes the element under the type's own tag, or under `tag` unless that is none.
    virtual bool encodeAs(AsnEncoder& encoder, AsnTag tag) const;
    /// Whether an element with that tag can be a value of this type.
    virtual bool canBeginWith(AsnTag tag) const { return tag == getTag(); }
    /// Reads the element, whose tag the caller has found right. `isTagged`: the tag was that of a component rather
    /// than the type's own.
    virtual bool decodeAs(AsnDecoder& decoder, AsnElement const& element, bool isTagged);

protected:
    /// For derived classes: a value is copied as one of the class that it is of. @{
    AsnSyntax() = default;
    AsnSyntax(AsnSyntax const&) = default;
    AsnSyntax(AsnSyntax&&) = default;
    AsnSyntax& operator=(AsnSyntax const&) = default;
    AsnSyntax& operator=(AsnSyntax&&) = default;
    /// @}

    /// REQUIRES: `same` is of the same class
    virtual bool hasSameValue(AsnSyntax const& same) const = 0;
    /// What stands between the header and the end of the element. REQUIRES: who reads has found the tag right. @{
    virtual bool encodeContents(AsnEncoder& encoder) const = 0;
    virtual bool decodeContents(AsnDecoder& decoder, AsnElement const& element) = 0;
    /// @}

private:
    bool isConstructed() const { return getKind() >= Kind::SEQUENCE; }
};
