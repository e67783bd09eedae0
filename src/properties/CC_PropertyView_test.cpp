#include "properties/CC_PropertyView.h"

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/FailingAllocator.h"
#include "tests/support/PropertyTesting.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <initializer_list>
#include <memory>
#include <string>
#include <vector>

namespace
{
using namespace CC_PropertyId;
using Ids = std::vector<unsigned int>;

String const LONG_TEXT("a text too long to be kept without memory");

CC_Flags FLAGS_OF(std::initializer_list<unsigned int> ids)
{
    CC_Flags flags;
    for (unsigned int const id : ids)
        EXPECT_TRUE(flags.set(id, true).isOk());
    return flags;
}

/// "Name=Anna Network=isdn"
std::string TEXT_OF(CC_PropertyContainer const& properties)
{
    std::string text;
    for (CC_Property const& property : properties)
    {
        String value;
        text += (text.empty() ? "" : " ") + std::string(property.getPropertyName()) + "=" +
                property.getValueString(value).c_str();
    }
    return text;
}

struct CC_PropertyView_Test : testing::Test
{
    CC_PropertyView_Test()
    {
        say(NETWORK, "isdn");
        say(NAME, "Anna");
        say(DISPLAY, "A");
        follow(nullptr);
        differences.clear();
    }
    void say(unsigned int id, String const& text) { EXPECT_TRUE(source.set(CC_PropertyString(id, text)).isOk()); }
    void follow(CC_Flags const* changed)
    {
        view.follow(source, TELL(changed), [this](unsigned int id) { differences.push_back(id); });
    }
    /// One notification after the other.
    CC_PropertyView::Told TELL(CC_Flags const* changed) { return {changed, ++number}; }
    std::string seen() const { return TEXT_OF(view.getProperties()); }

    CC_PropertyContainer source;
    CC_PropertyView view;
    Ids differences;
    unsigned int number = 0;
};
} // namespace

TEST_F(CC_PropertyView_Test, ItBeginsWithAllOfItsSourceInItsOrder)
{
    CC_PropertyView fresh;
    fresh.follow(source, {}, [this](unsigned int id) { differences.push_back(id); });
    EXPECT_EQ(TEXT_OF(fresh.getProperties()), "Network=isdn Name=Anna Display=A");
    EXPECT_EQ(differences, (Ids{NETWORK, NAME, DISPLAY}));
}

TEST_F(CC_PropertyView_Test, OfWhatIsToldOnlyTheDifferencesAreReported)
{
    say(NAME, "Bert");
    CC_Flags const told = FLAGS_OF({NAME, NETWORK});
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=A");
    EXPECT_EQ(differences, Ids{NAME});
}

TEST_F(CC_PropertyView_Test, OnceInStepItLooksAtNothingElse)
{
    say(NAME, "Bert");
    say(DISPLAY, "B");
    CC_Flags const told = FLAGS_OF({NAME});
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=A");
    follow(nullptr);
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=B") << "unless anything may differ";
}

TEST_F(CC_PropertyView_Test, ANotificationThatItMissedMakesItLookAtEverything)
{
    say(DISPLAY, "B");
    ++number;
    say(NAME, "Bert");
    CC_Flags const told = FLAGS_OF({NAME});
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=B");
}

TEST_F(CC_PropertyView_Test, WhatIsNewOrGoneMakesItLookAtEverything)
{
    say(ALERT_INFO, "ring");
    EXPECT_TRUE(source.remove(NETWORK));
    say(DISPLAY, "B");
    CC_Flags const told = FLAGS_OF({ALERT_INFO});
    follow(&told);
    EXPECT_EQ(seen(), "Name=Anna Display=B Alert-Info=ring");
    EXPECT_EQ(differences, (Ids{DISPLAY, ALERT_INFO, NETWORK})) << "what is gone comes last";
}

TEST_F(CC_PropertyView_Test, WhatWasWrittenToItAndNotToItsSourceIsTakenBackWithTheNextChange)
{
    EXPECT_TRUE(view.write(CC_PropertyString(DISPLAY, "mine")).isOk());
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=mine");
    say(NAME, "Bert");
    CC_Flags const told = FLAGS_OF({NAME});
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=A");
    EXPECT_EQ(differences, (Ids{NAME, DISPLAY}));
}

TEST_F(CC_PropertyView_Test, SeveralThatWereWrittenAreTakenBackAsWell)
{
    EXPECT_TRUE(view.write(CC_PropertyString(DISPLAY, "mine")).isOk());
    EXPECT_TRUE(view.write(CC_PropertyString(NETWORK, "my net")).isOk());
    CC_Flags const told;
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A");

    CC_PropertyContainer many;
    EXPECT_TRUE(many.set(CC_PropertyString(NAME, "me")).isOk());
    EXPECT_TRUE(many.set(CC_PropertyString(ALERT_INFO, "mine")).isOk());
    EXPECT_TRUE(view.write(many).isOk());
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A");
}

