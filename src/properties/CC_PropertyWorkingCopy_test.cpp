// A copy that is brought up to date by what has changed must be what a plain copy would be, whoever changes whatever in
// either, and whoever follows what filters leave in it must find the differences that a comparison of everything finds.
#include "properties/CC_PropertyWorkingCopy.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "properties/CC_PropertyView.h"
#include "testing/FailingAllocator.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <random>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

namespace
{
using namespace CC_PropertyId;
using Ids = std::vector<unsigned int>;

std::string TEXT_OF(CC_PropertyContainer const& properties)
{
    std::string text;
    for (CC_Property const& property : properties)
    {
        String value;
        text += std::to_string(property.getId()) + " " + property.getTypeName() + " " +
                property.getValueString(value).c_str() + "; ";
    }
    return text;
}

/// Where two have the same, copying one to the other ends no property.
std::string SHAPE_OF(CC_PropertyContainer const& properties)
{
    std::string text;
    for (CC_Property const& property : properties)
        text += std::to_string(property.getId()) + " " + property.getTypeName() + "; ";
    return text;
}

class CC_PropertyWorkingCopy_Test : public testing::Test
{
protected:
    // some of them share a mark
    static constexpr unsigned int IDS[] = {NETWORK, CALL_LEG_ID,     E164_NUMBER, NUMBERING_PLAN, NAME,
                                           DISPLAY, UNNAMED_BOOLEAN, CAUSE,       STATE,          FIRST_OF_MODULES};

    unsigned int random(unsigned int below) { return static_cast<unsigned int>(m_random() % below); }
    unsigned int randomId() { return IDS[random(std::size(IDS))]; }
    String randomText() { return random(2) == 0 ? "x" : "a text too long to be kept inline"; }

    void rewrite(CC_Property* property)
    {
        String error;
        if (property != nullptr)
            std::ignore = property->setValueString(error, randomText()); // some classes take no text
    }
    void store(CC_PropertyContainer& container, unsigned int id)
    {
        switch (random(8))
        {
        case 0:
            EXPECT_TRUE(container.set(CC_PropertyBoolean(id, random(2) == 0)).isOk());
            break;
        case 1:
            EXPECT_TRUE(container.set(CC_PropertyUnsigned(id, random(3))).isOk());
            break;
        default:
            EXPECT_TRUE(container.set(CC_PropertyString(id, randomText())).isOk());
            break;
        }
    }
    CC_PropertyContainer several()
    {
        CC_PropertyContainer container;
        for (unsigned int i = random(6); i > 0; --i)
            store(container, randomId());
        return container;
    }

    /// One of all the ways in which somebody can change a container. What was handed out before is written to as well.
    void change(CC_PropertyContainer& container, CC_Property*& kept)
    {
        switch (random(14))
        {
        case 0:
        case 1:
        case 2:
            kept = container.get(randomId());
            rewrite(kept);
            break;
        case 3:
            kept = container.getByIndex(random(12));
            rewrite(kept);
            break;
        case 4:
            for (CC_Property& property : container)
                if (random(3) == 0)
                    rewrite(&property);
            break;
        case 5:
            container.remove(randomId());
            break;
        case 6:
            container.removeByIndex(random(12));
            break;
        case 7:
            if (random(4) == 0)
                container.clear();
            break;
        case 8:
            if (random(4) == 0)
                container = several();
            break;
        case 9:
            EXPECT_TRUE(container.set(several()).isOk());
            break;
        case 10:
            rewriteIfThere(container, kept);
            break;
        default:
            store(container, randomId());
            break;
        }
    }
    void rewriteIfThere(CC_PropertyContainer const& container, CC_Property* property)
    {
        for (CC_Property const& other : container)
            if (&other == property)
                return rewrite(property);
    }

    CC_PropertyContainer source;
    CC_PropertyWorkingCopy copy;
    CC_PropertyView view;
    CC_PropertyView plain; // compares everything
    std::minstd_rand m_random;
};
} // namespace

