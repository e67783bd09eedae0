#include "properties/CC_PropertyContainer.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "tests/support/PropertyTesting.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <iterator>
#include <memory>
#include <ranges>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace
{
/// One property of every group, in ascending order, and one whose id belongs to none.
constexpr unsigned int UNGROUPED = 0x400042;
constexpr unsigned int s_ids[] = {UNGROUPED,
                                  CC_PropertyId::NETWORK,
                                  CC_PropertyId::NAME,
                                  CC_PropertyId::CONTEXT,
                                  CC_PropertyId::TARIFF,
                                  CC_PropertyId::CHARGE};

void FILL(CC_PropertyContainer& properties)
{
    for (unsigned int const id : s_ids)
        EXPECT_TRUE(properties.set(CC_PropertyUnsigned(id, id)).isOk());
}

std::vector<unsigned int> IDS_OF(CC_PropertyContainer const& properties)
{
    std::vector<unsigned int> ids;
    for (CC_Property const& property : properties)
        ids.push_back(property.getId());
    return ids;
}

/// A property whose clones are in a list already, so that no container takes them.
class Caught : public CC_PropertyClass<Caught>
{
public:
    static constexpr char const* TYPE_NAME = "Caught";
    static TypeId s_typeId;
    static LinkedListManager_Untyped s_trap;

    using CC_PropertyClass::CC_PropertyClass;
    Caught(Caught const& other) = default;
    ~Caught() override
    {
        if (isLinked())
            s_trap.unlink(*this);
    }
    CC_Property* clone() const override
    {
        auto* const copy = new Caught(*this);
        EXPECT_TRUE(s_trap.append(*copy).isOk());
        return copy;
    }
    String& getValueString(String& out) const override { return out = "caught"; }
    bool hasSameValue(Caught const&) const { return true; }
};
Caught::TypeId Caught::s_typeId;
LinkedListManager_Untyped Caught::s_trap;

/// A property that contains others, as a list of forwarding targets would.
class Nested : public CC_PropertyClass<Nested>
{
public:
    static constexpr char const* TYPE_NAME = "Nested";
    static TypeId s_typeId;
    using CC_PropertyClass::CC_PropertyClass;
    Nested(unsigned int id, CC_PropertyContainer const& inner) : CC_PropertyClass(id), m_inner(inner) {}
    String& getValueString(String& out) const override { return out = "nested"; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const&) const override
    {
        return m_inner.getInfo(info, maxLevel, level, maxDetail, detail, "inner ");
    }
    bool hasSameValue(Nested const&) const { return true; }

private:
    CC_PropertyContainer m_inner;
};
Nested::TypeId Nested::s_typeId;
} // namespace

TEST(CC_PropertyContainer, KeepsCopiesInTheOrderOfTheirAdding)
{
    CC_PropertyContainer properties;
    CC_PropertyString given(CC_PropertyId::NAME, "Anna");
    ASSERT_TRUE(properties.set(given).isOk());
    ASSERT_TRUE(properties.set(CC_PropertyUnsigned(CC_PropertyId::HOPS, 3)).isOk());
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NETWORK, "pstn")).isOk());
    given.setValue("Berta");
    EXPECT_EQ((std::vector<unsigned int>{CC_PropertyId::NAME, CC_PropertyId::HOPS, CC_PropertyId::NETWORK}),
              IDS_OF(properties));
    ASSERT_NE(nullptr, properties.get(CC_PropertyId::NAME));
    EXPECT_EQ("Anna", VALUE_OF(*properties.get(CC_PropertyId::NAME)));
    EXPECT_EQ(3U, properties.getNumberOfProperties());
}

static_assert(std::forward_iterator<CC_PropertyContainer::Iterator>);
static_assert(std::forward_iterator<CC_PropertyContainer::ConstIterator>);
static_assert(std::ranges::forward_range<CC_PropertyContainer>);
static_assert(std::ranges::forward_range<CC_PropertyContainer const>);
static_assert(std::is_convertible_v<CC_PropertyContainer::Iterator, CC_PropertyContainer::ConstIterator>);
static_assert(!std::is_convertible_v<CC_PropertyContainer::ConstIterator, CC_PropertyContainer::Iterator>);

