#include "properties/CC_PropertyFilterContainer.h"

#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "tests/support/PropertyTesting.h"

#include <cstddef>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <new>
#include <string>
#include <tuple>
#include <utility>

namespace
{
constexpr unsigned int CODE_X = 0x1234;
constexpr unsigned int CODE_Y = 0x4321;

/// Appends its letter to the Name and answers with its code.
class Letter : public CC_PropertyFilter
{
public:
    static int s_alive;
    static CC_PropertyFilterContainer const* s_dumpedWithin; // null: a line of its own

    explicit Letter(char letter, unsigned int code = 0) : m_letter(letter), m_code(code) { ++s_alive; }
    Letter(Letter const& other) : CC_PropertyFilter(other), m_letter(other.m_letter), m_code(other.m_code)
    {
        ++s_alive;
    }
    Letter& operator=(Letter const&) = delete;
    ~Letter() override { --s_alive; }

    CC_PropertyFilter* clone() const override { return new (std::nothrow) Letter(*this); }
    XCode apply(CC_PropertyContainer& properties) const override
    {
        CC_Property const* const name = properties.get(CC_PropertyId::NAME);
        String text;
        if (name != nullptr)
            name->getValueString(text);
        std::ignore = properties.set(CC_PropertyString(CC_PropertyId::NAME, text + String(&m_letter, 1)));
        return XCode(m_code);
    }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override
    {
        if (s_dumpedWithin != nullptr)
            return s_dumpedWithin->getInfo(info, maxLevel, level, maxDetail, detail, "again ");
        info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Letter", String(&m_letter, 1));
        return info;
    }

private:
    char m_letter;
    unsigned int m_code;
};
int Letter::s_alive = 0;
CC_PropertyFilterContainer const* Letter::s_dumpedWithin = nullptr;

/// The letters of the filters in the order of their application.
std::string LETTERS_OF(CC_PropertyFilterContainer const& filters)
{
    CC_PropertyContainer properties;
    std::ignore = filters.applyFilters(properties); // the letters are asked for, not the codes
    CC_Property const* const name = properties.get(CC_PropertyId::NAME);
    return name != nullptr ? VALUE_OF(*name) : "";
}

struct CC_PropertyFilterContainerTest : testing::Test
{
    CC_PropertyFilterContainerTest()
    {
        for (char const letter : {'a', 'b', 'c'})
            EXPECT_TRUE(m_filters.addFilter(Letter(letter)).isOk());
    }
    CC_PropertyFilterContainer m_filters;
};
} // namespace

TEST_F(CC_PropertyFilterContainerTest, KeepsItsOwnCopies)
{
    Letter const given('d');
    ASSERT_TRUE(m_filters.addFilter(given).isOk());
    ASSERT_EQ(4U, m_filters.getNumberOfFilters());
    EXPECT_NE(&given, m_filters.getFilter(3));
    EXPECT_NE(nullptr, dynamic_cast<Letter const*>(m_filters.getFilter(3)));
    EXPECT_EQ(nullptr, m_filters.getFilter(4));
    EXPECT_EQ("abcd", LETTERS_OF(m_filters));
}

TEST_F(CC_PropertyFilterContainerTest, AFilterIsInsertedAtItsPosition)
{
    EXPECT_TRUE(m_filters.addFilter(Letter('0'), 0).isOk());
    EXPECT_EQ("0abc", LETTERS_OF(m_filters));
    EXPECT_TRUE(m_filters.addFilter(Letter('2'), 2).isOk());
    EXPECT_EQ("0a2bc", LETTERS_OF(m_filters));
    EXPECT_TRUE(m_filters.addFilter(Letter('5'), 5).isOk());
    EXPECT_EQ("0a2bc5", LETTERS_OF(m_filters));
    EXPECT_TRUE(m_filters.addFilter(Letter('9'), 70).isOk());
    EXPECT_EQ("0a2bc59", LETTERS_OF(m_filters));
    EXPECT_EQ(7U, m_filters.getNumberOfFilters());
}

