#include "sip/access/SipAuthentication.h"

#include "SipMessage.h"
#include "sip/access/SipChallenge.h"
#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

namespace
{
InternetAddress const SOURCE = {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xff, 0xff, 192, 0, 2, 1};
InternetAddress const ELSEWHERE = {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xff, 0xff, 192, 0, 2, 2};

class SipAuthenticationTest : public testing::Test
{
protected:
    SipAuthentication::Decision check(std::string const& header, InternetAddress const& source = SOURCE)
    {
        SipMessage const invite = SipMessage::INVITE("From: <sip:4420@host>;tag=a\r\n" + header);
        return authentication.check(invite.get(), source);
    }
    /// Its first challenge.
    SipChallenge ask(std::string const& header = {}, InternetAddress const& source = SOURCE)
    {
        SipAuthentication::Decision const decision = check(header, source);
        EXPECT_EQ(decision.verdict, SipAuthentication::ASK);
        EXPECT_TRUE(decision.user.empty());
        SipMessage const answer("SIP/2.0 401 Unauthorized\r\n" + decision.challenge + "\r\n");
        return SipChallenge::READ(*answer.get()->sip_www_authenticate, false).value();
    }
    static std::string ANSWER(SipChallenge const& challenge, std::string const& user, std::string const& password,
                              unsigned int count = 1)
    {
        std::string const secret = SipDigest::SECRET(challenge.algorithm, user, challenge.realm, password);
        return challenge.answer({user, secret}, "INVITE", "sip:4989@host", "", count);
    }

    DrivenClock clock;
    SipAuthentication authentication{"a",
                                     "office",
                                     {SipDigest::SHA_256, SipDigest::MD5},
                                     std::make_shared<SipPasswords const>(SipPasswords::PARSE(
                                         "alice:office:secret\nbob:*:guess\ncarol:elsewhere:secret\n", "f"))};
};
} // namespace

TEST_F(SipAuthenticationTest, NobodyIsAskedForAnEmergencyNumber)
{
    auto const call = [this](std::string const& header)
    {
        SipMessage const invite = SipMessage::INVITE("From: <sip:4420@host>;tag=a\r\n" + header);
        return authentication.check(invite.get(), SOURCE, true);
    };
    std::string const right = ANSWER(ask(), "alice", "secret");
    for (unsigned int i = 0; i < SipBans::PATIENCE; ++i)
        EXPECT_EQ(call(ANSWER(ask(), "alice", "wrong")).verdict, SipAuthentication::ACCEPTED);
    EXPECT_EQ(authentication.getNumberOfBanned(), 0u); // nor does he learn whether he has guessed right
    EXPECT_EQ(call(right).user, "alice");
    EXPECT_EQ(call(right).user, ""); // replayed
    EXPECT_EQ(call("").verdict, SipAuthentication::ACCEPTED);

    std::string const later = ANSWER(ask(), "alice", "secret");
    for (unsigned int i = 0; i < SipBans::PATIENCE; ++i)
        std::ignore = check(ANSWER(ask(), "alice", "wrong"));
    EXPECT_EQ(check("").verdict, SipAuthentication::IGNORE);
    EXPECT_EQ(call(later).verdict, SipAuthentication::ACCEPTED);
    EXPECT_EQ(call(later).user, ""); // who is banned is nobody
    EXPECT_EQ(authentication.getCounters().emergency, SipBans::PATIENCE + 4u);
}

TEST_F(SipAuthenticationTest, WhoKnowsThePasswordIsKnown)
{
    SipChallenge challenge = ask();
    EXPECT_EQ(challenge.algorithm, SipDigest::SHA_256);
    SipAuthentication::Decision const decision = check(ANSWER(challenge, "alice", "secret"));
    EXPECT_EQ(decision.verdict, SipAuthentication::ACCEPTED);
    EXPECT_EQ(decision.user, "alice");
    EXPECT_EQ(check(ANSWER(challenge, "alice", "secret", 2)).verdict, SipAuthentication::ACCEPTED);
    challenge.algorithm = SipDigest::MD5;
    challenge.algorithmName = "MD5";
    EXPECT_EQ(check(ANSWER(challenge, "alice", "secret", 3)).verdict, SipAuthentication::ACCEPTED);
    EXPECT_EQ(authentication.getCounters().accepted, 3u);
}

TEST_F(SipAuthenticationTest, WhoDoesNotIsAskedAgainLikeEverybody)
{
    // but for the nonces all of them are told the same
    SipChallenge const first = ask();
    for (std::string const& header : {ANSWER(first, "alice", "wrong"), ANSWER(first, "nobody", "secret"),
                                      ANSWER(first, "bob", "guess"), ANSWER(first, "carol", "secret")})
    {
        SipChallenge const again = ask(header);
        EXPECT_FALSE(again.isStale);
        EXPECT_EQ(again.algorithm, first.algorithm);
        EXPECT_EQ(again.realm, first.realm);
        EXPECT_EQ(again.nonce.size(), first.nonce.size());
    }
    EXPECT_EQ(authentication.getCounters().wrong, 4u);
}

