#include "configuration/Configuration.h"

#include <gtest/gtest.h>

namespace
{
char const* const TWO_INTERFACES = R"(
[[sip]]
name = "a"

[[isdn]]
name = "b"
channels = 30
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
    EXPECT_FALSE(configuration.relaysMedia);
    EXPECT_EQ(configuration.media.firstPort, 16384);
    EXPECT_EQ(configuration.media.lastPort, 32767);
    EXPECT_EQ(configuration.media.threads, 1u);
    EXPECT_EQ(configuration.media.silence, 0u);
    EXPECT_EQ(configuration.media.differentiation, 46u);
}

TEST(Configuration, EveryKeyIsRead)
{
    Configuration const configuration = Configuration::PARSE(
        std::string("[gateway]\ncontext = \"X\"\nlog-level = \"debug\"\ncall-control-log-level = 5\nmax-hops = 9\n"
                    "max-calls = 7\n"
                    "max-calls-per-second = 8\nmax-calls-per-source = 6\nclear-after = 9\nrecording = "
                    "\"/r\"\nrecording-size = 4096\n"
                    "[media]\nmode = \"relay\"\nfirst-port = 30000\nlast-port = 30999\nthreads = 2\nsilence = 30\n"
                    "dscp = 0\ncountry = \"gb\"\n") +
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
    EXPECT_TRUE(configuration.relaysMedia);
    EXPECT_EQ(configuration.media.firstPort, 30000);
    EXPECT_EQ(configuration.media.lastPort, 30999);
    EXPECT_EQ(configuration.media.threads, 2u);
    EXPECT_EQ(configuration.media.silence, 30u);
    EXPECT_EQ(configuration.media.differentiation, 0u);
    EXPECT_EQ(configuration.media.country, "gb");
    ASSERT_EQ(configuration.routes.size(), 1u);
    EXPECT_EQ(configuration.routes[0].from, "a");
    EXPECT_EQ(configuration.routes[0].prefix, "49");
    EXPECT_EQ(configuration.routes[0].to, "b");
}

TEST(Configuration, SaysForWhomWhenAndHowARouteIsTaken)
{
    std::string const interfaces = TWO_INTERFACES;
    std::string const route = "[[route]]\nfrom = \"a\"\nto = \"b\"\n";
    Configuration const configuration = Configuration::PARSE(
        interfaces + route +
            "prefix = \"0049\"\ncalling = \"44\"\ndays = [\"mon\", \"fri\"]\nhours = \"08:00-18:00\"\nweight = 3\n"
            "strip = 4\nprepend = \"0\"\nnext-on = [34, 38]\n" +
            route + "number = \"112\"\n",
        "f");
    ASSERT_EQ(configuration.routes.size(), 2u);
    Route const& first = configuration.routes[0];
    EXPECT_FALSE(first.isWhole);
    EXPECT_EQ(first.calling, "44");
    EXPECT_EQ(first.hours, WeekHours::PARSE({"mon", "fri"}, "08:00-18:00"));
    EXPECT_EQ(first.weight, 3u);
    EXPECT_EQ(first.strip, 4u);
    EXPECT_EQ(first.prepend, "0");
    EXPECT_EQ(first.nextOn, (std::vector<unsigned int>{34, 38}));
    EXPECT_TRUE(configuration.routes[1].isWhole);
    EXPECT_EQ(configuration.routes[1].prefix, "112");
    EXPECT_EQ(COMPLAINT(interfaces + route + "prefix = \"1\"\nnumber = \"2\"\n"),
              "f: route[0].number: and prefix exclude each other");
    EXPECT_EQ(COMPLAINT(interfaces + route + "number = \"112\"\nemergency = true\nuser = \"alice\"\n"),
              "f: route[0].emergency: and user exclude each other");
    EXPECT_EQ(COMPLAINT(interfaces + route + "prefix = \"12\"\nstrip = 3\n"), "f: route[0].strip: must be from 0 to 2");
    EXPECT_EQ(COMPLAINT(interfaces + route + "days = [\"monday\"]\n"),
              "f: route[0].days: days are mon, tue, wed, thu, fri, sat, sun");
    EXPECT_EQ(COMPLAINT(interfaces + route + "hours = \"8-18\"\n"),
              "f: route[0].hours: expected hours as \"08:00-18:00\"");
    for (char const* const causes : {"34", "[128]", "[0]", "[\"34\"]"})
        EXPECT_EQ(COMPLAINT(interfaces + route + "next-on = " + causes + "\n"),
                  "f: route[0].next-on: expected a list of whole numbers from 1 to 127");
}

TEST(Configuration, SaysWhereAndForWhomItListensForOperators)
{
    std::string const interfaces = TWO_INTERFACES;
    EXPECT_TRUE(Configuration::PARSE(interfaces, "f").control.path.empty()) << "nowhere, unless it is asked to";
    Configuration const configuration = Configuration::PARSE(
        interfaces + "[control]\nsocket = \"/run/c\"\nmode = \"0660\"\ngroup = \"g\"\nmax-clients = 3\nidle = 4\n",
        "f");
    EXPECT_EQ(configuration.control.path, "/run/c");
    EXPECT_EQ(configuration.control.mode, 0660u);
    EXPECT_EQ(configuration.control.group, "g");
    EXPECT_EQ(configuration.control.maxClients, 3u);
    EXPECT_EQ(configuration.control.idle, 4u);
    EXPECT_EQ(configuration.moduleOf.at("b"), "isdn");
    EXPECT_EQ(COMPLAINT(interfaces + "[control]\nmode = \"0660\"\n"), "f: control.socket: is missing");
    for (char const* const mode : {"8", "1000", "rw", "6 "})
        EXPECT_EQ(COMPLAINT(interfaces + "[control]\nsocket = \"c\"\nmode = \"" + mode + "\"\n"),
                  "f: control.mode: must be an octal number from 000 to 777, as a text: \"0660\"");
}

TEST(Configuration, SaysWhereFiguresAreToBeHad)
{
    std::string const interfaces = TWO_INTERFACES;
    EXPECT_EQ(Configuration::PARSE(interfaces, "f").metrics.listen.port, 0) << "nowhere, unless it is asked to";
    EXPECT_EQ(Configuration::PARSE(interfaces + "[metrics]\nlisten = \"127.0.0.2:9100\"\n", "f").metrics.listen.port,
              9100);
    EXPECT_EQ(Configuration::PARSE(interfaces + "[metrics]\nlisten = \"[::1]:9100\"\n", "f").metrics.listen.host,
              "::1");
    for (char const* const address : {"0.0.0.0:9100", "192.0.2.1:9100", "[::]:9100", "[2001:db8::1]:9100"})
        EXPECT_EQ(COMPLAINT(interfaces + "[metrics]\nlisten = \"" + address + "\"\n"),
                  "f: metrics.listen: must be a loopback address");
    EXPECT_FALSE(Configuration::PARSE(interfaces + "[metrics]\nlisten = \"[::1]:9100\"\n", "f").metrics.hasPage);
    EXPECT_TRUE(
        Configuration::PARSE(interfaces + "[metrics]\nlisten = \"[::1]:9100\"\npage = true\n", "f").metrics.hasPage);
    EXPECT_EQ(COMPLAINT(interfaces + "[metrics]\npage = true\n"), "f: metrics.listen: is missing");
    std::string const page = interfaces + "[metrics]\nlisten = \"[::1]:9100\"\npage = true\n";
    EXPECT_EQ(Configuration::PARSE(page, "f").metrics.token, "") << "nobody changes anything from there";
    EXPECT_EQ(Configuration::PARSE(page + "token = \"0123456789-ab.d_~\"\n", "f").metrics.token, "0123456789-ab.d_~");
    for (char const* const token : {"0123456789abcde", "0123456789 abcdef", "0123456789abcdef\u00e4"})
        EXPECT_EQ(COMPLAINT(page + "token = \"" + token + "\"\n"),
                  "f: metrics.token: must be of 16 to 256 letters, digits, \"-\", \".\", \"_\" and \"~\"");
    EXPECT_EQ(COMPLAINT(interfaces + "[metrics]\nport = 1\n"), "f: metrics.port: is not a key");
    EXPECT_EQ(COMPLAINT(interfaces + "[metrics]\nlisten = \"127.0.0.1\"\n"),
              "f: metrics.listen: expected an address and a port, as in \"192.0.2.1:5060\"");
}

TEST(Configuration, SaysWhereRecordsOfCallsGo)
{
    std::string const interfaces = TWO_INTERFACES;
    EXPECT_TRUE(Configuration::PARSE(interfaces, "f").records.file.empty()) << "nowhere, unless it is asked to";
    RecordOptions const records =
        Configuration::PARSE(
            interfaces + "[records]\nfile = \"r\"\nnumbers = \"whole\"\nkept = 5\nwhen-full = \"refuse\"\n", "f")
            .records;
    EXPECT_EQ(records.file, "r");
    EXPECT_TRUE(records.isWhole);
    EXPECT_EQ(records.kept, 5u);
    EXPECT_TRUE(records.refusesUnrecorded);
    EXPECT_EQ(COMPLAINT(interfaces + "[records]\nkept = 5\n"), "f: records.file: is missing");
    EXPECT_EQ(COMPLAINT(interfaces + "[records]\nsqlite = \"r\"\n"),
              "f: records.spool: is missing: a database may not be there");
    EXPECT_EQ(COMPLAINT(interfaces + "[records]\nspool = \"s\"\npostgresql = \"host=h password = pass phrase\"\n"),
              "f: records.postgresql: is no connection string")
        << "nor any word of it";
    EXPECT_EQ(COMPLAINT(interfaces + "[records]\nspool = \"s\"\npostgresql = \"host=h password=pass\"\n"), "none");
    EXPECT_EQ(COMPLAINT(interfaces + "[records]\nfile = \"r\"\nwhen-full = \"x\"\n"),
              "f: records.when-full: must be one of lose, refuse");
}

TEST(Configuration, EveryOtherTableIsAnInterfaceOfTheModuleOfItsName)
{
    Configuration const configuration = Configuration::PARSE(TWO_INTERFACES, "f");
    ASSERT_EQ(configuration.modules.size(), 2u);
    EXPECT_EQ(configuration.modules.at("sip").at(0).neededText("name"), "a");
    EXPECT_EQ(configuration.modules.at("isdn").at(0).number("channels", 0, 1, 30), 30u);
}

TEST(Configuration, TheTablesOfModulesOutliveTheTextAndItsReader)
{
    ConfigurationSection const section = Configuration::PARSE(TWO_INTERFACES, "f").modules.at("isdn").at(0);
    EXPECT_EQ(section.neededText("name"), "b");
    EXPECT_EQ(section.getKeys(), (std::vector<std::string>{"channels", "name"}));
}

TEST(Configuration, WhatCannotBeServedIsOneLineWithFileKeyAndReason)
{
    struct Row
    {
        std::string text;
        std::string complaint;
    };
    std::string const good = TWO_INTERFACES;
    Row const rows[] = {
        {"", "f: interfaces: are missing: [[sip]] for one that speaks SIP"},
        {"sip = []", "f: sip: expected tables, [[sip]]"},
        {"sip = 3", "f: sip: expected tables, [[sip]]"},
        {"gateway = 3\n" + good, "f: gateway: expected a table, [gateway]"},
        {"nonsense = 3\n" + good, "f: nonsense: expected tables, [[nonsense]]"},
        {"[[sip]]\n", "f: sip[0].name: is missing"},
        {"[gateway]\nnonsense = 3\n" + good, "f: gateway.nonsense: is not a key"},
        {"[gateway]\nlog-level = \"loud\"\n" + good,
         "f: gateway.log-level: must be one of trace, debug, info, warning, error, off"},
        {"[gateway]\nmax-calls = 1.5\n" + good, "f: gateway.max-calls: expected a whole number"},
        {"[gateway]\nclear-after = -1\n" + good, "f: gateway.clear-after: must be from 0 to 86400"},
        {"[gateway]\ncall-control-log-level = 6\n" + good, "f: gateway.call-control-log-level: must be from 0 to 5"},
        {"[gateway]\nrecording-size = 100\n" + good, "f: gateway.recording-size: expected 0, or at least 4096"},
        {"[gateway]\ncontext = \"a\\u007f\"\n" + good,
         "f: gateway.context: has a line break or another control character"},
        {"[media]\nmode = \"both\"\n" + good, "f: media.mode: must be one of direct, relay"},
        {"[media]\nfirst-port = 20000\nlast-port = 20000\n" + good, "f: media.last-port: must be above first-port"},
        {"[media]\nports = 1\n" + good, "f: media.ports: is not a key"},
        {good + "[[sip]]\nname = \"a\"", "f: sip[1].name: 'a' is taken by another interface"},
        {good + "[[sip]]\nname = \"b\"", "f: sip[1].name: 'b' is taken by another interface"},
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

TEST(Configuration, AnEmptyFileIsReadAndLacksAnInterface)
{
    try
    {
        Configuration::READ("/dev/null");
        FAIL();
    }
    catch (ConfigurationError const& error)
    {
        EXPECT_STREQ(error.what(), "/dev/null: interfaces: are missing: [[sip]] for one that speaks SIP");
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
