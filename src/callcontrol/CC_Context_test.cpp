#include "callcontrol/CC_Context.h"

#include "callcontrol/CC_CallPool.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyId.h"
#include "testing/DrivenLoop.h"
#include "testing/FailingAllocator.h"
#include "testing/FakeMediaContext.h"
#include "testing/RecordingContextObserver.h"
#include "testing/RecordingProvider.h"

#include <gtest/gtest.h>
#include <memory>

namespace
{
class CC_Context_Test : public testing::Test
{
protected:
    CC_Context_Test() { observe(m_observer); }

    void observe(RecordingContextObserver& observer) { EXPECT_EQ(m_context->addContextObserver(observer), XCode::OK); }
    void addProvider(char const* name) { EXPECT_EQ(m_context->addProvider(name, m_provider), XCode::OK); }
    Lines heard() { return m_observer.take(); }
    void destroyContext() { m_context.reset(); }

    DrivenLoop m_loop;
    RecordingProvider m_provider{"provider"};
    RecordingContextObserver m_observer{"o"};
    std::unique_ptr<CC_Context> m_context = std::make_unique<CC_Context>("lab");
};
} // namespace

TEST_F(CC_Context_Test, ANewContextHasItsNameAndNothingElse)
{
    EXPECT_EQ(m_context->getName(), "lab");
    EXPECT_EQ(m_context->getNationalPrefix(), "");
    EXPECT_EQ(m_context->getInternationalPrefix(), "");
    EXPECT_EQ(m_context->getMaxHops(), 0u);
    EXPECT_EQ(m_context->getNumberOfProviders(), 0u);
    EXPECT_EQ(m_context->getNumberOfCalls(), 0u);
    EXPECT_NE(m_context->getCallPool(), nullptr);
    EXPECT_EQ(heard(), Lines());
}

TEST_F(CC_Context_Test, PrefixesAndHopLimitAreKeptAsTheyAre)
{
    EXPECT_EQ(m_context->setNationalPrefix("0"), XCode::OK);
    EXPECT_EQ(m_context->setInternationalPrefix("no prefix at all"), XCode::OK);
    EXPECT_EQ(m_context->setMaxHops(0xffffffff), XCode::OK);
    EXPECT_EQ(m_context->getNationalPrefix(), "0");
    EXPECT_EQ(m_context->getInternationalPrefix(), "no prefix at all");
    EXPECT_EQ(m_context->getMaxHops(), 0xffffffff);
    EXPECT_EQ(m_context->setNationalPrefix(""), XCode::OK);
    EXPECT_EQ(m_context->getNationalPrefix(), "");
    EXPECT_EQ(heard(), Lines());
}

TEST_F(CC_Context_Test, WithoutMemoryAPrefixStaysAsItWas)
{
    String const longPrefix("a prefix that is too long to be kept without memory");
    ASSERT_TRUE(m_context->setNationalPrefix("0").isOk());
    ASSERT_TRUE(m_context->setInternationalPrefix("00").isOk());
    FailingAllocator::failNth(1);
    XCode const national = m_context->setNationalPrefix(longPrefix);
    FailingAllocator::failNth(1);
    XCode const international = m_context->setInternationalPrefix(longPrefix);
    FailingAllocator::stop();
    EXPECT_EQ(national, XCode::FAILURE);
    EXPECT_EQ(international, XCode::FAILURE);
    EXPECT_EQ(m_context->getNationalPrefix(), "0");
    EXPECT_EQ(m_context->getInternationalPrefix(), "00");
}

// --- observers -------------------------------------------------------------------------------------------------------

TEST_F(CC_Context_Test, AnObserverAddedTwiceHearsUntilItIsRemovedTwiceAndAgainAfterTheThirdTime)
{
    observe(m_observer);
    struct Step
    {
        char const* situation;
        bool isTold;
    };
    for (Step const& step : {Step{"removed once", true}, Step{"removed twice", false}, Step{"removed thrice", true}})
    {
        m_context->removeContextObserver(m_observer);
        m_context->removeProvider("x");
        EXPECT_EQ(heard().size(), step.isTold ? 1u : 0u) << step.situation;
    }
}

TEST_F(CC_Context_Test, AddRemoveRemoveAddIsSilent)
{
    m_context->removeContextObserver(m_observer);
    m_context->removeContextObserver(m_observer);
    observe(m_observer);
    m_context->removeProvider("x");
    EXPECT_EQ(heard(), Lines());
}