TEST_F(SipAuthenticationTest, WhatWasSentOnceIsNotTakenTwice)
{
    SipChallenge const challenge = ask();
    std::string const header = ANSWER(challenge, "alice", "secret");
    EXPECT_EQ(check(header).verdict, SipAuthentication::ACCEPTED);
    EXPECT_FALSE(ask(header).isStale);
    EXPECT_EQ(authentication.getCounters().replayed, 1u);
}

TEST_F(SipAuthenticationTest, CredentialsForOneNumberCallNoOther)
{
    struct
    {
        char const* shown; // in the credentials
        char const* asked; // in the request
        SipAuthentication::Verdict verdict;
    } const cases[] = {
        {"sip:4989@host", "sip:4989@host", SipAuthentication::ACCEPTED},
        {"sip:4989@office.example", "sip:4989@192.0.2.1:5070;transport=tcp", SipAuthentication::ACCEPTED}, // routed on
        {"sip:+49-89@host;user=phone", "tel:+4989", SipAuthentication::ACCEPTED},
        {"sips:%34989@host", "sip:4989@host", SipAuthentication::ACCEPTED},
        {"urn:service:SOS", "urn:service:sos", SipAuthentication::ACCEPTED},
        {"sip:host", "sip:other", SipAuthentication::ACCEPTED}, // a REGISTER
        {"sip:4989@host", "sip:4988@host", SipAuthentication::REFUSE},
        {"sip:host", "sip:4989@host", SipAuthentication::REFUSE},
        {"sip:4989@host", "sip:host", SipAuthentication::REFUSE},
        {"sip:4989@host", "tel:+4989", SipAuthentication::REFUSE},
        {"", "sip:host", SipAuthentication::REFUSE},
        {"/", "sip:host", SipAuthentication::REFUSE},
    };
    for (auto const& [shown, asked, verdict] : cases)
    {
        SipChallenge const challenge = ask();
        std::string const secret = SipDigest::SECRET(challenge.algorithm, "alice", challenge.realm, "secret");
        std::string const header = challenge.answer({"alice", secret}, "INVITE", shown, "", 1);
        SipMessage const invite = SipMessage::INVITE("From: <sip:4420@host>;tag=a\r\n" + header, asked);
        EXPECT_EQ(authentication.check(invite.get(), SOURCE).verdict, verdict) << shown << " for " << asked;
    }
    EXPECT_EQ(authentication.getCounters().moved, 6u);
    EXPECT_EQ(authentication.getNumberOfBanned(), 0u); // nobody has guessed
}

TEST_F(SipAuthenticationTest, ANonceWithoutACountServesOnce)
{
    SipChallenge challenge = ask();
    challenge.quality.clear();
    std::string const header = ANSWER(challenge, "alice", "secret");
    EXPECT_EQ(check(header).verdict, SipAuthentication::ACCEPTED);
    EXPECT_EQ(check(header).verdict, SipAuthentication::ASK);
}

TEST_F(SipAuthenticationTest, AnExpiredNonceIsStaleForWhoKnowsThePassword)
{
    SipChallenge const challenge = ask();
    clock.advance((SipNonces::LIFETIME + 1) * 1000);
    EXPECT_TRUE(ask(ANSWER(challenge, "alice", "secret")).isStale);
    EXPECT_FALSE(ask(ANSWER(challenge, "alice", "wrong")).isStale);
}

TEST_F(SipAuthenticationTest, ANonceThatIsNotOursIsStaleWhateverThePassword)
{
    SipChallenge made = ask();
    made.nonce[0] = 'x';
    EXPECT_TRUE(ask(ANSWER(made, "alice", "secret")).isStale);
    EXPECT_TRUE(ask(ANSWER(made, "alice", "wrong")).isStale);
    EXPECT_TRUE(ask(ANSWER(ask(), "alice", "secret"), ELSEWHERE).isStale);
    EXPECT_EQ(authentication.getCounters().wrong, 0u);
    EXPECT_EQ(authentication.getCounters().stale, 3u);
}

TEST_F(SipAuthenticationTest, OtherCredentialsAreNone)
{
    SipChallenge challenge = ask();
    challenge.realm = "elsewhere";
    for (std::string const& header :
         {ANSWER(challenge, "alice", "secret"), std::string("Authorization: Basic YTpi\r\n"),
          std::string("Authorization: Digest realm=\"office\", username=\"alice\", algorithm=SHA-512-256\r\n"),
          std::string("Authorization: Digest realm=\"office\", username=\"alice\", qop=token\r\n")})
        EXPECT_FALSE(ask(header).isStale);
    EXPECT_EQ(authentication.getCounters().wrong, 0u);
}

TEST_F(SipAuthenticationTest, WhoGuessesIsNotAnsweredAnyMore)
{
    for (unsigned int i = 0; i < SipBans::PATIENCE; ++i)
        EXPECT_FALSE(ask(ANSWER(ask(), "alice", "wrong")).isStale);
    EXPECT_EQ(check("").verdict, SipAuthentication::IGNORE);
    EXPECT_EQ(check("", ELSEWHERE).verdict, SipAuthentication::ASK);
    EXPECT_EQ(authentication.getNumberOfBanned(), 1u);
    EXPECT_EQ(authentication.getCounters().ignored, 1u);
    clock.advance(SipBans::FIRST * 1000);
    EXPECT_EQ(check("").verdict, SipAuthentication::ASK);
}
