#include "sip/access/SipBans.h"

#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

namespace
{
InternetAddress ADDRESS(unsigned char last) { return {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xff, 0xff, 192, 0, 2, last}; }

class SipBansTest : public testing::Test
{
protected:
    /// As many times as it takes for a ban; its seconds.
    long fail(InternetAddress const& source)
    {
        for (unsigned int i = 1; i < SipBans::PATIENCE; ++i)
            EXPECT_EQ(bans.note(source), 0);
        return bans.note(source);
    }

    DrivenClock clock;
    SipBans bans{3};
};
} // namespace

TEST_F(SipBansTest, WhoFailsOftenIsBannedForLongerAndLonger)
{
    EXPECT_FALSE(bans.isBanned(ADDRESS(1)));
    for (long const seconds : {60, 120, 240, 480, 960, 1920, 3600, 3600})
    {
        EXPECT_EQ(fail(ADDRESS(1)), seconds);
        EXPECT_TRUE(bans.isBanned(ADDRESS(1)));
        EXPECT_FALSE(bans.isBanned(ADDRESS(2)));
        EXPECT_EQ(bans.getNumberOfBanned(), 1u);
        clock.advance(seconds * 1000 - 1000);
        EXPECT_TRUE(bans.isBanned(ADDRESS(1)));
        clock.advance(1000);
        EXPECT_FALSE(bans.isBanned(ADDRESS(1)));
    }
}

TEST_F(SipBansTest, WhoHasBeenQuietForLongStartsAnew)
{
    EXPECT_EQ(fail(ADDRESS(1)), 60);
    bans.note(ADDRESS(1));
    clock.advance((60 + SipBans::LONGEST + 1) * 1000);
    EXPECT_EQ(fail(ADDRESS(1)), 60);
}

TEST_F(SipBansTest, AnAddressOfVersionSixIsItsNetwork)
{
    InternetAddress one = {0x20, 0x01, 0x0d, 0xb8, 0, 0, 0, 1, 1};
    InternetAddress other = {0x20, 0x01, 0x0d, 0xb8, 0, 0, 0, 1, 2};
    InternetAddress const elsewhere = {0x20, 0x01, 0x0d, 0xb8, 0, 0, 0, 2, 1};
    fail(one);
    EXPECT_TRUE(bans.isBanned(other));
    EXPECT_FALSE(bans.isBanned(elsewhere));
}

TEST_F(SipBansTest, AFullTableKeepsThoseWhoAreBanned)
{
    fail(ADDRESS(1));
    bans.note(ADDRESS(2));
    clock.advance(1000);
    for (unsigned char i = 3; i < 100; ++i)
        bans.note(ADDRESS(i));
    EXPECT_TRUE(bans.isBanned(ADDRESS(1)));
    for (unsigned int i = 1; i < SipBans::PATIENCE; ++i)
        EXPECT_EQ(bans.note(ADDRESS(2)), 0); // its first failure was forgotten
}
