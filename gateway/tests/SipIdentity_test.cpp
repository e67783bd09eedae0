#include "sip/message/SipIdentity.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

#include <ostream>

namespace
{
SocketAddress const OURS{"192.0.2.1", 5060};

struct Row
{
    char const* situation;
    char const* headers; ///< that came in
    char const* party;
    char const* second;
    char const* from; ///< that goes out, and the lines below it
    char const* lines;
};

void PrintTo(Row const& row, std::ostream* stream) { *stream << row.situation; }

class SipIdentityOfCaller : public testing::TestWithParam<Row>
{
};

class SipIdentityOfAnswer : public testing::TestWithParam<Row>
{
};

Row const CALLERS[] = {
    {"From alone", "From: \"Alice\" <sip:4420@host>;tag=a\r\n",
     "\"Alice\" 4420 (Presentation allowed, User-provided, not screened)", "", "\"Alice\" <sip:4420@192.0.2.1:5060>",
     ""},
    {"From without a name, international, with separators", "From: <sip:+44-20(7).1@host;user=phone>;tag=a\r\n",
     "+442071 (Presentation allowed, User-provided, not screened)", "", "<sip:+442071@192.0.2.1:5060>", ""},
    {"PAI beside a From of the same number",
     "From: \"Alice\" <sip:+4420@host>;tag=a\r\nP-Asserted-Identity: <sip:+4420@network>\r\n",
     "\"Alice\" +4420 (Presentation allowed, Network provided)", "", "\"Alice\" <sip:+4420@192.0.2.1:5060>",
     "P-Asserted-Identity: \"Alice\" <sip:+4420@192.0.2.1:5060>\r\n"},
    {"PAI beside another From",
     "From: \"Desk\" <sip:+4455@host>;tag=a\r\nP-Asserted-Identity: \"Alice\" <tel:+4420;phone-context=x>\r\n",
     "\"Alice\" +4420 (Presentation allowed, Network provided)", "+4455", "\"Alice\" <sip:+4455@192.0.2.1:5060>",
     "P-Asserted-Identity: \"Alice\" <sip:+4420@192.0.2.1:5060>\r\n"},
    {"of two PAI the international one",
     "From: <sip:4420@host>;tag=a\r\nP-Asserted-Identity: \"Alice\" <sip:alice@network>, <tel:+4420>\r\n",
     "\"Alice\" +4420 (Presentation allowed, Network provided)", "4420", "\"Alice\" <sip:4420@192.0.2.1:5060>",
     "P-Asserted-Identity: \"Alice\" <sip:+4420@192.0.2.1:5060>\r\n"},
    {"of two PAI in two lines neither international: the first",
     "From: <sip:4420@host>;tag=a\r\nP-Asserted-Identity: <sip:one@network>\r\nP-Asserted-Identity: <sip:two@n>\r\n",
     "one (Presentation allowed, Network provided)", "4420", "<sip:4420@192.0.2.1:5060>",
     "P-Asserted-Identity: <sip:one@192.0.2.1:5060>\r\n"},
    {"PAI with Privacy id and an anonymous From",
     "From: \"Anonymous\" <sip:anonymous@anonymous.invalid>;tag=a\r\nP-Asserted-Identity: \"Alice\" <sip:+4420@n>\r\n"
     "Privacy: id\r\n",
     "\"Alice\" +4420 (Presentation restricted, Network provided)", "",
     "\"Anonymous\" <sip:anonymous@anonymous.invalid>",
     "P-Asserted-Identity: \"Alice\" <sip:+4420@192.0.2.1:5060>\r\nPrivacy: id\r\n"},
    {"Privacy user and a From that shows all the same", "From: \"Alice\" <sip:+4420@host>;tag=a\r\nPrivacy: USER\r\n",
     "\"Alice\" +4420 (Presentation restricted, User-provided, not screened)", "",
     "\"Anonymous\" <sip:anonymous@anonymous.invalid>", "Privacy: id\r\n"},
    {"Privacy header in a second line",
     "From: <sip:+4420@host>;tag=a\r\nPrivacy: critical\r\nPrivacy: header;session\r\n",
     "+4420 (Presentation restricted, User-provided, not screened)", "",
     "\"Anonymous\" <sip:anonymous@anonymous.invalid>", "Privacy: id\r\n"},
    {"a malformed Privacy", "From: <sip:+4420@host>;tag=a\r\nPrivacy: @@@\r\n",
     "+4420 (Presentation restricted, User-provided, not screened)", "",
     "\"Anonymous\" <sip:anonymous@anonymous.invalid>", "Privacy: id\r\n"},
    {"PAI and an anonymous From without Privacy",
     "From: <sip:anonymous@host>;tag=a\r\nP-Asserted-Identity: <sip:+4420@n>\r\n",
     "+4420 (Presentation restricted, Network provided)", "", "\"Anonymous\" <sip:anonymous@anonymous.invalid>",
     "P-Asserted-Identity: <sip:+4420@192.0.2.1:5060>\r\nPrivacy: id\r\n"},
    {"PAI and an anonymous From with Privacy none",
     "From: <sip:anonymous@anonymous.invalid>;tag=a\r\nP-Asserted-Identity: <sip:+4420@n>\r\nPrivacy: none\r\n",
     "+4420 (Presentation allowed, Network provided)", "", "<sip:+4420@192.0.2.1:5060>",
     "P-Asserted-Identity: <sip:+4420@192.0.2.1:5060>\r\n"},
    {"nobody but an anonymous From", "From: \"Anonymous\" <sip:anonymous@anonymous.invalid>;tag=a\r\n",
     "(Presentation restricted, User-provided, not screened)", "", "\"Anonymous\" <sip:anonymous@anonymous.invalid>",
     "Privacy: id\r\n"},
    {"a From that is unavailable", "From: <sip:unavailable@unknown.invalid>;tag=a\r\n",
     "(Number not available due to interworking, User-provided, not screened)", "", "<sip:unavailable@unknown.invalid>",
     ""},
    {"a From without a user", "From: \"Door\" <sip:host>;tag=a\r\n",
     "\"Door\" (Number not available due to interworking, User-provided, not screened)", "",
     "\"Door\" <sip:unavailable@unknown.invalid>", ""},
    {"a malformed PAI", "From: <sip:4420@host>;tag=a\r\nP-Asserted-Identity: \"open <sip:1@n>\r\n",
     "4420 (Presentation allowed, User-provided, not screened)", "", "<sip:4420@192.0.2.1:5060>", ""},
    {"a PAI of another scheme", "From: <sip:4420@host>;tag=a\r\nP-Asserted-Identity: <im:alice@n>\r\n",
     "4420 (Presentation allowed, User-provided, not screened)", "", "<sip:4420@192.0.2.1:5060>", ""},
    {"a PAI that is anonymous", "From: <sip:4420@host>;tag=a\r\nP-Asserted-Identity: <sip:anonymous@n>\r\n",
     "4420 (Presentation allowed, User-provided, not screened)", "", "<sip:4420@192.0.2.1:5060>", ""},
    {"an empty PAI", "From: <sip:4420@host>;tag=a\r\nP-Asserted-Identity:\r\n",
     "4420 (Presentation allowed, User-provided, not screened)", "", "<sip:4420@192.0.2.1:5060>", ""},
    {"a name with quotes", "From: \"Al \\\"A\\\"\" <sip:4420@host>;tag=a\r\n",
     "\"Al \"A\"\" 4420 (Presentation allowed, User-provided, not screened)", "",
     "\"Al \\\"A\\\"\" <sip:4420@192.0.2.1:5060>", ""},
    {"a name and a number with line breaks", "From: \"Al\r\n ice\" <sip:44%0d%0aX-Own%3a%201@host>;tag=a\r\n",
     "\"Al   ice\" 44%0D%0AX-Own: 1 (Presentation allowed, User-provided, not screened)", "",
     "\"Al   ice\" <sip:44%250D%250AX-Own%3A%201@192.0.2.1:5060>", ""},
};

Row const ANSWERS[] = {
    {"PAI with a name", "P-Asserted-Identity: \"Bob\" <sip:+4990@n>\r\n",
     "\"Bob\" +4990 (Presentation allowed, Network provided)", "", "",
     "P-Asserted-Identity: \"Bob\" <sip:+4990@192.0.2.1:5060>\r\n"},
    {"PAI with the name of To", "P-Asserted-Identity: <sip:+4990@n>\r\n",
     "\"Desk 4\" +4990 (Presentation allowed, Network provided)", "", "",
     "P-Asserted-Identity: \"Desk 4\" <sip:+4990@192.0.2.1:5060>\r\n"},
    {"PAI with Privacy", "P-Asserted-Identity: \"Bob\" <sip:+4990@n>\r\nPrivacy: id\r\n",
     "\"Bob\" +4990 (Presentation restricted, Network provided)", "", "",
     "P-Asserted-Identity: \"Bob\" <sip:+4990@192.0.2.1:5060>\r\nPrivacy: id\r\n"},
};

SipParty WITH_SCREENING(QScreeningIndicator screening)
{
    SipParty party;
    party.number = "4420";
    party.screening = screening;
    return party;
}
} // namespace

