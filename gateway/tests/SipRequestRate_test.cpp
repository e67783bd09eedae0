#include "sip/access/SipRequestRate.h"

#include "testing/DrivenClock.h"

#include <gtest/gtest.h>
#include <spdlog/sinks/ostream_sink.h>
#include <spdlog/spdlog.h>

#include <algorithm>
#include <memory>
#include <sstream>

namespace
{
class SipRequestRateTest : public testing::Test
{
protected:
    SipRequestRateTest()
    {
        spdlog::set_default_logger(
            std::make_shared<spdlog::logger>("", std::make_shared<spdlog::sinks::ostream_sink_mt>(log)));
    }
    ~SipRequestRateTest() override { spdlog::set_default_logger(before); }

    static InternetAddress HOST(unsigned char last)
    {
        return {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xff, 0xff, 192, 0, 2, last};
    }
    unsigned int send(unsigned int requests, unsigned char from)
    {
        unsigned int taken = 0;
        for (unsigned int i = 0; i < requests; ++i)
            taken += rate.admit(HOST(from)) ? 1 : 0;
        return taken;
    }
    long lines() const
    {
        std::string const text = log.str();
        return std::count(text.begin(), text.end(), '\n');
    }

    std::shared_ptr<spdlog::logger> before = spdlog::default_logger();
    std::ostringstream log;
    DrivenClock clock;
    SipRequestRate rate{"office", 10};
};
} // namespace

TEST_F(SipRequestRateTest, AFloodOfOneAddressIsCutAndTheOthersAreServed)
{
    EXPECT_EQ(send(1000, 1), 10u);
    EXPECT_EQ(send(5, 2), 5u);
    EXPECT_EQ(rate.getNumberOfRefused(), 990u);
    clock.advance(500);
    EXPECT_EQ(send(1000, 1), 5u) << "half a second's worth";
}

TEST_F(SipRequestRateTest, TheLogHearsOfAnAddressOnceAMinute)
{
    send(1000, 1);
    EXPECT_EQ(lines(), 1);
    EXPECT_NE(log.str().find("interface office: 192.0.2.1 sends more than 10 requests a second"), std::string::npos)
        << log.str();
    send(1000, 2);
    EXPECT_EQ(lines(), 2) << "another one";
    clock.advance(59000);
    send(1000, 1);
    EXPECT_EQ(lines(), 2);
    clock.advance(1000);
    send(1000, 1);
    EXPECT_EQ(lines(), 3);
    EXPECT_NE(log.str().find("1980 were dropped"), std::string::npos) << log.str(); // since it was told
}

TEST_F(SipRequestRateTest, WithoutALimitAllAreServed)
{
    rate.setLimit(0);
    EXPECT_EQ(send(1000, 1), 1000u);
    EXPECT_EQ(lines(), 0);
    rate.setLimit(20);
    EXPECT_EQ(send(1000, 1), 20u);
}
