#include "configuration/DialPlan.h"

#include "configuration/ConfigurationSection.h"

#include <gtest/gtest.h>

namespace
{
DialPlan const GERMANY{"00", "0", "49"};

std::string PLAN_COMPLAINT(std::string const& text)
{
    try
    {
        DialPlan::READ(ConfigurationSection::PARSE(text, "f"));
    }
    catch (ConfigurationError const& error)
    {
        return error.what();
    }
    return "none";
}
} // namespace

TEST(DialPlan, WhatComesWithAPrefixBecomesInternational)
{
    EXPECT_EQ(GERMANY.normalise("0044201"), "+44201");
    EXPECT_EQ(GERMANY.normalise("089123"), "+4989123");
}

TEST(DialPlan, EveryOtherNumberStaysAsItIs)
{
    for (char const* const number : {"", "0", "00", "4711", "+4989123", "112", "alice", "urn:service:sos"})
        EXPECT_EQ(GERMANY.normalise(number), number == std::string("00") ? "+490" : number) << number;
}

TEST(DialPlan, WithoutACountryOnlyInternationalNumbersAreKnown)
{
    DialPlan const plan{"00", "0", ""};
    EXPECT_EQ(plan.normalise("0044201"), "+44201");
    EXPECT_EQ(plan.normalise("089123"), "089123");
    EXPECT_TRUE(DialPlan().isEmpty());
    EXPECT_EQ(DialPlan().normalise("0044"), "0044");
}

TEST(DialPlan, TheLongerPrefixCounts)
{
    DialPlan const russia{"810", "8", "7"};
    EXPECT_EQ(russia.normalise("81049891"), "+49891");
    EXPECT_EQ(russia.normalise("84951"), "+74951");
    DialPlan const other{"0", "01", "49"};
    EXPECT_EQ(other.normalise("0123"), "+4923");
    EXPECT_EQ(other.normalise("0223"), "+223");
}

TEST(DialPlan, ANumberThatMayBecomeAPrefixIsABeginning)
{
    EXPECT_TRUE(GERMANY.isBeginning(""));
    EXPECT_TRUE(GERMANY.isBeginning("0"));
    EXPECT_TRUE(GERMANY.isBeginning("00"));
    EXPECT_FALSE(GERMANY.isBeginning("001"));
    EXPECT_FALSE(GERMANY.isBeginning("1"));
}

TEST(DialPlan, PrefixesAreDigitsAndOfUse)
{
    EXPECT_EQ(PLAN_COMPLAINT("international-prefix = \"00\"\nnational-prefix = \"0\"\ncountry-code = \"49\"\n"),
              "none");
    EXPECT_EQ(PLAN_COMPLAINT("international-prefix = \"+\"\n"), "f: international-prefix: must be digits, 8 at most");
    EXPECT_EQ(PLAN_COMPLAINT("national-prefix = \"123456789\"\n"), "f: national-prefix: must be digits, 8 at most");
    EXPECT_EQ(PLAN_COMPLAINT("international-prefix = \"0\"\nnational-prefix = \"0\"\n"),
              "f: national-prefix: is the international one");
    EXPECT_EQ(PLAN_COMPLAINT("country-code = \"49\"\n"), "f: country-code: is of no use without national-prefix");
}