TEST_P(SipIdentityOfCaller, BecomesPropertiesAndHeadersAgain)
{
    SipIdentity const caller = SipIdentity::READ_CALLER(SipMessage::INVITE(GetParam().headers).get());
    EXPECT_EQ(caller.party.getText(), GetParam().party);
    EXPECT_EQ(caller.second.getUser(), GetParam().second);
    EXPECT_EQ(caller.getFrom(OURS), GetParam().from);
    EXPECT_EQ(SipIdentity::GET_ASSERTED(caller.party, OURS), GetParam().lines);
}

INSTANTIATE_TEST_SUITE_P(SipIdentity, SipIdentityOfCaller, testing::ValuesIn(CALLERS));

TEST_P(SipIdentityOfAnswer, BecomesPropertiesAndHeadersAgain)
{
    SipMessage const answer = SipMessage::ANSWER(GetParam().headers, "\"Desk 4\" <sip:4989@host>");
    std::optional<SipParty> const connected = SipIdentity::READ_CONNECTED(answer.get());
    ASSERT_TRUE(connected);
    EXPECT_EQ(connected->getText(), GetParam().party);
    EXPECT_EQ(SipIdentity::GET_ASSERTED(*connected, OURS), GetParam().lines);
}

INSTANTIATE_TEST_SUITE_P(SipIdentity, SipIdentityOfAnswer, testing::ValuesIn(ANSWERS));