TEST_F(CC_PropertyFilterContainerTest, AReplacedFilterKeepsTheCount)
{
    EXPECT_TRUE(m_filters.replaceFilter(Letter('B'), 1).isOk());
    EXPECT_EQ("aBc", LETTERS_OF(m_filters));
    EXPECT_EQ(3U, m_filters.getNumberOfFilters());
    EXPECT_EQ(3, Letter::s_alive);
    EXPECT_TRUE(m_filters.replaceFilter(*m_filters.getFilter(0), 2).isOk());
    EXPECT_EQ("aBa", LETTERS_OF(m_filters));
}

TEST_F(CC_PropertyFilterContainerTest, ReplacingPastTheEndAppends)
{
    EXPECT_TRUE(m_filters.replaceFilter(Letter('d'), 9).isOk());
    EXPECT_EQ("abcd", LETTERS_OF(m_filters));
    EXPECT_EQ(4U, m_filters.getNumberOfFilters());
}

TEST_F(CC_PropertyFilterContainerTest, RemovingPastTheEndDoesNothing)
{
    m_filters.removeFilter(3);
    EXPECT_EQ(3U, m_filters.getNumberOfFilters());
    m_filters.removeFilter(1);
    EXPECT_EQ("ac", LETTERS_OF(m_filters));
    EXPECT_EQ(2U, m_filters.getNumberOfFilters());
    EXPECT_EQ(2, Letter::s_alive);
}

TEST(CC_PropertyFilterContainer, EachFilterEndsOnceWithItsContainer)
{
    {
        CC_PropertyFilterContainer filters;
        for (char const letter : {'a', 'b'})
            ASSERT_TRUE(filters.addFilter(Letter(letter)).isOk());
        EXPECT_EQ(2, Letter::s_alive);
    }
    EXPECT_EQ(0, Letter::s_alive);
}

TEST(CC_PropertyFilterContainer, AllFiltersAreAppliedAndTheFirstFailureIsReported)
{
    CC_PropertyFilterContainer filters;
    ASSERT_TRUE(filters.addFilter(Letter('a', CODE_X)).isOk());
    ASSERT_TRUE(filters.addFilter(Letter('b', CODE_Y)).isOk());
    ASSERT_TRUE(filters.addFilter(Letter('c')).isOk());
    CC_PropertyContainer properties;
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NAME, "Anna ")).isOk());
    EXPECT_EQ(XCode(CODE_X), filters.applyFilters(properties));
    EXPECT_EQ("Anna abc", VALUE_OF(*properties.get(CC_PropertyId::NAME)));
}

TEST(CC_PropertyFilterContainer, WithoutFiltersNothingChanges)
{
    CC_PropertyFilterContainer const filters;
    CC_PropertyContainer properties;
    EXPECT_EQ(XCode::OK, filters.applyFilters(properties));
    EXPECT_TRUE(properties.isEmpty());
    EXPECT_EQ(0U, filters.getNumberOfFilters());
    EXPECT_EQ(nullptr, filters.getFilter(0));
}

TEST_F(CC_PropertyFilterContainerTest, WithoutMemoryTheListStaysAsItIs)
{
    Letter const given('d');
    XCode result;
    auto const check = [&]
    {
        EXPECT_EQ(XCode::NO_ELEMENT, result);
        EXPECT_EQ(3U, m_filters.getNumberOfFilters());
        EXPECT_EQ(4, Letter::s_alive);
        EXPECT_EQ("abc", LETTERS_OF(m_filters));
    };
    EXPECT_EQ(2U, WITH_EACH_ALLOCATION_FAILING([&] { result = m_filters.addFilter(given, 1); }, check));
    EXPECT_EQ("adbc", LETTERS_OF(m_filters));
    m_filters.removeFilter(1);
    EXPECT_EQ(2U, WITH_EACH_ALLOCATION_FAILING([&] { result = m_filters.addFilter(given); }, check));
    m_filters.removeFilter(3);
    EXPECT_EQ(1U, WITH_EACH_ALLOCATION_FAILING([&] { result = m_filters.replaceFilter(given, 1); }, check));
    EXPECT_EQ("adc", LETTERS_OF(m_filters));
}

