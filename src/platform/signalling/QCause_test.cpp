#include "platform/signalling/QCause.h"

#include "platform/base/NameOf.h"

#include <gtest/gtest.h>
#include <set>
#include <string>

namespace
{
struct Case
{
    QCause cause;
    int value;
    char const* name;
};
constexpr Case s_cases[] = {
    {QCause::UNALLOCATED_NUMBER, 1, "Unallocated (unassigned) number"},
    {QCause::NO_ROUTE_TO_DESTINATION, 3, "No route to destination"},
    {QCause::SEND_SPECIAL_INFORMATION_TONE, 4, "Send special information tone"},
    {QCause::CALL_COMPLETED_ELSEWHERE, 13, "Call completed elsewhere"},
    {QCause::NORMAL_CALL_CLEARING, 16, "Normal call clearing"},
    {QCause::USER_BUSY, 17, "User busy"},
    {QCause::NO_USER_RESPONDING, 18, "No user responding"},
    {QCause::NO_ANSWER_FROM_USER, 19, "No answer from user (user alerted)"},
    {QCause::CALL_REJECTED, 21, "Call rejected"},
    {QCause::REDIRECTION_TO_NEW_DESTINATION, 23, "Redirection to new destination"},
    {QCause::NETWORK_OUT_OF_ORDER, 38, "Network out of order"},
    {QCause::TEMPORARY_FAILURE, 41, "Temporary failure"},
    {QCause::RECOVERY_ON_TIMER_EXPIRY, 102, "Recovery on timer expiry"},
    {QCause::INTERWORKING, 127, "Interworking, unspecified"},
};
} // namespace

TEST(QCause, ACauseHasItsNumberAndTitle)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.value, static_cast<int>(row.cause)) << row.name;
        EXPECT_STREQ(row.name, QCAUSE_NAME(row.cause)) << row.value;
    }
}

TEST(QCause, NothingAndNoneHaveNamesOfOurOwn)
{
    EXPECT_STREQ("No error", QCAUSE_NAME(QCause::NONE));
    EXPECT_STREQ("No error", QCAUSE_NAME(QCause{}));
    EXPECT_STREQ("Unspecified", QCAUSE_NAME(QCause::UNSPECIFIED));
    EXPECT_EQ(-1, static_cast<int>(QCause::UNSPECIFIED));
}

TEST(QCause, ANumberWithoutATitleIsInvalid)
{
    for (int value : {-2, 10, 15, 32, 33, 48, 51, 67, 89, 92, 126, 128, 1000})
        EXPECT_STREQ(ERROR::INVALID, QCAUSE_NAME(static_cast<QCause>(value))) << value;
}

TEST(QCause, SeventyTwoValuesHaveATitleAndNoTwoTheSame)
{
    std::set<std::string> names;
    unsigned int named = 0;
    for (int value = 1; value <= 127; ++value)
        if (std::string const name = QCAUSE_NAME(static_cast<QCause>(value)); name != ERROR::INVALID)
        {
            names.insert(name);
            ++named;
        }
    EXPECT_EQ(72U, named);
    EXPECT_EQ(named, names.size());
}

TEST(QCause, EveryClassHasItsCatchAll)
{
    for (int value : {31, 47, 63, 79, 95, 111, 127})
        EXPECT_NE(std::string::npos, std::string(QCAUSE_NAME(static_cast<QCause>(value))).find(", unspecified"))
            << value;
}
