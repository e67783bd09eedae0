#include "sip/SipConfiguration.h"

#include "configuration/ConfigurationSection.h"

#include <gtest/gtest.h>

namespace
{
/// The interfaces of a text that has nothing else.
std::vector<SipConfiguration> READ(std::string const& text, bool relaysMedia = false)
{
    std::vector<SipConfiguration> result;
    for (ConfigurationSection const& section : ConfigurationSection::PARSE(text, "f").sections("sip"))
        result.push_back(SipConfiguration::READ(section, relaysMedia));
    return result;
}

std::string COMPLAINT(std::string const& text, bool relaysMedia = false)
{
    try
    {
        READ(text, relaysMedia);
    }
    catch (ConfigurationError const& error)
    {
        return error.what();
    }
    return "none";
}

char const* const LEAST = "[[sip]]\nname = \"a\"\nlisten = \"127.0.0.1:5060\"\npeer = \"192.0.2.7:5070\"\n";
} // namespace

TEST(SipConfiguration, WhatIsLeftOutHasItsDefault)
{
    SipConfiguration const a = READ(LEAST).at(0);
    EXPECT_EQ(a.way, SipWay::UDP);
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
    EXPECT_EQ(a.mediaAddress, "127.0.0.1");
    EXPECT_FALSE(a.transfersOnWire);
    EXPECT_EQ(a.sessionExpires, 1800u);
    EXPECT_EQ(a.leastExpires, 90u);
    EXPECT_EQ(a.longestCall, 0u);
    EXPECT_EQ(a.security, SipStream::PLAIN);
    EXPECT_FALSE(a.ringsBack);
    EXPECT_FALSE(a.detectsDigits);
}

TEST(SipConfiguration, RedirectionsAreRefusedUnlessItSaysOtherwise)
{
    using Redirections = SipConfiguration::Redirections;
    EXPECT_EQ(READ(LEAST).at(0).redirections, Redirections::REFUSE);
    EXPECT_EQ(READ(LEAST + std::string("redirections = \"follow\"\n")).at(0).redirections, Redirections::FOLLOW);
    EXPECT_EQ(READ(LEAST + std::string("redirections = \"hand-on\"\n")).at(0).redirections, Redirections::HAND_ON);
    EXPECT_NE(COMPLAINT(LEAST + std::string("redirections = \"on\"\n")), "none");
}

TEST(SipConfiguration, OnlyHeadersThatNobodyLivesByMayBeCarried)
{
    EXPECT_EQ(READ(LEAST + std::string("headers = [\"X-Customer\", \"Organization\"]\n")).at(0).headers,
              (std::vector<std::string>{"X-Customer", "Organization"}));
    EXPECT_EQ(COMPLAINT(LEAST + std::string("headers = [\"X-Customer\", \"Via\"]\n")),
              "f: sip[0].headers: 'Via' is no header that may be carried");
}

TEST(SipConfiguration, EveryKeyIsRead)
{
    SipConfiguration const b = READ(R"([[sip]]
name = "b"
listen = "127.0.0.1:5061"
peer = "192.0.2.1:5060"
transport = "tcp"
transfer = "refer"
session-expires = 0
min-se = 120
max-call-duration = 3600
media-address = "192.0.2.9"
srtp = "required"
ringback = true
detect-digits = true
overlap = "invite"
charges = "take"
digit-timeout = 4
failure-tone = 3
t1 = 100
transports = ["tcp", "udp"]
allow = ["192.0.2.0/24", "2001:db8::7"]
max-message-size = 2000
max-header-size = 1500
max-connections-per-source = 3
tcp-idle = 4
t1x64 = 3200
answer-timeout = 30
)")
                                   .at(0);
    EXPECT_EQ(b.name, "b");
    EXPECT_EQ(b.way, SipWay::TCP);
    EXPECT_TRUE(b.listensOnUdp);
    EXPECT_TRUE(b.listensOnTcp);
    EXPECT_EQ(b.allow.size(), 2u);
    EXPECT_EQ(b.maxMessageSize, 2000u);
    EXPECT_EQ(b.maxHeaderSize, 1500u);
    EXPECT_EQ(b.maxConnectionsPerSource, 3u);
    EXPECT_EQ(b.tcpIdle, 4u);
    EXPECT_TRUE(b.transfersOnWire);
    EXPECT_EQ(b.sessionExpires, 0u);
    EXPECT_EQ(b.leastExpires, 120u);
    EXPECT_EQ(b.longestCall, 3600u);
    EXPECT_EQ(b.mediaAddress, "192.0.2.9");
    EXPECT_EQ(b.security, SipStream::SECURED);
    EXPECT_TRUE(b.ringsBack);
    EXPECT_TRUE(b.detectsDigits);
    EXPECT_EQ(b.overlap, SipConfiguration::Overlap::INVITE);
    EXPECT_EQ(b.digitTimeout, 4u);
    EXPECT_EQ(b.failureTone, 3u);
    EXPECT_EQ(b.charges, SipConfiguration::Charges::TAKE);
    EXPECT_EQ(b.t1, 100u);
    EXPECT_EQ(b.t1x64, 3200u);
    EXPECT_EQ(b.answerTimeout, 30u);
}