TEST(CC_PropertyContainer, StandardAlgorithmsWalkIt)
{
    CC_PropertyContainer properties;
    FILL(properties);
    auto const isName = [](CC_Property const& property) { return property.getId() == CC_PropertyId::NAME; };
    auto const found = std::find_if(std::as_const(properties).begin(), std::as_const(properties).end(), isName);
    ASSERT_NE(found, std::as_const(properties).end());
    EXPECT_EQ(found->getId(), CC_PropertyId::NAME);
    EXPECT_EQ(std::distance(properties.begin(), properties.end()), 6);
    EXPECT_EQ(std::ranges::count_if(properties, isName), 1);
    CC_PropertyContainer::Iterator position = properties.begin();
    EXPECT_EQ((position++)->getId(), UNGROUPED);
    EXPECT_EQ(position->getId(), CC_PropertyId::NETWORK);
}

TEST(CC_PropertyContainer, AWalkOverAContainerOfOnesOwnMayChangeTheValues)
{
    CC_PropertyContainer properties;
    FILL(properties);
    for (CC_Property& property : properties)
        CC_PropertyUnsigned::FROM(&property)->setValue(5);
    EXPECT_EQ("0x00000005", VALUE_OF(*properties.get(CC_PropertyId::TARIFF)));
}

TEST(CC_PropertyContainer, AnAbsentIdIsNull)
{
    CC_PropertyContainer properties;
    EXPECT_TRUE(properties.isEmpty());
    EXPECT_EQ(nullptr, properties.get(CC_PropertyId::NAME));
    FILL(properties);
    EXPECT_EQ(nullptr, properties.get(CC_PropertyId::HOPS));
    EXPECT_EQ(nullptr, std::as_const(properties).get(CC_PropertyId::HOPS));
    EXPECT_EQ(properties.get(CC_PropertyId::NAME), std::as_const(properties).get(CC_PropertyId::NAME));
}

TEST(CC_PropertyContainer, SettingAPresentIdAssignsInPlace)
{
    CC_PropertyContainer properties;
    FILL(properties);
    CC_Property const* const stored = properties.get(CC_PropertyId::NAME);
    ASSERT_TRUE(properties.set(CC_PropertyUnsigned(CC_PropertyId::NAME, 9)).isOk());
    EXPECT_EQ(stored, properties.get(CC_PropertyId::NAME));
    EXPECT_EQ("0x00000009", VALUE_OF(*stored));
    EXPECT_EQ(std::vector<unsigned int>(std::begin(s_ids), std::end(s_ids)), IDS_OF(properties));
}

// intended: the first owner of an id fixes its class
TEST(CC_PropertyContainer, APropertyOfAnotherClassIsTakenForOkAndDropped)
{
    CC_PropertyContainer properties;
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")).isOk());
    EXPECT_EQ(XCode::OK, properties.set(CC_PropertyBoolean(CC_PropertyId::NAME, true)));
    EXPECT_EQ("Anna", VALUE_OF(*properties.get(CC_PropertyId::NAME)));
    EXPECT_STREQ("String", properties.get(CC_PropertyId::NAME)->getTypeName());
}

TEST(CC_PropertyContainer, AMaskSelectsAGroup)
{
    CC_PropertyContainer all;
    FILL(all);
    struct Case
    {
        unsigned int mask;
        std::vector<unsigned int> ids;
    };
    for (Case const& row : {Case{0x100, {CC_PropertyId::NETWORK}}, Case{0x200, {CC_PropertyId::NAME}},
                            Case{0x400, {CC_PropertyId::CONTEXT}}, Case{0x800, {CC_PropertyId::TARIFF}},
                            Case{0x1000, {CC_PropertyId::CHARGE}},
                            Case{0x300, {CC_PropertyId::NETWORK, CC_PropertyId::NAME}}, Case{0, {}}})
    {
        CC_PropertyContainer some;
        EXPECT_EQ(XCode::OK, some.set(all, row.mask));
        EXPECT_EQ(row.ids, IDS_OF(some)) << std::hex << row.mask;
    }
}

