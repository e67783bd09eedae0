#include "sip/registrar/SipRegistration.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

namespace
{
unsigned int GRANTED(std::string const& headers)
{
    return SipRegistration::GRANTED(SipMessage::ANSWER(headers).get(), "sip:4420@192.0.2.1:5060", 600);
}
} // namespace

TEST(SipRegistration, TheContactOfOursCounts)
{
    EXPECT_EQ(GRANTED("Contact: <sip:4420@192.0.2.1:5060>;expires=77\r\n"), 77u);
    EXPECT_EQ(GRANTED("Contact: <sip:4420@192.0.2.2:5060>;expires=77, <sip:4420@192.0.2.1:5060>;expires=78\r\n"), 78u);
    EXPECT_EQ(GRANTED("Contact: <sip:4420@192.0.2.1:5060>\r\nExpires: 79\r\n"), 79u);
    EXPECT_EQ(GRANTED("Contact: <sip:4420@192.0.2.1:5060>\r\n"), 600u);
    EXPECT_EQ(GRANTED("Contact: <sip:4420@192.0.2.1:5060>;expires=4294967295\r\n"), 86400u);
}

TEST(SipRegistration, WhoIsNotInTheAnswerIsNotRegistered)
{
    EXPECT_EQ(GRANTED("Expires: 600\r\n"), 0u);
    EXPECT_EQ(GRANTED("Contact: <sip:4420@192.0.2.2:5060>;expires=77\r\n"), 0u);
    EXPECT_EQ(GRANTED("Contact: <sip:4421@192.0.2.1:5060>;expires=77\r\n"), 0u);
    EXPECT_EQ(GRANTED("Contact: <sip:4420@192.0.2.1:5060>;expires=0\r\n"), 0u);
}

TEST(SipRegistration, ItIsRefreshedBeforeItExpires) { EXPECT_EQ(SipRegistration::REFRESH_AFTER(600), 480000u); }

TEST(SipRegistration, FailuresInARowWaitForLongerAndLonger)
{
    EXPECT_EQ(SipRegistration::WAIT_AFTER(1, 30), 30u);
    EXPECT_EQ(SipRegistration::WAIT_AFTER(2, 30), 60u);
    EXPECT_EQ(SipRegistration::WAIT_AFTER(6, 30), 960u);
    EXPECT_EQ(SipRegistration::WAIT_AFTER(7, 30), 1800u);
    EXPECT_EQ(SipRegistration::WAIT_AFTER(4000000000u, 30), 1800u);
}
