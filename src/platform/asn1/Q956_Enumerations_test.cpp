#include "platform/asn1/Q956_Enumerations.h"

#include <gtest/gtest.h>
#include <string>

namespace
{
/// The names of 0, 1, 2 ... up to the first number without one.
template <class Enumeration>
std::string NAMES()
{
    std::string names;
    for (int number = 0;; ++number)
    {
        std::string const name = Enumeration::NAME(static_cast<typename Enumeration::Type>(number));
        if (name == ERROR::INVALID)
        {
            EXPECT_EQ(static_cast<std::size_t>(number), Enumeration::IDENTIFIERS().size());
            EXPECT_STREQ(ERROR::INVALID, Enumeration::NAME(static_cast<typename Enumeration::Type>(-1)));
            return names;
        }
        names += name + " ";
    }
}
} // namespace

TEST(Q956_Enumerations, NumbersHaveTheStandardsIdentifiers)
{
    EXPECT_EQ("oneThousandth oneHundredth oneTenth one ten hundred thousand ", NAMES<Q956::EMultiplier>());
    EXPECT_EQ("subTotal total ", NAMES<Q956::ETypeOfChargingInfo>());
    EXPECT_EQ("normalCharging reverseCharging creditCardCharging ", NAMES<Q956::EAOCDBillingId>());
    EXPECT_EQ("normalCharging reverseCharging creditCardCharging callForwardingUnconditional callForwardingBusy "
              "callForwardingNoReply callDeflection callTransfer ",
              NAMES<Q956::EAOCEBillingId>());
    EXPECT_EQ("basicCommunication callAttempt callSetup userToUserInfo operationOfSupplementaryServ ",
              NAMES<Q956::EChargedItem>());
    EXPECT_EQ("continuousCharging stepFunction ", NAMES<Q956::EChargingType>());
    EXPECT_EQ("oneHundredthSecond oneTenthSecond oneSecond tenSeconds oneMinute oneHour twentyFourHours ",
              NAMES<Q956::EScale>());
    EXPECT_EQ("octet segment message ", NAMES<Q956::EVolumeUnit>());
}
