#include "testing/RecordingPropertyFilter.h"

#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"

#include <gtest/gtest.h>

TEST(RecordingPropertyFilter, ItsClonesDoAndRecordTheSame)
{
    RecordingPropertyFilter filter("f");
    filter.onApply(
        [](CC_PropertyContainer& properties)
        {
            properties.remove(CC_PropertyId::NAME);
            return XCode::REFUSED;
        });
    CC_PropertyContainer properties;
    EXPECT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NAME, "n")).isOk());
    {
        CC_PropertyFilterContainer filters;
        EXPECT_TRUE(filters.addFilter(filter).isOk());
        EXPECT_EQ(filter.getNumberOfClones(), 1u);
        EXPECT_EQ(filter.getNumberAlive(), 2u);
        EXPECT_EQ(filters.applyFilters(properties), XCode::REFUSED);
        EXPECT_EQ(filters.applyFilters(properties), XCode::REFUSED);
    }
    EXPECT_EQ(filter.getNumberAlive(), 1u);
    EXPECT_EQ(filter.take(), (Lines{"f: apply (Name)", "f: apply ()"}));
}

TEST(RecordingPropertyFilter, CanRefuseToBeCloned)
{
    RecordingPropertyFilter filter("f");
    filter.refuseClones(true);
    CC_PropertyFilterContainer filters;
    EXPECT_EQ(filters.addFilter(filter), XCode::NO_ELEMENT);
    EXPECT_EQ(filter.getNumberOfClones(), 0u);
    filter.refuseClones(false);
    EXPECT_EQ(filters.addFilter(filter), XCode::OK);
}

TEST(RecordingPropertyFilter, WithoutAHookItLeavesEverything)
{
    RecordingPropertyFilter const filter("f");
    CC_PropertyContainer properties;
    EXPECT_TRUE(properties.set(CC_PropertyString(CC_PropertyId::NAME, "n")).isOk());
    EXPECT_EQ(filter.apply(properties), XCode::OK);
    EXPECT_EQ(properties.getNumberOfProperties(), 1u);
    InfoContainer info;
    filter.getInfo(info, 0, 0, 0, 0, "a ");
    ASSERT_EQ(info.getNumberOfEntries(), 1u);
    EXPECT_EQ(info.getEntry(0).key, "a Filter");
    EXPECT_EQ(info.getEntry(0).text, "f");
}
