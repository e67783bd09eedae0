#include "SecondCodec.h"

#include "platform/asn1/AsnPrimitive.h"

#include <array>

namespace
{
std::string CHILD(std::string const& path, std::string const& name) { return path.empty() ? name : path + "." + name; }

std::string ELEMENT(std::string const& path, std::size_t index)
{
    return CHILD(path, std::string("?").append(std::to_string(index + 1)));
}

/// A value under construction or just decoded in the other codec. Its operations return what went wrong, or nothing.
class Node
{
public:
    Node(asn1_node module, char const* type)
        : m_result(asn1_create_element(module, (std::string("CallControlRecords.") + type).c_str(), &m_node))
    {
    }
    ~Node() { asn1_delete_structure(&m_node); }
    Node(Node const&) = delete;
    Node& operator=(Node const&) = delete;

    std::string getError() const { return m_result == ASN1_SUCCESS ? "" : asn1_strerror(m_result); }

    std::string decode(std::vector<unsigned char> const& octets)
    {
        char text[ASN1_MAX_ERROR_DESCRIPTION_SIZE] = "";
        int const result = asn1_der_decoding(&m_node, octets.data(), static_cast<int>(octets.size()), text);
        return result == ASN1_SUCCESS ? "" : std::string(asn1_strerror(result)) + " " + text;
    }
    std::string encode(std::vector<unsigned char>& octets)
    {
        char text[ASN1_MAX_ERROR_DESCRIPTION_SIZE] = "";
        int length = 0;
        asn1_der_coding(m_node, "", nullptr, &length, text); // tells the length
        octets.resize(static_cast<std::size_t>(length));
        int const result = asn1_der_coding(m_node, "", octets.data(), &length, text);
        octets.resize(static_cast<std::size_t>(length));
        return result == ASN1_SUCCESS ? "" : std::string(asn1_strerror(result)) + " " + text;
    }

    std::string write(std::string const& path, AsnSyntax const& value)
    {
        switch (value.getKind())
        {
        case AsnSyntax::Kind::NULL_VALUE:
            return "";
        case AsnSyntax::Kind::INTEGER:
        case AsnSyntax::Kind::ENUMERATED:
            return writeNumber(path, static_cast<AsnIntegerPrimitive const&>(value).getNumber());
        case AsnSyntax::Kind::IA5_STRING:
            return writeText(path, static_cast<AsnIA5StringWrapper const&>(value).get());
        case AsnSyntax::Kind::SEQUENCE:
            return writeSequence(path, static_cast<AsnComposite const&>(value));
        case AsnSyntax::Kind::CHOICE:
            return writeChoice(path, static_cast<AsnComposite const&>(value));
        case AsnSyntax::Kind::SEQUENCE_OF:
            return writeList(path, static_cast<AsnList const&>(value));
        }
        return path + ": unknown kind";
    }

    std::string compare(std::string const& path, AsnSyntax const& expected)
    {
        switch (expected.getKind())
        {
        case AsnSyntax::Kind::NULL_VALUE:
            return isThere(path) ? "" : path + ": absent";
        case AsnSyntax::Kind::INTEGER:
        case AsnSyntax::Kind::ENUMERATED:
            return compareNumber(path, static_cast<AsnIntegerPrimitive const&>(expected).getNumber());
        case AsnSyntax::Kind::IA5_STRING:
            return compareText(path, static_cast<AsnIA5StringWrapper const&>(expected).get());
        case AsnSyntax::Kind::SEQUENCE:
            return compareSequence(path, static_cast<AsnComposite const&>(expected));
        case AsnSyntax::Kind::CHOICE:
            return compareChoice(path, static_cast<AsnComposite const&>(expected));
        case AsnSyntax::Kind::SEQUENCE_OF:
            return compareList(path, static_cast<AsnList const&>(expected));
        }
        return path + ": unknown kind";
    }

private:
    std::string put(std::string const& path, void const* value, std::size_t length)
    {
        int const result = asn1_write_value(m_node, path.c_str(), value, static_cast<int>(length));
        return result == ASN1_SUCCESS ? "" : path + ": " + asn1_strerror(result);
    }

    std::string writeNumber(std::string const& path, int number)
    {
        std::array<unsigned char, 4> octets{};
        for (std::size_t i = 0; i < octets.size(); ++i)
            octets[i] = static_cast<unsigned char>(static_cast<unsigned int>(number) >> (24 - 8 * i));
        return put(path, octets.data(), octets.size());
    }
    std::string writeText(std::string const& path, String const& text)
    {
        return put(path, text.c_str(), text.length());
    }
    std::string writeSequence(std::string const& path, AsnComposite const& value)
    {
        std::string error;
        for (unsigned int i = 0; i < value.getNumberOfFields() && error.empty(); ++i)
        {
            std::string const child = CHILD(path, value.getFields()[i].name);
            error = value.isUsed(i) ? write(child, value.getComponent(i)) : put(child, nullptr, 0);
        }
        return error;
    }
    std::string writeChoice(std::string const& path, AsnComposite const& value)
    {
        for (unsigned int i = 0; i < value.getNumberOfFields(); ++i)
            if (value.isUsed(i))
            {
                char const* const name = value.getFields()[i].name;
                std::string const error = put(path, name, 1);
                return error.empty() ? write(CHILD(path, name), value.getComponent(i)) : error;
            }
        return path + ": nothing is selected";
    }
    std::string writeList(std::string const& path, AsnList const& value)
    {
        std::string error;
        for (std::size_t i = 0; i < value.getSize() && error.empty(); ++i)
        {
            error = put(path, "NEW", 1);
            if (error.empty())
                error = write(ELEMENT(path, i), value.getElement(i));
        }
        return error;
    }