TEST_F(CC_Context_Test, RemovingAStrangerIsIgnored)
{
    RecordingContextObserver stranger("stranger");
    m_context->removeContextObserver(stranger);
    m_context->removeProvider("x");
    EXPECT_EQ(stranger.take(), Lines());
    EXPECT_EQ(heard().size(), 1u);
}

TEST_F(CC_Context_Test, WithoutMemoryAnObserverIsRefused)
{
    RecordingContextObserver second("second");
    RecordingContextObserver third("third");
    observe(second);
    FailingAllocator::failNth(1);
    XCode const result = m_context->addContextObserver(third);
    FailingAllocator::stop();
    EXPECT_EQ(result, XCode::NO_ELEMENT);
    m_context->removeProvider("x");
    EXPECT_EQ(third.take(), Lines());
    destroyContext();
}

TEST_F(CC_Context_Test, ItsEndIsToldBeforeAnythingIsGoneAndNothingAfterIt)
{
    addProvider("isdn");
    CC_Call* const call = m_context->acquireCall();
    heard();
    unsigned int providersThen = 0;
    unsigned int callsThen = 0;
    m_observer.m_onDestroy = [&](CC_Context& context)
    {
        providersThen = context.getNumberOfProviders();
        callsThen = context.getNumberOfCalls();
    };
    destroyContext();
    EXPECT_EQ(heard(), Lines{"o: lab destroyed"});
    EXPECT_EQ(providersThen, 1u);
    EXPECT_EQ(callsThen, 1u);
    EXPECT_EQ(m_provider.take(), Lines()) << "providers are left alone";
    EXPECT_EQ(call->getCallPool(), nullptr) << "and calls live on";
    call->destroy();
}

TEST_F(CC_Context_Test, AnObserverThatIsNotRegisteredAnyMoreDoesNotHearOfTheEnd)
{
    m_context->removeContextObserver(m_observer);
    destroyContext();
    EXPECT_EQ(heard(), Lines());
}

TEST_F(CC_Context_Test, TheTrampolinesPassTheirDatumOn)
{
    String const name("isdn");
    void* const data = const_cast<String*>(&name);
    CC_Context::NOTIFY_OBSERVER_ABOUT_DESTROY(m_observer, *m_context, nullptr);
    CC_Context::NOTIFY_OBSERVER_ABOUT_ADD_PROVIDER(m_observer, *m_context, data);
    CC_Context::NOTIFY_OBSERVER_ABOUT_REMOVE_PROVIDER(m_observer, *m_context, data);
    CC_Context::NOTIFY_OBSERVER_ABOUT_CREATE_CALL(m_observer, *m_context, nullptr);
    CC_Context::NOTIFY_OBSERVER_ABOUT_DESTROY_CALL(m_observer, *m_context, nullptr);
    EXPECT_EQ(heard(), (Lines{"o: lab destroyed", "o: lab provider isdn added", "o: lab provider isdn removed",
                              "o: lab none created", "o: lab none destroyed"}));
}

// --- providers -------------------------------------------------------------------------------------------------------

TEST_F(CC_Context_Test, AnAddedProviderIsThereWhenTheObserversHearOfIt)
{
    CC_Provider const* then = nullptr;
    m_observer.m_onAddProvider = [&](CC_Context& context, String const& name) { then = context.getProvider(name); };
    addProvider("isdn");
    EXPECT_EQ(heard(), Lines{"o: lab provider isdn added"});
    EXPECT_EQ(then, &m_provider);
}

TEST_F(CC_Context_Test, ATakenProviderNameIsRefusedAndNobodyIsTold)
{
    RecordingProvider other("other");
    addProvider("isdn");
    heard();
    EXPECT_EQ(m_context->addProvider("isdn", other), XCode::REFUSED);
    EXPECT_EQ(m_context->addProvider("isdn", m_provider), XCode::REFUSED);
    EXPECT_EQ(heard(), Lines());
    EXPECT_EQ(m_context->getProvider("isdn"), &m_provider);
    EXPECT_EQ(m_context->addProvider("ISDN", other), XCode::OK) << "names compare byte by byte";
}

TEST_F(CC_Context_Test, RemovingAnUnknownProviderTellsEveryObserver)
{
    RecordingContextObserver second("second");
    observe(second);
    m_context->removeProvider("nobody");
    EXPECT_EQ(heard(), Lines{"o: lab provider nobody removed"});
    EXPECT_EQ(second.take(), Lines{"second: lab provider nobody removed"});
    destroyContext();
}

