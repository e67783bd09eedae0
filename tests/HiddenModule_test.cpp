// A module in its own shared object, built with hidden symbols: type numbers, casts and observers agree with ours.
#include "HiddenModule.h"
#include "services/CC_ServiceUserInput.h"
#include "testing/CallControlFixture.h"
#include "tests/support/Party.h"

#include <dlfcn.h>
#include <gtest/gtest.h>

namespace
{
class HiddenModules : public testing::Test
{
protected:
    void SetUp() override
    {
        m_library = dlopen(HIDDEN_MODULE, RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(m_library, nullptr) << dlerror();
        auto const make = reinterpret_cast<MakeHiddenModule>(dlsym(m_library, "makeHiddenModule"));
        ASSERT_NE(make, nullptr);
        module.reset(make());
        ASSERT_EQ(CallControl::ADD_PROVIDER("SWITCH", "hidden", module->getProvider()), XCode::OK);
    }
    void TearDown() override
    {
        CallControl::REMOVE_PROVIDER("SWITCH", "hidden");
        fixture.m_loop.settle();
        module.reset(); // the shared object itself stays: its property class has a number for good
    }

    CallControlFixture fixture;
    std::unique_ptr<HiddenModule> module;

private:
    void* m_library = nullptr;
};

TEST_F(HiddenModules, TypeNumbersAreTheSameOnBothSides)
{
    EXPECT_EQ(module->getTypeIdOfString(), CC_PropertyString::TYPE_ID());
    EXPECT_EQ(module->getTypeIdOfState(), CC_PropertyCallLegState::TYPE_ID());
    EXPECT_EQ(module->getTypeOfUserInput(), CC_ServiceUserInput::TYPE());
    EXPECT_NE(module->getTypeIdOfOwnClass(), CC_PropertyString::TYPE_ID());
    EXPECT_NE(module->getTypeIdOfOwnClass(), CC_PropertyCallLegState::TYPE_ID());
}

TEST_F(HiddenModules, ACallWithTheModuleWorksInBothDirections)
{
    Party anna("anna");
    CC_PropertyContainer offer;
    ASSERT_EQ(offer.set(CC_PropertyString(CC_PropertyId::NAME, "Anna")), XCode::OK);
    auto const& none = CC_PropertyContainer::EMPTY();
    ASSERT_EQ(anna.adapter->dial("SWITCH", "hidden", "4989123", none, offer, none, nullptr), XCode::OK);
    EXPECT_EQ(module->takeStory(), "offer 4989123 from Anna");
    fixture.m_loop.settle();
    EXPECT_EQ(module->takeStory(), "peer CONNECTED");
    EXPECT_EQ(anna.peerText(HiddenModule::OWN_ID), "trunk 7") << "a class that the library does not know";

    ASSERT_EQ(anna.say(CC_PropertyId::DISPLAY, "hello"), XCode::OK);
    CC_ServiceUserInput digits("12");
    anna.adapter->invokeSynchronousService(digits);
    EXPECT_EQ(module->takeStory(), "display, digits 12, User Input: 12 (Duration: Unknown)");

    module->hangUp();
    fixture.m_loop.settle();
    EXPECT_EQ(anna.peerState(), "RELEASED");
    anna.hangUp();
    fixture.m_loop.settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
}
} // namespace