TEST_F(CC_PropertyFilterContainerTest, ADumpListsTheFiltersOneLevelDeeper)
{
    EXPECT_EQ("out Call-Control Property Filter Container\n  Letter: a\n  Letter: b\n  Letter: c\n",
              DUMP(m_filters, 1, 0, "out "));
    EXPECT_EQ("Call-Control Property Filter Container\n", DUMP(m_filters, 0, 9));
    InfoContainer info;
    m_filters.getInfo(info, 1, 2, 9, 0, "");
    m_filters.getInfo(info, 9, 0, 1, 2, "");
    EXPECT_EQ(0U, info.getNumberOfEntries());
}

// intended: a dump descends into the outermost one only
TEST(CC_PropertyFilterContainer, OneWithinItsOwnDumpIsAHeadlineOnly)
{
    CC_PropertyFilterContainer filters;
    ASSERT_TRUE(filters.addFilter(Letter('a')).isOk());
    Letter::s_dumpedWithin = &filters;
    std::string const dump = DUMP(filters, 9, 0);
    Letter::s_dumpedWithin = nullptr;
    EXPECT_EQ("Call-Control Property Filter Container\n  again Call-Control Property Filter Container\n", dump);
    EXPECT_EQ("Call-Control Property Filter Container\n  Letter: a\n", DUMP(filters, 9, 0));
}

// modules implement it: operations are appended, never inserted
TEST(CC_PropertyFilter, VirtualOperationsKeepTheirSlots)
{
    std::size_t const first = SLOT_OF(&CC_PropertyFilter::clone); // behind the destructor
    EXPECT_EQ(first + 1, SLOT_OF(&CC_PropertyFilter::apply));
    EXPECT_EQ(first + 2, SLOT_OF(&CC_PropertyFilter::getInfo));
}

namespace
{
/// A letter that does what the test says, each deed once; its copies share them.
class ActingLetter : public Letter
{
public:
    struct Deeds
    {
        std::function<void()> onClone, onApply, onInfo, onEnd;
    };
    ActingLetter(char letter, std::shared_ptr<Deeds> deeds) : Letter(letter), m_deeds(std::move(deeds)) {}
    ActingLetter(ActingLetter const&) = default;
    ~ActingLetter() override { ACT(m_deeds->onEnd); }
    CC_PropertyFilter* clone() const override
    {
        ACT(m_deeds->onClone);
        return new (std::nothrow) ActingLetter(*this);
    }
    XCode apply(CC_PropertyContainer& properties) const override
    {
        XCode const result = Letter::apply(properties);
        ACT(m_deeds->onApply);
        return result;
    }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override
    {
        Letter::getInfo(info, maxLevel, level, maxDetail, detail, prefix);
        ACT(m_deeds->onInfo);
        return info;
    }

private:
    static void ACT(std::function<void()>& deed)
    {
        if (auto const once = std::exchange(deed, nullptr))
            once();
    }
    std::shared_ptr<Deeds> m_deeds;
};

/// "abc" with an acting "b".
struct CC_PropertyFilterContainerWalkTest : testing::Test
{
    CC_PropertyFilterContainerWalkTest()
    {
        EXPECT_TRUE(m_filters->addFilter(Letter('a')).isOk());
        EXPECT_TRUE(m_filters->addFilter(ActingLetter('b', m_deeds)).isOk());
        EXPECT_TRUE(m_filters->addFilter(Letter('c')).isOk());
    }
    ~CC_PropertyFilterContainerWalkTest() override { *m_deeds = {}; }