TEST(CC_PropertyContainer, SettingAnotherSkipsAnIdWithoutGroupWhichCopyingTakes)
{
    CC_PropertyContainer all;
    FILL(all);
    CC_PropertyContainer set;
    EXPECT_EQ(XCode::OK, set.set(all));
    EXPECT_EQ(std::vector<unsigned int>(std::begin(s_ids) + 1, std::end(s_ids)), IDS_OF(set));

    CC_PropertyContainer const copied(all);
    EXPECT_EQ(std::vector<unsigned int>(std::begin(s_ids), std::end(s_ids)), IDS_OF(copied));
}

TEST(CC_PropertyContainer, SettingAnotherKeepsWhatIsThere)
{
    CC_PropertyContainer properties;
    CC_PropertyContainer other;
    ASSERT_TRUE(properties.set(CC_PropertyUnsigned(CC_PropertyId::HOPS, 1)).isOk());
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")).isOk());
    ASSERT_TRUE(other.set(CC_PropertyString(CC_PropertyId::NETWORK, "pstn")).isOk());
    ASSERT_TRUE(other.set(CC_PropertyUnsigned(CC_PropertyId::HOPS, 2)).isOk());
    ASSERT_TRUE(properties.set(other).isOk());
    EXPECT_EQ((std::vector<unsigned int>{CC_PropertyId::HOPS, CC_PropertyId::NAME, CC_PropertyId::NETWORK}),
              IDS_OF(properties));
    EXPECT_EQ("0x00000002", VALUE_OF(*properties.get(CC_PropertyId::HOPS)));
}

TEST(CC_PropertyContainer, ACopyReplacesEverything)
{
    CC_PropertyContainer properties;
    CC_PropertyContainer other;
    FILL(other);
    ASSERT_TRUE(properties.set(CC_PropertyUnsigned(CC_PropertyId::HOPS, 1)).isOk());
    properties = other;
    EXPECT_EQ(IDS_OF(other), IDS_OF(properties));
    CC_PropertyContainer const& same = properties;
    properties = same;
    EXPECT_EQ(IDS_OF(other), IDS_OF(properties));
    properties = CC_PropertyContainer::EMPTY();
    EXPECT_TRUE(properties.isEmpty());
}

TEST(CC_PropertyContainer, RemovingDeletesOneProperty)
{
    CC_PropertyContainer properties;
    FILL(properties);
    unsigned int const before = CC_Property::s_numberOfInstances;
    EXPECT_TRUE(properties.remove(CC_PropertyId::CONTEXT));
    EXPECT_FALSE(properties.remove(CC_PropertyId::CONTEXT));
    EXPECT_TRUE(properties.removeByIndex(0));
    EXPECT_FALSE(properties.removeByIndex(4));
    EXPECT_TRUE(properties.removeByIndex(3));
    EXPECT_EQ(before - 3, CC_Property::s_numberOfInstances);
    EXPECT_EQ((std::vector<unsigned int>{CC_PropertyId::NETWORK, CC_PropertyId::NAME, CC_PropertyId::TARIFF}),
              IDS_OF(properties));
    properties.clear();
    EXPECT_EQ(before - 6, CC_Property::s_numberOfInstances);
    EXPECT_TRUE(properties.isEmpty());
}

TEST(CC_PropertyContainer, PositionsCountFromTheFirstAdded)
{
    CC_PropertyContainer properties;
    FILL(properties);
    for (unsigned int i = 0; i < std::size(s_ids); ++i)
    {
        EXPECT_EQ(properties.get(s_ids[i]), properties.getByIndex(i));
        EXPECT_EQ(properties.get(s_ids[i]), std::as_const(properties).getByIndex(i));
    }
    EXPECT_EQ(nullptr, properties.getByIndex(std::size(s_ids)));
}