TEST(SipConfiguration, WithoutListOfTransportsAnInterfaceListensOnWhatItSpeaksToItsPeer)
{
    SipConfiguration const a = READ(std::string(LEAST) + "transport = \"tcp\"\n").at(0);
    EXPECT_TRUE(a.listensOnTcp);
    EXPECT_FALSE(a.listensOnUdp);
}

TEST(SipConfiguration, APeersNameMaySayHowItIsReached)
{
    std::string const named = "[[sip]]\nname = \"a\"\nlisten = \"127.0.0.1:5060\"\nallow = [\"127.0.0.1\"]\n"
                              "peer = \"sip.example\"\ntransport = \"named\"\n";
    SipConfiguration const a = READ(named).at(0);
    EXPECT_TRUE(a.listensOnUdp && a.listensOnTcp && !a.listensOnTls);
    EXPECT_EQ(a.getWayTo(a.peer), SipWay::AS_NAMED);
    EXPECT_EQ(a.getWayTo({"sip.example", 5060}), SipWay::UDP); // a port has no service to ask for
    EXPECT_EQ(a.getWayTo({"192.0.2.1", 5060}), SipWay::UDP);
    EXPECT_EQ(READ(named + "transports = [\"tcp\"]\n").at(0).way, SipWay::TCP);
}

TEST(SipConfiguration, ALongerTimeOfTransactionsFollowsFromALongerFirstRetransmission)
{
    EXPECT_EQ(READ(std::string(LEAST) + "t1 = 1000\n").at(0).t1x64, 64000u);
}

TEST(SipConfiguration, AnAddressForThePeersLetsItListenOnAll)
{
    SipConfiguration const a = READ("[[sip]]\nname = \"a\"\nlisten = \"0.0.0.0:5060\"\nadvertise = \"192.0.2.1:5070\"\n"
                                    "peer = \"192.0.2.7:5060\"\n")
                                   .at(0);
    EXPECT_EQ(a.listen.text(), "0.0.0.0:5060");
    EXPECT_EQ(a.getAddress().text(), "192.0.2.1:5070");
}