TEST_F(CC_Context_Test, ARemovedProviderIsGoneWhenTheObserversHearOfIt)
{
    addProvider("isdn");
    heard();
    CC_Provider const* then = &m_provider;
    m_observer.m_onRemoveProvider = [&](CC_Context& context, String const& name) { then = context.getProvider(name); };
    m_context->removeProvider("isdn");
    EXPECT_EQ(heard(), Lines{"o: lab provider isdn removed"});
    EXPECT_EQ(then, nullptr);
    EXPECT_EQ(m_context->getNumberOfProviders(), 0u);
    addProvider("isdn"); // the name is free again
}

TEST_F(CC_Context_Test, ProvidersComeBackInTheOrderOfAddingWithoutTheRemovedOnes)
{
    RecordingProvider a("a");
    RecordingProvider b("b");
    RecordingProvider c("c");
    ASSERT_TRUE(m_context->addProvider("z", a).isOk());
    ASSERT_TRUE(m_context->addProvider("m", b).isOk());
    ASSERT_TRUE(m_context->addProvider("a", c).isOk());
    EXPECT_EQ(m_context->getProvider(0u), &a);
    EXPECT_EQ(m_context->getProvider(1u), &b);
    EXPECT_EQ(m_context->getProvider(2u), &c);
    m_context->removeProvider("m");
    EXPECT_EQ(m_context->getProvider(0u), &a);
    EXPECT_EQ(m_context->getProvider(1u), &c);
    EXPECT_EQ(m_context->getNumberOfProviders(), 2u);
    ASSERT_TRUE(m_context->addProvider("m", b).isOk());
    EXPECT_EQ(m_context->getProvider(2u), &b) << "added again: at the end";
    EXPECT_EQ(m_context->getProvider("nobody"), nullptr);
}

TEST_F(CC_Context_Test, WithoutMemoryAProviderIsNotAddedAndNobodyIsTold)
{
    FailingAllocator::failNth(1);
    XCode const result = m_context->addProvider("isdn", m_provider);
    FailingAllocator::stop();
    EXPECT_EQ(result, XCode::FAILURE);
    EXPECT_EQ(m_context->getNumberOfProviders(), 0u);
    EXPECT_EQ(heard(), Lines());
}

// --- calls -----------------------------------------------------------------------------------------------------------

TEST_F(CC_Context_Test, AnAcquiredCallIsInThePoolWhenTheObserversHearOfIt)
{
    CC_Call* told = nullptr;
    unsigned int callsThen = 0;
    m_observer.m_onCreateCall = [&](CC_Context& context, CC_Call* call)
    {
        told = call;
        callsThen = context.getNumberOfCalls();
    };
    CC_Call* const call = m_context->acquireCall();
    EXPECT_EQ(heard(), Lines{"o: lab call created"});
    EXPECT_EQ(told, call);
    EXPECT_EQ(callsThen, 1u);
    EXPECT_EQ(m_context->getCall(0), call);
    EXPECT_EQ(m_context->getCall(1), nullptr);
    EXPECT_EQ(m_context->getCallPool()->getAcquiredCall(0), call);
    m_context->releaseCall(call);
}

TEST_F(CC_Context_Test, TheMediaContextIsHandedOnToTheCall)
{
    TYPtr<MG_IContext> const media(new FakeMediaContext(5));
    CC_Call* const call = m_context->acquireCall(media.get());
    auto const* const property =
        dynamic_cast<CC_PropertyContextId const*>(call->getProperties().get(CC_PropertyId::CONTEXT));
    ASSERT_NE(property, nullptr);
    EXPECT_EQ(property->getContext(), media.get());
    m_context->releaseCall(call);
}

TEST_F(CC_Context_Test, AFailedAcquireTellsNobody)
{
    FailingAllocator::failNth(1);
    CC_Call* const call = m_context->acquireCall();
    FailingAllocator::stop();
    EXPECT_EQ(call, nullptr);
    EXPECT_EQ(heard(), Lines());
    EXPECT_EQ(m_context->getNumberOfCalls(), 0u);
}

TEST_F(CC_Context_Test, TheObserversHearOfTheEndOfACallBeforeThePoolHasReleasedIt)
{
    CC_Call* const call = m_context->acquireCall();
    heard();
    CC_Call* told = nullptr;
    unsigned int callsThen = 0;
    m_observer.m_onDestroyCall = [&](CC_Context& context, CC_Call* ending)
    {
        told = ending;
        callsThen = context.getNumberOfCalls();
    };
    m_context->releaseCall(call);
    EXPECT_EQ(heard(), Lines{"o: lab call destroyed"});
    EXPECT_EQ(told, call);
    EXPECT_EQ(callsThen, 1u);
    EXPECT_EQ(m_context->getNumberOfCalls(), 0u);
}

