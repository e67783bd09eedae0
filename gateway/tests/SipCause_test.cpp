#include "sip/message/SipCause.h"

#include "properties/CC_PropertyId.h"

#include <gtest/gtest.h>

namespace
{
unsigned int FINAL_STATUS(QCause cause, unsigned int sipCode) { return SipCause{cause, sipCode, {}}.getFinalStatus(); }
} // namespace

TEST(SipCause, StatusesBecomeTheCausesOfTheRfc)
{
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(404), QCause::UNALLOCATED_NUMBER);
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(408), QCause::RECOVERY_ON_TIMER_EXPIRY);
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(480), QCause::NO_USER_RESPONDING);
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(484), QCause::INVALID_NUMBER_FORMAT);
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(486), QCause::USER_BUSY);
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(503), QCause::TEMPORARY_FAILURE);
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(600), QCause::USER_BUSY);
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(603), QCause::CALL_REJECTED);
}

TEST(SipCause, AnUnlistedStatusCountsAsTheFirstOfItsClass)
{
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(499), SipCause::CAUSE_OF_STATUS(400));
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(599), SipCause::CAUSE_OF_STATUS(500));
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(699), SipCause::CAUSE_OF_STATUS(600));
    EXPECT_EQ(SipCause::CAUSE_OF_STATUS(302), QCause::NORMAL_UNSPECIFIED);
}

TEST(SipCause, CausesBecomeTheStatusesOfTheRfc)
{
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::UNALLOCATED_NUMBER), 404u);
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::NO_ROUTE_TO_DESTINATION), 404u);
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::USER_BUSY), 486u);
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::NO_USER_RESPONDING), 408u);
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::NO_ANSWER_FROM_USER), 480u);
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::CALL_REJECTED), 403u);
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::INTERWORKING), 500u);
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::PREEMPTION), 500u);
    EXPECT_EQ(SipCause::STATUS_OF_CAUSE(QCause::NONE), 500u);
}

TEST(SipCause, TheCauseOfAResponsesReasonWinsOverThatOfItsStatus)
{
    SipCause const cause = SipCause::FROM_RESPONSE(486, "Busy Here", "Q.850;cause=20;text=\"gone\"");
    EXPECT_EQ(cause.cause, QCause::SUBSCRIBER_ABSENT);
    EXPECT_EQ(cause.sipCode, 486u);
    EXPECT_EQ(cause.text, "gone");
    SipCause const plain = SipCause::FROM_RESPONSE(486, "Busy Here", "");
    EXPECT_EQ(plain.cause, QCause::USER_BUSY);
    EXPECT_EQ(plain.text, "Busy Here");
    EXPECT_EQ(SipCause::FROM_RESPONSE(486, "Busy\x1b[31m", "").text, "Busy [31m");
}

TEST(SipCause, ARedirectionIsNotFollowed)
{
    SipCause const cause = SipCause::FROM_RESPONSE(302, "Moved Temporarily", "");
    EXPECT_EQ(cause.cause, QCause::REDIRECTION_TO_NEW_DESTINATION);
    EXPECT_EQ(cause.getFinalStatus(), 410u);
}

TEST(SipCause, ARequestWithoutReasonEndsNormally)
{
    EXPECT_EQ(SipCause::FROM_REQUEST("").cause, QCause::NORMAL_CALL_CLEARING);
    EXPECT_EQ(SipCause::FROM_REQUEST("garbage").cause, QCause::NORMAL_CALL_CLEARING);
    EXPECT_EQ(SipCause::FROM_REQUEST("SIP;cause=200").cause, QCause::NON_SELECTED_USER_CLEARING);
    EXPECT_EQ(SipCause::FROM_REQUEST("SIP;cause=486").cause, QCause::USER_BUSY);
    EXPECT_EQ(SipCause::FROM_REQUEST("SIP;cause=486, Q.850;cause=21").cause, QCause::CALL_REJECTED);
}

TEST(SipCause, AStatusThatMeansSomethingOnlyToUsIsNotPassedOn)
{
    EXPECT_EQ(FINAL_STATUS(QCause::USER_BUSY, 486), 486u);
    EXPECT_EQ(FINAL_STATUS(QCause::CALL_REJECTED, 603), 603u);
    EXPECT_EQ(FINAL_STATUS(QCause::CALL_REJECTED, 401), 403u);
    EXPECT_EQ(FINAL_STATUS(QCause::CALL_REJECTED, 407), 403u);
    EXPECT_EQ(FINAL_STATUS(QCause::TEMPORARY_FAILURE, 481), 503u);
    EXPECT_EQ(FINAL_STATUS(QCause::USER_BUSY, 0), 486u);
    EXPECT_EQ(FINAL_STATUS(QCause::NON_SELECTED_USER_CLEARING, 200), 404u);
}

TEST(SipCause, AReasonHeaderNamesTheCauseAndInARequestTheCodeAsWell)
{
    SipCause const cause{QCause::USER_BUSY, 486, "say \"no\""};
    EXPECT_EQ(cause.getReasonHeader(false), "Q.850;cause=17;text=\"User busy\"");
    EXPECT_EQ(cause.getReasonHeader(true), "Q.850;cause=17;text=\"User busy\", SIP;cause=486;text=\"say \\\"no\\\"\"");
    EXPECT_EQ((SipCause{QCause::USER_BUSY, 0, {}}).getReasonHeader(true), "Q.850;cause=17;text=\"User busy\"");
    EXPECT_EQ((SipCause{QCause::USER_BUSY, 600, {}}).getReasonHeader(true),
              "Q.850;cause=17;text=\"User busy\", SIP;cause=600;text=\"Busy Everywhere\"");
}

TEST(SipCause, TravelsAsAProperty)
{
    SipCause const cause{QCause::USER_BUSY, 486, "gone"};
    CC_PropertyCause const property = cause.getProperty();
    EXPECT_EQ(property.getId(), CC_PropertyId::CAUSE);
    SipCause const back = SipCause::FROM_PROPERTY(&property);
    EXPECT_EQ(back.cause, cause.cause);
    EXPECT_EQ(back.sipCode, cause.sipCode);
    EXPECT_EQ(back.text, cause.text);
}

TEST(SipCause, APropertyThatSaysNothingIsNormalClearing)
{
    CC_PropertyCause const none(CC_PropertyId::CAUSE, QCause::NONE, 0);
    CC_PropertyCause const unspecified(CC_PropertyId::CAUSE, QCause::UNSPECIFIED, 0);
    CC_PropertyCause const codeAlone(CC_PropertyId::CAUSE, QCause::NONE, 404);
    EXPECT_EQ(SipCause::FROM_PROPERTY(nullptr).cause, QCause::NORMAL_CALL_CLEARING);
    EXPECT_EQ(SipCause::FROM_PROPERTY(&none).cause, QCause::NORMAL_CALL_CLEARING);
    EXPECT_EQ(SipCause::FROM_PROPERTY(&unspecified).cause, QCause::NORMAL_CALL_CLEARING);
    EXPECT_EQ(SipCause::FROM_PROPERTY(&codeAlone).cause, QCause::UNALLOCATED_NUMBER);
}