TEST(CC_PropertyContainer, ACopyThatNoListTakesIsAFailure)
{
    CC_PropertyContainer properties;
    EXPECT_EQ(XCode::FAILURE, properties.set(Caught(CC_PropertyId::NAME)));
    EXPECT_TRUE(properties.isEmpty());
    EXPECT_TRUE(Caught::s_trap.isEmpty()); // the copy is deleted
}

TEST(CC_PropertyContainer, WithoutMemoryNothingIsAddedNorChanged)
{
    CC_PropertyString const property(CC_PropertyId::NAME, std::string(100, 'x').c_str());
    CC_PropertyContainer properties;
    XCode result;
    auto const set = [&] { result = properties.set(property); };
    EXPECT_EQ(2U, WITH_EACH_ALLOCATION_FAILING(set,
                                               [&]
                                               {
                                                   EXPECT_EQ(XCode::NO_ELEMENT, result);
                                                   EXPECT_TRUE(properties.isEmpty());
                                               }));
    EXPECT_EQ(XCode::OK, result);

    properties.clear();
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")).isOk());
    EXPECT_EQ(1U, WITH_EACH_ALLOCATION_FAILING(set,
                                               [&]
                                               {
                                                   EXPECT_EQ(XCode::NO_ELEMENT, result);
                                                   EXPECT_EQ("Anna", VALUE_OF(*properties.get(CC_PropertyId::NAME)));
                                               }));
    EXPECT_EQ(XCode::OK, result);
    EXPECT_TRUE(properties.get(CC_PropertyId::NAME)->isEqual(property));
}

TEST(CC_PropertyContainer, SettingAnotherStopsWhereMemoryEnds)
{
    CC_PropertyContainer all;
    FILL(all);
    CC_PropertyContainer properties;
    FailingAllocator::failNth(3); // one allocation per property
    XCode const result = properties.set(all, CC_PropertyContainer::ALL_GROUPS);
    FailingAllocator::stop();
    EXPECT_EQ(XCode::FAILURE, result);
    EXPECT_EQ((std::vector<unsigned int>{CC_PropertyId::NETWORK, CC_PropertyId::NAME}), IDS_OF(properties));
}

TEST(CC_PropertyContainer, ACopySilentlyLacksWhatMemoryRefused)
{
    CC_PropertyContainer all;
    FILL(all);
    CC_PropertyContainer properties;
    FailingAllocator::failNth(3);
    properties = all;
    FailingAllocator::stop();
    std::vector<unsigned int> expected(std::begin(s_ids), std::end(s_ids));
    expected.erase(expected.begin() + 2);
    EXPECT_EQ(expected, IDS_OF(properties));
}

TEST(CC_PropertyContainer, ADumpListsThePropertiesOneLevelDeeper)
{
    CC_PropertyContainer properties;
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")).isOk());
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NETWORK)).isOk());
    EXPECT_EQ("own Properties\n  Name: Anna (String)\n  Network: (none) (String)\n", DUMP(properties, 1, 1, "own "));
    EXPECT_EQ("Properties\n  Name: Anna\n  Network: (none)\n", DUMP(properties, 1, 0));
    EXPECT_EQ("Properties\n", DUMP(properties, 0, 9));

    InfoContainer info;
    properties.getInfo(info, 1, 2, 9, 0, "");
    properties.getInfo(info, 9, 0, 1, 2, "");
    EXPECT_EQ(0U, info.getNumberOfEntries());
}

