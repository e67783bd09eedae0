#include "configuration/Configuration.h"

#include <gtest/gtest.h>

#include <cstdio>

namespace
{
char const* const TWO_INTERFACES = R"(
[[interface]]
name = "a"
listen = "127.0.0.1:5060"
peer = "192.0.2.7:5070"

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
transports = ["tcp", "udp"]
allow = ["192.0.2.0/24", "2001:db8::7"]
max-message-size = 2000
max-header-size = 1500
max-connections-per-source = 3
tcp-idle = 4
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
    EXPECT_EQ(configuration.maxCalls, 4000u);
    EXPECT_EQ(configuration.maxCallsPerSecond, 200u);
    EXPECT_EQ(configuration.maxCallsPerSource, 2000u);
    EXPECT_EQ(configuration.clearAfter, 10u);
    EXPECT_EQ(configuration.recording, "");
    EXPECT_EQ(configuration.recordingSize, 4194304u);
    EXPECT_TRUE(configuration.routes.empty());
    ASSERT_EQ(configuration.interfaces.size(), 2u);
    Configuration::Interface const& a = configuration.interfaces[0];
    EXPECT_FALSE(a.usesTcp);
    EXPECT_TRUE(a.listensOnUdp);
    EXPECT_FALSE(a.listensOnTcp);
    EXPECT_TRUE(a.allow.empty());
    EXPECT_EQ(a.maxMessageSize, 65535u);
    EXPECT_EQ(a.maxHeaderSize, 32768u);
    EXPECT_EQ(a.maxConnectionsPerSource, 16u);
    EXPECT_EQ(a.tcpIdle, 120u);
    EXPECT_EQ(a.t1, 500u);
    EXPECT_EQ(a.t1x64, 32000u);
    EXPECT_EQ(a.answerTimeout, 180u);
    EXPECT_EQ(a.peer.text(), "192.0.2.7:5070");
    EXPECT_EQ(a.getAddress().text(), "127.0.0.1:5060");
    EXPECT_FALSE(a.transfersOnWire);
    EXPECT_EQ(a.sessionExpires, 1800u);
    EXPECT_EQ(a.leastExpires, 90u);
    EXPECT_EQ(a.longestCall, 0u);
}

