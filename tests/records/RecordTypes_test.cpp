#include "RecordTypes.h"

#include "platform/asn1/AsnNotation.h"

#include <gtest/gtest.h>

TEST(RecordTypes, MakesEveryTypeByItsName)
{
    for (char const* const name : RecordTypes::NAMES())
    {
        std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(name);
        ASSERT_NE(nullptr, value) << name;
        EXPECT_STREQ(name, AsnNotation::NAME_OF(*value));
    }
    EXPECT_EQ(34U, RecordTypes::NAMES().size());
}

TEST(RecordTypes, TheQualityRecordHasTwoNames)
{
    std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE("QoS");
    ASSERT_NE(nullptr, value);
    EXPECT_TRUE(value->isEqual(*RecordTypes::CREATE("CC-QoS")));
}

TEST(RecordTypes, AnyOtherNameMakesNothing)
{
    for (char const* const name : {"", "charge", "Charge ", "SEQUENCE"})
        EXPECT_EQ(nullptr, RecordTypes::CREATE(name)) << name;
}

TEST(RecordTypes, TheThreeRecordsHaveATextAndOtherTypesHaveNone)
{
    String text;
    EXPECT_TRUE(RecordTypes::TEXT_OF(*RecordTypes::CREATE("Charge"), text));
    EXPECT_EQ("", text);
    EXPECT_TRUE(RecordTypes::TEXT_OF(*RecordTypes::CREATE("Tariff"), text));
    EXPECT_EQ("", text);
    EXPECT_TRUE(RecordTypes::TEXT_OF(*RecordTypes::CREATE("QoS"), text));
    EXPECT_EQ("    MOS:                                 0.00\n", text);
    EXPECT_FALSE(RecordTypes::TEXT_OF(*RecordTypes::CREATE("Amount"), text));
}