TEST_F(CC_PropertyWorkingCopy_Test, WhoeverChangesItOrItsSourceItIsBroughtUpToDateToBeAPlainCopy)
{
    CC_Property* keptOfSource = nullptr;
    CC_Property* keptOfCopy = nullptr;
    Ids differences;
    Ids expected;
    for (unsigned int id : IDS)
        store(source, id);
    for (unsigned int round = 0; round < 20000 && !HasFailure(); ++round)
    {
        SCOPED_TRACE("round " + std::to_string(round));
        for (unsigned int i = random(3); i > 0; --i)
            change(source, keptOfSource);
        if (SHAPE_OF(copy.getProperties()) != SHAPE_OF(source))
            keptOfCopy = nullptr; // it may point to a property that took the place of an ended one
        keptOfSource = nullptr;   // whoever has a source's properties for longer has them all marked
        copy.bringUpToDate(source,
                           round == 0 ? CC_PropertyWorkingCopy::ALL : CC_PropertyWorkingCopy::TAKE_MARKS(source));
        ASSERT_EQ(TEXT_OF(copy.getProperties()), TEXT_OF(source));
        for (unsigned int i = random(3); i > 0; --i)
            change(copy.getProperties(), keptOfCopy);
        if (random(8) == 0) // the module writes to what it sees
        {
            CC_PropertyString const written(randomId(), randomText());
            EXPECT_TRUE(view.write(written).isOk());
            EXPECT_TRUE(plain.write(written).isOk());
        }
        if (random(8) == 0)
            continue; // a filter has failed
        view.followMarked(copy.getProperties(), copy.settle(), 0, [&](unsigned int id) { differences.push_back(id); });
        plain.follow(copy.getProperties(), {}, [&](unsigned int id) { expected.push_back(id); });
        EXPECT_EQ(TEXT_OF(view.getProperties()), TEXT_OF(plain.getProperties()));
        std::sort(differences.begin(), differences.end()); // whoever is told collects them
        std::sort(expected.begin(), expected.end());
        EXPECT_EQ(std::exchange(differences, {}), std::exchange(expected, {}));
    }
}

TEST_F(CC_PropertyWorkingCopy_Test, AViewThatIsAssignedWhatMayDifferIsAPlainCopy)
{
    CC_Property* kept = nullptr;
    for (unsigned int round = 0; round < 20000 && !HasFailure(); ++round)
    {
        SCOPED_TRACE("round " + std::to_string(round));
        change(source, kept);
        kept = nullptr;
        copy.bringUpToDate(source,
                           round == 0 ? CC_PropertyWorkingCopy::ALL : CC_PropertyWorkingCopy::TAKE_MARKS(source));
        for (unsigned int i = random(3); i > 0; --i)
            change(copy.getProperties(), kept);
        switch (random(24))
        {
        case 0:
        case 1:
        case 2:
            EXPECT_TRUE(view.write(CC_PropertyString(randomId(), randomText())).isOk());
            break;
        case 3:
            EXPECT_TRUE(view.write(several()).isOk());
            break;
        case 4:
            view.clear();
            break;
        default:
            break;
        }
        if (random(8) == 0)
            continue;
        view.assignMarked(copy.getProperties(), copy.settle(), 0);
        EXPECT_EQ(TEXT_OF(view.getProperties()), TEXT_OF(copy.getProperties()));
        kept = nullptr;
    }
}

TEST_F(CC_PropertyWorkingCopy_Test, ReadingMarksNothing)
{
    store(source, NAME);
    std::ignore = CC_PropertyWorkingCopy::TAKE_MARKS(source);
    CC_PropertyContainer const& toRead = source;
    for (CC_Property const& property : toRead)
        EXPECT_EQ(toRead.get(property.getId()), toRead.getByIndex(0));
    EXPECT_EQ(CC_PropertyWorkingCopy::TAKE_MARKS(source), 0u) << "else nothing is gained";
}

TEST_F(CC_PropertyWorkingCopy_Test, WhatMemoryRefusesIsMissingAndTheNumberTells)
{
    for (unsigned int id : IDS)
        EXPECT_TRUE(source.set(CC_PropertyString(id, "x")).isOk());
    std::string const before = TEXT_OF(source);
    bool hasMissed = false;
    for (unsigned long n = 1;; ++n)
    {
        EXPECT_TRUE(source.set(CC_PropertyString(NAME, "x")).isOk());
        copy.bringUpToDate(source, CC_PropertyWorkingCopy::ALL);
        ASSERT_EQ(TEXT_OF(copy.getProperties()), before);
        std::ignore = CC_PropertyWorkingCopy::TAKE_MARKS(source);
        EXPECT_TRUE(source.set(CC_PropertyString(NAME, "a text too long to be kept inline")).isOk());
        copy.getProperties().remove(NETWORK);
        FailingAllocator::failNth(n);
        copy.bringUpToDate(source, CC_PropertyWorkingCopy::TAKE_MARKS(source));
        FailingAllocator::stop();
        bool const isWhole = copy.getProperties().getNumberOfProperties() == source.getNumberOfProperties();
        EXPECT_EQ(isWhole, TEXT_OF(copy.getProperties()) == TEXT_OF(source)) << n;
        hasMissed = hasMissed || !isWhole;
        if (!FailingAllocator::hasFailed())
            break;
    }
    EXPECT_TRUE(hasMissed);
}