// intended: a dump descends into the outermost container only
TEST(CC_PropertyContainer, AContainerWithinAContainersDumpIsAHeadlineOnly)
{
    CC_PropertyContainer inner;
    ASSERT_TRUE(inner.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")).isOk());
    CC_PropertyContainer outer;
    ASSERT_TRUE(outer.set(Nested(CC_PropertyId::URI, inner)).isOk());
    ASSERT_TRUE(outer.set(CC_PropertyUnsigned(CC_PropertyId::HOPS, 1)).isOk());
    EXPECT_EQ("Properties\n  inner Properties\n  Hops: 0x00000001\n", DUMP(outer, 9, 0));
    EXPECT_EQ("Properties\n  Name: Anna\n", DUMP(inner, 9, 0)); // the count is back at zero
}

TEST(CC_PropertyContainer, TheSharedEmptyOneIsAlwaysTheSame)
{
    EXPECT_EQ(&CC_PropertyContainer::EMPTY(), &CC_PropertyContainer::EMPTY());
    EXPECT_TRUE(CC_PropertyContainer::EMPTY().isEmpty());
    EXPECT_TRUE(CC_PropertyContainer::EMPTY().begin() == CC_PropertyContainer::EMPTY().end());
}

TEST(CC_PropertyContainer, AssigningCopiesAlsoWhatAClassAddsToTheOneThatItsAssignBelongsTo)
{
    struct Stamped : CC_PropertyString
    {
        Stamped(unsigned int id, String const& text, int newStamp) : CC_PropertyString(id, text), stamp(newStamp) {}
        CC_Property* clone() const override { return new Stamped(*this); }
        int stamp;
    };
    CC_PropertyContainer from;
    CC_PropertyContainer to;
    ASSERT_TRUE(to.set(Stamped(CC_PropertyId::NAME, "Anna", 1)).isOk());
    ASSERT_TRUE(from.set(Stamped(CC_PropertyId::NAME, "Anna", 2)).isOk());
    to = from;
    auto const* const copy = dynamic_cast<Stamped const*>(to.get(CC_PropertyId::NAME));
    ASSERT_NE(copy, nullptr);
    EXPECT_EQ(copy->stamp, 2);
}

TEST(CC_PropertyContainer, AssigningTakesEqualKindsOverWhereTheyStand)
{
    CC_PropertyContainer from;
    FILL(from);
    CC_PropertyContainer to(from);
    CC_Property const* const first = to.getByIndex(0);
    ASSERT_TRUE(from.set(CC_PropertyUnsigned(CC_PropertyId::NAME, 7)).isOk());
    to = from;
    EXPECT_EQ(to.getByIndex(0), first);
    EXPECT_TRUE(to.get(CC_PropertyId::NAME)->isEqual(CC_PropertyUnsigned(0, 7)));
    EXPECT_EQ(IDS_OF(to), IDS_OF(from));
}

namespace
{
/// Holds a name inside, and lets its base's assign take that over; the base is a number.
class NamedNumber : public CC_PropertyUnsigned
{
public:
    NamedNumber(unsigned int id, unsigned int number, String const& name)
        : CC_PropertyUnsigned(id, number), m_name(id, name)
    {
    }
    String const& getName() const { return m_name.getValue(); }
    /// Takes the name over, and forgets the number.
    CC_Property& assign(CC_Property const& other) override
    {
        if (auto const* const same = dynamic_cast<NamedNumber const*>(&other))
            m_name.assign(same->m_name);
        return *this;
    }
    CC_Property* clone() const override { return new NamedNumber(*this); }

private:
    CC_PropertyString m_name;
};

/// Compares by the rounded number only.
class Rounded : public CC_PropertyClass<Rounded>
{
public:
    static constexpr char const* TYPE_NAME = "Rounded";
    static TypeId s_typeId;
    using CC_PropertyClass::CC_PropertyClass;
    Rounded(unsigned int id, int number, String const& remark)
        : CC_PropertyClass(id), m_number(number), m_remark(remark)
    {
    }
    String& getValueString(String& out) const override { return out.format("%d %s", m_number, m_remark.c_str()); }
    bool hasSameValue(Rounded const& other) const { return m_number / 10 == other.m_number / 10; }

private:
    int m_number = 0;
    String m_remark;
};
Rounded::TypeId Rounded::s_typeId;

/// A container with an acting property between two others.
struct CC_PropertyContainerWalkTest : testing::Test
{
    CC_PropertyContainerWalkTest()
    {
        EXPECT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NETWORK, "isdn")).isOk());
        EXPECT_TRUE(properties.set(ActingProperty(CC_PropertyId::NAME, 1, deeds)).isOk());
        EXPECT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::DISPLAY, "A")).isOk());
    }
    ~CC_PropertyContainerWalkTest() override { *deeds = {}; }

    auto removing(unsigned int id)
    {
        return [this, id] { properties.remove(id); };
    }
    auto clearing()
    {
        return [this] { properties.clear(); };
    }

    std::shared_ptr<ActingProperty::Deeds> const deeds = std::make_shared<ActingProperty::Deeds>();
    CC_PropertyContainer properties;
};
using Ids = std::vector<unsigned int>;
} // namespace

