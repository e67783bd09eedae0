#include "configuration/Configuration.h"

#include <gtest/gtest.h>

#include <cstdio>

namespace
{
char const* const TWO_INTERFACES = R"(
[[interface]]
name = "a"
listen = "127.0.0.1:5060"
peer = "[2001:db8::1]:5070"

[[interface]]
name = "b"
listen = "127.0.0.1:5061"
peer = "192.0.2.1:5060"
transport = "tcp"
transfer = "refer"
session-expires = 0
min-se = 120
max-call-duration = 3600
t1 = 100
t1x64 = 3200
answer-timeout = 30
)";

std::string COMPLAINT(std::string const& text)
{
    try
    {
        Configuration::PARSE(text, "f");
    }
    catch (ConfigurationError const& error)
    {
        return error.what();
    }
    return "none";
}
} // namespace

TEST(Configuration, WhatIsLeftOutHasItsDefault)
{
    Configuration const configuration = Configuration::PARSE(TWO_INTERFACES, "f");
    EXPECT_EQ(configuration.file, "f");
    EXPECT_EQ(configuration.logLevel, "info");
    EXPECT_EQ(configuration.callControlLogLevel, 1u);
    EXPECT_EQ(configuration.maxHops, 0u);
    EXPECT_EQ(configuration.maxCalls, 0u);
    EXPECT_EQ(configuration.maxCallsPerSecond, 0u);
    EXPECT_EQ(configuration.clearAfter, 10u);
    EXPECT_EQ(configuration.recording, "");
    EXPECT_EQ(configuration.recordingSize, 4194304u);
    EXPECT_TRUE(configuration.routes.empty());
    ASSERT_EQ(configuration.interfaces.size(), 2u);
    Configuration::Interface const& a = configuration.interfaces[0];
    EXPECT_FALSE(a.usesTcp);
    EXPECT_EQ(a.t1, 500u);
    EXPECT_EQ(a.t1x64, 32000u);
    EXPECT_EQ(a.answerTimeout, 180u);
    EXPECT_FALSE(a.transfersOnWire);
    EXPECT_EQ(a.sessionExpires, 1800u);
    EXPECT_EQ(a.leastExpires, 90u);
    EXPECT_EQ(a.longestCall, 0u);
    EXPECT_EQ(a.peer.host, "2001:db8::1");
    EXPECT_EQ(a.peer.text(), "[2001:db8::1]:5070");
}

TEST(Configuration, EveryKeyIsRead)
{
    Configuration const configuration = Configuration::PARSE(
        std::string("[gateway]\ncontext = \"X\"\nlog-level = \"debug\"\ncall-control-log-level = 5\nmax-hops = 9\n"
                    "max-calls = 7\n"
                    "max-calls-per-second = 8\nclear-after = 9\nrecording = \"/r\"\nrecording-size = 4096\n") +
            TWO_INTERFACES + "[[route]]\nfrom = \"a\"\nprefix = \"49\"\nto = \"b\"\n",
        "f");
    EXPECT_EQ(configuration.context, "X");
    EXPECT_EQ(configuration.logLevel, "debug");
    EXPECT_EQ(configuration.callControlLogLevel, 5u);
    EXPECT_EQ(configuration.maxHops, 9u);
    EXPECT_EQ(configuration.maxCalls, 7u);
    EXPECT_EQ(configuration.maxCallsPerSecond, 8u);
    EXPECT_EQ(configuration.clearAfter, 9u);
    EXPECT_EQ(configuration.recording, "/r");
    EXPECT_EQ(configuration.recordingSize, 4096u);
    Configuration::Interface const* const b = configuration.findInterface("b");
    ASSERT_NE(b, nullptr);
    EXPECT_TRUE(b->usesTcp);
    EXPECT_TRUE(b->transfersOnWire);
    EXPECT_EQ(b->sessionExpires, 0u);
    EXPECT_EQ(b->leastExpires, 120u);
    EXPECT_EQ(b->longestCall, 3600u);
    EXPECT_EQ(b->t1, 100u);
    EXPECT_EQ(b->t1x64, 3200u);
    EXPECT_EQ(b->answerTimeout, 30u);
    ASSERT_EQ(configuration.routes.size(), 1u);
    EXPECT_EQ(configuration.routes[0].prefix, "49");
}

