#include "sip/message/SipPropertyId.h"

#include "sip/dialog/SipSessionWord.h"

#include <gtest/gtest.h>

TEST(SipPropertyId, OwnAndKnownIdsHaveNames)
{
    EXPECT_EQ(SipPropertyId::DECLARE(), XCode::OK);
    EXPECT_STREQ(SipPropertyId::NAME(SipPropertyId::SESSION_OFFER), "Session-Offer");
    EXPECT_STREQ(SipPropertyId::NAME(SipPropertyId::SESSION_ANSWER), "Session-Answer");
    EXPECT_STREQ(SipPropertyId::NAME(SipPropertyId::CALL_NUMBER), "Call-Number");
    EXPECT_STREQ(SipPropertyId::NAME(SipPropertyId::MAX_FORWARDS), "Max-Forwards");
    EXPECT_STREQ(SipPropertyId::NAME(CC_PropertyId::STATE), "State");
    EXPECT_STREQ(SipPropertyId::NAME(CC_PropertyId::UNNAMED_BOOLEAN), "(unknown)");
    EXPECT_STREQ(SipPropertyId::NAME(0), "(unknown)");
}

TEST(SipPropertyId, LogsShowTheNamesOfThoseOfTheGateway)
{
    EXPECT_EQ(SipPropertyId::DECLARE(), XCode::OK);
    EXPECT_EQ(SipPropertyId::DECLARE(), XCode::OK) << "a second gateway in the process declares the same";
    SipSessionWord const session(SipPropertyId::SESSION_OFFER, {17, 2, 0, false, "v=0"});
    InfoContainer info;
    EXPECT_EQ(session.getInfo(info, 9, 0, 9, 0, "").getString_TreeFormat(),
              "Session-Offer: 2 (3 bytes) (Session-Word)\n");
}
