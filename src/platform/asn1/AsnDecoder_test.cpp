#include "platform/asn1/AsnDecoder.h"

#include "platform/asn1/Q956.h"
#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>

namespace
{
Q956::Amount AMOUNT(int amount, Q956::EMultiplier::Type multiplier)
{
    Q956::Amount value;
    value.m_currencyAmount = amount;
    value.m_multiplier = multiplier;
    return value;
}

std::string REPEATED(char const* text, unsigned int times)
{
    std::string repeated;
    while (times-- != 0)
        repeated += text;
    return repeated;
}
} // namespace

TEST(AsnDecoder, TakesEveryFormOfLength)
{
    for (char const* const hex : {
             "30 06 81 01 05 82 01 03",                    // the shortest
             "30 81 06 81 01 05 82 01 03",                 // long
             "30 82 0006 81 01 05 82 01 03",               // longer
             "30 89 000000000000000006 81 01 05 82 01 03", // longer than any number of the machine
             "30 08 81 81 01 05 82 81 01 03",              // inside
             "30 80 81 01 05 82 01 03 00 00",              // indefinite
             "30 80 81 82 0001 05 82 02 0003 00 00",       // both, and a number that is not the shortest
         })
    {
        Q956::Amount amount;
        EXPECT_EQ("", DECODE(amount, hex)) << hex;
        EXPECT_TRUE(amount == AMOUNT(5, Q956::EMultiplier::ONE)) << hex;
        EXPECT_EQ("3006810105820103", HEX(amount));
    }
}

TEST(AsnDecoder, IndefiniteLengthsNest)
{
    Q956::FlatRateCurrency rate;
    EXPECT_EQ("", DECODE(rate, "30 80 81 03 455552 A2 80 81 01 05 82 01 03 00 00 00 00"));
    EXPECT_EQ("300D8103455552A206810105820103", HEX(rate));
    EXPECT_EQ("", DECODE(rate, "30 0F 81 03 455552 A2 80 81 01 05 82 01 03 0000"));
    EXPECT_EQ("", DECODE(rate, "30 80 A1 80 04 02 4555 24 80 04 01 52 0000 0000 A2 06 81 01 05 82 01 03 0000"));
    EXPECT_EQ("EUR", rate.m_fRCurrency.get());
}

TEST(AsnDecoder, SaysWhichFieldAndOctetAreWrong)
{
    struct Case
    {
        char const* hex;
        char const* error;
    };
    Case const cases[] = {
        {"", "Amount: the input ends where an element should begin, octet 0"},
        {"30", "Amount: the input ends where a length should stand, octet 1"},
        {"30 06 81 01 05", "Amount: the length 6 runs past the end, octet 1"},
        {"30 82 01", "Amount: the input ends within a length, octet 1"},
        {"30 FF 00", "Amount: the length octet FF is reserved, octet 1"},
        {"30 88 FFFFFFFFFFFFFFFF 00", "Amount: the length runs past the end, octet 1"},
        {"30 84 FFFFFFFF 00", "Amount: the length runs past the end, octet 1"},
        {"3F", "Amount: the input ends within a tag, octet 1"},
        {"3F 81", "Amount: the input ends within a tag, octet 2"},
        {"3F 80", "Amount: the tag number begins with zeros, octet 1"},
        {"3F 80 81 00 00", "Amount: the tag number begins with zeros, octet 1"},
        {"3F 10 06 81 01 05 82 01 03", "Amount: the tag number 16 must stand in the first octet, octet 1"},
        {"3F 1E 00", "Amount: the tag number 30 must stand in the first octet, octet 1"},
        {"3F 1F 00", "Amount: cannot begin with [UNIVERSAL 31], octet 0"},
        {"30 07 9F 01 01 05 82 01 03", "Amount: the tag number 1 must stand in the first octet, octet 3"},
        {"30 07 81 01 05 9F 02 01 03", "Amount: the tag number 2 must stand in the first octet, octet 6"},
        {"30 08 9F 80 01 01 05 82 01 03", "Amount: the tag number begins with zeros, octet 3"},
        {"30 80 81 01 05 82 01 03 1F 00 00", "Amount: the tag number 0 must stand in the first octet, octet 9"},
        {"3F FF FF FF FF FF 00 00", "Amount: the tag number is too large, octet 5"},
        {"31 00", "Amount: cannot begin with [UNIVERSAL 17], octet 0"},
        {"70 00", "Amount: cannot begin with [APPLICATION 16], octet 0"},
        {"BF 81 00 00", "Amount: cannot begin with [128], octet 0"},
        {"F0 00", "Amount: cannot begin with [PRIVATE 16], octet 0"},
        {"10 00", "Amount: must be constructed, octet 0"},
        {"30 00", "Amount.currencyAmount: is missing, octet 2"},
        {"30 03 81 01 05", "Amount.multiplier: is missing, octet 5"},
        {"30 06 82 01 03 81 01 05", "Amount.currencyAmount: is missing, octet 2"},
        {"30 09 81 01 05 82 01 03 83 01 00", "Amount: has no place for [3], octet 8"},
        {"30 09 81 01 05 81 01 05 82 01 03", "Amount.multiplier: is missing, octet 5"},
        {"30 06 81 02 05 82 01 03", "Amount: the length 3 runs past the end, octet 7"},
        {"30 06 81 05 05 82 01 03", "Amount: the length 5 runs past the end, octet 3"},
        {"30 05 81 00 82 01 03", "Amount.currencyAmount: a number needs an octet, octet 4"},
        {"30 08 A1 03 02 01 05 82 01 03", "Amount.currencyAmount: must be primitive, octet 2"},
        {"30 06 81 01 05 82 01 03 00", "Amount: is over, but the input goes on, octet 8"},
        {"30 80 81 01 05 82 01 03 00", "Amount: the input ends where a length should stand, octet 9"},
        {"30 80 81 01 05 82 01 03", "Amount: contents of indefinite length do not end, octet 0"},
        {"30 80 81 01 05 82 01 03 00 01 00", "Amount: a malformed end of contents, octet 8"},
        {"30 80 81 01 05 82 01 03 00 81 00", "Amount: a malformed end of contents, octet 8"},
        {"30 80 81 01 05 82 01 03 20 00", "Amount: a malformed end of contents, octet 8"},
        {"30 80 81 80 82 01 03 00 00", "Amount: indefinite length of a primitive element, octet 3"},
        {"30 08 81 01 05 82 01 03 00 00", "Amount: has no place for [UNIVERSAL 0], octet 8"},
    };
    for (Case const& row : cases)
    {
        Q956::Amount amount = AMOUNT(77, Q956::EMultiplier::TEN);
        EXPECT_EQ(row.error, DECODE(amount, row.hex)) << row.hex;
        EXPECT_TRUE(amount == AMOUNT(77, Q956::EMultiplier::TEN)) << row.hex;
    }
}

