#include "sip/message/SipUserToUser.h"

#include "SipMessage.h"

#include <gtest/gtest.h>

namespace
{
using Content = CC_PropertyParametrizedString::ParametrizedString;

std::optional<Content> READ(std::string const& value)
{
    SipMessage const invite = SipMessage::INVITE("From: <sip:4420@host>;tag=a\r\nuser-TO-user: " + value + "\r\n");
    return SipUserToUser::READ(invite.get());
}

/// As it leaves when it has come so; "absent" for what counts as that.
std::string CROSSED(std::string const& value)
{
    std::optional<Content> const content = READ(value);
    return content ? SipUserToUser::GET_LINE(*content) : "absent";
}
} // namespace

TEST(SipUserToUser, CrossesWithItsParameters)
{
    EXPECT_EQ(CROSSED("0461626364;encoding=hex;purpose=isdn-uui;content=isdn-uui"),
              "User-to-User: 0461626364;encoding=hex;purpose=isdn-uui;content=isdn-uui\r\n");
    EXPECT_EQ(CROSSED(" 04ab ; encoding = hex "), "User-to-User: 04ab;encoding=hex\r\n");
    EXPECT_EQ(CROSSED("\"a, b; \\\"c\\\"\";purpose=app"), "User-to-User: \"a, b; \\\"c\\\"\";purpose=app\r\n");
}

TEST(SipUserToUser, TheProperyHasTheContentWithoutItsQuotes)
{
    std::optional<Content> const content = READ("\"04ab\";encoding=\"hex\"");
    ASSERT_TRUE(content);
    EXPECT_EQ(content->content, "04ab");
    EXPECT_EQ(content->getParameter("encoding"), "hex");
}

TEST(SipUserToUser, OfSeveralTheFirstCounts)
{
    EXPECT_EQ(CROSSED("04ab, 04cd;encoding=hex"), "User-to-User: 04ab\r\n");
}

TEST(SipUserToUser, WhatIsMalformedOrTooLongIsAbsent)
{
    for (char const* const value : {";encoding=hex", "a b", "\"04", "04;=hex", "04;encoding=", "04;enc oding=hex"})
        EXPECT_EQ(CROSSED(value), "absent") << value;
    EXPECT_EQ(CROSSED(std::string(SipUserToUser::LONGEST + 1, 'a')), "absent");
}

TEST(SipUserToUser, NothingOfAnotherModuleBreaksOutOfTheLine)
{
    Content broken("04\r\nVia: a");
    EXPECT_EQ(SipUserToUser::GET_LINE(broken), "");
    Content key("04");
    ASSERT_TRUE(key.parameters.append({"a\r\nVia", "b"}).isOk());
    EXPECT_EQ(SipUserToUser::GET_LINE(key), "");
    Content value("04");
    ASSERT_TRUE(value.parameters.append({"a", "b\nVia: c"}).isOk());
    EXPECT_EQ(SipUserToUser::GET_LINE(value), "");
    EXPECT_EQ(SipUserToUser::GET_LINE(Content()), "");
    EXPECT_EQ(SipUserToUser::GET_LINE(Content(String(std::string_view(std::string(2000, 'a'))))), "");
}
