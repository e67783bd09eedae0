#include "sip/message/SipDiversion.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

#include <ostream>

namespace
{
SocketAddress const OURS{"192.0.2.1", 5060};
std::string const CALLED = "sip:+4989@198.51.100.1:5060";

struct Row
{
    char const* situation;
    char const* headers; ///< that came in
    char const* text;
    char const* first;
    char const* lines; ///< that go out; null: as in the rows that have them
};

std::string TEXT_OF(SipDiversion const& diversion)
{
    if (diversion.count == 0)
        return {};
    return "redirected by " + diversion.last.number + " (" + QREASON_FOR_REDIRECTION_NAME(diversion.last.reason) +
           ", " + QPRESENTATION_INDICATOR_NAME(diversion.presentation) + "), " + std::to_string(diversion.count) +
           " in all";
}

void PrintTo(Row const& row, std::ostream* stream) { *stream << row.situation; }

class SipDiversionHeaders : public testing::TestWithParam<Row>
{
};

Row const ROWS[] = {
    {"Diversion, busy", "Diversion: \"Bob\" <sip:+4990@host>;reason=user-busy;counter=1;privacy=off;screen=yes\r\n",
     "redirected by +4990 (Call forwarding busy or called DTE busy, Presentation allowed), 1 in all", "+4990",
     "Diversion: \"Bob\" <sip:+4990@192.0.2.1:5060>;reason=user-busy;counter=1;privacy=off;screen=yes\r\n"
     "History-Info: \"Bob\" <sip:+4990@192.0.2.1:5060>;index=1, <sip:+4989@198.51.100.1:5060;cause=486>;index=1.1\r\n"},
    {"two Diversions in one line, the latest first",
     "Diversion: <sip:+4992@h>;reason=no-answer, <tel:+4991>;reason=\"unconditional\";privacy=full\r\n",
     "redirected by +4992 (Call forwarding no reply, Presentation restricted), 2 in all", "+4991",
     "Diversion: <sip:+4992@192.0.2.1:5060>;reason=no-answer;counter=1;privacy=full;screen=no, "
     "<sip:+4991@192.0.2.1:5060>;reason=unconditional;counter=1;privacy=full;screen=no\r\n"
     "History-Info: <sip:+4991@192.0.2.1:5060?Privacy=history>;index=1, "
     "<sip:+4992@192.0.2.1:5060;cause=302?Privacy=history>;index=1.1, "
     "<sip:+4989@198.51.100.1:5060;cause=408>;index=1.1.1\r\n"},
    {"three Diversions in two lines", "Diversion: <sip:3@h>;reason=deflection\r\nDiversion: <sip:2@h>, <sip:1@h>\r\n",
     "redirected by 3 (Call deflection, Presentation allowed), 3 in all", "1",
     "Diversion: <sip:3@192.0.2.1:5060>;reason=deflection;counter=1;privacy=off;screen=no, "
     "<sip:1@192.0.2.1:5060>;reason=unknown;counter=2;privacy=off;screen=no\r\n"
     "History-Info: <sip:1@192.0.2.1:5060>;index=1, <sip:3@192.0.2.1:5060;cause=404>;index=1.1, "
     "<sip:+4989@198.51.100.1:5060;cause=480>;index=1.1.1\r\n"},
    {"counters", "Diversion: <sip:3@h>;counter=1, <sip:1@h>;counter=4\r\n",
     "redirected by 3 (Unknown, Presentation allowed), 5 in all", "1", nullptr},
    {"a counter without sense", "Diversion: <sip:3@h>;counter=4294967295, <sip:1@h>;counter=-1\r\n",
     "redirected by 3 (Unknown, Presentation allowed), 2 in all", "1", nullptr},
    {"counters that add up to nonsense", "Diversion: <sip:3@h>;counter=100, <sip:1@h>;counter=4\r\n",
     "redirected by 3 (Unknown, Presentation allowed), 100 in all", "1",
     "Diversion: <sip:3@192.0.2.1:5060>;reason=unknown;counter=1;privacy=off;screen=no, "
     "<sip:1@192.0.2.1:5060>;reason=unknown;counter=99;privacy=off;screen=no\r\n"
     "History-Info: <sip:1@192.0.2.1:5060>;index=1, <sip:3@192.0.2.1:5060;cause=404>;index=1.1, "
     "<sip:+4989@198.51.100.1:5060;cause=404>;index=1.1.1\r\n"},
    {"History-Info, cause in the next URI",
     "History-Info: <sip:+4990@h>;index=1, <sip:+4989@h;cause=408>;index=1.1\r\n",
     "redirected by +4990 (Call forwarding no reply, Presentation allowed), 1 in all", "+4990", nullptr},
    {"History-Info, Reason in its own URI",
     "History-Info: \"Bob\" "
     "<sip:+4990@h?Privacy=history%3Bid&Reason=SIP%3Bcause%3D486%3Btext%3D%22Busy%22>;index=1,\r\n"
     " <sip:+4989@h>;index=1.1\r\n",
     "redirected by +4990 (Call forwarding busy or called DTE busy, Presentation restricted), 1 in all", "+4990",
     nullptr},
    {"History-Info of three, one step of which is routing",
     "History-Info: <sip:1@h>;index=1\r\nHistory-Info: <sip:2@h;cause=302>;index=1.1, <sip:3@h>;index=1.1.1, "
     "<sip:4@h;cause=503>;index=1.1.1.1\r\n",
     "redirected by 3 (Called DTE out of order, Presentation allowed), 2 in all", "1", nullptr},
    {"History-Info private as a whole",
     "Privacy: history\r\nHistory-Info: <sip:1@h>;index=1, <sip:2@h;cause=487>;index=1.1\r\n",
     "redirected by 1 (Call deflection, Presentation restricted), 1 in all", "1", nullptr},
    {"a Diversion of which the name alone is withheld",
     "Diversion: \"Bob\" <sip:1@h>;reason=user-busy;privacy=name\r\n",
     "redirected by 1 (Call forwarding busy or called DTE busy, Presentation restricted), 1 in all", "1", nullptr},
    {"a Diversion with a privacy that nobody knows", "Diversion: <sip:1@h>;reason=user-busy;privacy=most\r\n",
     "redirected by 1 (Call forwarding busy or called DTE busy, Presentation restricted), 1 in all", "1", nullptr},
    {"History-Info of which an entry is not private",
     "History-Info: <sip:1@h?Privacy=none>;index=1, <sip:2@h;cause=487>;index=1.1\r\n",
     "redirected by 1 (Call deflection, Presentation allowed), 1 in all", "1", nullptr},
    {"History-Info in a message whose headers are private",
     "Privacy: header\r\nHistory-Info: <sip:1@h>;index=1, <sip:2@h;cause=487>;index=1.1\r\n",
     "redirected by 1 (Call deflection, Presentation restricted), 1 in all", "1", nullptr},
    {"History-Info beside a malformed Privacy",
     "Privacy: @\r\nHistory-Info: <sip:1@h>;index=1, <sip:2@h;cause=487>;index=1.1\r\n",
     "redirected by 1 (Call deflection, Presentation restricted), 1 in all", "1", nullptr},
    {"History-Info without a redirection",
     "History-Info: <sip:1@h>;index=1, <sip:2@h>;index=1.1, <sip:3@h;cause=500>;index=1.1.1\r\n", "", "", ""},
    {"both headers",
     "Diversion: <sip:1@h>;reason=user-busy;counter=3;privacy=full;screen=yes\r\n"
     "History-Info: <sip:2@h>;index=1, <sip:3@h;cause=302>;index=1.1\r\n",
     "redirected by 2 (Call forwarding unconditional or systematic call redirection, Presentation restricted), 3 in "
     "all",
     "2", nullptr},
    {"History-Info that tells of no redirection beside a Diversion",
     "Diversion: <sip:1@h>;reason=user-busy\r\nHistory-Info: <sip:2@h>;index=1\r\n",
     "redirected by 1 (Call forwarding busy or called DTE busy, Presentation allowed), 1 in all", "1", nullptr},
    {"a number that is withheld", "Diversion: <sip:anonymous@anonymous.invalid>;reason=unavailable\r\n",
     "redirected by  (Called DTE out of order, Presentation restricted), 1 in all", "",
     "Diversion: <sip:unavailable@unknown.invalid>;reason=out-of-service;counter=1;privacy=full;screen=no\r\n"
     "History-Info: <sip:unavailable@unknown.invalid?Privacy=history>;index=1, "
     "<sip:+4989@198.51.100.1:5060;cause=503>;index=1.1\r\n"},
    {"an address that is whole before one that is not", "Diversion: <sip:1@h>;reason=no-answer, \"<<\r\n",
     "redirected by 1 (Call forwarding no reply, Presentation allowed), 1 in all", "1", nullptr},
    {"nothing that is whole", "Diversion: <<>>;;=\r\nDiversion:\r\nHistory-Info: ,;,\r\nHistory-Info: <sip:%zz@h>\r\n",
     "", "", ""},
    {"none of the headers", "", "", "", ""},
};
} // namespace

