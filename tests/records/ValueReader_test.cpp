#include "ValueReader.h"

#include "RandomValue.h"
#include "RecordTypes.h"
#include "platform/asn1/AsnNotation.h"

#include <gtest/gtest.h>

namespace
{
std::string ERROR_OF(char const* type, char const* text)
{
    std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(type);
    ValueReader reader(text);
    return reader.readWhole(*value) ? "" : reader.getError();
}
} // namespace

TEST(ValueReader, ReadsWhatIsPrinted)
{
    RandomValue random(4);
    for (char const* const type : {"Charge", "Tariff", "CC-QoS", "Currency", "Multiplier", "RecordedUnitsList"})
        for (unsigned int i = 0; i < 500; ++i)
        {
            std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(type);
            std::unique_ptr<AsnSyntax> const read = RecordTypes::CREATE(type);
            random.fill(*value);
            String text;
            ASSERT_TRUE(AsnNotation::VALUE_OF(*value, text).isOk());
            ValueReader reader(text.view());
            ASSERT_TRUE(reader.readWhole(*read)) << reader.getError() << '\n' << text.c_str();
            ASSERT_TRUE(read->isEqual(*value)) << text.c_str();
        }
}

TEST(ValueReader, SaysWhereATextGoesWrong)
{
    struct Case
    {
        char const* type;
        char const* text;
        char const* error;
    };
    for (Case const& row : {
             Case{"Charge", "free : NULL", "there is no alternative \"free\", character 4"},
             Case{"Charge", "freeOfCharge NULL", "':' is expected, character 13"},
             Case{"Charge", "freeOfCharge : 1", "NULL is expected, character 16"},
             Case{"Charge", "freeOfCharge : NULL x", "the value is over, character 20"},
             Case{"Amount", "currencyAmount 1", "'{' is expected, character 0"},
             Case{"Amount", "{ amount 1 }", "there is no component \"amount\", character 8"},
             Case{"Amount", "{ currencyAmount 1", "'}' is expected, character 18"},
             Case{"CurrencyAmount", "2147483648", "a number of 32 bits is expected, character 10"},
             Case{"CurrencyAmount", "", "a number of 32 bits is expected, character 0"},
             Case{"Scale", "second", "an identifier of the enumeration is expected, character 6"},
             Case{"Currency", "EUR", "'\"' is expected, character 0"},
             Case{"Currency", "\"EUR", "the text does not end, character 4"},
             Case{"Currency", "{ {8, 0} }", "a place of the code table is expected, character 8"},
             Case{"Currency", "{ {1} }", "a place of the code table is expected, character 5"},
             Case{"Currency", "{ {1, 2, 3} }", "{column, row} is expected, character 8"},
         })
        EXPECT_EQ(row.error, ERROR_OF(row.type, row.text)) << row.text;
}
