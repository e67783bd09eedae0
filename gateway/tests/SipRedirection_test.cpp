#include "sip/message/SipRedirection.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

namespace
{
using Reason = QReasonForRedirection;

std::optional<SipRedirection> READ_MOVED(std::string const& headers, bool hasRung = false,
                                         char const* status = "302 Moved")
{
    SipMessage const response("SIP/2.0 " + std::string(status) +
                              "\r\nVia: SIP/2.0/UDP host;branch=z9hG4bK1\r\nCall-ID: 1\r\nCSeq: 1 INVITE\r\n"
                              "To: <sip:4989@host>;tag=b\r\nFrom: <sip:4420@host>;tag=a\r\n" +
                              headers + "\r\n");
    return SipRedirection::READ(response.get(), hasRung);
}

std::string MOVED_TO(std::string const& headers, char const* status = "302 Moved")
{
    std::optional<SipRedirection> const redirection = READ_MOVED(headers, false, status);
    return redirection ? redirection->number : "none";
}
} // namespace

TEST(SipRedirection, TheBestContactThatHasANumberSaysWhereTo)
{
    EXPECT_EQ(MOVED_TO("Contact: <sip:+4930@elsewhere:5070>\r\n"), "+4930");
    EXPECT_EQ(MOVED_TO("Contact: <sip:1@h>;q=0.2, <sip:2@h>;q=0.7\r\nContact: <sip:3@h>;q=0.5\r\n"), "2");
    EXPECT_EQ(MOVED_TO("Contact: <sip:1@h>;q=0.9, <sip:2@h>\r\n"), "2");
    EXPECT_EQ(MOVED_TO("Contact: <mailto:a@b>, <sip:host>;q=0.9, <tel:4711>;q=0.1\r\n"), "4711");
}

TEST(SipRedirection, WhatSaysNoNumberIsNone)
{
    EXPECT_EQ(MOVED_TO(""), "none");
    EXPECT_EQ(MOVED_TO("Contact: <mailto:a@b>\r\n"), "none");
    EXPECT_EQ(MOVED_TO("Contact: <sip:" + std::string(200, '1') + "@h>\r\n"), "none");
    EXPECT_EQ(MOVED_TO("Contact: <sip:1@h>\r\n", "305 Use Proxy"), "none");
    EXPECT_EQ(MOVED_TO("Contact: <sip:1@h>\r\n", "380 Alternative Service"), "none");
    EXPECT_EQ(MOVED_TO("Contact: <sip:1@h>\r\n", "404 Not Found"), "none");
    EXPECT_EQ(MOVED_TO("Contact: <sip:1@h>\r\n", "300 Multiple Choices"), "1");
}

TEST(SipRedirection, WhyIsSaidByTheContactOrADiversionOrTheMoment)
{
    EXPECT_EQ(READ_MOVED("Contact: <sip:1@h;cause=486>\r\nDiversion: <sip:2@h>;reason=no-answer\r\n")->from.reason,
              Reason::FORWARDING_BUSY);
    EXPECT_EQ(READ_MOVED("Contact: <sip:1@h>\r\nDiversion: <sip:2@h>;reason=no-answer\r\n")->from.reason,
              Reason::FORWARDING_NO_REPLY);
    EXPECT_EQ(READ_MOVED("Contact: <sip:1@h>\r\n")->from.reason, Reason::FORWARDING_UNCONDITIONAL);
    EXPECT_EQ(READ_MOVED("Contact: <sip:1@h>\r\n", true)->from.reason, Reason::CALL_DEFLECTION);
}

TEST(SipRedirection, WhoWithholdsHimselfIsWithheld)
{
    EXPECT_FALSE(READ_MOVED("Contact: <sip:1@h>\r\n")->isWithheld);
    EXPECT_TRUE(READ_MOVED("Contact: <sip:1@h>\r\nPrivacy: id\r\n")->isWithheld);
    EXPECT_TRUE(READ_MOVED("Contact: <sip:1@h>\r\nPrivacy: history\r\n")->isWithheld);
}

TEST(SipRedirection, CrossesAsAProperty)
{
    SipRedirection redirection{"4711", {"4989", {}, Reason::FORWARDING_BUSY}, true, true, "pbx"};
    SipRedirection const crossed = SipRedirection::OF(redirection.getProperty().getContent());
    EXPECT_EQ(crossed.number, "4711");
    EXPECT_EQ(crossed.from.number, "4989");
    EXPECT_EQ(crossed.from.reason, Reason::FORWARDING_BUSY);
    EXPECT_TRUE(crossed.isWithheld);
    EXPECT_TRUE(crossed.isHandedOn);
    EXPECT_EQ(crossed.interface, "pbx");
    EXPECT_TRUE(SipRedirection::OF({}).isWithheld) << "for want of knowledge";
}