TEST_P(SipDiversionHeaders, BecomePropertiesAndHeadersAgain)
{
    SipMessage const invite = SipMessage::INVITE(std::string("From: <sip:4420@host>;tag=a\r\n") + GetParam().headers);
    SipDiversion const diversion = SipDiversion::READ(invite.get());
    EXPECT_EQ(TEXT_OF(diversion), GetParam().text);
    EXPECT_EQ(diversion.first.number, GetParam().first);
    if (GetParam().lines != nullptr)
    {
        EXPECT_EQ(diversion.getHeaders(OURS, CALLED), GetParam().lines);
    }
}

INSTANTIATE_TEST_SUITE_P(SipDiversion, SipDiversionHeaders, testing::ValuesIn(ROWS));

TEST(SipDiversion, WhatIsWrittenIsReadAsTheSame)
{
    SipDiversion written;
    written.count = 3;
    written.first = {"+4991", "First, \"the\" one", QReasonForRedirection::FORWARDING_BUSY};
    written.last = {"4992", "Last", QReasonForRedirection::FORWARDING_UNCONDITIONAL};
    written.presentation = QPresentationIndicator::RESTRICTED;
    written.screening = QScreeningIndicator::USER_PROVIDED_PASSED;
    SipMessage const invite = SipMessage::INVITE("From: <sip:4420@host>;tag=a\r\n" + written.getHeaders(OURS, CALLED));
    SipDiversion const read = SipDiversion::READ(invite.get());
    EXPECT_EQ(TEXT_OF(read), TEXT_OF(written));
    EXPECT_EQ(read.first.number, written.first.number);
    EXPECT_EQ(read.first.name, written.first.name);
    EXPECT_EQ(read.first.reason, written.first.reason);
    EXPECT_EQ(read.last.name, written.last.name);
    EXPECT_EQ(read.screening, written.screening);
}

TEST(SipDiversion, ReasonsThatOnlyOneSideKnowsBecomeTheNearest)
{
    EXPECT_EQ(SipDiversion::REASON_OF_TEXT("time-of-day"), QReasonForRedirection::UNKNOWN);
    EXPECT_EQ(SipDiversion::REASON_OF_TEXT(""), QReasonForRedirection::UNKNOWN);
    EXPECT_EQ(SipDiversion::REASON_OF_TEXT("Do-Not-Disturb"), QReasonForRedirection::UNKNOWN);
    EXPECT_EQ(SipDiversion::REASON_OF_TEXT("USER-BUSY"), QReasonForRedirection::FORWARDING_BUSY);
    EXPECT_EQ(SipDiversion::REASON_OF_CAUSE(500), QReasonForRedirection::UNSPECIFIED);
    EXPECT_EQ(SipDiversion::REASON_OF_CAUSE(0), QReasonForRedirection::UNSPECIFIED);
    EXPECT_EQ(SipDiversion::CAUSE_OF_REASON(QReasonForRedirection::FORWARDING_BY_CALLED), 404u);
    EXPECT_STREQ(SipDiversion::TEXT_OF_REASON(QReasonForRedirection::FORWARDING_BY_CALLED), "unknown");
}
