#include "properties/CC_PropertyContainerContainer.h"

#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <memory>

namespace
{
/// A property that leads back to the containers in which it stands, as a call's dump leads to its legs.
class Loop : public CC_PropertyClass<Loop>
{
public:
    static constexpr char const* TYPE_NAME = "Loop";
    static TypeId s_typeId;
    static CC_PropertyContainerContainer const* s_sides;
    using CC_PropertyClass::CC_PropertyClass;
    String& getValueString(String& out) const override { return out = "loop"; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const&) const override
    {
        return s_sides->getInfo(info, maxLevel, level, maxDetail, detail, "again ");
    }
    bool hasSameValue(Loop const&) const { return true; }
};
Loop::TypeId Loop::s_typeId;
CC_PropertyContainerContainer const* Loop::s_sides = nullptr;
} // namespace

TEST(CC_PropertyContainerContainer, HoldsOneContainerPerSide)
{
    CC_PropertyContainer calling;
    CC_PropertyContainer called;
    CC_PropertyContainerContainer sides;
    EXPECT_EQ(XCode::OK, sides.add(CC_PCT_CALLING, &calling));
    EXPECT_EQ(XCode::REFUSED, sides.add(CC_PCT_CALLING, &called));
    EXPECT_EQ(&calling, sides.get(CC_PCT_CALLING));
    EXPECT_EQ(nullptr, sides.get(CC_PCT_CALLED));
    EXPECT_EQ(XCode::OK, sides.add(CC_PCT_CALLED, &called));
    EXPECT_EQ(2U, sides.getNumberOfContainers());
}

TEST(CC_PropertyContainerContainer, RefusesNull)
{
    CC_PropertyContainerContainer sides;
    EXPECT_EQ(XCode::REFUSED, sides.add(CC_PCT_CALLING, nullptr));
    EXPECT_EQ(0U, sides.getNumberOfContainers());
}

TEST(CC_PropertyContainerContainer, TypesOfTheSameBucketAreKeptApart)
{
    CC_PropertyContainer calling;
    CC_PropertyContainer other;
    CC_PropertyContainerContainer sides;
    auto const sameBucket = static_cast<CC_PropertyContainerType>(CC_PCT_CALLING + 32);
    EXPECT_EQ(XCode::OK, sides.add(CC_PCT_CALLING, &calling));
    EXPECT_EQ(XCode::OK, sides.add(sameBucket, &other));
    sides.remove(CC_PCT_CALLING);
    EXPECT_EQ(nullptr, sides.get(CC_PCT_CALLING));
    EXPECT_EQ(&other, sides.get(sameBucket));
}