TEST(SipIdentity, AnAnswerThatAssertsNothingNamesNobody)
{
    EXPECT_FALSE(SipIdentity::READ_CONNECTED(SipMessage::ANSWER("").get()));
    EXPECT_FALSE(SipIdentity::READ_CONNECTED(SipMessage::ANSWER("P-Asserted-Identity: <<<\r\n").get()));
}

TEST(SipIdentity, TheNameOfToIsReadUnlessItIsThatOfNobody)
{
    EXPECT_EQ(SipIdentity::READ_NAME_OF_TO(SipMessage::ANSWER("", "\"Bob\" <sip:4989@host>").get()), "Bob");
    EXPECT_EQ(SipIdentity::READ_NAME_OF_TO(SipMessage::ANSWER("", "\"Anonymous\" <sip:anonymous@x>").get()), "");
    EXPECT_EQ(SipIdentity::READ_NAME_OF_TO(SipMessage("SIP/2.0 200 OK\r\n\r\n").get()), "");
}

TEST(SipIdentity, TheCalledNumberIsThatOfTheRequestUriAndTheNameThatOfTo)
{
    SipMessage const invite = SipMessage::INVITE(
        "From: <sip:1@h>;tag=a\r\n", "sip:+49%38%39;cpc=ordinary@host;user=phone", "\"Bob\" <sip:4711@host>");
    SipParty const called = SipIdentity::READ_CALLED(invite.get());
    EXPECT_EQ(called.number, "4989");
    EXPECT_EQ(called.type, QTypeOfNumber::INTERNATIONAL);
    EXPECT_EQ(called.plan, QNumberingPlan::ISDN);
    EXPECT_EQ(called.name, "Bob");
}

TEST(SipIdentity, WhoIsCalledByTheNameOfNobodyIsCalledAllTheSame)
{
    SipMessage const invite = SipMessage::INVITE("From: <sip:1@h>;tag=a\r\n", "sip:anonymous@host");
    EXPECT_EQ(SipIdentity::READ_CALLED(invite.get()).getUser(), "anonymous");
}

TEST(SipIdentity, OnlyWhatTheNetworkVouchesForIsAsserted)
{
    EXPECT_EQ(SipIdentity::GET_ASSERTED(WITH_SCREENING(QScreeningIndicator::USER_PROVIDED_NOT_SCREENED), OURS), "");
    EXPECT_EQ(SipIdentity::GET_ASSERTED(WITH_SCREENING(QScreeningIndicator::USER_PROVIDED_FAILED), OURS), "");
    for (auto const screening : {QScreeningIndicator::USER_PROVIDED_PASSED, QScreeningIndicator::NETWORK_PROVIDED})
        EXPECT_EQ(SipIdentity::GET_ASSERTED(WITH_SCREENING(screening), OURS),
                  "P-Asserted-Identity: <sip:4420@192.0.2.1:5060>\r\n");
}

