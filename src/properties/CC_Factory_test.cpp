#include "properties/CC_Factory.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyQoS.h"
#include "properties/CC_PropertyTable.h"
#include "properties/CC_PropertyUnsigned.h"
#include "tests/support/PropertyTesting.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <map>
#include <memory>
#include <string>
#include <tuple>
#include <typeinfo>
#include <vector>

namespace
{
/// A class of its own that no property of the table is of.
class Stranger : public CC_PropertyClass<Stranger>
{
public:
    static constexpr char const* TYPE_NAME = "Stranger";
    static inline TypeId s_typeId;
    using CC_PropertyClass::CC_PropertyClass;
    String& getValueString(String& out) const override { return out = "?"; }
    bool hasSameValue(Stranger const&) const { return true; }
};

std::vector<unsigned int> IDS_OF(CC_Factory const& factory)
{
    TYVector<unsigned int> ids;
    factory.getPropertyIds(ids);
    return std::vector<unsigned int>(ids.begin(), ids.end());
}
} // namespace

TEST(CC_Factory, ListsItsIdsInTheirFixedOrder)
{
    std::vector<unsigned int> expected = {0x400100, 0x400101};
    for (unsigned int id = 0x400200; id <= 0x40021e; ++id)
        if (id != 0x40020f)
            expected.push_back(id);
    expected.insert(expected.end(),
                    {0x400227, 0x400228, 0x40021f, 0x400220, 0x400221, 0x400222, 0x400223, 0x400224, 0x400400,
                     0x400225, 0x400401, 0x400402, 0x400801, 0x400802, 0x400803, 0x400804, 0x40022a, 0x40022b,
                     0x40022c, 0x40022d, 0x40022e, 0x401000, 0x400229, 0x401001, 0x401003});
    EXPECT_EQ(57U, expected.size());
    EXPECT_EQ(expected, IDS_OF(CC_Factory()));
}

TEST(CC_Factory, AppendsBehindIdsThatTheVectorHolds)
{
    TYVector<unsigned int> ids;
    ASSERT_TRUE(ids.append(7).isOk());
    CC_Factory().getPropertyIds(ids);
    ASSERT_EQ(58U, ids.getSize());
    EXPECT_EQ(7U, ids[0]);
    EXPECT_EQ(CC_PropertyId::NETWORK, ids[1]);
    EXPECT_EQ(CC_PropertyId::STATE, ids[57]);
}

TEST(CC_Factory, WithoutMemoryNoIdIsListed)
{
    TYVector<unsigned int> ids;
    unsigned long const failures =
        WITH_EACH_ALLOCATION_FAILING([&] { CC_Factory().getPropertyIds(ids); }, [&] { EXPECT_TRUE(ids.isEmpty()); });
    EXPECT_EQ(1U, failures);
    EXPECT_EQ(57U, ids.getSize());
}

TEST(CC_Factory, UriSipHeadersAndQualityOfServiceAreNamedButNotCreated)
{
    CC_Factory factory;
    for (unsigned int const id : {CC_PropertyId::URI, CC_PropertyId::SIP_HEADERS, CC_PropertyId::QUALITY_OF_SERVICE})
    {
        EXPECT_EQ(nullptr, factory.createProperty(id));
        EXPECT_STRNE("(unknown)", CC_PropertyBoolean(id).getPropertyName());
        EXPECT_STRNE("(unknown)", CC_PropertyBoolean(id).getPropertyShortName());
    }
}

TEST(CC_Factory, AnUnknownIdIsNotCreated)
{
    CC_Factory factory;
    for (unsigned int const id : {0U, 0x400000U, 0x40022fU, 0xffffffffU})
        EXPECT_EQ(nullptr, factory.createProperty(id)) << std::hex << id;
}

TEST(CC_Factory, CapabilitiesBeginTrueAndEveryOtherBooleanFalse)
{
    CC_Factory factory;
    for (unsigned int const id : IDS_OF(factory))
    {
        std::unique_ptr<CC_Property> const property(factory.createProperty(id));
        auto const* const boolean = dynamic_cast<CC_PropertyBoolean const*>(property.get());
        if (boolean == nullptr)
            continue;
        bool const isCapability = id == CC_PropertyId::SUPPORTS_OVERLAP_RECEIVING ||
                                  id == CC_PropertyId::SUPPORTS_OVERLAP_SENDING ||
                                  id == CC_PropertyId::ALLOWS_PUSH_BACK;
        EXPECT_EQ(isCapability, boolean->getValue()) << std::hex << id;
    }
}

TEST(CC_Factory, AnIdMayBeCreatedWithoutHavingAName)
{
    std::unique_ptr<CC_Property> const property(CC_Factory().createProperty(CC_PropertyId::UNNAMED_BOOLEAN));
    ASSERT_NE(nullptr, property);
    EXPECT_STREQ("(unknown)", property->getPropertyName());
    EXPECT_STREQ("(unknown)", property->getPropertyShortName());
}

