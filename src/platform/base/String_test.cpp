#include "platform/base/String.h"

#include <cstdint>
#include <gtest/gtest.h>
#include <string>
#include <string_view>
#include <type_traits>

namespace
{
struct UsesTheEmptyStringEarly
{
    bool isEmpty = String::s_empty.isEmpty();
    String copy = String::s_empty;
};
UsesTheEmptyStringEarly const s_early; // a static initialiser of another file

template <class T>
concept HasText = requires(T value)
{
    String::stringOf(value);
};
static_assert(HasText<bool> && HasText<int> && HasText<unsigned long long>);
static_assert(!HasText<int*> && !HasText<char const*> && !HasText<std::nullptr_t>);
} // namespace

TEST(String, ADefaultStringIsEmpty)
{
    EXPECT_TRUE(String().isEmpty());
    EXPECT_EQ(0U, String().length());
    EXPECT_STREQ("", String().c_str());
}

TEST(String, ANullPointerStandsForTheEmptyText)
{
    char const* const null = nullptr;
    String text(null);
    EXPECT_TRUE(text.isEmpty());
    EXPECT_TRUE(text == null);
    text += null;
    EXPECT_TRUE(text.isEmpty());
    EXPECT_FALSE(String("a") == null);
}

TEST(String, TheEmptyStringIsReadyBeforeOtherStaticInitialisers)
{
    EXPECT_TRUE(s_early.isEmpty);
    EXPECT_EQ(String(), s_early.copy);
}

TEST(String, NulBytesAreKeptAndCompared)
{
    String const text("a\0b", 3);
    EXPECT_EQ(3U, text.length());
    EXPECT_FALSE(text == "a");
    EXPECT_FALSE(text == String("a\0c", 3));
    EXPECT_EQ(text, String("a\0b", 3));
    String const doubled = text + text;
    EXPECT_EQ(String("a\0ba\0b", 6), doubled);
}

TEST(String, FormatReplacesAndConcatfAppends)
{
    String text("old");
    EXPECT_EQ(&text, &text.format("%u calls", 3U));
    EXPECT_EQ(&text, &text.concatf(", %s", "two legs"));
    EXPECT_STREQ("3 calls, two legs", text.c_str());
}

TEST(String, FormatMayPrintItself)
{
    String text("abc");
    text.format("<%s>", text.c_str());
    EXPECT_STREQ("<abc>", text.c_str());
    text.concatf("%s", text.c_str());
    EXPECT_STREQ("<abc><abc>", text.c_str());
}

TEST(String, FormatTakesTextsOfEveryLength)
{
    for (std::size_t length : {0U, 1U, 254U, 255U, 256U, 257U, 5000U})
    {
        std::string const expected(length, 'x');
        String text("p");
        EXPECT_EQ("p" + expected, text.concatf("%s", expected.c_str()).view()) << length;
        EXPECT_EQ(expected, text.format("%s", expected.c_str()).view()) << length;
    }
}

TEST(String, EveryStringStartsWithTheEmptyOneAndItself)
{
    String const text("calling-pi");
    EXPECT_TRUE(text.startsWith(""));
    EXPECT_TRUE(text.startsWith("calling-"));
    EXPECT_TRUE(text.startsWith(text));
    EXPECT_FALSE(text.startsWith("Calling-"));
    EXPECT_FALSE(text.startsWith("calling-pi2"));
    EXPECT_FALSE(String().startsWith("c"));
}

TEST(String, DeletingARegionStopsAtTheEnd)
{
    String text("0123456789");
    text.deleteRegion(10, 1);
    text.deleteRegion(99, 1);
    text.deleteRegion(3, 0);
    EXPECT_STREQ("0123456789", text.c_str());
    text.deleteRegion(2, 3);
    EXPECT_STREQ("0156789", text.c_str());
    text.deleteRegion(5, 1000);
    EXPECT_STREQ("01567", text.c_str());
    text.deleteRegion(0, std::string::npos);
    EXPECT_TRUE(text.isEmpty());
}

TEST(String, IgnoringCaseConcernsTheAsciiLettersOnly)
{
    EXPECT_TRUE(String("User-Busy").equalsIgnoreCase("uSER-bUSY"));
    EXPECT_TRUE(String().equalsIgnoreCase(""));
    EXPECT_FALSE(String("a").equalsIgnoreCase("ab"));
    EXPECT_FALSE(String("[").equalsIgnoreCase("{")); // 32 apart, as letters of two cases are
    EXPECT_FALSE(String("@").equalsIgnoreCase("`"));
    EXPECT_FALSE(String("\xc4").equalsIgnoreCase("\xe4"));
    EXPECT_TRUE(String("A\0B", 3).equalsIgnoreCase(String("a\0b", 3)));
    EXPECT_FALSE(String("A\0B", 3).equalsIgnoreCase(String("a\0c", 3)));
}

