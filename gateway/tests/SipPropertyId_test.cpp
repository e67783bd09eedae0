#include "sip/SipPropertyId.h"

#include "properties/CC_PropertyId.h"

#include <gtest/gtest.h>

TEST(SipPropertyId, OwnAndKnownIdsHaveNames)
{
    EXPECT_STREQ(SipPropertyId::NAME(SipPropertyId::SESSION_DESCRIPTION), "Session-Description");
    EXPECT_STREQ(SipPropertyId::NAME(SipPropertyId::CALL_NUMBER), "Call-Number");
    EXPECT_STREQ(SipPropertyId::NAME(SipPropertyId::MAX_FORWARDS), "Max-Forwards");
    EXPECT_STREQ(SipPropertyId::NAME(CC_PropertyId::STATE), "State");
    EXPECT_STREQ(SipPropertyId::NAME(CC_PropertyId::UNNAMED_BOOLEAN), "(unknown)");
    EXPECT_STREQ(SipPropertyId::NAME(0), "(unknown)");
}
