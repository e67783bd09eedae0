#include "properties/CC_PropertyCause.h"

#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <string>

namespace
{
CC_PropertyCause CAUSE_OF(QCause cause, unsigned int sipCode, char const* text = "")
{
    return CC_PropertyCause(CC_PropertyId::CAUSE, cause, sipCode, text);
}

std::string HEADER_OF(CC_PropertyCause const& cause)
{
    String header("left from before");
    return cause.getReasonHeaderString(header).c_str();
}

struct Phrase
{
    unsigned int code;
    char const* text;
};
constexpr Phrase s_phrases[] = {
    {400, "Bad Request"},
    {401, "Unauthorized"},
    {402, "Payment Required"},
    {403, "Forbidden"},
    {404, "Not Found"},
    {405, "Method Not Allowed"},
    {406, "Not Acceptable"},
    {407, "Proxy Authentication Required"},
    {408, "Request Timeout"},
    {410, "Gone"},
    {413, "Request Entity Too Large"},
    {414, "Request-URI Too Large"},
    {415, "Unsupported Media Type"},
    {416, "Unsupported URI Scheme"},
    {420, "Bad Extension"},
    {421, "Extension Required"},
    {423, "Interval Too Brief"},
    {480, "Temporarily not available"},
    {481, "Call Leg/Transaction Does Not Exist"},
    {482, "Loop Detected"},
    {483, "Too Many Hops"},
    {484, "Address Incomplete"},
    {485, "Ambiguous"},
    {486, "Busy Here"},
    {487, "Request Terminated"},
    {488, "Not Acceptable Here"},
    {491, "Request Pending"},
    {493, "Undecipherable"},
    {500, "Internal Server Error"},
    {501, "Not Implemented"},
    {502, "Bad Gateway"},
    {503, "Service Unavailable"},
    {504, "Server Time-out"},
    {505, "SIP Version not supported"},
    {513, "Message Too Large"},
    {600, "Busy Everywhere"},
    {603, "Decline"},
    {604, "Does not exist anywhere"},
    {606, "Not Acceptable"},
    {0, "UNKNOWN CAUSE"},
    {200, "UNKNOWN CAUSE"},
    {409, "UNKNOWN CAUSE"},
    {411, "UNKNOWN CAUSE"},
    {422, "UNKNOWN CAUSE"},
    {607, "UNKNOWN CAUSE"},
};
} // namespace

TEST(CC_PropertyCause, PrintsTheCauseAndTheSipCode)
{
    EXPECT_EQ("User busy (486)", VALUE_OF(CAUSE_OF(QCause::USER_BUSY, 486)));
    EXPECT_EQ("User busy", VALUE_OF(CAUSE_OF(QCause::USER_BUSY, 0)));
    EXPECT_EQ("No error", VALUE_OF(CC_PropertyCause(CC_PropertyId::CAUSE)));
}

TEST(CC_PropertyCause, PrintsThePeersTextInPlaceOfTheCause)
{
    EXPECT_EQ("Out for lunch", VALUE_OF(CAUSE_OF(QCause::USER_BUSY, 0, "Out for lunch")));
    EXPECT_EQ("Out for lunch (486)", VALUE_OF(CAUSE_OF(QCause::USER_BUSY, 486, "Out for lunch")));
}

TEST(CC_PropertyCause, TheReasonHeaderPrefersTheQ850Cause)
{
    EXPECT_EQ("Q.850;cause=17;text=\"User busy\"", HEADER_OF(CAUSE_OF(QCause::USER_BUSY, 486)));
    EXPECT_EQ("Q.850;cause=17;text=\"User busy\"", HEADER_OF(CAUSE_OF(QCause::USER_BUSY, 0, "Out for lunch")));
    EXPECT_EQ("Q.850;cause=4294967295;text=\"Unspecified\"", HEADER_OF(CAUSE_OF(QCause::UNSPECIFIED, 486)));
}

TEST(CC_PropertyCause, TheReasonHeaderOfASipCodeHasItsPhraseOrThePeersText)
{
    EXPECT_EQ("SIP;cause=486;text=\"Busy Here\"", HEADER_OF(CAUSE_OF(QCause::NONE, 486)));
    EXPECT_EQ("SIP;cause=486;text=\"Out for lunch\"", HEADER_OF(CAUSE_OF(QCause::NONE, 486, "Out for lunch")));
    EXPECT_EQ("SIP;cause=499;text=\"UNKNOWN CAUSE\"", HEADER_OF(CAUSE_OF(QCause::NONE, 499)));
    EXPECT_EQ("SIP;cause=486;text=\"say \"no\"\"", HEADER_OF(CAUSE_OF(QCause::NONE, 486, "say \"no\"")));
}

TEST(CC_PropertyCause, WithoutCauseAndCodeThereIsNoReasonHeader)
{
    EXPECT_EQ("", HEADER_OF(CAUSE_OF(QCause::NONE, 0)));
    EXPECT_EQ("", HEADER_OF(CAUSE_OF(QCause::NONE, 0, "Out for lunch")));
}

TEST(CC_PropertyCause, EverySipCodeHasItsPhrase)
{
    CC_PropertyCause const cause(CC_PropertyId::CAUSE);
    for (Phrase const& row : s_phrases)
        EXPECT_STREQ(row.text, cause.getSipTextFromCode(row.code).c_str()) << row.code;
}

TEST(CC_PropertyCause, ComparesCauseCodeAndText)
{
    CC_PropertyCause const cause = CAUSE_OF(QCause::USER_BUSY, 486, "Out for lunch");
    EXPECT_TRUE(cause.isEqual(CAUSE_OF(QCause::USER_BUSY, 486, "Out for lunch")));
    EXPECT_FALSE(cause.isEqual(CAUSE_OF(QCause::CALL_REJECTED, 486, "Out for lunch")));
    EXPECT_FALSE(cause.isEqual(CAUSE_OF(QCause::USER_BUSY, 600, "Out for lunch")));
    EXPECT_FALSE(cause.isEqual(CAUSE_OF(QCause::USER_BUSY, 486, "out for lunch")));
}

TEST(CC_PropertyCause, ItsPartsCanBeSetAndRead)
{
    CC_PropertyCause cause(CC_PropertyId::CAUSE);
    cause.setCause(QCause::CALL_REJECTED);
    cause.setSipCode(603);
    cause.setText("No");
    EXPECT_EQ(QCause::CALL_REJECTED, cause.getCause());
    EXPECT_EQ(603U, cause.getSipCode());
    EXPECT_STREQ("No", cause.getText().c_str());
    EXPECT_EQ("Invalid value", REFUSAL_OF(cause, "User busy"));
}

TEST(CC_PropertyCause, AnAssignmentWithoutMemoryLeavesAllPartsAsTheyWere)
{
    CC_PropertyCause const source = CAUSE_OF(QCause::CALL_REJECTED, 603, std::string(100, 'x').c_str());
    CC_PropertyCause target = CAUSE_OF(QCause::USER_BUSY, 486);
    WITH_EACH_ALLOCATION_FAILING([&] { target.assign(source); },
                                 [&] { EXPECT_TRUE(target.isEqual(CAUSE_OF(QCause::USER_BUSY, 486))); });
    EXPECT_TRUE(target.isEqual(source));
}
