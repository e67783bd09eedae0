#include "properties/CC_PropertyClass.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <typeinfo>

namespace
{
/// A class as a module would write it, from two fields.
class Point : public CC_PropertyClass<Point>
{
public:
    static constexpr char const* TYPE_NAME = "Point";
    static TypeId s_typeId;
    using CC_PropertyClass::CC_PropertyClass;
    Point(unsigned int id, int x, int y) : CC_PropertyClass(id), m_x(x), m_y(y) {}
    String& getValueString(String& out) const override { return out.format("%d/%d", m_x, m_y); }
    bool hasSameValue(Point const& other) const { return m_x == other.m_x && m_y == other.m_y; }

private:
    int m_x = 0;
    int m_y = 0;
};
Point::TypeId Point::s_typeId;

/// Extends a class of the library.
class Title : public CC_PropertyClass<Title, CC_PropertyString>
{
public:
    static constexpr char const* TYPE_NAME = "Title";
    static TypeId s_typeId;
    using CC_PropertyClass::CC_PropertyClass;
    String& getValueString(String& out) const override { return out = String("Dr. ") + getValue(); }
};
Title::TypeId Title::s_typeId;

/// Forgot its variable.
class Forgetful : public CC_PropertyClass<Forgetful, CC_PropertyUnsigned>
{
};

static_assert(HAS_OWN_TYPE_ID<Title>);
static_assert(HAS_OWN_TYPE_ID<Point>);
static_assert(!HAS_OWN_TYPE_ID<Forgetful>, "would share its base's number");
} // namespace

TEST(CC_PropertyClass, AClassOfItsOwnWorksAsTheLibrarysDo)
{
    Point point(CC_PropertyId::NAME, 1, 2);
    std::unique_ptr<CC_Property> const clone(point.clone());
    ASSERT_NE(nullptr, dynamic_cast<Point const*>(clone.get()));
    EXPECT_TRUE(point.isEqual(*clone));
    EXPECT_STREQ("Point", clone->getTypeName());
    EXPECT_EQ(Point::TYPE_ID(), clone->getTypeId());

    EXPECT_EQ(&point, &point.assign(Point(CC_PropertyId::DISPLAY, 3, 4)));
    EXPECT_EQ("3/4", VALUE_OF(point));
    EXPECT_EQ(CC_PropertyId::DISPLAY, point.getId());
    EXPECT_FALSE(point.isEqual(*clone));
    EXPECT_EQ("0/0", VALUE_OF(Point(CC_PropertyId::NAME)));
    EXPECT_EQ("Invalid value", REFUSAL_OF(point, "5/6"));
}

TEST(CC_PropertyClass, AssigningAnotherClassChangesNothing)
{
    CC_PropertyBoolean boolean(CC_PropertyId::PROVIDES_DATA, true);
    EXPECT_EQ(&boolean, &boolean.assign(CC_PropertyString(CC_PropertyId::NAME, "false")));
    EXPECT_TRUE(boolean.getValue());
    EXPECT_EQ(CC_PropertyId::PROVIDES_DATA, boolean.getId());
}

TEST(CC_PropertyClass, ADerivedClassCountsAsItsBaseButNotTheOtherWayRound)
{
    CC_PropertyString string(CC_PropertyId::NAME, "Who");
    Title title(CC_PropertyId::DISPLAY, "Who");
    EXPECT_TRUE(title.isOfType(Title::TYPE_ID()));
    EXPECT_TRUE(title.isOfType(CC_PropertyString::TYPE_ID()));
    EXPECT_TRUE(title.isOfType(CC_Property::TYPE_ID()));
    EXPECT_FALSE(string.isOfType(Title::TYPE_ID()));
    EXPECT_NE(Title::TYPE_ID(), CC_PropertyString::TYPE_ID());

    EXPECT_TRUE(string.isEqual(title));
    EXPECT_FALSE(title.isEqual(string));

    title.setValue("Else");
    string.assign(title);
    EXPECT_EQ("Else", VALUE_OF(string));
    EXPECT_EQ(CC_PropertyId::DISPLAY, string.getId());
    title.assign(CC_PropertyString(CC_PropertyId::NAME, "Nobody"));
    EXPECT_EQ("Dr. Else", VALUE_OF(title));

    std::unique_ptr<CC_Property> const clone(title.clone());
    CC_Property const& cloned = *clone;
    EXPECT_EQ(typeid(Title), typeid(cloned));
}

TEST(CC_PropertyClass, AssigningWithoutMemoryChangesNothingAndCanBeLearned)
{
    std::string const text(100, 'x');
    CC_PropertyString const longer(CC_PropertyId::DISPLAY, text.c_str());
    Title const title(CC_PropertyId::DISPLAY, text.c_str());
    for (CC_Property const* const other :
         {static_cast<CC_Property const*>(&longer), static_cast<CC_Property const*>(&title)})
    {
        CC_PropertyString stored(CC_PropertyId::NAME, "stored");
        XCode result;
        unsigned long const failures =
            WITH_EACH_ALLOCATION_FAILING([&] { result = CC_Property::ASSIGN(stored, *other); },
                                         [&]
                                         {
                                             EXPECT_EQ(XCode::NO_ELEMENT, result);
                                             EXPECT_EQ("stored", VALUE_OF(stored));
                                             EXPECT_EQ(CC_PropertyId::NAME, stored.getId());
                                         });
        EXPECT_EQ(1U, failures);
        EXPECT_EQ(XCode::OK, result);
        EXPECT_EQ(text, VALUE_OF(stored));
    }
}

TEST(CC_PropertyClass, AnotherClassIsNoFailureOfMemory)
{
    CC_PropertyBoolean boolean(CC_PropertyId::PROVIDES_DATA, true);
    EXPECT_EQ(XCode::OK, CC_Property::ASSIGN(boolean, CC_PropertyString(CC_PropertyId::NAME, "false")));
    EXPECT_TRUE(boolean.getValue());
}

TEST(CC_PropertyClass, CloningALongTextWithoutMemoryGivesNull)
{
    CC_PropertyString const property(CC_PropertyId::NAME, std::string(100, 'x').c_str());
    CC_Property* clone = nullptr;
    unsigned long const failures =
        WITH_EACH_ALLOCATION_FAILING([&] { clone = property.clone(); }, [&] { EXPECT_EQ(nullptr, clone); });
    EXPECT_EQ(2U, failures); // the object, the text
    ASSERT_NE(nullptr, clone);
    EXPECT_TRUE(clone->isEqual(property));
    delete clone;
}