TEST(CC_PropertyContainer, AssigningCopiesAClassWhoseAssignTakesLessThanItHolds)
{
    CC_PropertyContainer from;
    CC_PropertyContainer to;
    ASSERT_TRUE(to.set(NamedNumber(CC_PropertyId::NAME, 1, "Anna")).isOk());
    ASSERT_TRUE(from.set(NamedNumber(CC_PropertyId::NAME, 2, "Berta")).isOk());
    to = from;
    auto const* const copy = dynamic_cast<NamedNumber const*>(to.get(CC_PropertyId::NAME));
    ASSERT_NE(copy, nullptr);
    EXPECT_EQ(copy->getName(), "Berta");
    EXPECT_EQ(copy->getValue(), 2U);
}

TEST(CC_PropertyContainer, AssigningCopiesAClassThatComparesLessThanItHolds)
{
    CC_PropertyContainer from;
    CC_PropertyContainer to;
    ASSERT_TRUE(to.set(Rounded(CC_PropertyId::NAME, 11, "eleven")).isOk());
    ASSERT_TRUE(from.set(Rounded(CC_PropertyId::NAME, 12, "twelve")).isOk());
    to = from;
    EXPECT_EQ("12 twelve", VALUE_OF(*to.get(CC_PropertyId::NAME)));
    ASSERT_TRUE(to.set(Rounded(CC_PropertyId::NAME, 13, "thirteen")).isOk());
    EXPECT_EQ("13 thirteen", VALUE_OF(*to.get(CC_PropertyId::NAME)));
}

TEST_F(CC_PropertyContainerWalkTest, AssigningAsksAModulesClassForAClone)
{
    CC_PropertyContainer to(properties);
    EXPECT_EQ(deeds->numberOfClones, 2U) << "to be stored, and as a copy";
    to = properties;
    EXPECT_EQ(deeds->numberOfClones, 3U);
}

TEST_F(CC_PropertyContainerWalkTest, AssigningLeavesOutWhatIsNotCloned)
{
    CC_PropertyContainer to(properties);
    deeds->isClonable = false;
    to = properties;
    EXPECT_EQ(IDS_OF(to), (Ids{CC_PropertyId::NETWORK, CC_PropertyId::DISPLAY}));
}

TEST_F(CC_PropertyContainerWalkTest, AnAssignThatFailsInsideAnotherDoesNotPassForTheOuterOne)
{
    CC_PropertyContainer other;
    std::string const text(100, 'x');
    CC_PropertyString const longer(CC_PropertyId::NAME, text.c_str());
    ASSERT_TRUE(other.set(CC_PropertyString(CC_PropertyId::NAME, "short")).isOk());
    XCode inner;
    deeds->onAssign = [&]
    {
        FailingAllocator::failNth(1);
        inner = other.set(longer);
        FailingAllocator::stop();
    };
    EXPECT_EQ(properties.set(ActingProperty(CC_PropertyId::NAME, 2, deeds)), XCode::OK);
    EXPECT_EQ(inner, XCode::NO_ELEMENT);
}

