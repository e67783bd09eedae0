#include "operation/page/ControlRelay.h"

#include <gtest/gtest.h>

namespace
{
std::string LINE_OF(std::string const& path, std::string const& query = {})
{
    HttpRequest request;
    request.path = path;
    request.query = query;
    return ControlRelay::LINE_OF(request);
}
} // namespace

TEST(ControlRelay, APathIsACommandAndItsArguments)
{
    EXPECT_EQ(LINE_OF("/control/calls"), "calls --json\n");
    EXPECT_EQ(LINE_OF("/control/call/7"), "call 7 --json\n");
    EXPECT_EQ(LINE_OF("/control/history/7/Call-Leg%2dID"), "history 7 Call-Leg-ID --json\n");
    EXPECT_EQ(LINE_OF("/control/calls", "older=60&interface=trunk"), "calls --older 60 --interface trunk --json\n");
}

TEST(ControlRelay, NothingThatChangesSomethingIsGivenOut)
{
    for (char const* const verb : {"drop/1/16", "block/trunk", "unblock/trunk", "drain", "resume", "reload", "shutdown",
                                   "trace/on/1", "help", "nonsense", ""})
        EXPECT_EQ(LINE_OF(std::string("/control/") + verb), "") << verb;
    EXPECT_EQ(LINE_OF("/calls"), "");
    EXPECT_EQ(LINE_OF("/controls/calls"), "");
}

TEST(ControlRelay, WhoKnowsTheTokenClearsCallsAndBlocksInterfacesAndNothingElse)
{
    HttpRequest request;
    request.isPost = true;
    for (char const* const verb : {"drop/1/16", "block/trunk", "unblock/trunk"})
    {
        request.path = std::string("/control/") + verb;
        EXPECT_NE(ControlRelay::LINE_OF(request), "") << verb;
    }
    EXPECT_EQ(ControlRelay::LINE_OF(request), "unblock trunk --json\n");
    for (char const* const verb : {"drain", "resume", "reload", "shutdown", "trace/on/1", "calls", "call/7"})
    {
        request.path = std::string("/control/") + verb;
        EXPECT_EQ(ControlRelay::LINE_OF(request), "") << verb;
    }
}

TEST(ControlRelay, WithoutTheTokenNothingIsChanged)
{
    auto const refusalOf = [](ControlRelay relay, std::string const& path, std::string const& token)
    {
        HttpRequest request;
        request.isPost = true;
        request.path = path;
        request.token = token;
        unsigned int refusal = 404;
        EXPECT_EQ(relay.open(request, refusal), -1);
        return refusal;
    };
    EXPECT_EQ(refusalOf(ControlRelay("/nowhere"), "/control/drop/1/16", ""), 405u) << "there is none";
    EXPECT_EQ(refusalOf(ControlRelay("/nowhere"), "/control/drop/1/16", "guessed"), 405u);
    ControlRelay const guarded("/nowhere", "0123456789abcdef");
    for (char const* const token : {"", "0123456789abcde", "0123456789abcdeg", "0123456789abcdef0"})
        EXPECT_EQ(refusalOf(guarded, "/control/drop/1/16", token), 401u) << token;
    EXPECT_EQ(refusalOf(guarded, "/control/shutdown", "0123456789abcdef"), 404u);
    EXPECT_EQ(refusalOf(guarded, "/control/drop/1/16", "0123456789abcdef"), 503u) << "the socket is not there";
}

TEST(ControlRelay, NoArgumentBecomesTwoOrAnOptionOrAnotherLine)
{
    EXPECT_EQ(LINE_OF("/control/call/7%208"), "");
    EXPECT_EQ(LINE_OF("/control/call/7%0adrain"), "");
    EXPECT_EQ(LINE_OF("/control/call/%00"), "");
    EXPECT_EQ(LINE_OF("/control/call/--older"), "");
    EXPECT_EQ(LINE_OF("/control/call//7"), "");
    EXPECT_EQ(LINE_OF("/control/calls", "older=6%0a0"), "");
    EXPECT_EQ(LINE_OF("/control/calls", "older"), "");
}

TEST(ControlRelay, WhatIsNoHexadecimalNumberStaysAsItIs)
{
    EXPECT_EQ(LINE_OF("/control/call/%4"), "call %4 --json\n");
    EXPECT_EQ(LINE_OF("/control/call/%zz%"), "call %zz% --json\n");
}

TEST(ControlRelay, AnAnswerIsWholeWithItsEmptyLine)
{
    ControlRelay relay("/nowhere");
    EXPECT_FALSE(relay.read("", false).has_value());
    EXPECT_FALSE(relay.read("{\"status\":\"ok\"}\n{\"call\":7}\n", false).has_value());
    std::optional<HttpAnswer> const answer = relay.read("{\"status\":\"ok\"}\n{\"call\":7}\n\n", false);
    ASSERT_TRUE(answer.has_value());
    EXPECT_EQ(answer->status, 200u);
    EXPECT_EQ(answer->content, "{\"call\":7}\n");
    EXPECT_EQ(relay.read("{\"status\":\"ok\"}\n\n", false)->content, "");
}

TEST(ControlRelay, AReasonOfTheSocketIsToldAndAnEndOfItIsNoAnswer)
{
    ControlRelay relay("/nowhere");
    std::optional<HttpAnswer> const refused = relay.read("{\"status\":\"error\",\"reason\":\"no\"}\n\n", false);
    ASSERT_TRUE(refused.has_value());
    EXPECT_EQ(refused->status, 404u);
    EXPECT_EQ(refused->content, "{\"status\":\"error\",\"reason\":\"no\"}\n");
    EXPECT_EQ(relay.read("{\"status\":\"ok\"}\n{", true)->status, 503u);
}

TEST(ControlRelay, ASocketThatIsNotThereIsNoService)
{
    ControlRelay relay("/nowhere/at/all");
    HttpRequest request;
    request.path = "/control/status";
    unsigned int refusal = 0;
    EXPECT_EQ(relay.open(request, refusal), -1);
    EXPECT_EQ(refusal, 503u);
}
