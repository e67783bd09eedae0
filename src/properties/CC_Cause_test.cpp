#include "properties/CC_Cause.h"

#include <gtest/gtest.h>
#include <iterator>
#include <set>
#include <string>

namespace
{
struct Case
{
    int value;
    char const* name;
};
// in the order of their indexes; values and names stand in configurations
constexpr Case s_causes[] = {
    {0, "no-error"},
    {1, "unallocated-number"},
    {2, "no-route-to-network"},
    {3, "no-route-to-destination"},
    {6, "channel-unacceptable"},
    {7, "call-awarded"},
    {16, "normal-call-clearing"},
    {17, "user-busy"},
    {18, "no-user-responding"},
    {19, "no-answer-from-user"},
    {20, "subscriber-absent"},
    {21, "call-rejected"},
    {22, "number-changed"},
    {26, "non-selected-user-clearing"},
    {27, "destination-out-of-order"},
    {28, "invalid-number-format"},
    {29, "facility-rejected"},
    {30, "response-to-status-enquiry"},
    {31, "normal-unspecified"},
    {34, "no-circuit-channel-available"},
    {38, "network-out-of-order"},
    {41, "temporary-failure"},
    {42, "switching-equipment-congestion"},
    {43, "access-info-discarded"},
    {44, "circuit-channel-not-available"},
    {47, "resources-unavailable"},
    {49, "qos-unavailable"},
    {50, "facility-not-subscribed"},
    {57, "bearer-capability-not-authorized"},
    {58, "bearer-capability-not-available"},
    {63, "service-or-option-not-available"},
    {65, "bearer-capability-not-implemented"},
    {66, "channel-type-not-implemented"},
    {69, "facility-not-implemented"},
    {70, "only-restricted-digital-available"},
    {79, "service-or-option-not-implemented"},
    {81, "invalid-call-reference"},
    {82, "channel-does-not-exist"},
    {83, "call-identity-does-not-exist"},
    {84, "call-identity-in-use"},
    {85, "no-call-suspended"},
    {86, "call-has-been-cleared"},
    {88, "incompatible-destination"},
    {91, "invalid-transit-network"},
    {95, "invalid-message"},
    {96, "mandatory-ie-missing"},
    {97, "message-type-not-implemented"},
    {98, "message-type-not-state-compatible"},
    {99, "ie-does-not-exist"},
    {100, "invalid-ie-contents"},
    {101, "message-not-state-compatible"},
    {102, "recovery-on-timer-expiry"},
    {111, "protocol-error"},
    {127, "interworking"},
};
constexpr Case s_reasons[] = {
    {0, "unknown"}, {1, "cfb"}, {2, "cfnr"}, {4, "cd"}, {9, "ooo"}, {10, "cfcd"}, {15, "cfu"},
};
} // namespace

TEST(CC_Cause, EveryCauseHasItsIndexValueAndShortName)
{
    ASSERT_EQ(54U, std::size(s_causes));
    ASSERT_EQ(54U, GET_CAUSE_SIZE());
    for (unsigned int i = 0; i < std::size(s_causes); ++i)
    {
        auto const cause = static_cast<QCause>(s_causes[i].value);
        EXPECT_EQ(cause, GET_CAUSE_BY_INDEX(i)) << i;
        EXPECT_STREQ(s_causes[i].name, CAUSE_SHORT_NAME(cause));
        EXPECT_EQ(cause, GET_CAUSE_BY_SHORT_NAME(s_causes[i].name)) << s_causes[i].name;
    }
}

TEST(CC_Cause, PastTheLastIndexThereIsNoCause)
{
    EXPECT_EQ(QCause::INTERWORKING, GET_CAUSE_BY_INDEX(53));
    for (unsigned int const index : {54U, 55U, 0xffffffffU})
        EXPECT_EQ(QCause::UNSPECIFIED, GET_CAUSE_BY_INDEX(index));
}

TEST(CC_Cause, ACauseBesideTheTableHasAnEmptyShortName)
{
    std::set<int> named;
    for (Case const& row : s_causes)
        named.insert(row.value);
    named.insert(-1);
    for (int value = -3; value < 300; ++value)
    {
        bool const isEmpty = *CAUSE_SHORT_NAME(static_cast<QCause>(value)) == '\0';
        EXPECT_EQ(named.count(value) == 0, isEmpty) << value;
    }
    EXPECT_STREQ("(unspecified)", CAUSE_SHORT_NAME(QCause::UNSPECIFIED));
}

TEST(CC_Cause, AShortNameIsFoundByItsExactSpellingOnly)
{
    EXPECT_EQ(QCause::USER_BUSY, GET_CAUSE_BY_SHORT_NAME("user-busy"));
    for (String const& name : {String("User-Busy"), String("user-busy "), String("user-busy\0", 10), String("user"),
                               String("(unspecified)"), String("")})
        EXPECT_EQ(QCause::UNSPECIFIED, GET_CAUSE_BY_SHORT_NAME(name)) << name.c_str();
}

TEST(CC_Cause, EveryRedirectionReasonHasItsIndexValueAndShortName)
{
    for (unsigned int i = 0; i < std::size(s_reasons); ++i)
    {
        auto const reason = static_cast<QReasonForRedirection>(s_reasons[i].value);
        EXPECT_EQ(reason, GET_REASON_FOR_REDIRECTION_BY_INDEX(i)) << i;
        EXPECT_STREQ(s_reasons[i].name, REASON_FOR_REDIRECTION_SHORT_NAME(reason));
        EXPECT_EQ(reason, GET_REASON_FOR_REDIRECTION_BY_SHORT_NAME(s_reasons[i].name));
    }
    for (unsigned int const index : {7U, 0xffffffffU})
        EXPECT_EQ(QReasonForRedirection::UNSPECIFIED, GET_REASON_FOR_REDIRECTION_BY_INDEX(index));
}

TEST(CC_Cause, AReasonBesideTheTableHasAnEmptyShortName)
{
    for (int const value : {-2, 3, 5, 6, 7, 8, 11, 12, 13, 14, 16, 100})
        EXPECT_STREQ("", REASON_FOR_REDIRECTION_SHORT_NAME(static_cast<QReasonForRedirection>(value))) << value;
    EXPECT_STREQ("(unspecified)", REASON_FOR_REDIRECTION_SHORT_NAME(QReasonForRedirection::UNSPECIFIED));
    for (char const* const name : {"CFU", "cfu ", "(unspecified)", ""})
        EXPECT_EQ(QReasonForRedirection::UNSPECIFIED, GET_REASON_FOR_REDIRECTION_BY_SHORT_NAME(name)) << name;
}