TEST(CC_PropertyContainer, AnAssignThatFailsIsSeenThoughAnotherSucceedsInsideIt)
{
    /// Sets a container of its own once its base has, or has not, taken the value over.
    class Busy : public CC_PropertyString
    {
    public:
        using CC_PropertyString::CC_PropertyString;
        CC_Property& assign(CC_Property const& other) override
        {
            CC_PropertyString::assign(other);
            FailingAllocator::stop();
            EXPECT_TRUE(m_inner.set(CC_PropertyUnsigned(CC_PropertyId::HOPS, ++m_count)).isOk());
            return *this;
        }
        CC_Property* clone() const override { return new Busy(*this); }

    private:
        CC_PropertyContainer m_inner;
        unsigned int m_count = 0;
    };
    CC_PropertyContainer properties;
    ASSERT_TRUE(properties.set(Busy(CC_PropertyId::NAME, "Anna")).isOk());
    Busy const longer(CC_PropertyId::NAME, std::string(100, 'x').c_str());
    FailingAllocator::failNth(1);
    XCode const result = properties.set(longer);
    FailingAllocator::stop();
    EXPECT_EQ(result, XCode::NO_ELEMENT);
    EXPECT_EQ("Anna", VALUE_OF(*properties.get(CC_PropertyId::NAME)));
}

// --- properties that change the container while it walks -------------------------------------------------------------

TEST_F(CC_PropertyContainerWalkTest, AnEndingPropertyMayRemoveTheNextOneOfAnAssignedContainer)
{
    deeds->onEnd = removing(CC_PropertyId::DISPLAY);
    properties = CC_PropertyContainer::EMPTY();
    EXPECT_TRUE(properties.isEmpty());
}

TEST_F(CC_PropertyContainerWalkTest, AnEndingPropertyMayClearItsContainerOrAddToIt)
{
    deeds->onEnd = clearing();
    properties = CC_PropertyContainer::EMPTY();
    EXPECT_TRUE(properties.isEmpty());

    CC_PropertyContainer other;
    ASSERT_TRUE(other.set(CC_PropertyString(CC_PropertyId::NETWORK, "sip")).isOk());
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NETWORK, "isdn")).isOk());
    ASSERT_TRUE(properties.set(ActingProperty(CC_PropertyId::NAME, 1, deeds)).isOk());
    deeds->onEnd = [this] { EXPECT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::ALERT_INFO, "!")).isOk()); };
    properties = other;
    EXPECT_EQ(IDS_OF(properties), Ids{CC_PropertyId::NETWORK}) << "as clear() does, what it adds goes as well";
    EXPECT_EQ("sip", VALUE_OF(*properties.get(CC_PropertyId::NETWORK)));
}

TEST_F(CC_PropertyContainerWalkTest, AnEndingPropertySeesNothingOfTheNewValues)
{
    CC_PropertyContainer other;
    ASSERT_TRUE(other.set(CC_PropertyString(CC_PropertyId::NETWORK, "sip")).isOk());
    bool isNetworkThere = true;
    deeds->onEnd = [&] { isNetworkThere = properties.get(CC_PropertyId::NETWORK) != nullptr; };
    properties = other;
    EXPECT_FALSE(isNetworkThere) << "all are deleted before the first is copied";
}

TEST_F(CC_PropertyContainerWalkTest, AClonedPropertyMayRemoveOthersOfTheCopiedContainer)
{
    deeds->onClone = removing(CC_PropertyId::DISPLAY);
    EXPECT_EQ(IDS_OF(CC_PropertyContainer(properties)), (Ids{CC_PropertyId::NETWORK, CC_PropertyId::NAME}));
    ASSERT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::DISPLAY, "A")).isOk());
    deeds->onClone = removing(CC_PropertyId::NETWORK);
    EXPECT_EQ(IDS_OF(CC_PropertyContainer(properties)),
              (Ids{CC_PropertyId::NETWORK, CC_PropertyId::NAME, CC_PropertyId::DISPLAY}));
}

