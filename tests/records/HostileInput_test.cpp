#include "Hex.h"
#include "RandomValue.h"
#include "RecordTypes.h"
#include "platform/asn1/AsnNotation.h"

#include <gtest/gtest.h>

namespace
{
using Octets = std::vector<unsigned char>;

constexpr char const* RECORDS[] = {"Charge", "Tariff", "CC-QoS"};

Octets ENCODE(AsnSyntax const& value)
{
    AsnOctets octets;
    String error;
    EXPECT_TRUE(value.encode(octets, error).isOk()) << error.c_str();
    return Octets(octets.begin(), octets.end());
}

/// Decodes into a value that holds something. What is refused must leave it and say where; what is accepted must be
/// the value of its own encoding.
void EXPECT_SOUND(char const* type, AsnSyntax const& before, Octets const& octets)
{
    std::unique_ptr<AsnSyntax> const value(before.clone());
    String error;
    if (!value->decode(octets.data(), octets.size(), error).isOk())
    {
        EXPECT_TRUE(value->isEqual(before)) << Hex::WRITE(octets);
        EXPECT_TRUE(error.view().find(", octet ") != std::string_view::npos) << error.c_str();
        EXPECT_TRUE(error.startsWith(type)) << error.c_str();
        return;
    }
    Octets const encoded = ENCODE(*value);
    EXPECT_LE(encoded.size(), octets.size()) << Hex::WRITE(octets);
    std::unique_ptr<AsnSyntax> const again = RecordTypes::CREATE(type);
    EXPECT_TRUE(again->decode(encoded.data(), encoded.size(), error).isOk()) << error.c_str();
    EXPECT_TRUE(again->isEqual(*value)) << Hex::WRITE(octets);
}
} // namespace

// where decoders of other makers disagree, ours takes what BER allows and keeps unknown numbers, and no more
TEST(HostileInput, DisputedFormsAreDecided)
{
    struct Case
    {
        char const* type;
        char const* hex;
        char const* result; // the value, or the error text
    };
    for (Case const& row : {
             Case{"Tariff", "02020001", "specialArrInfo : 1"},
             Case{"Tariff", "02810101", "specialArrInfo : 1"},
             Case{"Tariff", "30800000", "currencyInfoList : { }"},
             Case{"Tariff", "02010100", "Tariff: is over, but the input goes on, octet 3"},
             Case{"Multiplier", "0A0107", "7"},
             Case{"Amount", "3006820103810105", "Amount.currencyAmount: is missing, octet 2"},
             Case{"Amount", "3003810105", "Amount.multiplier: is missing, octet 5"},
             Case{"Amount", "3009810105820103830100", "Amount: has no place for [3], octet 8"},
             Case{"Charge", "8400", "Charge: cannot begin with [4], octet 0"},
             Case{"Charge", "810100", "Charge.chargeNotAvailable: NULL has no contents, octet 2"},
             Case{"Charge", "A305A1", "Charge: the length 5 runs past the end, octet 1"},
         })
    {
        std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(row.type);
        Octets const octets = *Hex::READ(row.hex);
        String text;
        if (value->decode(octets.data(), octets.size(), text).isOk())
        {
            EXPECT_TRUE(AsnNotation::VALUE_OF(*value, text).isOk());
        }
        EXPECT_STREQ(row.result, text.c_str()) << row.hex;
    }
}

TEST(HostileInput, DamagedRecordsAreRefusedOrSound)
{
    RandomValue random(5);
    for (char const* const type : RECORDS)
        for (unsigned int i = 0; i < 3000; ++i)
        {
            std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(type);
            random.fill(*value);
            Octets octets = ENCODE(*value);
            for (unsigned int damage = 1 + random.below(3); damage != 0; --damage)
                octets[random.below(static_cast<unsigned int>(octets.size()))] =
                    static_cast<unsigned char>(random.below(256));
            EXPECT_SOUND(type, *value, octets);
        }
}

TEST(HostileInput, CutRecordsAreRefused)
{
    RandomValue random(6);
    for (char const* const type : RECORDS)
        for (unsigned int i = 0; i < 500; ++i)
        {
            std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(type);
            random.fill(*value);
            Octets octets = ENCODE(*value);
            octets.resize(random.below(static_cast<unsigned int>(octets.size())));
            String error;
            EXPECT_EQ(XCode::FAILURE, RecordTypes::CREATE(type)->decode(octets.data(), octets.size(), error))
                << Hex::WRITE(octets);
            EXPECT_SOUND(type, *value, octets);
        }
}

TEST(HostileInput, NoiseIsRefusedOrSound)
{
    RandomValue random(7);
    for (char const* const type : RECORDS)
        for (unsigned int i = 0; i < 3000; ++i)
        {
            Octets octets(random.below(40));
            for (unsigned char& octet : octets)
                octet = static_cast<unsigned char>(random.below(256));
            EXPECT_SOUND(type, *RecordTypes::CREATE(type), octets);
        }
}
