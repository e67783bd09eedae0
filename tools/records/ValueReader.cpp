#include "ValueReader.h"

#include <charconv>

namespace
{
bool IS_PART_OF_WORD(char letter)
{
    return (letter >= 'a' && letter <= 'z') || (letter >= 'A' && letter <= 'Z') || (letter >= '0' && letter <= '9') ||
           letter == '-';
}

bool PARSE(std::string_view word, int& number)
{
    auto const result = std::from_chars(word.data(), word.data() + word.size(), number);
    return !word.empty() && result.ec == std::errc() && result.ptr == word.data() + word.size();
}
} // namespace

bool ValueReader::readWhole(AsnSyntax& value)
{
    if (!read(value))
        return false;
    skipBlanks();
    return m_position == m_text.size() || fail("the value is over");
}

bool ValueReader::read(AsnSyntax& value)
{
    switch (value.getKind())
    {
    case AsnSyntax::Kind::NULL_VALUE:
        return takeWord() == "NULL" || fail("NULL is expected");
    case AsnSyntax::Kind::INTEGER:
        return readNumber(static_cast<AsnIntegerPrimitive&>(value));
    case AsnSyntax::Kind::ENUMERATED:
        return readEnumerated(static_cast<AsnEnumeratedPrimitive&>(value));
    case AsnSyntax::Kind::IA5_STRING:
        return readString(static_cast<AsnIA5StringWrapper&>(value));
    case AsnSyntax::Kind::SEQUENCE:
        return readSequence(static_cast<AsnComposite&>(value));
    case AsnSyntax::Kind::CHOICE:
        return readChoice(static_cast<AsnComposite&>(value));
    case AsnSyntax::Kind::SEQUENCE_OF:
        return readList(static_cast<AsnList&>(value));
    }
    return fail("a value of no known kind");
}

bool ValueReader::readNumber(AsnIntegerPrimitive& value)
{
    int number = 0;
    if (!PARSE(takeWord(), number))
        return fail("a number of 32 bits is expected");
    value.setNumber(number);
    return true;
}

bool ValueReader::readEnumerated(AsnEnumeratedPrimitive& value)
{
    std::string_view const word = takeWord();
    int number = 0;
    bool isKnown = PARSE(word, number);
    for (NamedValue<int> const& row : value.getIdentifiers())
        if (word == row.name)
        {
            number = row.value;
            isKnown = true;
        }
    value.setNumber(number);
    return isKnown || fail("an identifier of the enumeration is expected");
}

bool ValueReader::readString(AsnIA5StringWrapper& value)
{
    std::string text;
    skipBlanks();
    bool const isList = m_position < m_text.size() && m_text[m_position] == '{';
    auto const readPart = [&]
    {
        skipBlanks();
        bool const isQuoted = m_position < m_text.size() && m_text[m_position] == '"';
        return isQuoted ? readQuoted(text) : readCharacter(text);
    };
    if (!(isList ? readBraced(readPart) : readQuoted(text)))
        return false;
    value = String(std::string_view(text));
    return true;
}

bool ValueReader::readQuoted(std::string& text)
{
    if (!expect('"'))
        return false;
    for (; m_position < m_text.size(); ++m_position)
    {
        if (m_text[m_position] == '"')
        {
            ++m_position;
            if (m_position == m_text.size() || m_text[m_position] != '"') // two stand for one
                return true;
        }
        text.push_back(m_text[m_position]);
    }
    return fail("the text does not end");
}

bool ValueReader::readCharacter(std::string& text)
{
    int place[2] = {0, 0}; // column and row of the code table
    unsigned int count = 0;
    auto const readPlace = [&]
    { return (count < 2 && PARSE(takeWord(), place[count++])) || fail("{column, row} is expected"); };
    if (!readBraced(readPlace))
        return false;
    if (count != 2 || place[0] < 0 || place[0] > 7 || place[1] < 0 || place[1] > 15)
        return fail("a place of the code table is expected");
    text.push_back(static_cast<char>(place[0] * 16 + place[1]));
    return true;
}

bool ValueReader::readSequence(AsnComposite& value)
{
    return readBraced([&] { return readField(value); });
}

bool ValueReader::readField(AsnComposite& value)
{
    std::string_view const name = takeWord();
    for (unsigned int i = 0; i < value.getNumberOfFields(); ++i)
        if (name == value.getFields()[i].name)
        {
            value.use(i);
            return read(value.getComponent(i));
        }
    return fail("there is no component \"" + std::string(name) + "\"");
}

bool ValueReader::readChoice(AsnComposite& value)
{
    std::string_view const name = takeWord();
    for (unsigned int i = 0; i < value.getNumberOfFields(); ++i)
        if (name == value.getFields()[i].name)
        {
            value.use(i);
            return expect(':') && read(value.getComponent(i));
        }
    return fail("there is no alternative \"" + std::string(name) + "\"");
}

bool ValueReader::readList(AsnList& value)
{
    return readBraced(
        [&]
        {
            AsnSyntax* const element = value.appendElement();
            return element != nullptr ? read(*element) : fail("out of memory");
        });
}

template <class ReadOne>
bool ValueReader::readBraced(ReadOne const& readOne)
{
    if (!expect('{'))
        return false;
    if (take('}'))
        return true;
    do
        if (!readOne())
            return false;
    while (take(','));
    return expect('}');
}

void ValueReader::skipBlanks()
{
    while (m_position < m_text.size() && (m_text[m_position] == ' ' || m_text[m_position] == '\t'))
        ++m_position;
}

bool ValueReader::take(char letter)
{
    skipBlanks();
    if (m_position == m_text.size() || m_text[m_position] != letter)
        return false;
    ++m_position;
    return true;
}

bool ValueReader::expect(char letter) { return take(letter) || fail(std::string("'") + letter + "' is expected"); }

std::string_view ValueReader::takeWord()
{
    skipBlanks();
    std::size_t const begin = m_position;
    while (m_position < m_text.size() && IS_PART_OF_WORD(m_text[m_position]))
        ++m_position;
    return m_text.substr(begin, m_position - begin);
}

bool ValueReader::fail(std::string const& reason)
{
    if (m_error.empty())
        m_error = reason + ", character " + std::to_string(m_position);
    return false;
}