    std::function<void()> removing(unsigned int index)
    {
        return [this, index] { m_filters->removeFilter(index); };
    }
    std::function<void()> adding(char letter)
    {
        return [this, letter] { EXPECT_TRUE(m_filters->addFilter(Letter(letter)).isOk()); };
    }

    std::shared_ptr<ActingLetter::Deeds> const m_deeds = std::make_shared<ActingLetter::Deeds>();
    std::unique_ptr<CC_PropertyFilterContainer> m_filters = std::make_unique<CC_PropertyFilterContainer>();
};
} // namespace

TEST_F(CC_PropertyFilterContainerWalkTest, AFilterIsAppendedBehindWhatItsCloneAdds)
{
    m_deeds->onClone = adding('x');
    EXPECT_TRUE(m_filters->addFilter(ActingLetter('d', m_deeds)).isOk());
    EXPECT_EQ("abcxd", LETTERS_OF(*m_filters));
}

TEST_F(CC_PropertyFilterContainerWalkTest, APositionCountsWhatTheCloneHasAddedOrRemoved)
{
    m_deeds->onClone = removing(0);
    EXPECT_TRUE(m_filters->addFilter(ActingLetter('d', m_deeds), 1).isOk());
    EXPECT_EQ("bdc", LETTERS_OF(*m_filters));
    m_deeds->onClone = adding('x');
    EXPECT_TRUE(m_filters->replaceFilter(ActingLetter('e', m_deeds), 3).isOk());
    EXPECT_EQ("bdce", LETTERS_OF(*m_filters));
}

TEST_F(CC_PropertyFilterContainerWalkTest, AnAppliedFilterMayRemoveOthersOrItself)
{
    m_deeds->onApply = removing(2);
    EXPECT_EQ("ab", LETTERS_OF(*m_filters));
    m_deeds->onApply = removing(0);
    EXPECT_EQ("ab", LETTERS_OF(*m_filters));
    m_deeds->onApply = adding('x');
    EXPECT_EQ("bx", LETTERS_OF(*m_filters));
    m_deeds->onApply = removing(0);
    EXPECT_EQ("bx", LETTERS_OF(*m_filters));
    EXPECT_EQ("x", LETTERS_OF(*m_filters));
}

TEST_F(CC_PropertyFilterContainerWalkTest, ADumpedFilterMayRemoveOthersOrItself)
{
    m_deeds->onInfo = removing(2);
    EXPECT_EQ("Call-Control Property Filter Container\n  Letter: a\n  Letter: b\n", DUMP(*m_filters, 9, 0));
    m_deeds->onInfo = removing(1);
    EXPECT_EQ("Call-Control Property Filter Container\n  Letter: a\n  Letter: b\n", DUMP(*m_filters, 9, 0));
    EXPECT_EQ("Call-Control Property Filter Container\n  Letter: a\n", DUMP(*m_filters, 9, 0));
}

TEST_F(CC_PropertyFilterContainerWalkTest, AnEndingFilterMayRemoveOthersOfAnEndingContainer)
{
    CC_PropertyFilterContainer& ending = *m_filters;
    m_deeds->onEnd = [&ending] { ending.removeFilter(ending.getNumberOfFilters() - 1); };
    m_filters.reset();
    EXPECT_EQ(0, Letter::s_alive);
}

TEST_F(CC_PropertyFilterContainerWalkTest, AnEndingFilterMayRemoveAllOthersWhileItIsReplaced)
{
    m_deeds->onEnd = [this]
    {
        while (m_filters->getNumberOfFilters() != 0)
            m_filters->removeFilter(0);
    };
    EXPECT_TRUE(m_filters->replaceFilter(Letter('B'), 1).isOk());
    EXPECT_EQ("B", LETTERS_OF(*m_filters)) << "the new one comes in once the old one is gone";
}