TEST(Configuration, EveryKeyIsRead)
{
    Configuration const configuration = Configuration::PARSE(
        std::string("[gateway]\ncontext = \"X\"\nlog-level = \"debug\"\ncall-control-log-level = 5\nmax-hops = 9\n"
                    "max-calls = 7\n"
                    "max-calls-per-second = 8\nmax-calls-per-source = 6\nclear-after = 9\nrecording = "
                    "\"/r\"\nrecording-size = 4096\n") +
            TWO_INTERFACES + "[[route]]\nfrom = \"a\"\nprefix = \"49\"\nto = \"b\"\n",
        "f");
    EXPECT_EQ(configuration.context, "X");
    EXPECT_EQ(configuration.logLevel, "debug");
    EXPECT_EQ(configuration.callControlLogLevel, 5u);
    EXPECT_EQ(configuration.maxHops, 9u);
    EXPECT_EQ(configuration.maxCalls, 7u);
    EXPECT_EQ(configuration.maxCallsPerSecond, 8u);
    EXPECT_EQ(configuration.maxCallsPerSource, 6u);
    EXPECT_EQ(configuration.clearAfter, 9u);
    EXPECT_EQ(configuration.recording, "/r");
    EXPECT_EQ(configuration.recordingSize, 4096u);
    Configuration::Interface const* const b = configuration.findInterface("b");
    ASSERT_NE(b, nullptr);
    EXPECT_TRUE(b->usesTcp);
    EXPECT_TRUE(b->listensOnUdp);
    EXPECT_TRUE(b->listensOnTcp);
    EXPECT_EQ(b->allow.size(), 2u);
    EXPECT_EQ(b->maxMessageSize, 2000u);
    EXPECT_EQ(b->maxHeaderSize, 1500u);
    EXPECT_EQ(b->maxConnectionsPerSource, 3u);
    EXPECT_EQ(b->tcpIdle, 4u);
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

TEST(Configuration, WithoutListOfTransportsAnInterfaceListensOnWhatItSpeaksToItsPeer)
{
    Configuration const configuration = Configuration::PARSE(
        "[[interface]]\nname = \"a\"\nlisten = \"127.0.0.1:1\"\npeer = \"127.0.0.1:2\"\ntransport = \"tcp\"\n", "f");
    EXPECT_TRUE(configuration.interfaces[0].listensOnTcp);
    EXPECT_FALSE(configuration.interfaces[0].listensOnUdp);
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
    std::string const whole = first + "listen = \"127.0.0.1:1\"\npeer = \"127.0.0.1:2\"\n";
    auto const addresses = [&](std::string const& listen, std::string const& peer)
    { return first + "listen = \"" + listen + "\"\npeer = \"" + peer + "\"\n"; };
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
        {addresses("0.0.0.0:1", "127.0.0.1:2"),
         "f: interface[0].listen: '0.0.0.0' cannot be told to peers: advertise is needed"},
        {addresses("[::]:1", "[::1]:2"), "f: interface[0].listen: '::' cannot be told to peers: advertise is needed"},
        {addresses("[::]:1", "[::1]:2") + "advertise = \"127.0.0.1:1\"",
         "f: interface[0].advertise: is not of the version of the internet protocol that listen is of"},
        {addresses("0.0.0.0:1", "127.0.0.1:2") + "advertise = \"0.0.0.0:1\"",
         "f: interface[0].advertise: '0.0.0.0' is nobody's address"},
        {addresses("224.0.0.1:1", "127.0.0.1:2"), "f: interface[0].listen: '224.0.0.1' is a multicast address"},
        {addresses("127.0.0.1:1", "239.1.2.3:2"), "f: interface[0].peer: '239.1.2.3' is a multicast address"},
        {addresses("[::1]:1", "[ff02::1]:2"), "f: interface[0].peer: 'ff02::1' is a multicast address"},
        {addresses("127.0.0.1:1", "0.0.0.0:2"), "f: interface[0].peer: '0.0.0.0' is nobody's address"},
        {addresses("127.0.0.1:1", "[::1]:2"),
         "f: interface[0].peer: is not of the version of the internet protocol that listen is of"},
        {addresses("127.0.0.1:1", "127.0.0.1:1"), "f: interface[0].peer: is the interface itself"},
        {"[[interface]]\nname = \"a\\nb\"", "f: interface[0].name: has a line break or another control character"},
        {"[gateway]\ncontext = \"a\\u007f\"\n" + good,
         "f: gateway.context: has a line break or another control character"},
        {whole + "transports = []", "f: interface[0].transports: expected a list of texts"},
        {whole + "transports = \"tcp\"", "f: interface[0].transports: expected a list of texts"},
        {whole + "transports = [3]", "f: interface[0].transports: expected a list of texts"},
        {whole + "transports = [\"sctp\"]", "f: interface[0].transports: must be some of udp, tcp"},
        {whole + "transports = [\"tcp\"]", "f: interface[0].transports: must have 'udp', which is the peer's"},
        {whole + "allow = [\"host\"]", "f: interface[0].allow: 'host' is not an address"},
        {whole + "allow = [\"10.0.0.1/8\"]", "f: interface[0].allow: '10.0.0.1/8' has bits beyond its prefix"},
        {whole + "max-message-size = 100", "f: interface[0].max-message-size: must be from 1024 to 1048576"},
        {whole + "tcp-idle = 0", "f: interface[0].tcp-idle: must be from 1 to 86400"},
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

TEST(Configuration, AnAddressForThePeersLetsItListenOnAll)
{
    Configuration const configuration =
        Configuration::PARSE("[[interface]]\nname = \"a\"\nlisten = \"0.0.0.0:5060\"\nadvertise = \"192.0.2.1:5070\"\n"
                             "peer = \"192.0.2.7:5060\"\n",
                             "f");
    EXPECT_EQ(configuration.interfaces[0].listen.text(), "0.0.0.0:5060");
    EXPECT_EQ(configuration.interfaces[0].getAddress().text(), "192.0.2.1:5070");
}

TEST(Configuration, AnEmptyFileIsReadAndLacksAnInterface)
{
    try
    {
        Configuration::READ("/dev/null");
        FAIL();
    }
    catch (ConfigurationError const& error)
    {
        EXPECT_STREQ(error.what(), "/dev/null: interface: is missing: at least one [[interface]] is needed");
    }
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

TEST(ConfigurationOfMedia, IsDirectUnlessAskedForOtherwise)
{
    Configuration const configuration = Configuration::PARSE(std::string(TWO_INTERFACES), "g.toml");
    EXPECT_FALSE(configuration.relaysMedia);
    EXPECT_EQ(configuration.media.firstPort, 16384);
    EXPECT_EQ(configuration.media.lastPort, 32767);
    EXPECT_EQ(configuration.media.threads, 1u);
    EXPECT_EQ(configuration.media.silence, 0u);
    EXPECT_EQ(configuration.media.differentiation, 46u);
}

TEST(ConfigurationOfMedia, IsRelayedFromTheAddressThatTheInterfaceListensOn)
{
    std::string const text =
        std::string("[media]\nmode = \"relay\"\nfirst-port = 30000\nlast-port = 30999\nthreads = 2\nsilence = 30\n"
                    "dscp = 0\n") +
        TWO_INTERFACES;
    Configuration const configuration = Configuration::PARSE(text, "g.toml");
    EXPECT_TRUE(configuration.relaysMedia);
    EXPECT_EQ(configuration.media.firstPort, 30000);
    EXPECT_EQ(configuration.media.lastPort, 30999);
    EXPECT_EQ(configuration.media.threads, 2u);
    EXPECT_EQ(configuration.media.silence, 30u);
    EXPECT_EQ(configuration.media.differentiation, 0u);
    for (Configuration::Interface const& interface : configuration.interfaces)
        EXPECT_EQ(interface.mediaAddress, interface.listen.host);
}

TEST(ConfigurationOfMedia, IsRefusedByKeyWhereItCannotBe)
{
    std::string const interfaces = TWO_INTERFACES;
    std::string const relayed = "[media]\nmode = \"relay\"\n" + interfaces;
    EXPECT_NE(COMPLAINT("[media]\nmode = \"both\"\n" + interfaces).find("media.mode"), std::string::npos);
    EXPECT_NE(COMPLAINT("[media]\nfirst-port = 20000\nlast-port = 20000\n" + interfaces).find("media.last-port"),
              std::string::npos);
    EXPECT_NE(COMPLAINT("[media]\nports = 1\n" + interfaces).find("media.ports"), std::string::npos);
    EXPECT_NE(COMPLAINT("[[interface]]\nname = \"a\"\nlisten = \"127.0.0.1:1\"\npeer = \"127.0.0.1:2\"\n"
                        "media-address = \"0.0.0.0\"\n[media]\nmode = \"relay\"\n")
                  .find("media-address"),
              std::string::npos);
}

TEST(ConfigurationOfCodecs, AreThoseOfTheListInItsOrder)
{
    std::string text = TWO_INTERFACES;
    text.insert(text.find("listen"), "codecs = [\"G729\", \"opus\", \"L16\"]\n");
    Configuration const configuration = Configuration::PARSE(text, "g.toml");
    EXPECT_EQ(
        configuration.interfaces[0].codecs,
        (std::vector<MG_Rtp::ECodec::Type>{MG_Rtp::ECodec::G729, MG_Rtp::ECodec::OPUS, MG_Rtp::ECodec::L16_MONO}));
    EXPECT_EQ(configuration.interfaces[1].codecs.front(), MG_Rtp::ECodec::PCMA) << "the default";
}

TEST(ConfigurationOfCodecs, AreRefusedWhereTheyAreNone)
{
    for (char const* const list : {"[\"PCMX\"]", "[\"PCMA\", \"pcma\"]", "[]", "\"PCMA\""})
    {
        std::string text = TWO_INTERFACES;
        text.insert(text.find("listen"), std::string("codecs = ") + list + "\n");
        EXPECT_NE(COMPLAINT(text).find("codecs"), std::string::npos) << list;
    }
}