TEST_F(CC_PropertyContainerWalkTest, AClonedPropertyMayRemoveItselfFromTheCopiedContainer)
{
    deeds->onClone = removing(CC_PropertyId::NAME);
    EXPECT_EQ(IDS_OF(CC_PropertyContainer(properties)),
              (Ids{CC_PropertyId::NETWORK, CC_PropertyId::NAME, CC_PropertyId::DISPLAY}));
    EXPECT_EQ(IDS_OF(properties), (Ids{CC_PropertyId::NETWORK, CC_PropertyId::DISPLAY}));
}

TEST_F(CC_PropertyContainerWalkTest, AClonedPropertyMayClearTheCopiedContainerOrAddToIt)
{
    deeds->onClone = [this] { EXPECT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::ALERT_INFO, "!")).isOk()); };
    EXPECT_EQ(CC_PropertyContainer(properties).getNumberOfProperties(), 4U);
    deeds->onClone = clearing();
    EXPECT_EQ(IDS_OF(CC_PropertyContainer(properties)), (Ids{CC_PropertyId::NETWORK, CC_PropertyId::NAME}));
}

TEST_F(CC_PropertyContainerWalkTest, AStoredPropertyMayChangeTheContainersOfASelectiveCopy)
{
    CC_PropertyContainer to;
    deeds->onClone = clearing();
    EXPECT_EQ(to.set(properties), XCode::OK);
    EXPECT_EQ(IDS_OF(to), (Ids{CC_PropertyId::NETWORK, CC_PropertyId::NAME}));

    deeds->onClone = [&to] { to.clear(); };
    ASSERT_TRUE(properties.set(ActingProperty(CC_PropertyId::NAME, 1, deeds)).isOk());
    deeds->onAssign = [&] { properties.clear(), to.clear(); };
    ASSERT_TRUE(to.set(ActingProperty(CC_PropertyId::NAME, 2, deeds)).isOk());
    EXPECT_EQ(to.set(properties), XCode::OK);
    EXPECT_TRUE(to.isEmpty());
}

TEST_F(CC_PropertyContainerWalkTest, AnAssignedPropertyMayRemoveTheOneThatIsCopied)
{
    CC_PropertyContainer from;
    ASSERT_TRUE(from.set(CC_PropertyString(CC_PropertyId::NAME, "a text too long to be kept without memory")).isOk());
    ASSERT_TRUE(from.set(CC_PropertyString(CC_PropertyId::DISPLAY, "B")).isOk());
    deeds->onAssign = [&] { from.remove(CC_PropertyId::NAME); };
    EXPECT_EQ(properties.set(from), XCode::OK);
    EXPECT_EQ("B", VALUE_OF(*properties.get(CC_PropertyId::DISPLAY)));
}

TEST_F(CC_PropertyContainerWalkTest, ACloneThatStoresItsIdItselfDoesNotMakeTwoOfIt)
{
    CC_PropertyContainer to;
    deeds->onClone = [&] { EXPECT_TRUE(to.set(CC_PropertyString(CC_PropertyId::NAME, "first")).isOk()); };
    EXPECT_EQ(to.set(*properties.get(CC_PropertyId::NAME)), XCode::OK);
    EXPECT_EQ(IDS_OF(to), Ids{CC_PropertyId::NAME});
}

TEST_F(CC_PropertyContainerWalkTest, ADumpedPropertyMayChangeItsContainer)
{
    deeds->onText = removing(CC_PropertyId::DISPLAY);
    EXPECT_EQ("Properties\n  Network: isdn\n  Name: 1\n", DUMP(properties, 1, 0));
    deeds->onText = [this] { EXPECT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::ALERT_INFO, "!")).isOk()); };
    EXPECT_EQ("Properties\n  Network: isdn\n  Name: 1\n  Alert-Info: !\n", DUMP(properties, 1, 0));
    deeds->onText = removing(CC_PropertyId::NETWORK);
    EXPECT_EQ("Properties\n  Network: isdn\n  Name: 1\n  Alert-Info: !\n", DUMP(properties, 1, 0));
}
