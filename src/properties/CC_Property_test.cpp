#include "properties/CC_Property.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "tests/support/PropertyTesting.h"

#include <cstddef>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <thread>
#include <type_traits>

namespace
{
/// A property that leaves everything to the base that it may.
class Bare : public CC_Property
{
public:
    using CC_Property::CC_Property;
    CC_Property& assign(CC_Property const&) override { return *this; }
    CC_Property* clone() const override { return nullptr; }
    String& getValueString(String& out) const override { return out = "bare"; }
    bool isEqual(CC_Property const&) const override { return false; }
};

class Linked : public LinkedListManager<CC_Property>
{
public:
    explicit Linked(CC_Property* property) { EXPECT_TRUE(append(property).isOk()); }
};
} // namespace

TEST(CC_Property, EveryObjectOfEveryClassIsCounted)
{
    unsigned int const before = CC_Property::s_numberOfInstances;
    {
        CC_PropertyBoolean const boolean(CC_PropertyId::PROVIDES_DATA);
        CC_PropertyString const string(CC_PropertyId::NAME, "n");
        CC_PropertyString const copy(string);
        EXPECT_EQ(before + 3, CC_Property::s_numberOfInstances);
        delete boolean.clone();
        EXPECT_EQ(before + 3, CC_Property::s_numberOfInstances);
    }
    EXPECT_EQ(before, CC_Property::s_numberOfInstances);
}

TEST(CC_Property, ACopyIsInNoList)
{
    auto* const listed = new CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true);
    Linked const list(listed);
    CC_PropertyBoolean const copy(*listed);
    EXPECT_TRUE(listed->isLinked());
    EXPECT_FALSE(copy.isLinked());
    EXPECT_EQ(CC_PropertyId::PROVIDES_DATA, copy.getId());
}

TEST(CC_Property, CopyingOverAListedOneLeavesItInItsList)
{
    auto* const listed = new CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA);
    Linked const list(listed);
    *listed = CC_PropertyBoolean(CC_PropertyId::ENDPOINT_IS_ISDN, true);
    EXPECT_TRUE(listed->isLinked());
    EXPECT_EQ(1U, list.getCount());
    EXPECT_EQ(CC_PropertyId::ENDPOINT_IS_ISDN, listed->getId());
    EXPECT_TRUE(listed->getValue());

    CC_PropertyBoolean const& same = *listed;
    *listed = same;
    EXPECT_EQ(CC_PropertyId::ENDPOINT_IS_ISDN, listed->getId());
}

TEST(CC_Property, TheBaseHasANameATypeAndRefusesText)
{
    Bare bare(CC_PropertyId::NAME);
    EXPECT_STREQ("Property", bare.getTypeName());
    EXPECT_EQ(CC_Property::TYPE_ID(), bare.getTypeId());
    EXPECT_TRUE(bare.isOfType(CC_Property::TYPE_ID()));
    EXPECT_FALSE(bare.isOfType(CC_PropertyBoolean::TYPE_ID()));
    EXPECT_EQ("Invalid value", REFUSAL_OF(bare, "bare"));
}

TEST(CC_Property, AnIdBesideTheTableIsUnknown)
{
    Bare const bare(0x400fff);
    EXPECT_STREQ("(unknown)", bare.getPropertyName());
    EXPECT_STREQ("(unknown)", bare.getPropertyShortName());
}

TEST(CC_Property, TypeNumbersAreAssignedInTheOrderOfAsking)
{
    CC_PropertyTypeNumber first;
    CC_PropertyTypeNumber second;
    unsigned int const number = first.get();
    EXPECT_EQ(number + 1, second.get());
    EXPECT_EQ(number, first.get());
    EXPECT_EQ(0xffffffffU, CC_Property::NO_TYPE_ID);
}

// nobody else gives a class another's number
static_assert(!std::is_assignable_v<decltype(CC_PropertyString::s_typeId)&, unsigned int>);
static_assert(!std::is_copy_assignable_v<decltype(CC_PropertyString::s_typeId)>);
static_assert(!std::is_move_assignable_v<decltype(CC_PropertyString::s_typeId)>);

TEST(CC_Property, OwnersOnSeveralThreadsAreAllCounted)
{
    unsigned int const before = CC_Property::s_numberOfInstances;
    std::unique_ptr<CC_Property> kept[2];
    auto const make = [](std::unique_ptr<CC_Property>& last)
    {
        for (unsigned int i = 0; i < 20000; ++i)
            last = std::make_unique<CC_PropertyUnsigned>(CC_PropertyId::HOPS, i);
    };
    {
        std::jthread const one([&] { make(kept[0]); });
        std::jthread const other([&] { make(kept[1]); });
    }
    EXPECT_EQ(before + 2, CC_Property::s_numberOfInstances);
    kept[0].reset();
    kept[1].reset();
    EXPECT_EQ(before, CC_Property::s_numberOfInstances);
}

