#include "platform/asn1/AsnNotation.h"

#include "platform/asn1/AsnComposite.h"
#include "platform/asn1/AsnEnumerated.h"
#include "platform/asn1/AsnSequenceOf.h"

#include <memory>
#include <new>

namespace
{
using Kind = AsnSyntax::Kind;

constexpr NamedValue<Kind> s_kinds[] = {{Kind::NULL_VALUE, "NULL"},        {Kind::INTEGER, "INTEGER"},
                                        {Kind::ENUMERATED, "ENUMERATED"},  {Kind::IA5_STRING, "IA5String"},
                                        {Kind::SEQUENCE, "SEQUENCE"},      {Kind::CHOICE, "CHOICE"},
                                        {Kind::SEQUENCE_OF, "SEQUENCE OF"}};

char const* KIND_NAME(AsnSyntax const& value) { return NAME_OF(s_kinds, value.getKind()); }

/// Prints a type's definition.
class TypePrinter
{
public:
    explicit TypePrinter(String& out) : m_out(out) {}

    void printBody(AsnSyntax const& value)
    {
        switch (value.getKind())
        {
        case Kind::ENUMERATED:
            return printIdentifiers(static_cast<AsnEnumeratedPrimitive const&>(value));
        case Kind::SEQUENCE:
        case Kind::CHOICE:
            return printFields(static_cast<AsnComposite const&>(value));
        case Kind::SEQUENCE_OF:
            return printList(static_cast<AsnList const&>(value));
        default:
            m_out += KIND_NAME(value);
            if (*value.getConstraint() != '\0')
                m_out.concatf(" %s", value.getConstraint());
        }
    }

private:
    void beginLine() { m_out.concatf("\n%*s", 4 * m_depth, ""); }

    void printReference(AsnSyntax const& value)
    {
        if (value.getTypeName() != nullptr)
            m_out += value.getTypeName();
        else
            printBody(value);
    }

    void printIdentifiers(AsnEnumeratedPrimitive const& value)
    {
        m_out += "ENUMERATED {";
        ++m_depth;
        char const* separator = "";
        for (NamedValue<int> const& row : value.getIdentifiers())
        {
            m_out += separator;
            beginLine();
            m_out.concatf("%s (%d)", row.name, row.value);
            separator = ",";
        }
        --m_depth;
        beginLine();
        m_out += "}";
    }

    void printFields(AsnComposite const& value)
    {
        m_out.concatf("%s {", KIND_NAME(value));
        ++m_depth;
        for (unsigned int i = 0; i < value.getNumberOfFields(); ++i)
        {
            if (i != 0)
                m_out += ",";
            beginLine();
            printField(value.getFields()[i], value.getComponent(i));
        }
        --m_depth;
        beginLine();
        m_out += "}";
    }

    void printField(AsnField const& field, AsnSyntax const& component)
    {
        m_out.concatf("%s ", field.name);
        if (!field.tag.isNone())
            m_out.concatf("[%u] %s ", field.tag.getNumber(),
                          component.getKind() == Kind::CHOICE ? "EXPLICIT" : "IMPLICIT");
        printReference(component);
        if (field.isOptional)
            m_out += " OPTIONAL";
    }

    void printList(AsnList const& value)
    {
        std::unique_ptr<AsnSyntax> const element(value.createElement());
        if (element == nullptr)
            throw std::bad_alloc();
        m_out += "SEQUENCE ";
        if (*value.getConstraint() != '\0')
            m_out.concatf("%s ", value.getConstraint());
        m_out += "OF ";
        printReference(*element);
    }

    String& m_out;
    int m_depth = 0;
};

/// Prints a value.
class ValuePrinter
{
public:
    explicit ValuePrinter(String& out) : m_out(out) {}

