#pragma once

#include "platform/asn1/AsnComposite.h"
#include "platform/asn1/AsnEnumerated.h"
#include "platform/asn1/AsnSequenceOf.h"

#include <random>

/// Fills values of any declared type at random, the same ones for the same seed: all widths of numbers, unknown numbers
/// of enumerations (never negative, which the second codec cannot write), texts of all IA5 characters, lists of no to
/// many elements, optional parts present and absent.
///
///     RandomValue random(1);
///     CC_QoS qos;
///     random.fill(qos);
class RandomValue
{
public:
    explicit RandomValue(unsigned int seed) : m_engine(seed) {}

    void fill(AsnSyntax& value);
    /// 0 to `limit` - 1
    unsigned int below(unsigned int limit) { return static_cast<unsigned int>(m_engine() % limit); }

private:
    int number();
    void fillEnumerated(AsnEnumeratedPrimitive& value);
    void fillText(AsnIA5StringWrapper& value);
    void fillSequence(AsnComposite& value);
    void fillChoice(AsnComposite& value);
    void fillList(AsnList& value);

    std::mt19937 m_engine;
};
