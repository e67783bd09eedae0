#include "sip/dialog/SipSessionTimer.h"

#include <gtest/gtest.h>

namespace
{
constexpr SipSessionTimer::Refresher UAC = SipSessionTimer::UAC;
constexpr SipSessionTimer::Refresher UAS = SipSessionTimer::UAS;
} // namespace

TEST(SipSessionTimer, ACallerWithoutTimersIsRefreshedByUs)
{
    SipSessionTimer timer(1800, 90);
    EXPECT_TRUE(timer.takeRequest({}));
    EXPECT_EQ(timer.getInterval(), 1800u);
    EXPECT_TRUE(timer.isOurs());
    EXPECT_EQ(timer.getDelay(), 900000u);
    EXPECT_EQ(timer.getResponseHeaders(), "Session-Expires: 1800;refresher=uas\r\n");
}

TEST(SipSessionTimer, ACallerThatHasThemRefreshesUnlessItWantsUsTo)
{
    SipSessionTimer timer(1800, 90);
    EXPECT_TRUE(timer.takeRequest({.interval = 600, .isSupported = true}));
    EXPECT_FALSE(timer.isOurs());
    EXPECT_EQ(timer.getDelay(), 568000u);
    EXPECT_EQ(timer.getResponseHeaders(), "Session-Expires: 600;refresher=uac\r\nRequire: timer\r\n");
    EXPECT_TRUE(timer.takeRequest({.interval = 600, .refresher = UAS, .isSupported = true}));
    EXPECT_TRUE(timer.isOurs());
}

TEST(SipSessionTimer, TheShorterIntervalCountsButNoneBelowThePeersLeast)
{
    SipSessionTimer timer(300, 90);
    EXPECT_TRUE(timer.takeRequest({.interval = 1800, .least = 600, .isSupported = true}));
    EXPECT_EQ(timer.getInterval(), 600u);
}

TEST(SipSessionTimer, ARequestForTooLittleIsRefusedIfItsSenderUnderstands)
{
    SipSessionTimer timer(1800, 90);
    EXPECT_FALSE(timer.takeRequest({.interval = 60, .isSupported = true}));
    EXPECT_EQ(timer.getInterval(), 0u);
    EXPECT_EQ(timer.getMinimum(), "Min-SE: 90\r\n");
    EXPECT_TRUE(timer.takeRequest({.interval = 60})) << "a proxy has put it there";
}

TEST(SipSessionTimer, WhoAsksForNothingTakesWhatThePeerAsks)
{
    SipSessionTimer timer(0, 90);
    EXPECT_EQ(timer.getRequestHeaders(), "");
    EXPECT_TRUE(timer.takeRequest({.isSupported = true}));
    EXPECT_EQ(timer.getResponseHeaders(), "");
    EXPECT_TRUE(timer.takeRequest({.interval = 120, .isSupported = true}));
    EXPECT_EQ(timer.getInterval(), 120u);
}

TEST(SipSessionTimer, AnAnswerSaysWhoRefreshes)
{
    SipSessionTimer timer(1800, 90);
    EXPECT_EQ(timer.getRequestHeaders(), "Session-Expires: 1800\r\n");
    timer.takeResponse({.interval = 900, .refresher = UAS});
    EXPECT_FALSE(timer.isOurs());
    EXPECT_EQ(timer.getRequestHeaders(), "Session-Expires: 900;refresher=uas\r\n");
    timer.takeResponse({.interval = 900, .refresher = UAC});
    EXPECT_TRUE(timer.isOurs());
    timer.takeResponse({});
    EXPECT_TRUE(timer.isOurs()) << "it knows no timers";
    EXPECT_EQ(timer.getInterval(), 1800u);
}

TEST(SipSessionTimer, ARefusalRaisesWhatIsAskedForOnce)
{
    SipSessionTimer timer(1800, 90);
    EXPECT_TRUE(timer.raise(3600));
    EXPECT_EQ(timer.getRequestHeaders(), "Session-Expires: 3600\r\nMin-SE: 3600\r\n");
    EXPECT_FALSE(timer.raise(3600));
    EXPECT_FALSE(timer.raise(0));
}

TEST(SipSessionTimer, TwoRefreshesInARowThatReachNobodyAreTheSessionsEnd)
{
    SipSessionTimer timer(1800, 90);
    timer.takeResponse({});
    EXPECT_FALSE(timer.miss());
    timer.takeResponse({});
    EXPECT_FALSE(timer.miss()) << "the one before was answered";
    EXPECT_TRUE(timer.miss());
}
