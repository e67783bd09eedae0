#include "SecondCodec.h"

#include "Hex.h"
#include "RandomValue.h"
#include "RecordTypes.h"
#include "platform/asn1/AsnNotation.h"

#include <gtest/gtest.h>
#include <set>

namespace
{
constexpr unsigned int NUMBER_OF_VALUES = 20000; // of each record; two thirds of the charges are one of two

std::vector<unsigned char> ENCODE(AsnSyntax const& value)
{
    AsnOctets octets;
    String error;
    EXPECT_TRUE(value.encode(octets, error).isOk()) << error.c_str();
    return std::vector<unsigned char>(octets.begin(), octets.end());
}

std::string PRINT(AsnSyntax const& value)
{
    String text;
    EXPECT_TRUE(AsnNotation::VALUE_OF(value, text).isOk());
    return text.c_str();
}

class SecondCodecOverRecord : public testing::TestWithParam<char const*>
{
public:
    SecondCodecOverRecord() { EXPECT_EQ("", m_codec.getError()); }

    /// Calls `check(value)` for all values, until a check fails.
    template <class Check>
    void forAllValues(unsigned int seed, Check const& check)
    {
        RandomValue random(seed);
        std::set<std::string> different;
        for (unsigned int i = 0; i < NUMBER_OF_VALUES && !HasFailure(); ++i)
        {
            std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(GetParam());
            random.fill(*value);
            check(*value);
            different.insert(PRINT(*value));
        }
        EXPECT_LT(HasFailure() ? 0U : 5000U, different.size()); // the generator does generate
    }

    SecondCodec m_codec{RECORDS_MODULE};
};
} // namespace

TEST_P(SecondCodecOverRecord, DecodesWhatWeEncode)
{
    forAllValues(1,
                 [&](AsnSyntax const& value)
                 {
                     std::vector<unsigned char> const octets = ENCODE(value);
                     EXPECT_EQ("", m_codec.compare(GetParam(), octets, value)) << PRINT(value) << '\n'
                                                                               << Hex::WRITE(octets);
                 });
}

TEST_P(SecondCodecOverRecord, EncodesWhatWeDecode)
{
    forAllValues(2,
                 [&](AsnSyntax const& value)
                 {
                     std::vector<unsigned char> const octets = m_codec.encode(GetParam(), value);
                     EXPECT_EQ("", m_codec.getError()) << PRINT(value);
                     std::unique_ptr<AsnSyntax> const decoded = RecordTypes::CREATE(GetParam());
                     String error;
                     EXPECT_TRUE(decoded->decode(octets.data(), octets.size(), error).isOk()) << error.c_str() << '\n'
                                                                                              << PRINT(value) << '\n'
                                                                                              << Hex::WRITE(octets);
                     EXPECT_TRUE(decoded->isEqual(value)) << PRINT(value) << '\n' << PRINT(*decoded);
                     EXPECT_EQ(Hex::WRITE(octets), Hex::WRITE(ENCODE(value)));
                 });
}

INSTANTIATE_TEST_SUITE_P(AllThree, SecondCodecOverRecord, testing::Values("Charge", "Tariff", "CC-QoS"),
                         [](auto const& row) { return row.param == std::string("CC-QoS") ? "QoS" : row.param; });

// a comparison that could not tell values apart would prove nothing
TEST(SecondCodec, SeesEachDifference)
{
    SecondCodec codec(RECORDS_MODULE);
    RandomValue random(3);
    for (char const* const type : {"Charge", "Tariff", "CC-QoS"})
        for (unsigned int i = 0; i < 300; ++i)
        {
            std::unique_ptr<AsnSyntax> const one = RecordTypes::CREATE(type);
            std::unique_ptr<AsnSyntax> const other = RecordTypes::CREATE(type);
            random.fill(*one);
            random.fill(*other);
            EXPECT_EQ(one->isEqual(*other), codec.compare(type, ENCODE(*one), *other).empty()) << PRINT(*one) << '\n'
                                                                                               << PRINT(*other);
        }
}