TEST(SipIdentity, WhoIsNotTrustedAssertsNothing)
{
    SipMessage const invite =
        SipMessage::INVITE("From: <sip:1@h>;tag=a\r\nP-Asserted-Identity: <sip:+4420@h>\r\nPrivacy: id\r\n");
    SipIdentity const caller = SipIdentity::READ_CALLER(invite.get(), false);
    EXPECT_EQ(caller.party.number, "1");
    EXPECT_EQ(caller.party.screening, QScreeningIndicator::USER_PROVIDED_NOT_SCREENED);
    EXPECT_TRUE(caller.party.isRestricted()); // what it withholds is withheld all the same
    EXPECT_EQ(caller.second.number, "");
    SipMessage const answer = SipMessage::ANSWER("P-Asserted-Identity: <sip:+4420@h>\r\n");
    EXPECT_TRUE(SipIdentity::READ_CONNECTED(answer.get(), true));
    EXPECT_FALSE(SipIdentity::READ_CONNECTED(answer.get(), false));
}

TEST(SipIdentity, WhoIsNotTrustedIsToldNoRestrictedNumber)
{
    SipParty party = WITH_SCREENING(QScreeningIndicator::NETWORK_PROVIDED);
    EXPECT_EQ(SipIdentity::GET_ASSERTED(party, OURS, false), "P-Asserted-Identity: <sip:4420@192.0.2.1:5060>\r\n");
    party.presentation = QPresentationIndicator::RESTRICTED;
    EXPECT_EQ(SipIdentity::GET_ASSERTED(party, OURS, false), "Privacy: id\r\n");
    EXPECT_EQ(SipIdentity::GET_ASSERTED(party, OURS, true),
              "P-Asserted-Identity: <sip:4420@192.0.2.1:5060>\r\nPrivacy: id\r\n");
}

TEST(SipIdentity, ASecondNumberThatIsRestrictedIsNotShown)
{
    SipIdentity caller{WITH_SCREENING(QScreeningIndicator::NETWORK_PROVIDED), {}};
    caller.second.number = "4455";
    caller.second.presentation = QPresentationIndicator::RESTRICTED;
    EXPECT_EQ(caller.getFrom(OURS), "<sip:4420@192.0.2.1:5060>");
}

TEST(SipIdentity, NumbersThatCameWithAPrefixBecomeInternational)
{
    DialPlan const plan{"00", "0", "49"};
    SipMessage const invite =
        SipMessage::INVITE("From: <sip:089123@host>;tag=a\r\nP-Asserted-Identity: <sip:004420@host>\r\n");
    SipIdentity caller = SipIdentity::READ_CALLER(invite.get());
    caller.normalise({});
    EXPECT_EQ(caller.party.getUser(), "004420");
    caller.normalise(plan);
    EXPECT_EQ(caller.party.getUser(), "+4420");
    EXPECT_EQ(caller.party.screening, QScreeningIndicator::NETWORK_PROVIDED);
    EXPECT_EQ(caller.second.getUser(), "+4989123");
    SipIdentity internal = SipIdentity::READ_CALLER(SipMessage::INVITE("From: <sip:4711@host>;tag=a\r\n").get());
    internal.normalise(plan);
    EXPECT_EQ(internal.party.getUser(), "4711");
}

TEST(SipIdentity, AServiceIsCalledInThePlaceOfANumber)
{
    auto const called = [](std::string const& uri)
    { return SipIdentity::READ_CALLED(SipMessage::INVITE("From: <sip:4420@host>;tag=a\r\n", uri).get()).getUser(); };
    EXPECT_EQ(called("urn:service:sos"), "urn:service:sos");
    EXPECT_EQ(called("URN:service:SOS.Fire"), "urn:service:sos.fire");
    EXPECT_EQ(called("urn:service:counseling"), "");
    EXPECT_EQ(called("urn:service:sosial"), "");
    EXPECT_EQ(called("urn:service:sos.a%0db"), "");
    EXPECT_EQ(called("sip:112@host"), "112");
}
