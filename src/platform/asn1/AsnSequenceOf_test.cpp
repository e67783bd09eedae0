#include "platform/asn1/AsnSequenceOf.h"

#include "platform/asn1/Q956.h"
#include "tests/support/AsnTesting.h"

#include <gtest/gtest.h>

namespace
{
using List = AsnSequenceOf<Q956::RecordedUnits>;

void APPEND(List& list, int number)
{
    Q956::RecordedUnits* const units = list.append();
    ASSERT_NE(nullptr, units);
    units->m_recordedNumber.select(units->m_recordedNumber.m_recordedNumberOfUnits) = number;
}
} // namespace

TEST(AsnSequenceOf, AnEmptyListIsAValue)
{
    List list;
    EXPECT_TRUE(list.isEmpty());
    EXPECT_EQ("3000", HEX(list));
    EXPECT_EQ("{ }", PRINT(list));
    APPEND(list, 1);
    EXPECT_EQ("", DECODE(list, "30800000"));
    EXPECT_TRUE(list.isEmpty());
}

TEST(AsnSequenceOf, KeepsTheOrder)
{
    List list;
    APPEND(list, 300);
    APPEND(list, 2);
    EXPECT_EQ("300B30040202012C3003020102", HEX(list));
    List decoded;
    EXPECT_EQ("", DECODE(decoded, HEX(list)));
    ASSERT_EQ(2U, decoded.getSize());
    EXPECT_EQ(2, decoded[1].m_recordedNumber.m_recordedNumberOfUnits);
    EXPECT_TRUE(decoded == list);
    List reversed;
    APPEND(reversed, 2);
    APPEND(reversed, 300);
    EXPECT_FALSE(reversed == list);
    reversed.clear();
    EXPECT_FALSE(reversed == list);
}

TEST(AsnSequenceOf, AppendsCopies)
{
    List list;
    Q956::RecordedUnits units;
    units.setPresent(units.m_recordedTypeOfUnits) = 2;
    EXPECT_TRUE(list.append(units).isOk());
    units.m_recordedTypeOfUnits = 3;
    EXPECT_EQ(2, list[0].m_recordedTypeOfUnits);
    int count = 0;
    for (Q956::RecordedUnits const& element : list)
        count += element.m_recordedTypeOfUnits;
    EXPECT_EQ(2, count);
    list[0].m_recordedTypeOfUnits = 9;
    EXPECT_TRUE(static_cast<AsnList const&>(list).getElement(0).isEqual(list[0]));
}

TEST(AsnSequenceOf, AnErrorNamesTheElement)
{
    List list;
    EXPECT_EQ("SEQUENCE OF[1].recordedNumber: is missing, octet 9", DECODE(list, "3007300302010130 00"));
    APPEND(list, 1);
    ASSERT_NE(nullptr, list.append());
    EXPECT_EQ("REFUSED SEQUENCE OF[1].recordedNumber: no alternative is selected", HEX(list));
}

TEST(AsnSequenceOf, ALongListRoundTrips)
{
    List list;
    for (int i = 0; i < 5000; ++i)
        APPEND(list, i * 1000);
    List decoded;
    EXPECT_EQ("", DECODE(decoded, HEX(list)));
    EXPECT_TRUE(decoded == list);
    std::unique_ptr<AsnSyntax> const element(list.createElement());
    EXPECT_TRUE(element->isEqual(Q956::RecordedUnits()));
}