TEST(SipConfiguration, WhatCannotBeServedIsOneLineWithFileKeyAndReason)
{
    struct Row
    {
        std::string text;
        std::string complaint;
    };
    std::string const first = "[[sip]]\nname = \"a\"\n";
    std::string const whole = LEAST;
    auto const addresses = [&](std::string const& listen, std::string const& peer)
    { return first + "listen = \"" + listen + "\"\npeer = \"" + peer + "\"\n"; };
    Row const rows[] = {
        {first, "f: sip[0].listen: is missing"},
        {first + "listen = 5060", "f: sip[0].listen: expected a text"},
        {first + "listen = \"\"", "f: sip[0].listen: must not be empty"},
        {first + "listen = \"127.0.0.1\"",
         "f: sip[0].listen: expected an address and a port, as in \"192.0.2.1:5060\""},
        {first + "listen = \"host:5060\"", "f: sip[0].listen: 'host' is not an address"},
        {first + "listen = \"10.0.0.0/8:5060\"", "f: sip[0].listen: '10.0.0.0/8' is not an address"},
        {first + "listen = \"2001:db8::1:5060\"", "f: sip[0].listen: '2001:db8::1' is not an address"},
        {first + "listen = \"[127.0.0.1]:5060\"", "f: sip[0].listen: '[127.0.0.1]' is not an address"},
        {first + "listen = \"127.0.0.1:0\"", "f: sip[0].listen: '0' is not a port"},
        {first + "listen = \"127.0.0.1:65536\"", "f: sip[0].listen: '65536' is not a port"},
        {first + "listen = \"127.0.0.1:5x\"", "f: sip[0].listen: '5x' is not a port"},
        {whole + whole + "t2 = 1", "f: sip[1].t2: is not a key"},
        {addresses("0.0.0.0:1", "127.0.0.1:2"),
         "f: sip[0].listen: '0.0.0.0' cannot be told to peers: advertise is needed"},
        {addresses("[::]:1", "[::1]:2"), "f: sip[0].listen: '::' cannot be told to peers: advertise is needed"},
        {addresses("[::]:1", "[::1]:2") + "advertise = \"127.0.0.1:1\"",
         "f: sip[0].advertise: is not of the version of the internet protocol that listen is of"},
        {addresses("0.0.0.0:1", "127.0.0.1:2") + "advertise = \"0.0.0.0:1\"",
         "f: sip[0].advertise: '0.0.0.0' is nobody's address"},
        {addresses("224.0.0.1:1", "127.0.0.1:2"), "f: sip[0].listen: '224.0.0.1' is a multicast address"},
        {addresses("127.0.0.1:1", "239.1.2.3:2"), "f: sip[0].peer: '239.1.2.3' is a multicast address"},
        {addresses("[::1]:1", "[ff02::1]:2"), "f: sip[0].peer: 'ff02::1' is a multicast address"},
        {addresses("127.0.0.1:1", "0.0.0.0:2"), "f: sip[0].peer: '0.0.0.0' is nobody's address"},
        {addresses("127.0.0.1:1", "[::1]:2"),
         "f: sip[0].peer: is not of the version of the internet protocol that listen is of"},
        {addresses("127.0.0.1:1", "127.0.0.1:1"), "f: sip[0].peer: is the interface itself"},
        {"[[sip]]\nname = \"a\\nb\"", "f: sip[0].name: has a line break or another control character"},
        {whole + "transports = []", "f: sip[0].transports: expected a list of texts"},
        {whole + "transports = \"tcp\"", "f: sip[0].transports: expected a list of texts"},
        {whole + "transports = [3]", "f: sip[0].transports: expected a list of texts"},
        {whole + "transports = [\"sctp\"]", "f: sip[0].transports: must be some of udp, tcp, tls"},
        {whole + "transports = [\"tcp\"]", "f: sip[0].transports: must have 'udp', which is the peer's"},
        {whole + "allow = [\"host\"]", "f: sip[0].allow: 'host' is not an address"},
        {whole + "allow = [\"10.0.0.1/8\"]", "f: sip[0].allow: '10.0.0.1/8' has bits beyond its prefix"},
        {whole + "max-message-size = 100", "f: sip[0].max-message-size: must be from 1024 to 1048576"},
        {whole + "srtp = \"on\"", "f: sip[0].srtp: must be one of off, optional, required"},
        {whole + "ringback = 1", "f: sip[0].ringback: expected true or false"},
        {whole + "conference = \"77\"", "f: sip[0].conference: needs media.mode \"relay\""},
        {first + "listen = \"127.0.0.1:1\"\npeer = \"sip.example\"",
         "f: sip[0].allow: is needed where a peer has a name"},
        {first + "listen = \"127.0.0.1:1\"\npeer = \"sip_.example:5060\"",
         "f: sip[0].peer: 'sip_.example' is not an address"},
        {first + "listen = \"127.0.0.1:1\"\npeer = \"sip.example:0\"", "f: sip[0].peer: '0' is not a port"},
        {whole + "resolver = \"192.0.2.1\"",
         "f: sip[0].resolver: expected an address and a port, as in \"192.0.2.1:5060\""},
        {whole + "[[sip.peers]]\naddress = \"192.0.2.1:5060\"", "f: sip[0].peer: is of no use with peers"},
        {first + "listen = \"127.0.0.1:1\"\n[[sip.peers]]\npriority = 1", "f: sip[0].peers[0].address: is missing"},
        {first + "listen = \"127.0.0.1:1\"\n[[sip.peers]]\naddress = \"127.0.0.1:1\"",
         "f: sip[0].peers[0].address: is the interface itself"},
        {first + "listen = \"127.0.0.1:1\"\n[[sip.peers]]\naddress = \"127.0.0.1:2\"\n[[sip.peers]]\naddress = "
                 "\"127.0.0.1:2\"",
         "f: sip[0].peers[1].address: is that of another peer"},
        {first + "listen = \"127.0.0.1:1\"\n[[sip.peers]]\naddress = \"127.0.0.1:2\"\nweight = 65536",
         "f: sip[0].peers[0].weight: must be from 0 to 65535"},
        {whole + "peers = [\"127.0.0.1:2\"]", "f: sip[0].peers: expected tables, [[peers]]"},
        {whole + "probe = 3601", "f: sip[0].probe: must be from 0 to 3600"},
        {whole + "transport = \"tls\"", "f: sip[0].tls-certificate: is missing"},
        {whole + "isup = true\ntrusted = false",
         "f: sip[0].isup: tells who withholds his number: it is for peers that are trusted"},
        {whole + "transport = \"named\"", "f: sip[0].transport: 'named' is for peers that have a name without a port"},
        {whole + "transport = \"tls\"\ntls-certificate = \"c\"", "f: sip[0].tls-key: is missing"},
        {whole + "transports = [\"udp\", \"tls\"]\ntls-certificate = \"c\"\ntls-key = \"k\"",
         "f: sip[0].tls-authorities: is needed to verify certificates"},
        {whole + "transport = \"sips\"\ntls-certificate = \"/no/c\"\ntls-key = \"k\"\ntls-verify = \"off\"",
         "f: sip[0].tls-certificate: /no/c: cannot be read"},
        {whole + "transport = \"tls\"\ntls-certificate = \"c\"\ntls-key = \"k\"\ntls-verify = \"off\"\n"
                 "tls-names = [\"192.0.2.1\"]",
         "f: sip[0].tls-names: '192.0.2.1' is no name of a host"},
        {whole + "transports = [\"udp\", \"tcp\", \"tls\"]\ntls-port = 5060", "f: sip[0].tls-port: is that of TCP"},
        {whole + "transport = \"tls\"\ntransports = [\"udp\"]",
         "f: sip[0].transports: must have 'tls', which is the peer's"},
        {whole + "tls-key = \"k\"", "f: sip[0].tls-key: is of no use without 'tls' in transports"},
        {whole + "transport = \"tls\"\ntls-verify = \"no\"", "f: sip[0].tls-verify: must be one of name, peer, off"},
        {whole + "tcp-idle = 0", "f: sip[0].tcp-idle: must be from 1 to 86400"},
    };
    for (Row const& row : rows)
        EXPECT_EQ(COMPLAINT(row.text), row.complaint) << row.text;
}

