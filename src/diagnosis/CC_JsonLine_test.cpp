#include "diagnosis/CC_JsonLine.h"

#include <gtest/gtest.h>

TEST(CC_JsonLine, MembersStandInOrder)
{
    CC_JsonLine line;
    EXPECT_EQ(line.get(), "{}");
    line.add("call", 18446744073709551615ULL).add("name", "trunk/9").addJson("legs", "[1,2]");
    EXPECT_EQ(line.get(), R"({"call":18446744073709551615,"name":"trunk/9","legs":[1,2]})");
}

TEST(CC_JsonLine, TextsMayBeAnything)
{
    EXPECT_EQ(CC_JsonLine::QUOTED("a\"b\\c/d"), R"("a\"b\\c/d")");
    EXPECT_EQ(CC_JsonLine::QUOTED(std::string_view("\0\n\x1f\x7f", 4)), R"("\u0000\u000a\u001f\u007f")");
    EXPECT_EQ(CC_JsonLine::QUOTED("\xc3\xa4 \xe2\x82\xac \xf0\x9f\x98\x80"),
              "\"\xc3\xa4 \xe2\x82\xac \xf0\x9f\x98\x80\"");
}

TEST(CC_JsonLine, WhatIsNoUtf8IsReplaced)
{
    for (char const* const text : {"\xff", "\xc3", "\x80", "\xc0"})
        EXPECT_EQ(CC_JsonLine::QUOTED(text), "\"\xef\xbf\xbd\"") << "octet " << int{text[0]};
    EXPECT_EQ(CC_JsonLine::QUOTED("\xed\xa0\x80"), "\"\xef\xbf\xbd\xef\xbf\xbd\xef\xbf\xbd\"")
        << "half of a surrogate pair";
    EXPECT_EQ(CC_JsonLine::QUOTED("\xe0\x80\xaf"), "\"\xef\xbf\xbd\xef\xbf\xbd\xef\xbf\xbd\"") << "a slash in disguise";
    EXPECT_EQ(CC_JsonLine::QUOTED("a\xe2\x82"), "\"a\xef\xbf\xbd\xef\xbf\xbd\"") << "cut off";
}

TEST(CC_JsonLine, AnOctetIsWrittenTheSameWayWhereverItStandsInALongText)
{
    for (int octet = 0; octet < 256; ++octet)
    {
        std::string const alone(1, static_cast<char>(octet));
        std::string const quoted = CC_JsonLine::QUOTED(alone);
        std::string const expected = quoted.substr(1, quoted.size() - 2);
        for (std::size_t place = 0; place < 20; ++place)
        {
            std::string const before(place, 'a');
            std::string const behind(20 - place, '~');
            EXPECT_EQ(CC_JsonLine::QUOTED(before + alone + behind), '"' + before + expected + behind + '"')
                << octet << " at " << place;
        }
    }
}