TEST(Configuration, ALongerTimeOfTransactionsFollowsFromALongerFirstRetransmission)
{
    Configuration const configuration = Configuration::PARSE(
        "[[interface]]\nname = \"a\"\nlisten = \"127.0.0.1:1\"\npeer = \"127.0.0.1:2\"\nt1 = 1000\n", "f");
    EXPECT_EQ(configuration.interfaces[0].t1x64, 64000u);
}

TEST(Configuration, WhatCannotBeServedIsOneLineWithFileKeyAndReason)
{
    struct Row
    {
        std::string text;
        std::string complaint;
    };
    std::string const good = TWO_INTERFACES;
    std::string const first = "[[interface]]\nname = \"a\"\n";
    Row const rows[] = {
        {"", "f: interface: is missing: at least one [[interface]] is needed"},
        {"interface = 3", "f: interface: expected tables, [[interface]]"},
        {"gateway = 3\n" + good, "f: gateway: expected a table, [gateway]"},
        {"nonsense = 3\n" + good, "f: nonsense: is not a key"},
        {"[gateway]\nlog-level = \"loud\"\n" + good,
         "f: gateway.log-level: must be one of trace, debug, info, warning, error, off"},
        {"[gateway]\nmax-calls = 1.5\n" + good, "f: gateway.max-calls: expected a whole number"},
        {"[gateway]\nclear-after = -1\n" + good, "f: gateway.clear-after: must be from 0 to 86400"},
        {"[gateway]\ncall-control-log-level = 6\n" + good, "f: gateway.call-control-log-level: must be from 0 to 5"},
        {"[gateway]\nrecording-size = 100\n" + good, "f: gateway.recording-size: expected 0, or at least 4096"},
        {first, "f: interface[0].listen: is missing"},
        {first + "listen = 5060", "f: interface[0].listen: expected a text"},
        {first + "listen = \"\"", "f: interface[0].listen: must not be empty"},
        {first + "listen = \"127.0.0.1\"",
         "f: interface[0].listen: expected an address and a port, as in \"192.0.2.1:5060\""},
        {first + "listen = \"host:5060\"", "f: interface[0].listen: 'host' is not an address"},
        {first + "listen = \"10.0.0.0/8:5060\"", "f: interface[0].listen: '10.0.0.0/8' is not an address"},
        {first + "listen = \"2001:db8::1:5060\"", "f: interface[0].listen: '2001:db8::1' is not an address"},
        {first + "listen = \"[127.0.0.1]:5060\"", "f: interface[0].listen: '[127.0.0.1]' is not an address"},
        {first + "listen = \"127.0.0.1:0\"", "f: interface[0].listen: '0' is not a port"},
        {first + "listen = \"127.0.0.1:65536\"", "f: interface[0].listen: '65536' is not a port"},
        {first + "listen = \"127.0.0.1:5x\"", "f: interface[0].listen: '5x' is not a port"},
        {good + "t2 = 1", "f: interface[1].t2: is not a key"},
        {good + "[[interface]]\nname = \"a\"\nlisten = \"127.0.0.1:1\"\npeer = \"127.0.0.1:2\"",
         "f: interface[2].name: 'a' is taken by another interface"},
        {good + "[[route]]\nto = \"b\"", "f: route[0].from: is missing"},
        {good + "[[route]]\nfrom = \"c\"\nto = \"b\"", "f: route[0].from: there is no interface 'c'"},
        {good + "[[route]]\nfrom = \"a\"\nto = \"c\"", "f: route[0].to: there is no interface 'c'"},
    };
    for (Row const& row : rows)
        EXPECT_EQ(COMPLAINT(row.text), row.complaint) << row.text;
}

TEST(Configuration, TextThatIsNoTomlIsNamedByItsLine)
{
    EXPECT_EQ(COMPLAINT("[gateway]\nmax-calls = = 3\n").rfind("f: line 2: ", 0), 0u);
    EXPECT_EQ(COMPLAINT("a = \"\n\n").find('\n'), std::string::npos);
}

TEST(Configuration, AFileThatCannotBeReadIsNamed)
{
    try
    {
        Configuration::READ("/nonexistent/file.toml");
        FAIL();
    }
    catch (ConfigurationError const& error)
    {
        EXPECT_STREQ(error.what(), "/nonexistent/file.toml: file: cannot be read");
    }
}