TEST(SipConfiguration, APeerMayHaveANameWithAPortOrWithout)
{
    std::string const text = "[[sip]]\nname = \"a\"\nlisten = \"127.0.0.1:1\"\nallow = [\"192.0.2.0/24\"]\npeer = ";
    SocketAddress const one = READ(text + "\"sip.example:5070\"").at(0).peer;
    EXPECT_EQ(one.text(), "sip.example:5070");
    EXPECT_TRUE(one.isName());
    SipConfiguration const other = READ(text + "\"4you.example\"").at(0);
    EXPECT_EQ(other.peer.text(), "4you.example");
    EXPECT_EQ(other.domain, "4you.example");
    EXPECT_FALSE(READ(LEAST).at(0).peer.isName());
}

TEST(SipConfiguration, AMediaAddressThatNobodyReachesIsRefusedWhereMediaAreRelayed)
{
    std::string const text = std::string(LEAST) + "media-address = \"0.0.0.0\"\n";
    EXPECT_EQ(COMPLAINT(text), "none");
    EXPECT_EQ(COMPLAINT(text, true), "f: sip[0].media-address: '0.0.0.0' cannot be told to peers");
    EXPECT_EQ(COMPLAINT(std::string(LEAST) + "media-address = \"host\"\n", true),
              "f: sip[0].media-address: 'host' is not an address");
}

TEST(SipConfiguration, AConferenceHasANumberWhereMediaAreRelayed)
{
    EXPECT_EQ(READ(std::string(LEAST) + "conference = \"77\"\n", true).at(0).conference, "77");
    EXPECT_EQ(READ(LEAST, true).at(0).conference, "");
}

TEST(SipConfiguration, TheCodecsAreThoseOfTheListInItsOrder)
{
    std::vector<SipConfiguration> const interfaces =
        READ(std::string(LEAST) + "codecs = [\"G729\", \"opus\", \"L16\"]\n" + LEAST);
    EXPECT_EQ(interfaces.at(0).codecs, (std::vector<MG_Rtp::ECodec::Type>{MG_Rtp::ECodec::G729, MG_Rtp::ECodec::OPUS,
                                                                          MG_Rtp::ECodec::L16_MONO}));
    EXPECT_EQ(interfaces.at(1).codecs.front(), MG_Rtp::ECodec::PCMA) << "the default";
}

TEST(SipConfiguration, CodecsAreRefusedWhereTheyAreNone)
{
    for (char const* const list : {"[\"PCMX\"]", "[\"PCMA\", \"pcma\"]", "[]", "\"PCMA\""})
        EXPECT_NE(COMPLAINT(std::string(LEAST) + "codecs = " + list + "\n").find("codecs"), std::string::npos) << list;
}
