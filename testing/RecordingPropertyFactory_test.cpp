#include "testing/RecordingPropertyFactory.h"

#include "callcontrol/CallControl.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"

#include <gtest/gtest.h>
#include <memory>

TEST(RecordingPropertyFactory, MakesStringsOfTheIdsThatItNames)
{
    RecordingPropertyFactory factory("f", {CC_PropertyId::URI, CC_PropertyId::SIP_HEADERS});
    EXPECT_TRUE(CallControl::ADD_PROPERTY_FACTORY(&factory).isOk());
    std::unique_ptr<CC_Property> const property(CallControl::CREATE_PROPERTY(CC_PropertyId::SIP_HEADERS));
    EXPECT_EQ(CallControl::CREATE_PROPERTY(CC_PropertyId::NAME), nullptr);
    CallControl::REMOVE_PROPERTY_FACTORY(&factory);
    ASSERT_NE(property, nullptr);
    EXPECT_EQ(property->getTypeId(), CC_PropertyString::TYPE_ID());
    EXPECT_EQ(factory.take(), Lines{"f: create SIP Headers"});
}

TEST(RecordingPropertyFactory, MakesWhatTheTestSays)
{
    RecordingPropertyFactory factory("f", {CC_PropertyId::URI});
    factory.m_create = [](unsigned int id) { return new CC_PropertyBoolean(id, true); };
    std::unique_ptr<CC_Property> const property(factory.createProperty(CC_PropertyId::URI));
    EXPECT_EQ(property->getTypeId(), CC_PropertyBoolean::TYPE_ID());
    TYVector<unsigned int> ids;
    EXPECT_TRUE(ids.append(1).isOk());
    factory.getPropertyIds(ids);
    ASSERT_EQ(ids.getSize(), 2u);
    EXPECT_EQ(ids[1], CC_PropertyId::URI);
}