TEST_F(CC_PropertyView_Test, AnotherSourceIsLookedAtWhole)
{
    CC_PropertyContainer other(source);
    EXPECT_TRUE(other.set(CC_PropertyString(DISPLAY, "B")).isOk());
    CC_Flags const told;
    view.follow(other, TELL(&told), [this](unsigned int id) { differences.push_back(id); });
    EXPECT_EQ(differences, Ids{DISPLAY});
}

TEST_F(CC_PropertyView_Test, AClearedOneBeginsAnew)
{
    view.clear();
    EXPECT_TRUE(view.getProperties().isEmpty());
    CC_Flags const told;
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A");
}

TEST_F(CC_PropertyView_Test, APropertyOfAnotherClassStaysAndIsReportedEachTime)
{
    EXPECT_TRUE(view.write(CC_PropertyBoolean(ALERT_INFO, true)).isOk());
    say(ALERT_INFO, "ring");
    CC_Flags const told;
    follow(&told);
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A Alert-Info=true");
    EXPECT_EQ(differences, (Ids{ALERT_INFO, ALERT_INFO}));
}

TEST_F(CC_PropertyView_Test, WhatMemoryRefusesComesWithTheNextChange)
{
    say(NAME, LONG_TEXT);
    CC_Flags const told = FLAGS_OF({NAME});
    FailingAllocator::failNth(1);
    view.follow(source, TELL(&told), [](unsigned int) {});
    FailingAllocator::failNth(1);
    view.follow(source, TELL(&told), [](unsigned int) {});
    FailingAllocator::stop();
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A");
    CC_Flags const nothing;
    follow(&nothing);
    EXPECT_EQ(seen(), "Network=isdn Name=" + std::string(LONG_TEXT.c_str()) + " Display=A");
}

// --- as a plain copy -------------------------------------------------------------------------------------------------

TEST_F(CC_PropertyView_Test, AssignedItIsACopyWhateverWasThere)
{
    EXPECT_TRUE(view.write(CC_PropertyBoolean(ALERT_INFO, true)).isOk());
    EXPECT_TRUE(source.remove(NETWORK));
    say(ALERT_INFO, "ring");
    say(NETWORK, "sip");
    CC_Flags const told;
    view.assign(source, TELL(&told));
    EXPECT_EQ(seen(), "Name=Anna Display=A Alert-Info=ring Network=sip");
}

TEST_F(CC_PropertyView_Test, AssignedAgainItTakesWhatIsTold)
{
    view.assign(source, TELL(nullptr));
    say(NAME, "Bert");
    EXPECT_TRUE(view.write(CC_PropertyString(NAME, "Bert")).isOk());
    CC_Flags const told = FLAGS_OF({NAME});
    view.assign(source, TELL(&told));
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=A");
    say(DISPLAY, "B");
    view.assign(source, TELL(&told));
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=A");
    view.assign(source, TELL(nullptr));
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=B");
}

TEST_F(CC_PropertyView_Test, AssignedWithoutMemoryItLacksWhatWasRefusedUntilTheNextTime)
{
    say(NAME, LONG_TEXT);
    FailingAllocator::failNth(1);
    view.assign(source, TELL(nullptr));
    FailingAllocator::stop();
    EXPECT_NE(seen().find("Network=isdn"), std::string::npos);
    CC_Flags const told;
    view.assign(source, TELL(&told));
    EXPECT_EQ(seen(), "Network=isdn Name=" + std::string(LONG_TEXT.c_str()) + " Display=A");
}

// --- a module's own classes ------------------------------------------------------------------------------------------

namespace
{
struct CC_PropertyViewOfAModulesClass_Test : CC_PropertyView_Test
{
    CC_PropertyViewOfAModulesClass_Test()
    {
        act(1);
        say(ALERT_INFO, "ring");
        follow(nullptr);
        differences.clear();
    }
    ~CC_PropertyViewOfAModulesClass_Test() override { *deeds = {}; }

    void act(int value) { EXPECT_TRUE(source.set(ActingProperty(PRECALL_SERVICE, value, deeds)).isOk()); }
    void followAll() { follow(nullptr); }

    std::shared_ptr<ActingProperty::Deeds> const deeds = std::make_shared<ActingProperty::Deeds>();
};
} // namespace

