#include "platform/signalling/QInformationTransferCapability.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>

namespace
{
struct Case
{
    QInformationTransferCapability value;
    int number;
    char const* name;
};
// numbers are on the wire and names in configurations: neither may change
constexpr Case s_cases[] = {
    {QInformationTransferCapability::SPEECH, 0, "Speech"},
    {QInformationTransferCapability::UNRESTRICTED_DIGITAL, 8, "Unrestricted digital information"},
    {QInformationTransferCapability::RESTRICTED_DIGITAL, 9, "Restricted digital information"},
    {QInformationTransferCapability::AUDIO_3_1_KHZ, 16, "3.1 kHz audio"},
    {QInformationTransferCapability::UNRESTRICTED_DIGITAL_WITH_TONES, 17,
     "Unrestricted digital information with tones/announcements"},
    {QInformationTransferCapability::VIDEO, 24, "Video"},
};
} // namespace

TEST(QInformationTransferCapability, EveryValueHasItsNumberAndName)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.number, static_cast<int>(row.value)) << row.name;
        EXPECT_STREQ(row.name, QINFORMATION_TRANSFER_CAPABILITY_NAME(row.value)) << row.number;
    }
}

TEST(QInformationTransferCapability, AReservedOrForeignNumberIsInvalid)
{
    for (int const number : {-1, 1, 7, 10, 15, 18, 23, 25})
        EXPECT_STREQ(ERROR::INVALID,
                     QINFORMATION_TRANSFER_CAPABILITY_NAME(static_cast<QInformationTransferCapability>(number)))
            << number;
}

TEST(QInformationTransferCapability, TheDefaultIsTheValueZero)
{
    EXPECT_STREQ("Speech", QINFORMATION_TRANSFER_CAPABILITY_NAME(QInformationTransferCapability{}));
}
