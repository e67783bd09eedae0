#include "callcontrol/provider/CC_Provider.h"

#include "platform/base/NameOf.h"
#include "testing/FailingAllocator.h"
#include "testing/RecordingProvider.h"
#include "testing/RecordingProviderObserver.h"

#include <gtest/gtest.h>
#include <memory>

TEST(CC_Provider, TypesHaveALongAndAShortName)
{
    struct Case
    {
        int type;
        char const* name;
        char const* shortName;
    };
    Case const cases[] = {
        {0, "Hidden Internal Interface", "iif"}, {1, "Internal Interface", "sif"},
        {2, "User-Defined Interface", "dif"},    {3, "Hidden Internal Service", "isvc"},
        {4, "Internal Service", "ssvc"},         {5, "User-Defined Service", "dsvc"},
        {7, ERROR::INVALID, ERROR::INVALID},     {-1, ERROR::INVALID, ERROR::INVALID},
    };
    for (Case const& row : cases)
    {
        auto const type = static_cast<CC_Provider::ProviderType>(row.type);
        EXPECT_STREQ(CC_Provider::PROVIDER_TYPE_NAME(type), row.name) << row.type;
        EXPECT_STREQ(CC_Provider::PROVIDER_TYPE_SHORT_NAME(type), row.shortName) << row.type;
    }
}

TEST(CC_Provider, TypeSixHasAShortNameAndNoLongOne)
{
    auto const type = static_cast<CC_Provider::ProviderType>(6);
    EXPECT_STREQ(CC_Provider::PROVIDER_TYPE_NAME(type), ERROR::INVALID);
    EXPECT_STREQ(CC_Provider::PROVIDER_TYPE_SHORT_NAME(type), "cdsvc");
}

TEST(CC_Provider, LiveProvidersAreCounted)
{
    unsigned int const before = CC_Provider::s_numberOfInstances;
    {
        RecordingProvider const first("first");
        RecordingProvider const second("second");
        EXPECT_EQ(CC_Provider::s_numberOfInstances, before + 2);
    }
    EXPECT_EQ(CC_Provider::s_numberOfInstances, before);
}

TEST(CC_Provider, ItsEndIsToldOnceToEachWhoseCountIsNotZero)
{
    Journal journal;
    RecordingProviderObserver once("once", &journal);
    RecordingProviderObserver twice("twice", &journal);
    RecordingProviderObserver gone("gone", &journal);
    RecordingProviderObserver overdrawn("overdrawn", &journal);
    {
        RecordingProvider provider("p", &journal);
        for (CC_Provider::Observer* const observer :
             std::initializer_list<CC_Provider::Observer*>{&gone, &once, &twice, &twice, &overdrawn})
            EXPECT_EQ(provider.addProviderObserver(*observer), XCode::OK);
        provider.removeProviderObserver(gone);
        provider.removeProviderObserver(overdrawn);
        provider.removeProviderObserver(overdrawn); // no floor: -1 is told
    }
    EXPECT_EQ(journal.take(),
              (Lines{"once: provider destroyed", "twice: provider destroyed", "overdrawn: provider destroyed"}));
}

TEST(CC_Provider, ItsEndIsToldBeforeItIsCounted)
{
    RecordingProviderObserver observer("o");
    unsigned int then = 0;
    observer.m_onDestroy = [&](CC_Provider&) { then = CC_Provider::s_numberOfInstances; };
    auto provider = std::make_unique<RecordingProvider>("p");
    ASSERT_TRUE(provider->addProviderObserver(observer).isOk());
    unsigned int const alive = CC_Provider::s_numberOfInstances;
    provider.reset();
    EXPECT_EQ(then, alive);
}

TEST(CC_Provider, WithoutMemoryAnObserverIsRefusedAsAFailure)
{
    RecordingProviderObserver a("a");
    RecordingProviderObserver b("b");
    RecordingProviderObserver c("c");
    RecordingProvider provider("p");
    ASSERT_TRUE(provider.addProviderObserver(a).isOk());
    ASSERT_TRUE(provider.addProviderObserver(b).isOk());
    FailingAllocator::failNth(1);
    XCode const result = provider.addProviderObserver(c);
    FailingAllocator::stop();
    EXPECT_EQ(result, XCode::FAILURE) << "a context says NO_ELEMENT here";
}

TEST(CC_Provider, TheNotificationCanBeAskedForByAnybody)
{
    RecordingProviderObserver observer("o");
    RecordingProvider provider("p");
    CC_Provider::NOTIFY_OBSERVER_ABOUT_DESTROY(observer, provider, nullptr);
    EXPECT_EQ(observer.take(), Lines{"o: provider destroyed"});
}