TEST(CC_Property, ADumpNamesTheClassWhileMoreDetailIsWanted)
{
    CC_PropertyBoolean const property(CC_PropertyId::PROVIDES_DATA, true);
    EXPECT_EQ("Provides Data: true (Boolean)\n", DUMP(property, 0, 1));
    EXPECT_EQ("Provides Data: true\n", DUMP(property, 0, 0));
    EXPECT_EQ("peer Provides Data: true\n", DUMP(property, 5, 0, "peer "));
}

TEST(CC_Property, ADumpBeyondItsLimitsAddsNothing)
{
    CC_PropertyBoolean const property(CC_PropertyId::PROVIDES_DATA, true);
    InfoContainer info;
    property.getInfo(info, 1, 2, 9, 0, ""); // too deep
    property.getInfo(info, 9, 0, 1, 2, ""); // too fine
    property.getInfo(info, 1, 2, 2, 2, "");
    EXPECT_EQ(0U, info.getNumberOfEntries());
    property.getInfo(info, 2, 2, 3, 3, "");
    ASSERT_EQ(1U, info.getNumberOfEntries());
    EXPECT_EQ(2U, info.getEntry(0).level);
    EXPECT_EQ(3U, info.getEntry(0).detail);
}

TEST(CC_Property, ADumpPrintsNoneForAnEmptyText)
{
    CC_PropertyString const property(CC_PropertyId::NAME);
    EXPECT_EQ("Name: (none)\n", DUMP(property, 0, 0));
    EXPECT_EQ("Name: (none) (String)\n", DUMP(property, 0, 1));
}

TEST(CC_Property, ADumpWithoutMemorySaysSo)
{
    CC_PropertyString const property(CC_PropertyId::NAME, std::string(100, 'n').c_str());
    String const prefix("a prefix that needs memory ");
    InfoContainer* info = nullptr;
    auto const dump = [&]
    {
        {
            FailingAllocator::Pause const unseen;
            delete info;
            info = new InfoContainer;
        }
        property.getInfo(*info, 9, 0, 9, 0, prefix);
    };
    auto const check = [&]
    {
        bool const isMarked = info->getNumberOfEntries() == 1 && info->getEntry(0).text == "(out of memory)";
        EXPECT_TRUE(isMarked || info->isIncomplete());
    };
    EXPECT_LT(2U, WITH_EACH_ALLOCATION_FAILING(dump, check));
    EXPECT_FALSE(info->isIncomplete());
    EXPECT_EQ(1U, info->getNumberOfEntries());
    delete info;
}

TEST(CC_Property, ARefusalWithoutMemoryHasNoMessage)
{
    CC_PropertyBoolean property(CC_PropertyId::PROVIDES_DATA);
    String const text("neither");
    String error;
    XCode result;
    FailingAllocator::failNth(1);
    result = property.setValueString(error, text);
    FailingAllocator::stop();
    EXPECT_TRUE(FailingAllocator::hasFailed());
    EXPECT_EQ(XCode::FAILURE, result);
    EXPECT_TRUE(error.isEmpty());
}

// modules are compiled against this order: operations are appended, never inserted
TEST(CC_Property, VirtualOperationsKeepTheirSlots)
{
    std::size_t const first = SLOT_OF(&CC_Property::assign); // behind the destructor
    EXPECT_EQ(first + 1, SLOT_OF(&CC_Property::clone));
    EXPECT_EQ(first + 2, SLOT_OF(&CC_Property::getTypeId));
    EXPECT_EQ(first + 3, SLOT_OF(&CC_Property::getTypeName));
    EXPECT_EQ(first + 4, SLOT_OF(&CC_Property::isOfType));
    EXPECT_EQ(first + 5, SLOT_OF(&CC_Property::getValueString));
    EXPECT_EQ(first + 6, SLOT_OF(&CC_Property::setValueString));
    EXPECT_EQ(first + 7, SLOT_OF(&CC_Property::isEqual));
    EXPECT_EQ(first + 8, SLOT_OF(&CC_Property::getInfo));
    EXPECT_EQ(first + 9, SLOT_OF(&CC_PropertyUnsigned::getValue));
    EXPECT_EQ(first + 10, SLOT_OF(&CC_PropertyUnsigned::setValue));
}