TEST_F(CC_PropertyViewOfAModulesClass_Test, ItIsComparedWithEveryChangeWhateverIsTold)
{
    act(2);
    say(NAME, "Bert");
    CC_Flags const told = FLAGS_OF({NAME});
    follow(&told);
    EXPECT_EQ(seen(), "Network=isdn Name=Bert Display=A Precall-Service=2 Alert-Info=ring");
    EXPECT_EQ(differences, (Ids{NAME, PRECALL_SERVICE}));
    act(3);
    follow(&told);
    EXPECT_EQ(differences, (Ids{NAME, PRECALL_SERVICE, PRECALL_SERVICE}));
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, AssignedItIsClonedEveryTime)
{
    view.assign(source, TELL(nullptr));
    unsigned int const before = deeds->numberOfClones;
    CC_Flags const told = FLAGS_OF({NAME});
    view.assign(source, TELL(&told));
    EXPECT_EQ(deeds->numberOfClones, before + 1);
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, WhatIsNotClonedIsGone)
{
    deeds->isClonable = false;
    followAll();
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A Alert-Info=ring");
    EXPECT_EQ(differences, Ids{PRECALL_SERVICE});
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, WithoutMemoryForACopyNothingOfOursIsCalledGone)
{
    say(ALERT_INFO, LONG_TEXT);
    Ids told;
    auto const followTold = [&] { view.follow(source, {}, [&](unsigned int id) { told.push_back(id); }); };
    told.reserve(10);
    unsigned long const failures = WITH_EACH_ALLOCATION_FAILING(
        followTold, [&] { EXPECT_EQ(seen().find("Network=isdn Name=Anna Display=A"), 0U); });
    EXPECT_LE(5U, failures);
    EXPECT_EQ(view.getProperties().getNumberOfProperties(), 5U);
    EXPECT_EQ(std::count(told.begin(), told.end(), NETWORK), 0);
    EXPECT_EQ(VALUE_OF(*view.getProperties().get(ALERT_INFO)), LONG_TEXT.c_str());
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, ComparedItMayChangeTheSource)
{
    deeds->onIsEqual = [this] { source.clear(); };
    followAll();
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A Precall-Service=1 Alert-Info=ring") << "as it was";
    followAll();
    EXPECT_EQ(seen(), "");
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, ComparedItMayClearTheView)
{
    act(2);
    deeds->onIsEqual = [this] { view.clear(); };
    followAll();
    EXPECT_EQ(seen(), "") << "whoever clears it ends what is under way";
    followAll();
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A Precall-Service=2 Alert-Info=ring");
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, AssignedItMayClearTheView)
{
    act(2);
    deeds->onAssign = [this] { view.clear(); };
    followAll();
    EXPECT_EQ(seen(), "");
    EXPECT_EQ(differences, (Ids{PRECALL_SERVICE}));
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, AssignedItMayWriteToTheView)
{
    act(2);
    deeds->onAssign = [this] { EXPECT_TRUE(view.write(CC_PropertyString(DISPLAY, "mine")).isOk()); };
    followAll();
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=mine Precall-Service=2 Alert-Info=ring");
    followAll();
    EXPECT_EQ(seen(), "Network=isdn Name=Anna Display=A Precall-Service=2 Alert-Info=ring");
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, EndingItMayClearTheView)
{
    EXPECT_TRUE(source.remove(PRECALL_SERVICE));
    deeds->onEnd = [this] { view.clear(); };
    followAll();
    EXPECT_EQ(seen(), "");
    EXPECT_EQ(differences, Ids{PRECALL_SERVICE});

    act(1);
    followAll();
    EXPECT_TRUE(source.remove(PRECALL_SERVICE));
    deeds->onEnd = [this] { view.clear(); };
    view.assign(source, TELL(nullptr));
    EXPECT_EQ(seen(), "");
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, AssignedAgainInsideAnyCloneItIsACopyOfWhatWasThereThen)
{
    for (unsigned int skipped = 0; skipped < 3; ++skipped)
    {
        act(2);
        unsigned int left = skipped;
        std::function<void()> assignAnew = [&]
        {
            if (left-- > 0)
            {
                deeds->onClone = assignAnew; // the next one
                return;
            }
            act(3);
            view.assign(source, TELL(nullptr));
        };
        deeds->onClone = assignAnew;
        view.assign(source, TELL(nullptr));
        *deeds = {};
        EXPECT_EQ(seen(), TEXT_OF(source)) << "clone " << skipped;
    }
}

TEST_F(CC_PropertyViewOfAModulesClass_Test, FollowingAgainInsideAnyCloneItSeesWhatIsThereThen)
{
    for (unsigned int skipped = 0; skipped < 3; ++skipped)
    {
        view.clear();
        act(2);
        unsigned int left = skipped;
        std::function<void()> followAnew = [&]
        {
            if (left-- > 0)
            {
                deeds->onClone = followAnew; // the next one
                return;
            }
            act(3);
            followAll();
        };
        deeds->onClone = followAnew;
        followAll();
        *deeds = {};
        EXPECT_EQ(seen(), TEXT_OF(source)) << "clone " << skipped;
    }
}
