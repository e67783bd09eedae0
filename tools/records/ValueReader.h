#pragma once

#include "platform/asn1/AsnComposite.h"
#include "platform/asn1/AsnEnumerated.h"
#include "platform/asn1/AsnSequenceOf.h"

#include <string>
#include <string_view>

/// Reads values in ASN.1 value notation, the counterpart of AsnNotation::VALUE_OF, so that an example can be checked
/// from its text to its octets as well as back.
///
///     Q956::Time time;
///     ValueReader reader("{ lengthOfTimeUnit 60, scale oneSecond }");
///     if (!reader.readWhole(time))
///         std::puts(reader.getError().c_str());
class ValueReader
{
public:
    explicit ValueReader(std::string_view text) : m_text(text) {}

    /// Reads the whole text into `value`, which must have its initial value. False: `getError` says where the text
    /// goes wrong, and `value` is whatever was read so far.
    bool readWhole(AsnSyntax& value);
    std::string const& getError() const { return m_error; }

private:
    bool read(AsnSyntax& value);
    bool readNumber(AsnIntegerPrimitive& value);
    bool readEnumerated(AsnEnumeratedPrimitive& value);
    bool readString(AsnIA5StringWrapper& value);
    bool readQuoted(std::string& text);
    bool readCharacter(std::string& text);
    bool readSequence(AsnComposite& value);
    bool readChoice(AsnComposite& value);
    bool readList(AsnList& value);
    bool readField(AsnComposite& value);

    template <class ReadOne>
    bool readBraced(ReadOne const& readOne);

    void skipBlanks();
    bool take(char letter);
    bool expect(char letter);
    std::string_view takeWord();
    bool fail(std::string const& reason);

    std::string_view m_text;
    std::size_t m_position = 0;
    std::string m_error;
};