    bool isThere(std::string const& path)
    {
        int count = 0;
        return asn1_number_of_elements(m_node, path.c_str(), &count) == ASN1_SUCCESS;
    }
    std::string get(std::string const& path, std::vector<unsigned char>& octets)
    {
        octets.resize(1024); // more than any single part has
        int length = static_cast<int>(octets.size());
        int const result = asn1_read_value(m_node, path.c_str(), octets.data(), &length);
        octets.resize(result == ASN1_SUCCESS ? static_cast<std::size_t>(length) : 0);
        return result == ASN1_SUCCESS ? "" : path + ": " + asn1_strerror(result);
    }

    std::string compareNumber(std::string const& path, int expected)
    {
        std::vector<unsigned char> octets;
        std::string const error = get(path, octets);
        if (!error.empty() || octets.empty())
            return error.empty() ? path + ": empty" : error;
        long long number = (octets[0] & 0x80) != 0 ? -1 : 0;
        for (unsigned char const octet : octets)
            number = number * 256 + octet;
        return number == expected ? "" : path + ": " + std::to_string(number) + " for " + std::to_string(expected);
    }
    std::string compareText(std::string const& path, String const& expected)
    {
        std::vector<unsigned char> octets;
        std::string const error = get(path, octets);
        if (!error.empty())
            return error;
        return std::string(octets.begin(), octets.end()) == expected.view() ? "" : path + ": another text";
    }
    std::string compareSequence(std::string const& path, AsnComposite const& expected)
    {
        std::string error;
        for (unsigned int i = 0; i < expected.getNumberOfFields() && error.empty(); ++i)
        {
            std::string const child = CHILD(path, expected.getFields()[i].name);
            if (isThere(child) != expected.isUsed(i))
                error = child + ": presence differs";
            else if (expected.isUsed(i))
                error = compare(child, expected.getComponent(i));
        }
        return error;
    }
    std::string compareChoice(std::string const& path, AsnComposite const& expected)
    {
        std::vector<unsigned char> octets;
        std::string const error = get(path, octets);
        if (!error.empty())
            return error;
        std::string const selected(reinterpret_cast<char const*>(octets.data())); // it ends with a NUL
        for (unsigned int i = 0; i < expected.getNumberOfFields(); ++i)
            if (expected.isUsed(i))
                return selected == expected.getFields()[i].name
                           ? compare(CHILD(path, selected), expected.getComponent(i))
                           : path + ": " + selected + " is selected";
        return path + ": " + selected + " is selected for nothing";
    }
    std::string compareList(std::string const& path, AsnList const& expected)
    {
        int count = 0;
        if (asn1_number_of_elements(m_node, path.c_str(), &count) != ASN1_SUCCESS)
            return path + ": absent";
        if (static_cast<std::size_t>(count) != expected.getSize())
            return path + ": " + std::to_string(count) + " elements for " + std::to_string(expected.getSize());
        std::string error;
        for (std::size_t i = 0; i < expected.getSize() && error.empty(); ++i)
            error = compare(ELEMENT(path, i), expected.getElement(i));
        return error;
    }

    asn1_node m_node = nullptr;
    int m_result;
};
} // namespace

SecondCodec::SecondCodec(char const* modulePath)
{
    char text[ASN1_MAX_ERROR_DESCRIPTION_SIZE] = "";
    int const result = asn1_parser2tree(modulePath, &m_module, text);
    if (result != ASN1_SUCCESS)
        m_error = std::string(asn1_strerror(result)) + " " + text;
}

SecondCodec::~SecondCodec() { asn1_delete_structure(&m_module); }

std::vector<unsigned char> SecondCodec::encode(char const* type, AsnSyntax const& value)
{
    std::vector<unsigned char> octets;
    Node node(m_module, type);
    m_error = node.getError();
    if (m_error.empty())
        m_error = node.write("", value);
    if (m_error.empty())
        m_error = node.encode(octets);
    if (!m_error.empty())
        octets.clear();
    return octets;
}

std::string SecondCodec::compare(char const* type, std::vector<unsigned char> const& octets, AsnSyntax const& expected)
{
    Node node(m_module, type);
    std::string error = node.getError();
    if (error.empty())
        error = node.decode(octets);
    return error.empty() ? node.compare("", expected) : error;
}