TEST(CC_Factory, EveryClassClonesComparesAndAssignsAsItself)
{
    CC_Factory factory;
    Stranger const stranger(CC_PropertyId::NAME);
    for (unsigned int const id : IDS_OF(factory))
    {
        std::unique_ptr<CC_Property> const original(factory.createProperty(id));
        ASSERT_NE(nullptr, original) << std::hex << id;
        SCOPED_TRACE(original->getTypeName());
        std::unique_ptr<CC_Property> const clone(original->clone());
        ASSERT_NE(nullptr, clone);
        CC_Property const& copied = *clone;
        CC_Property const& source = *original;
        EXPECT_EQ(typeid(source), typeid(copied));
        EXPECT_EQ(id, clone->getId());
        EXPECT_FALSE(clone->isLinked());
        EXPECT_TRUE(clone->isEqual(*original));
        EXPECT_TRUE(original->isEqual(*clone));
        EXPECT_TRUE(original->isOfType(CC_Property::TYPE_ID()));
        EXPECT_TRUE(original->isOfType(original->getTypeId()));
        EXPECT_FALSE(original->isOfType(stranger.getTypeId()));

        EXPECT_FALSE(original->isEqual(stranger));
        EXPECT_FALSE(stranger.isEqual(*original));
        EXPECT_EQ(original.get(), &original->assign(stranger));
        EXPECT_EQ(id, original->getId());
        EXPECT_TRUE(original->isEqual(*clone));
        EXPECT_EQ(original.get(), &original->assign(*original));
        EXPECT_TRUE(original->isEqual(*clone));
    }
}

TEST(CC_Factory, EveryClassHasATypeNumberOfItsOwn)
{
    CC_Factory factory;
    std::map<unsigned int, std::string> names = {{CC_Property::TYPE_ID(), "Property"}};
    for (unsigned int const id : IDS_OF(factory))
    {
        std::unique_ptr<CC_Property> const property(factory.createProperty(id));
        ASSERT_NE(nullptr, property) << std::hex << id;
        auto const added = names.emplace(property->getTypeId(), property->getTypeName());
        EXPECT_EQ(added.first->second, property->getTypeName());
        EXPECT_GT(CC_Property::NO_TYPE_ID, property->getTypeId());
    }
    EXPECT_EQ(23U, names.size()); // twenty-two value classes and the base
}

// this test is another object than the library: both have to use the same variable
TEST(CC_Factory, TypeNumbersAgreeAcrossSharedObjects)
{
    CC_Factory factory;
    std::unique_ptr<CC_Property> const boolean(factory.createProperty(CC_PropertyId::PROVIDES_DATA));
    std::unique_ptr<CC_Property> const number(factory.createProperty(CC_PropertyId::HOPS));
    EXPECT_EQ(CC_PropertyBoolean::TYPE_ID(), boolean->getTypeId());
    EXPECT_EQ(CC_PropertyUnsigned::TYPE_ID(), number->getTypeId());
    EXPECT_TRUE(number->isOfType(CC_PropertyUnsigned::TYPE_ID()));
    EXPECT_FALSE(number->isOfType(CC_PropertyBoolean::TYPE_ID()));
}

TEST(CC_Factory, WithoutMemoryNothingIsCreated)
{
    CC_Factory factory;
    for (unsigned int i = 0; i < CC_PropertyTable::NUMBER_OF_IDS; ++i)
    {
        CC_PropertyTable::Row const& row = CC_PropertyTable::GET_ROW(i);
        if (row.create == nullptr || row.id == CC_PropertyId::CONTEXT)
            continue; // the context's repository is the media layer's
        FailingAllocator::failNth(1);
        CC_Property* const property = factory.createProperty(row.id);
        FailingAllocator::stop();
        EXPECT_EQ(nullptr, property) << std::hex << row.id;
    }
}

TEST(CC_Factory, ClonesOfFreshPropertiesTakeOneAllocationAndMayFindNone)
{
    CC_Factory factory;
    for (unsigned int const id : IDS_OF(factory))
    {
        std::unique_ptr<CC_Property> const property(factory.createProperty(id));
        ASSERT_NE(nullptr, property) << std::hex << id;
        SCOPED_TRACE(property->getTypeName());
        CC_Property* clone = nullptr;
        unsigned long const failures =
            WITH_EACH_ALLOCATION_FAILING([&] { clone = property->clone(); }, [&] { EXPECT_EQ(nullptr, clone); });
        EXPECT_EQ(1U, failures);
        EXPECT_NE(nullptr, clone);
        delete clone;
    }
}

// in a process of its own, as ctest runs it, nobody has asked before
TEST(CC_Factory, RegisteringItGivesEveryClassItsTypeNumber)
{
    CC_Factory factory;
    std::ignore = IDS_OF(factory);
    unsigned int const next = Stranger::TYPE_ID();
    for (unsigned int const id : IDS_OF(factory))
    {
        std::unique_ptr<CC_Property> const property(factory.createProperty(id));
        ASSERT_NE(nullptr, property) << std::hex << id;
        EXPECT_LT(property->getTypeId(), next) << property->getTypeName();
    }
    EXPECT_LT(CC_Property::TYPE_ID(), next);
    EXPECT_LT(CC_PropertyQoS::TYPE_ID(), next);
}
