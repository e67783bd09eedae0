#include "sip/message/SipCarriedHeaders.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

using namespace SipCarriedHeaders;

namespace
{
std::string const FROM = "From: <sip:4420@host>;tag=a\r\n";
std::vector<std::string> const NONE_LISTED;
std::vector<std::string> const CUSTOMER{"X-Customer", "Organization"};

std::string READ_FROM(std::string const& headers, Rules const& rules)
{
    SipMessage const invite = SipMessage::INVITE(FROM + headers);
    return READ(invite.get(), rules);
}

std::string LINES(std::size_t count, std::size_t length)
{
    std::string text;
    for (std::size_t i = 0; i < count; ++i)
        text += "X-Customer: " + std::string(length - 14, 'x') + "\r\n";
    return text;
}
} // namespace

TEST(SipCarriedHeaders, WhatBothSidesMayKnowCrossesAsItIs)
{
    std::string const lines = "Alert-Info: <http://host/ring>;info=alert\r\n"
                              "Subject: the invoice\r\n"
                              "Priority: urgent\r\n"
                              "Session-ID: 0123;remote=4567\r\n"
                              "Geolocation: <sip:40.7@host>\r\n"
                              "Geolocation-Routing: yes\r\n";
    EXPECT_EQ(READ_FROM(lines, {NONE_LISTED, false}), lines);
}

TEST(SipCarriedHeaders, AHeaderThatTheStackReadsIsWrittenAgain)
{
    EXPECT_EQ(
        READ_FROM("Call-Info: <http://host/a>;purpose=icon, <http://host/b>\r\ns: short\r\n", {NONE_LISTED, true}),
        "Call-Info: <http://host/a>;purpose=icon\r\nCall-Info: <http://host/b>\r\nSubject: short\r\n");
}

TEST(SipCarriedHeaders, EverythingElseStaysOnItsSide)
{
    EXPECT_EQ(READ_FROM("X-Customer: 7\r\nOrganization: us\r\nUser-Agent: phone\r\nP-Preferred-Identity: <sip:1@h>\r\n",
                        {NONE_LISTED, true}),
              "");
}

TEST(SipCarriedHeaders, AListedNameCrossesInWhateverCase)
{
    EXPECT_EQ(READ_FROM("x-customer: 7\r\nOrganization: us\r\nX-Other: 8\r\n", {CUSTOMER, false}),
              "x-customer: 7\r\nOrganization: us\r\n");
}

TEST(SipCarriedHeaders, ChargingAndEarlyMediaAreForTrustedPeersAlone)
{
    std::string const lines = "P-Charging-Vector: icid-value=1\r\nP-Early-Media: sendrecv\r\n";
    EXPECT_EQ(READ_FROM(lines, {NONE_LISTED, true}), lines);
    EXPECT_EQ(READ_FROM(lines, {NONE_LISTED, false}), "");
    EXPECT_EQ(FOR_PEER(lines, {NONE_LISTED, true}, REQUEST, true), lines);
    EXPECT_EQ(FOR_PEER(lines, {NONE_LISTED, false}, REQUEST, false), "");
}

TEST(SipCarriedHeaders, OfWhoWithholdsHisNumberAStrangerGetsOnlyWhatCannotTellIt)
{
    std::string const lines =
        "Alert-Info: <sip:4420@h>\r\nCall-Info: <sip:4420@h>\r\nSubject: 4420\r\nPriority: normal\r\n"
        "Session-ID: 01\r\nGeolocation: <sip:4420@h>\r\nX-Customer: 4420\r\n";
    EXPECT_EQ(FOR_PEER(lines, {CUSTOMER, false}, REQUEST, true), "Priority: normal\r\nSession-ID: 01\r\n");
    EXPECT_EQ(FOR_PEER(lines, {CUSTOMER, false}, REQUEST, false), lines);
    EXPECT_EQ(FOR_PEER(lines, {CUSTOMER, true}, REQUEST, true), lines);
}

TEST(SipCarriedHeaders, WhatOneSideLetsInTheOtherNeedNotLetOut)
{
    EXPECT_EQ(FOR_PEER("X-Customer: 7\r\nPriority: normal\r\n", {NONE_LISTED, true}, REQUEST, false),
              "Priority: normal\r\n");
}

TEST(SipCarriedHeaders, AnAnswerHasNothingOfARequestAlone)
{
    EXPECT_EQ(FOR_PEER("Subject: a\r\nPriority: normal\r\nGeolocation: <a:b>\r\nAlert-Info: <a:b>\r\n",
                       {NONE_LISTED, true}, RESPONSE, false),
              "Alert-Info: <a:b>\r\n");
}

TEST(SipCarriedHeaders, NothingBreaksOutOfItsLine)
{
    EXPECT_EQ(FOR_PEER("Priority: a\rVia: b\r\nSubject: c\n\nP-Asserted-Identity: <sip:1@h>\nno header\n:\n",
                       {NONE_LISTED, true}, REQUEST, false),
              "Subject: c\r\n");
    EXPECT_EQ(READ_FROM("Subject: folded\r\n Via: in truth\r\n", {NONE_LISTED, true}).find("\nVia"), std::string::npos);
}

TEST(SipCarriedHeaders, NumberAndSizeAreBounded)
{
    EXPECT_EQ(READ_FROM(LINES(MOST_LINES + 1, 20), {CUSTOMER, true}).size(), 20 * MOST_LINES);
    EXPECT_EQ(READ_FROM(LINES(6, LONGEST_LINE), {CUSTOMER, true}).size(), MOST_OCTETS);
    EXPECT_EQ(READ_FROM(LINES(1, LONGEST_LINE + 1) + "Subject: a\r\n", {CUSTOMER, true}), "Subject: a\r\n");
}

TEST(SipCarriedHeaders, OnlyNamesThatNobodyLivesByCanBeListed)
{
    EXPECT_TRUE(IS_LISTABLE("X-Customer"));
    EXPECT_TRUE(IS_LISTABLE("Organization"));
    for (char const* const name :
         {"", "a b", "X:", "X\r\nVia", "Via", "via", "i", "From", "CONTACT", "P-Asserted-Identity", "Remote-Party-ID",
          "Content-Length", "Replaces", "User-to-User"})
        EXPECT_FALSE(IS_LISTABLE(name)) << name;
}