TEST_F(CC_Context_Test, ReleasingNullDoesNothing)
{
    m_context->releaseCall(nullptr);
    EXPECT_EQ(heard(), Lines());
}

TEST_F(CC_Context_Test, ACallThatEndsByItselfIsNotAnnounced)
{
    CC_Call* const call = m_context->acquireCall();
    heard();
    call->defer();
    m_loop.turn();
    EXPECT_EQ(m_context->getNumberOfCalls(), 0u);
    EXPECT_EQ(heard(), Lines());
}

TEST_F(CC_Context_Test, ACallReleasedByWhoHearsOfItIsNotHandedOut)
{
    m_observer.m_onCreateCall = [](CC_Context& context, CC_Call* call) { context.releaseCall(call); };
    EXPECT_EQ(m_context->acquireCall(), nullptr);
    EXPECT_EQ(heard(), (Lines{"o: lab call created", "o: lab call destroyed"}));
    EXPECT_EQ(m_context->getNumberOfCalls(), 0u);
}

TEST_F(CC_Context_Test, ACallReleasedAgainByWhoHearsOfItsEndEndsOnce)
{
    CC_Call* const call = m_context->acquireCall();
    heard();
    m_observer.m_onDestroyCall = [this](CC_Context& context, CC_Call* ending)
    {
        m_observer.m_onDestroyCall = nullptr;
        context.releaseCall(ending);
    };
    m_context->releaseCall(call);
    EXPECT_EQ(heard(), (Lines{"o: lab call destroyed", "o: lab call destroyed"}));
    EXPECT_EQ(m_context->getNumberOfCalls(), 0u);
}

// --- the context destroyed from inside each of its own notifications -------------------------------------------------

TEST_F(CC_Context_Test, ItMayBeDestroyedWhileAProviderIsAdded)
{
    m_observer.m_onAddProvider = [this](CC_Context&, String const&) { destroyContext(); };
    EXPECT_EQ(m_context->addProvider("isdn", m_provider), XCode::OK);
    EXPECT_EQ(heard(), (Lines{"o: lab provider isdn added", "o: lab destroyed"}));
}

TEST_F(CC_Context_Test, ItMayBeDestroyedWhileAProviderIsRemoved)
{
    m_observer.m_onRemoveProvider = [this](CC_Context&, String const&) { destroyContext(); };
    m_context->removeProvider("isdn");
    EXPECT_EQ(heard(), (Lines{"o: lab provider isdn removed", "o: lab destroyed"}));
}

TEST_F(CC_Context_Test, ItMayBeDestroyedWhileACallIsCreated)
{
    m_observer.m_onCreateCall = [this](CC_Context&, CC_Call*) { destroyContext(); };
    CC_Call* const call = m_context->acquireCall();
    EXPECT_EQ(heard(), (Lines{"o: lab call created", "o: lab destroyed"}));
    ASSERT_NE(call, nullptr) << "the call lives on without its pool";
    EXPECT_EQ(call->getCallPool(), nullptr);
    call->destroy();
}

TEST_F(CC_Context_Test, ItMayBeDestroyedWhileACallIsReleased)
{
    CC_Call* const call = m_context->acquireCall();
    heard();
    unsigned int const alive = CC_Call::s_numberOfInstances;
    m_observer.m_onDestroyCall = [this](CC_Context&, CC_Call*) { destroyContext(); };
    m_context->releaseCall(call);
    EXPECT_EQ(heard(), (Lines{"o: lab call destroyed", "o: lab destroyed"}));
    EXPECT_EQ(CC_Call::s_numberOfInstances, alive - 1) << "released all the same";
}

TEST_F(CC_Context_Test, TheObserversBehindTheOneThatDestroysItHearOfItsEndAlone)
{
    Journal journal;
    RecordingContextObserver first("first", &journal);
    RecordingContextObserver second("second", &journal);
    m_context->removeContextObserver(m_observer);
    observe(first);
    observe(second);
    first.m_onRemoveProvider = [this](CC_Context&, String const&) { destroyContext(); };
    m_context->removeProvider("x");
    EXPECT_EQ(journal.take(),
              (Lines{"first: lab provider x removed", "first: lab destroyed", "second: lab destroyed"}));
}
