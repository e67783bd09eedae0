#include "operation/control/ControlRequest.h"

#include "operation/control/ControlAnswer.h"

#include <gtest/gtest.h>

TEST(ControlRequest, IsAVerbWithArgumentsAndOptions)
{
    ControlRequest const request = ControlRequest::PARSE(" call\t7 --older 60  name --json\r");
    EXPECT_EQ(request.verb, "call");
    EXPECT_EQ(request.arguments, (std::vector<std::string>{"7", "name"}));
    EXPECT_EQ(request.options.at("older"), "60");
    EXPECT_TRUE(request.isJson);
}

TEST(ControlRequest, WithoutWordsIsNothing)
{
    ControlRequest const request = ControlRequest::PARSE(" \r");
    EXPECT_TRUE(request.verb.empty());
    EXPECT_TRUE(request.arguments.empty());
    EXPECT_TRUE(ControlRequest::PARSE("").verb.empty());
}

TEST(ControlRequest, GivesAnOptionWithoutAValueNone)
{
    EXPECT_EQ(ControlRequest::PARSE("calls --older").options.at("older"), "");
}

TEST(ControlAnswer, EndsWithAnEmptyLineAndHasNoOther)
{
    EXPECT_EQ((ControlAnswer{{"a", "", "b"}, {}}.getText(false)), "ok\na\n \nb\n\n");
    EXPECT_EQ(ControlAnswer().getText(true), "{\"status\":\"ok\"}\n\n");
}

TEST(ControlAnswer, TellsWhyThereIsNone)
{
    EXPECT_EQ((ControlAnswer{{}, "no \"x\""}.getText(false)), "error: no \"x\"\n\n");
    EXPECT_EQ((ControlAnswer{{}, "no \"x\""}.getText(true)), "{\"status\":\"error\",\"reason\":\"no \\\"x\\\"\"}\n\n");
}