TEST(AsnDecoder, NamesTheWholeWayToTheField)
{
    AsnSequenceOf<Q956::AOCSCurrencyInfo> list;
    EXPECT_EQ("SEQUENCE OF[1].aOCSCurrencyInfo.specificCurrency.flatRateCurrency.fRAmount.multiplier: is missing, "
              "octet 23",
              DECODE(list, "30 15 30 05 0A0100 8400 30 0C 0A0102 A2 07 8100 A2 03 810105"));
    EXPECT_EQ("SEQUENCE OF[0]: cannot begin with [UNIVERSAL 2], octet 2", DECODE(list, "3003020105"));
    EXPECT_EQ(0U, list.getSize());
}

TEST(AsnDecoder, NestingIsBounded)
{
    unsigned int const deep = 100000;
    AsnIA5String text;
    EXPECT_EQ("IA5String: is nested deeper than 16 levels, octet 32",
              DECODE(text, "3680" + REPEATED("2480", deep) + REPEATED("0000", deep + 1)));
    EXPECT_EQ("IA5String: contents of indefinite length do not end, octet 0",
              DECODE(text, "3680" + REPEATED("2480", deep)));
    EXPECT_EQ("", DECODE(text, "3680" + REPEATED("2480", 15) + "040141" + REPEATED("0000", 16)));
    EXPECT_EQ("A", text.get());
}

TEST(AsnDecoder, ALengthBeyondTheInputTakesNoMemory)
{
    AsnSequenceOf<Q956::AOCSCurrencyInfo> list;
    EXPECT_EQ("SEQUENCE OF: the length runs past the end, octet 1", DECODE(list, "3085 00FFFFFFF0 0A0100"));
    AsnIA5String text;
    EXPECT_EQ("IA5String: the length runs past the end, octet 1", DECODE(text, "16847FFFFFFF41"));
}

TEST(AsnDecoder, EveryBeginningOfAnInputIsRefused)
{
    char const* const hex = "30250A0100A1208103455552A206810105820101830101A40681013C820102A506810101820104";
    std::vector<unsigned char> const octets = OCTETS(hex);
    Q956::AOCSCurrencyInfo whole;
    ASSERT_EQ("", DECODE(whole, hex));
    for (std::size_t length = 0; length < octets.size(); ++length)
    {
        std::vector<unsigned char> const part(octets.begin(), octets.begin() + static_cast<std::ptrdiff_t>(length));
        Q956::AOCSCurrencyInfo info;
        String error;
        EXPECT_EQ(XCode::FAILURE, info.decode(part.data(), part.size(), error)) << length;
        EXPECT_TRUE(error.view().find("octet ") != std::string_view::npos) << error.c_str();
        EXPECT_TRUE(info == Q956::AOCSCurrencyInfo());
    }
}