TEST(String, OrderIsByBytes)
{
    EXPECT_TRUE(String("B") < String("a"));
    EXPECT_TRUE(String("a") < String("aa"));
    EXPECT_FALSE(String("a") < String("a"));
}

TEST(String, NumbersAndTruthValuesHaveTexts)
{
    EXPECT_EQ("true", String::stringOf(true).view());
    EXPECT_EQ("false", String::stringOf(false).view());
    EXPECT_EQ("-2147483648", String::stringOf(-2147483647 - 1).view());
    EXPECT_EQ("4294967295", String::stringOf(4294967295U).view());
    EXPECT_EQ("-7", String::stringOf(-7L).view());
    EXPECT_EQ("7", String::stringOf(7UL).view());
    EXPECT_EQ("-9223372036854775808", String::stringOf(-9223372036854775807LL - 1).view());
    EXPECT_EQ("18446744073709551615", String::stringOf(18446744073709551615ULL).view());
}

TEST(String, AnAddressPrintsAsAPointer)
{
    for (std::uintptr_t const address : {std::uintptr_t{0}, std::uintptr_t{42}, ~std::uintptr_t{0}})
    {
        auto* const object = reinterpret_cast<void*>(address);
        EXPECT_EQ(String().format("%p", object), String::addressOf(object));
    }
    EXPECT_EQ("0x2a", String::addressOf(reinterpret_cast<void*>(42)).view());
}

TEST(String, TruthValuesHaveTheirTwoNames)
{
    EXPECT_STREQ("true", TRUE_FALSE(true));
    EXPECT_STREQ("false", TRUE_FALSE(false));
}

TEST(String, AViewBecomesAStringAndClearEmptiesIt)
{
    String text(std::string_view("abc").substr(1));
    EXPECT_EQ("bc", text.view());
    text.clear();
    EXPECT_TRUE(text.isEmpty());
}

TEST(String, ComesFromAViewAndIsOneWithoutBeingAsked)
{
    static_assert(!std::is_convertible_v<std::string_view, String>); // may need memory
    String const text(std::string_view("a\0b", 3));
    std::string_view const view = text;
    EXPECT_EQ(view.data(), text.c_str());
    EXPECT_EQ(3U, view.size());
    String line("x");
    line += std::string_view("yz!", 2);
    EXPECT_EQ("xyz", line);
}

TEST(String, ComparesWithAViewOfAPartOfAText)
{
    std::string_view const part = std::string_view("sipping").substr(0, 3);
    EXPECT_TRUE(String("sip") == part);
    EXPECT_TRUE(part == String("sip"));
    EXPECT_TRUE(String("sipp") != part);
    EXPECT_TRUE(String("sip") == std::string("sip"));
    EXPECT_TRUE(String("a") < std::string_view("b"));
    EXPECT_TRUE(std::string_view("b") > String("a"));
    EXPECT_FALSE(String("a\0b", 3) == std::string_view("a"));
    EXPECT_TRUE(String("a") < String("a\0b", 3));
    EXPECT_TRUE(String("b") > String("a") && String("b") >= String("b"));
    EXPECT_TRUE(String("a") < "b" && "b" > String("a"));
    EXPECT_TRUE(String("\x7f") < "\x80"); // bytes have no sign
}

TEST(String, ATextIsWhateverNamesCanBeTakenFrom)
{
    static_assert(TYText<char[4]> && TYText<char const*> && TYText<std::string_view> && TYText<std::string>);
    static_assert(TYText<String> && !TYText<int> && !TYText<char>);
    char const* const null = nullptr;
    EXPECT_EQ("", String::VIEW_OF(null));
    EXPECT_EQ("sip", String::VIEW_OF("sip"));
    EXPECT_EQ("sip", String::VIEW_OF(String("sip")));
}

TEST(String, WhatReadsACStringEndsAtTheFirstNul)
{
    String const text("a\0b", 3);
    EXPECT_EQ(String("a"), String(text.c_str()));
    EXPECT_EQ("<a>", String().format("<%s>", text.c_str()));
    EXPECT_TRUE(text == text.view());
    EXPECT_FALSE(text == text.c_str());
}
