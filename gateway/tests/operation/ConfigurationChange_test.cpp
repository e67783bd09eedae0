#include "configuration/ConfigurationChange.h"

#include "configuration/Configuration.h"

#include <array>
#include <gtest/gtest.h>
#include <string_view>

namespace
{
char const* const FILE_TEXT = R"(
[gateway]
max-calls = 5
[control]
socket = "c"
[records]
file = "r"
[[sip]]
name = "a"
port = 1
[[sip]]
name = "b"
[[route]]
from = "a"
to = "b"
)";

/// What a running gateway says to that text instead.
std::string CHANGED(std::string text, std::string const& what, std::string const& into)
{
    text.replace(text.find(what), what.size(), into);
    return ConfigurationChange::FIND_RESTART(Configuration::PARSE(FILE_TEXT, "f"), Configuration::PARSE(text, "f"));
}
std::string CHANGED(std::string const& what, std::string const& into) { return CHANGED(FILE_TEXT, what, into); }

/// Whether a change of that text is one of its module.
bool IS_CHANGED(std::string const& what, std::string const& into)
{
    std::string text = FILE_TEXT;
    text.replace(text.find(what), what.size(), into);
    return ConfigurationChange::IS_OF_MODULE("sip", Configuration::PARSE(FILE_TEXT, "f"),
                                             Configuration::PARSE(text, "f"));
}
} // namespace

TEST(ConfigurationChange, OfRoutesLimitsAndLogLevelsCanBeFollowed)
{
    EXPECT_EQ(CHANGED("name", "name"), "");
    EXPECT_EQ(CHANGED("from = \"a\"\nto = \"b\"", "from = \"b\"\nprefix = \"4\"\nto = \"a\""), "");
    EXPECT_EQ(CHANGED("max-calls = 5", "max-calls = 6\nmax-hops = 3\nlog-level = \"debug\"\nclear-after = 1"), "");
    EXPECT_EQ(CHANGED("name = \"a\"\nport = 1", "port = 1\nname = \"a\""), "") << "the order says nothing";
}

TEST(ConfigurationChange, OfWhatIsOpenNeedsARestart)
{
    EXPECT_EQ(CHANGED("max-calls = 5", "context = \"x\""), "gateway.context");
    EXPECT_EQ(CHANGED("max-calls = 5", "log-file = \"x\""), "gateway.log-file");
    EXPECT_EQ(CHANGED("max-calls = 5", "recording = \"x\""), "gateway.recording");
    EXPECT_EQ(CHANGED("max-calls = 5", "recording-size = 5000"), "gateway.recording-size");
    EXPECT_EQ(CHANGED("[control]", "[media]\nmode = \"relay\"\n[control]"), "media");
    EXPECT_EQ(CHANGED("[control]", "[media]\ndscp = 1\n[control]"), "media");
    EXPECT_EQ(CHANGED("socket = \"c\"", "socket = \"d\""), "control");
    EXPECT_EQ(CHANGED("file = \"r\"", "file = \"r\"\nkept = 1"), "records");
    EXPECT_EQ(CHANGED("[control]", "[metrics]\nlisten = \"127.0.0.1:9100\"\n[control]"), "metrics");
}

TEST(ConfigurationChange, OfModulesNeedsARestart)
{
    EXPECT_EQ(CHANGED("[[route]]", "[[isdn]]\nname = \"c\"\n[[route]]"), "isdn");
    EXPECT_EQ(ConfigurationChange::FIND_RESTART(Configuration::PARSE("[[sip]]\nname = \"a\"", "f"),
                                                Configuration::PARSE("[[isdn]]\nname = \"a\"", "f")),
              "sip");
}

TEST(ConfigurationChange, OfInterfacesIsForTheirModules)
{
    EXPECT_FALSE(IS_CHANGED("[gateway]", "[gateway]\nmax-hops = 3"));
    EXPECT_TRUE(IS_CHANGED("port = 1", "port = 2"));
    EXPECT_TRUE(IS_CHANGED("port = 1", ""));
    EXPECT_TRUE(IS_CHANGED("[[route]]", "[[sip]]\nname = \"c\"\n[[route]]"));
}

TEST(ConfigurationSection, FindsTheKeyThatIsAnother)
{
    static constexpr std::array<std::string_view, 1> FREE{"free"};
    auto const findChange = [](char const* before, char const* after)
    { return ConfigurationSection::PARSE(before, "f").findChange(ConfigurationSection::PARSE(after, "f"), FREE); };
    EXPECT_EQ(findChange("a = 1\nfree = 1", "free = 2\na = 1"), "");
    EXPECT_EQ(findChange("a = 1", "a = 2\nfree = 2"), "a");
    EXPECT_EQ(findChange("a = 1", ""), "a");
    EXPECT_EQ(findChange("", "a = [1]"), "a");
}
