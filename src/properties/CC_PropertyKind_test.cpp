#include "properties/CC_PropertyKind.h"

#include "properties/CC_PropertyClass.h"
#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"

#include <gtest/gtest.h>
#include <utility>

namespace
{
/// One class for each number.
template <int NUMBER>
class Numbered : public CC_PropertyClass<Numbered<NUMBER>>
{
public:
    static constexpr char const* TYPE_NAME = "Numbered";
    static typename CC_PropertyClass<Numbered>::TypeId s_typeId;
    using CC_PropertyClass<Numbered>::CC_PropertyClass;
    Numbered(unsigned int id, unsigned int value) : CC_PropertyClass<Numbered>(id), m_value(value) {}
    String& getValueString(String& out) const override { return out.format("%u", m_value); }
    bool hasSameValue(Numbered const& other) const { return m_value == other.m_value; }
    unsigned int getValue() const { return m_value; }

private:
    unsigned int m_value = 0;
};
template <int NUMBER>
typename CC_PropertyClass<Numbered<NUMBER>>::TypeId Numbered<NUMBER>::s_typeId;

using Declared = Numbered<0>;
using Other = Numbered<1>;

/// More than the base that is declared.
class Derived : public Declared
{
public:
    using Declared::Declared;
};

template <int... NUMBERS>
unsigned int declareAll(std::integer_sequence<int, NUMBERS...>)
{
    return (0u + ... + (CC_PropertyKind::DECLARE<Numbered<100 + NUMBERS>>().isOk() ? 1 : 0));
}
} // namespace

TEST(CC_PropertyKind, AModulesClassIsOfNoKindUnlessItWasDeclared)
{
    EXPECT_EQ(CC_PropertyKind::OF(Other(CC_PropertyId::NAME, 1)), nullptr);
    EXPECT_NE(CC_PropertyKind::OF(CC_PropertyString(CC_PropertyId::NAME, "x")), nullptr);
    ASSERT_TRUE(CC_PropertyKind::DECLARE<Declared>().isOk());
    EXPECT_TRUE(CC_PropertyKind::DECLARE<Declared>().isOk()) << "by a second module of the process";
    CC_PropertyKind const* const kind = CC_PropertyKind::OF(Declared(CC_PropertyId::NAME, 1));
    ASSERT_NE(kind, nullptr);
    EXPECT_TRUE(kind->isSelfContained);
    EXPECT_EQ(kind->place, CC_PropertyKind::NO_PLACE);
    EXPECT_EQ(CC_PropertyKind::OF(Derived(CC_PropertyId::NAME, 1)), nullptr) << "of this nothing was promised";
}

TEST(CC_PropertyKind, ADeclaredClassIsComparedAndAssignedAsByItsOperations)
{
    ASSERT_TRUE(CC_PropertyKind::DECLARE<Declared>().isOk());
    Declared stored(CC_PropertyId::NAME, 1);
    Declared const other(CC_PropertyId::NAME, 2);
    CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(stored, other);
    ASSERT_NE(kind, nullptr);
    EXPECT_FALSE(kind->isEqual(stored, other));
    EXPECT_TRUE(kind->assign(stored, other));
    EXPECT_EQ(stored.getValue(), 2u);
    EXPECT_TRUE(kind->isEqual(stored, other));
    EXPECT_TRUE(kind->assign(stored, stored));
    EXPECT_EQ(CC_PropertyKind::OF_BOTH(stored, Derived(CC_PropertyId::NAME, 2)), nullptr);
}

TEST(CC_PropertyKind, AContainerIsTroubledByAClassThatWasNotDeclaredAlone)
{
    ASSERT_TRUE(CC_PropertyKind::DECLARE<Declared>().isOk());
    CC_PropertyContainer from;
    ASSERT_TRUE(from.set(Declared(CC_PropertyId::NAME, 1)).isOk());
    EXPECT_TRUE(from.isSelfContained());
    CC_PropertyContainer to(from);
    CC_Property const* const stored = to.get(CC_PropertyId::NAME);
    ASSERT_TRUE(from.set(Declared(CC_PropertyId::NAME, 2)).isOk());
    to = from;
    EXPECT_EQ(to.get(CC_PropertyId::NAME), stored) << "it took the value over where it stands";
    EXPECT_TRUE(stored->isEqual(Declared(CC_PropertyId::NAME, 2)));
    ASSERT_TRUE(from.set(Other(CC_PropertyId::DISPLAY, 1)).isOk());
    EXPECT_FALSE(from.isSelfContained());
}

TEST(CC_PropertyKind, ThereIsRoomForHalfAHundredClasses)
{
    unsigned int const declared = declareAll(std::make_integer_sequence<int, 60>());
    EXPECT_GE(declared, 48u); // others of this program have some
    EXPECT_LT(declared, 60u);
    EXPECT_FALSE(CC_PropertyKind::DECLARE<Numbered<2>>().isOk());
    EXPECT_EQ(CC_PropertyKind::OF(Numbered<2>(CC_PropertyId::NAME, 1)), nullptr);
    EXPECT_TRUE(CC_PropertyKind::DECLARE<Numbered<100>>().isOk()) << "which was declared";
}