    void print(AsnSyntax const& value)
    {
        switch (value.getKind())
        {
        case Kind::NULL_VALUE:
            m_out += "NULL";
            break;
        case Kind::INTEGER:
            m_out.concatf("%d", static_cast<AsnIntegerPrimitive const&>(value).getNumber());
            break;
        case Kind::ENUMERATED:
            return printEnumerated(static_cast<AsnEnumeratedPrimitive const&>(value));
        case Kind::IA5_STRING:
            return printString(static_cast<AsnIA5StringWrapper const&>(value).get().view());
        case Kind::SEQUENCE:
            return printSequence(static_cast<AsnComposite const&>(value));
        case Kind::CHOICE:
            return printChoice(static_cast<AsnComposite const&>(value));
        case Kind::SEQUENCE_OF:
            return printList(static_cast<AsnList const&>(value));
        }
    }

private:
    void printEnumerated(AsnEnumeratedPrimitive const& value)
    {
        for (NamedValue<int> const& row : value.getIdentifiers())
            if (row.value == value.getNumber())
            {
                m_out += row.name;
                return;
            }
        m_out.concatf("%d", value.getNumber());
    }

    static bool IS_PRINTABLE(char letter) { return letter >= ' ' && letter <= '~'; }

    // control characters have no place in quotes: they stand between quoted parts as {column, row} of the code table
    void printString(std::string_view text)
    {
        bool isPlain = true;
        for (char const letter : text)
            isPlain = isPlain && IS_PRINTABLE(letter);
        if (isPlain)
            return printQuoted(text);
        m_out += "{";
        char const* separator = " ";
        while (!text.empty())
        {
            m_out += separator;
            separator = ", ";
            std::size_t length = 0;
            while (length < text.size() && IS_PRINTABLE(text[length]))
                ++length;
            unsigned int const next = static_cast<unsigned char>(text[0]);
            if (length != 0)
                printQuoted(text.substr(0, length));
            else
                m_out.concatf("{%u, %u}", next / 16, next % 16);
            text.remove_prefix(length != 0 ? length : 1);
        }
        m_out += " }";
    }

    void printQuoted(std::string_view text)
    {
        m_out += "\"";
        for (char const letter : text)
            m_out += letter == '"' ? String("\"\"") : String(&letter, 1);
        m_out += "\"";
    }

    void printSequence(AsnComposite const& value)
    {
        m_out += "{";
        char const* separator = " ";
        for (unsigned int i = 0; i < value.getNumberOfFields(); ++i)
        {
            if (!value.isUsed(i))
                continue;
            m_out.concatf("%s%s ", separator, value.getFields()[i].name);
            print(value.getComponent(i));
            separator = ", ";
        }
        m_out += " }";
    }

    void printChoice(AsnComposite const& value)
    {
        for (unsigned int i = 0; i < value.getNumberOfFields(); ++i)
            if (value.isUsed(i))
            {
                m_out.concatf("%s : ", value.getFields()[i].name);
                print(value.getComponent(i));
            }
    }

    void printList(AsnList const& value)
    {
        m_out += "{";
        char const* separator = " ";
        for (std::size_t i = 0; i < value.getSize(); ++i)
        {
            m_out += separator;
            print(value.getElement(i));
            separator = ", ";
        }
        m_out += " }";
    }

    String& m_out;
};
} // namespace

XCode AsnNotation::TYPE_OF(AsnSyntax const& value, String& out)
{
    try
    {
        String text;
        text.format("%s ::= ", NAME_OF(value));
        TypePrinter(text).printBody(value);
        out = std::move(text);
        return XCode::OK;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::NO_ELEMENT;
    }
}

XCode AsnNotation::VALUE_OF(AsnSyntax const& value, String& out)
{
    try
    {
        String text;
        ValuePrinter(text).print(value);
        out = std::move(text);
        return XCode::OK;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::NO_ELEMENT;
    }
}

char const* AsnNotation::NAME_OF(AsnSyntax const& value)
{
    return value.getTypeName() != nullptr ? value.getTypeName() : KIND_NAME(value);
}