TEST(CC_PropertyContainerContainer, ForgettingAContainerLeavesItAlive)
{
    CC_PropertyContainer calling;
    ASSERT_TRUE(calling.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")).isOk());
    {
        CC_PropertyContainerContainer sides;
        ASSERT_TRUE(sides.add(CC_PCT_CALLING, &calling).isOk());
        sides.remove(CC_PCT_CALLED); // absent
        sides.remove(CC_PCT_CALLING);
        EXPECT_EQ(nullptr, sides.get(CC_PCT_CALLING));
        ASSERT_TRUE(sides.add(CC_PCT_CALLING, &calling).isOk());
        sides.clear();
        EXPECT_EQ(0U, sides.getNumberOfContainers());
        ASSERT_TRUE(sides.add(CC_PCT_GENERAL, &calling).isOk());
    }
    EXPECT_EQ(1U, calling.getNumberOfProperties());
}

TEST(CC_PropertyContainerContainer, WithoutMemoryNothingIsAdded)
{
    CC_PropertyContainer calling;
    CC_PropertyContainerContainer sides;
    FailingAllocator::failNth(1);
    XCode const result = sides.add(CC_PCT_CALLING, &calling);
    FailingAllocator::stop();
    EXPECT_EQ(XCode::NO_ELEMENT, result);
    EXPECT_EQ(0U, sides.getNumberOfContainers());
}

TEST(CC_PropertyContainerContainer, ADumpListsTheSidesInTheOrderOfTheirAdding)
{
    CC_PropertyContainer calling;
    CC_PropertyContainer general;
    ASSERT_TRUE(calling.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")).isOk());
    CC_PropertyContainerContainer sides;
    ASSERT_TRUE(sides.add(CC_PCT_GENERAL, &general).isOk());
    ASSERT_TRUE(sides.add(CC_PCT_CALLING, &calling).isOk());
    EXPECT_EQ("own Property Containers\n"
              "  Properties\n"
              "  calling-Properties\n"
              "    Name: Anna\n",
              DUMP(sides, 9, 0, "own "));
    EXPECT_EQ("Property Containers\n  Properties\n  calling-Properties\n", DUMP(sides, 1, 0));
    EXPECT_EQ("Property Containers\n", DUMP(sides, 0, 0));
    EXPECT_EQ("Properties\n  Name: Anna\n", DUMP(calling, 9, 0)); // directly: one level higher, without the side

    InfoContainer info;
    sides.getInfo(info, 1, 2, 9, 0, "");
    sides.getInfo(info, 9, 0, 1, 2, "");
    EXPECT_EQ(0U, info.getNumberOfEntries());
}

// intended: a dump descends into the outermost one only
TEST(CC_PropertyContainerContainer, OneWithinItsOwnDumpIsAHeadlineOnly)
{
    CC_PropertyContainer calling;
    CC_PropertyContainerContainer sides;
    ASSERT_TRUE(calling.set(Loop(CC_PropertyId::URI)).isOk());
    ASSERT_TRUE(sides.add(CC_PCT_CALLING, &calling).isOk());
    Loop::s_sides = &sides;
    EXPECT_EQ("Property Containers\n  calling-Properties\n    again Property Containers\n", DUMP(sides, 9, 0));
    EXPECT_EQ("Property Containers\n  calling-Properties\n    again Property Containers\n", DUMP(sides, 9, 0));
}

TEST(CC_PropertyContainerContainer, TheSharedEmptyOneIsAlwaysTheSame)
{
    EXPECT_EQ(&CC_PropertyContainerContainer::EMPTY(), &CC_PropertyContainerContainer::EMPTY());
    EXPECT_EQ(0U, CC_PropertyContainerContainer::EMPTY().getNumberOfContainers());
}

TEST(CC_PropertyContainerContainer, ADumpedPropertyMayForgetContainers)
{
    auto const deeds = std::make_shared<ActingProperty::Deeds>();
    CC_PropertyContainer calling;
    CC_PropertyContainer called;
    CC_PropertyContainer general;
    ASSERT_TRUE(calling.set(ActingProperty(CC_PropertyId::NAME, 1, deeds)).isOk());
    CC_PropertyContainerContainer sides;
    auto const addAll = [&]
    {
        sides.clear();
        ASSERT_TRUE(sides.add(CC_PCT_CALLING, &calling).isOk());
        ASSERT_TRUE(sides.add(CC_PCT_CALLED, &called).isOk());
        ASSERT_TRUE(sides.add(CC_PCT_GENERAL, &general).isOk());
    };
    addAll();
    deeds->onText = [&] { sides.clear(); };
    EXPECT_EQ("Property Containers\n  calling-Properties\n    Name: 1\n", DUMP(sides, 9, 0));
    addAll();
    deeds->onText = [&] { sides.remove(CC_PCT_CALLING); };
    EXPECT_EQ("Property Containers\n  calling-Properties\n    Name: 1\n  called-Properties\n  Properties\n",
              DUMP(sides, 9, 0));
    addAll();
    deeds->onText = [&] { sides.remove(CC_PCT_CALLED); };
    EXPECT_EQ("Property Containers\n  calling-Properties\n    Name: 1\n  Properties\n", DUMP(sides, 9, 0));
}
