#include "platform/asn1/Q956.h"
#include "testing/FailingAllocator.h"
#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>

namespace
{
/// Two entries with a currency too long for a string that allocates nothing.
AsnSequenceOf<Q956::AOCSCurrencyInfo> RATES()
{
    AsnSequenceOf<Q956::AOCSCurrencyInfo> list;
    for (int i = 0; i < 2; ++i)
    {
        Q956::AOCSCurrencyInfo::Info& info = list.append()->m_aOCSCurrencyInfo;
        Q956::AOCSCurrencyInfo::SpecificCurrency& specific = info.select(info.m_specificCurrency);
        specific.select(specific.m_flatRateCurrency).m_fRCurrency = "a currency of more than thirty letters";
    }
    return list;
}

/// Runs the operation with its first, second ... allocation failing, which must give NO_ELEMENT and pass the check,
/// until it succeeds. Returns the number of failures.
template <class Operation, class Check>
unsigned long FAIL_EACH(Operation const& operation, Check const& check)
{
    for (unsigned long n = 1;; ++n)
    {
        FailingAllocator::failNth(n);
        XCode const result = operation();
        FailingAllocator::stop();
        if (!FailingAllocator::hasFailed())
        {
            EXPECT_TRUE(result.isOk());
            return n - 1;
        }
        EXPECT_EQ(XCode::NO_ELEMENT, result);
        check();
    }
}
} // namespace

TEST(AsnOutOfMemory, EncodingReportsItAndLeavesTheOctets)
{
    auto const rates = RATES();
    AsnOctets octets;
    String error;
    EXPECT_LT(2U, FAIL_EACH([&] { return rates.encode(octets, error); }, [&] { EXPECT_TRUE(octets.isEmpty()); }));
    EXPECT_FALSE(octets.isEmpty());
}

TEST(AsnOutOfMemory, DecodingReportsItAndLeavesTheValue)
{
    auto const rates = RATES();
    std::vector<unsigned char> const octets = OCTETS(HEX(rates));
    AsnSequenceOf<Q956::AOCSCurrencyInfo> decoded;
    ASSERT_NE(nullptr, decoded.append());
    auto const before = decoded;
    String error;
    EXPECT_LT(4U, FAIL_EACH([&] { return decoded.decode(octets.data(), octets.size(), error); },
                            [&] { EXPECT_TRUE(decoded == before); }));
    EXPECT_TRUE(decoded == rates);
}

TEST(AsnOutOfMemory, AnErrorTextThatLacksMemoryIsStillAnError)
{
    auto const rates = RATES();
    std::vector<unsigned char> octets = OCTETS(HEX(rates));
    octets.back() = 0x80;
    octets.push_back(0);
    AsnSequenceOf<Q956::AOCSCurrencyInfo> decoded;
    for (unsigned long n = 1;; ++n)
    {
        String error;
        FailingAllocator::failNth(n);
        XCode const result = decoded.decode(octets.data(), octets.size(), error);
        FailingAllocator::stop();
        EXPECT_FALSE(result.isOk());
        EXPECT_TRUE(decoded.isEmpty());
        if (!FailingAllocator::hasFailed())
            break;
    }
}

TEST(AsnOutOfMemory, CloningGivesNothing)
{
    auto const rates = RATES();
    AsnSyntax* clone = nullptr;
    EXPECT_LT(2U, FAIL_EACH(
                      [&]
                      {
                          clone = rates.clone();
                          return clone != nullptr ? XCode::OK : XCode::NO_ELEMENT;
                      },
                      [&] { EXPECT_EQ(nullptr, clone); }));
    EXPECT_TRUE(clone->isEqual(rates));
    delete clone;
}

TEST(AsnOutOfMemory, AListRefusesAnElementAndStays)
{
    AsnSequenceOf<Q956::AOCSCurrencyInfo> list;
    Q956::AOCSCurrencyInfo const entry;
    EXPECT_EQ(1U, FAIL_EACH([&] { return list.append(entry); }, [&] { EXPECT_TRUE(list.isEmpty()); }));
    FailingAllocator::failNth(1);
    bool const isRefused = list.append() == nullptr;
    FailingAllocator::stop();
    EXPECT_TRUE(isRefused);
    EXPECT_EQ(1U, list.getSize());
}

TEST(AsnOutOfMemory, PrintingReportsItAndLeavesTheText)
{
    auto const rates = RATES();
    String text("before");
    EXPECT_LT(1U, FAIL_EACH([&] { return AsnNotation::VALUE_OF(rates, text); }, [&] { EXPECT_EQ("before", text); }));
    text = "before";
    EXPECT_LT(1U, FAIL_EACH([&] { return AsnNotation::TYPE_OF(rates, text); }, [&] { EXPECT_EQ("before", text); }));
}

TEST(AsnOutOfMemory, MakingAndComparingValuesNeedsNone)
{
    FailingAllocator::failNth(1);
    Q956::AOCSCurrencyInfo one;
    Q956::AOCSCurrencyInfo const other;
    one.m_aOCSCurrencyInfo.select(one.m_aOCSCurrencyInfo.m_freeOfCharge);
    bool const areEqual = one == other;
    FailingAllocator::stop();
    EXPECT_FALSE(areEqual);
    EXPECT_EQ(0U, FailingAllocator::count());
}
