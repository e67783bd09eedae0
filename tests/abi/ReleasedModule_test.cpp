// A module built with the headers of a release, in calls with one of today.
#include "ReleasedModule.h"

#include "callcontrol/CallControl.h"
#include "callcontrol/provider/CC_Provider.h"
#include "properties/CC_PropertyId.h"
#include "testing/CallControlFixture.h"
#include "testing/FakeModule.h"

#include <dlfcn.h>
#include <gtest/gtest.h>

using State = FakeModule::State;

namespace
{
struct ReleasedModules : testing::Test, CallControlFixture
{
    void SetUp() override
    {
        void* const library =
            dlopen(RELEASED_MODULE, RTLD_NOW | RTLD_LOCAL); // stays: its classes have numbers for good
        ASSERT_NE(library, nullptr) << dlerror();
        auto const make = reinterpret_cast<MakeReleasedModule>(dlsym(library, "makeReleasedModule"));
        ASSERT_NE(make, nullptr) << dlerror();
        module = make();
        auto* const provider = static_cast<CC_Provider*>(module->getProvider());
        ASSERT_EQ(CallControl::ADD_PROVIDER("SWITCH", "released", *provider), XCode::OK);
    }
    void TearDown() override
    {
        if (module == nullptr)
            return;
        module->hangUp();
        settle();
        CallControl::REMOVE_PROVIDER("SWITCH", "released");
        module->end();
    }
    std::string story()
    {
        settle();
        return module->takeStory();
    }

    ReleasedModule const* module = nullptr;
};
} // namespace

TEST_F(ReleasedModules, TakeACall)
{
    FakeModule anna("anna");
    anna.setNumber("4420791234");
    ASSERT_EQ(anna.dial("released", "4989123", {}, {}, {}), XCode::OK);
    EXPECT_EQ(story(),
              "provider released, provider anna, call with 0 legs, offer 4989123 with 1 number, peer CONNECTED");
    EXPECT_EQ(anna.getPeerValue(CC_PropertyId::NAME), "Bert");
    EXPECT_EQ(anna.getPeerValue(CC_PropertyId::E164_NUMBER), "4989123");
    EXPECT_EQ(anna.getPeerState(), "TRYING");
    module->answer();
    EXPECT_EQ(story(), "turned");
    EXPECT_EQ(anna.getPeerState(), "CONNECTED");
    EXPECT_EQ(anna.say(CC_PropertyId::DISPLAY, "hello"), XCode::OK);
    anna.key("12");
    EXPECT_EQ(story(), "digits 12, display filtered");
    module->hangUp();
    settle();
    EXPECT_EQ(anna.getPeerState(), "RELEASED");
    EXPECT_EQ(anna.getPeerValue(CC_PropertyId::CAUSE), "Normal call clearing (200)");
    anna.hangUp();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(), 0u);
}

TEST_F(ReleasedModules, PlaceACall)
{
    FakeModule bert("bert");
    story();
    ASSERT_EQ(module->dial("bert"), XCode(XCode::OK).getValue());
    EXPECT_EQ(bert.become(State::CONNECTED), XCode::OK);
    EXPECT_EQ(bert.say(CC_PropertyId::NAME, "Bert"), XCode::OK);
    EXPECT_EQ(story(), "call with 0 legs, peer CONNECTED, name Bert");
    EXPECT_EQ(bert.getPeerValue(CC_PropertyId::NAME), "Ada");
    EXPECT_EQ(bert.getPeerValue(0x4018fe), "trunk 7") << "a class that the library does not know";
    bert.hangUp();
    EXPECT_EQ(story(), "peer RELEASED");
}
