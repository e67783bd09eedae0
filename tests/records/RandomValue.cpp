#include "RandomValue.h"

#include <string>

void RandomValue::fill(AsnSyntax& value)
{
    switch (value.getKind())
    {
    case AsnSyntax::Kind::NULL_VALUE:
        return;
    case AsnSyntax::Kind::INTEGER:
        return static_cast<AsnIntegerPrimitive&>(value).setNumber(number());
    case AsnSyntax::Kind::ENUMERATED:
        return fillEnumerated(static_cast<AsnEnumeratedPrimitive&>(value));
    case AsnSyntax::Kind::IA5_STRING:
        return fillText(static_cast<AsnIA5StringWrapper&>(value));
    case AsnSyntax::Kind::SEQUENCE:
        return fillSequence(static_cast<AsnComposite&>(value));
    case AsnSyntax::Kind::CHOICE:
        return fillChoice(static_cast<AsnComposite&>(value));
    case AsnSyntax::Kind::SEQUENCE_OF:
        return fillList(static_cast<AsnList&>(value));
    }
}

int RandomValue::number()
{
    unsigned int const bits = static_cast<unsigned int>(m_engine());
    int const positive = static_cast<int>(bits >> (1 + below(31)));
    switch (below(8))
    {
    case 0: // the edges, where one more octet is needed
        return static_cast<int>((1U << below(32)) - below(2));
    case 1:
    case 2:
        return -positive - 1;
    default:
        return positive;
    }
}

void RandomValue::fillEnumerated(AsnEnumeratedPrimitive& value)
{
    unsigned int const known = static_cast<unsigned int>(value.getIdentifiers().size());
    bool const isUnknown = below(10) == 0;
    value.setNumber(isUnknown ? static_cast<int>(m_engine() >> (1 + below(31))) : static_cast<int>(below(known)));
}

void RandomValue::fillText(AsnIA5StringWrapper& value)
{
    std::string text(below(20) == 0 ? below(400) : below(12), ' ');
    for (char& letter : text)
        letter = static_cast<char>(below(128));
    value = String(std::string_view(text));
}

void RandomValue::fillSequence(AsnComposite& value)
{
    for (unsigned int i = 0; i < value.getNumberOfFields(); ++i)
    {
        if (value.getFields()[i].isOptional && below(2) == 0)
            continue;
        value.use(i);
        fill(value.getComponent(i));
    }
}

void RandomValue::fillChoice(AsnComposite& value)
{
    unsigned int const index = below(value.getNumberOfFields());
    value.use(index);
    fill(value.getComponent(index));
}

void RandomValue::fillList(AsnList& value)
{
    for (unsigned int left = below(10) == 0 ? below(40) : below(4); left != 0; --left)
        fill(*value.appendElement());
}
