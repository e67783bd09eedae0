#include "callcontrol/CallControl.h"

#include "callcontrol/CC_Context.h"
#include "calls/CC_Call.h"
#include "properties/CC_Factory.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/DrivenLoop.h"
#include "testing/FailingAllocator.h"
#include "testing/RecordingContextObserver.h"
#include "testing/RecordingPropertyFactory.h"
#include "testing/RecordingRegistryObserver.h"

#include <gtest/gtest.h>
#include <memory>

namespace
{
using namespace CC_PropertyId;

/// A repository that says when its last reference is given up.
template <class Interface>
class CountedRepository : public Interface
{
public:
    explicit CountedRepository(bool& isAlive) : m_isAlive(isAlive) { m_isAlive = true; }
    ~CountedRepository() override { m_isAlive = false; }

private:
    bool& m_isAlive;
};

class CountedContextRepository : public CountedRepository<MG_IContextRepository>
{
public:
    using CountedRepository::CountedRepository;
    XCode createContext(TYPtr<MG_IContext>&) override { return XCode::FAILURE; }
};

/// A registry of its own beside the process's one.
class CallControl_Test : public testing::Test
{
protected:
    /// Which of the ids have a factory: a digit for each.
    std::string makes(std::initializer_list<unsigned int> ids) const
    {
        std::string made;
        for (unsigned int const id : ids)
        {
            std::unique_ptr<CC_Property> const property(m_control.createProperty(id));
            made += property != nullptr ? '1' : '0';
        }
        return made;
    }

    CallControl m_control;
};
} // namespace

// --- the one object --------------------------------------------------------------------------------------------------

TEST(CallControl, ThereIsOneObjectMadeOnFirstUse)
{
    CallControl* const first = CallControl::INSTANCE();
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(CallControl::INSTANCE(), first);
}

TEST(CallControl, AfterItsEndTheNextUseMakesAFreshOne)
{
    ASSERT_TRUE(CallControl::CREATE_CONTEXT("lab").isOk());
    TYEventLoop loop;
    CallControl::SET_CC_EVENT_LOOP(&loop);
    delete CallControl::INSTANCE();
    EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), nullptr);
    EXPECT_EQ(CallControl::GET_CONTEXT("lab"), nullptr);
}

TEST_F(CallControl_Test, AnotherObjectDoesNotTakeTheOnesPlace)
{
    CallControl* const one = CallControl::INSTANCE();
    {
        CallControl const other;
        EXPECT_EQ(CallControl::INSTANCE(), one);
    }
    EXPECT_EQ(CallControl::INSTANCE(), one);
}

TEST_F(CallControl_Test, LoopsAreKeptAsTheyAreGiven)
{
    EXPECT_EQ(m_control.getCcEventLoop(), nullptr) << "none before one was set";
    EXPECT_EQ(m_control.getDpEventLoop(), nullptr);
    TYEventLoop cc;
    TYEventLoop dp;
    m_control.setCcEventLoop(&cc);
    m_control.setDpEventLoop(&dp);
    EXPECT_EQ(m_control.getCcEventLoop(), &cc);
    EXPECT_EQ(m_control.getDpEventLoop(), &dp);
    for (EventPrio::Type const priority : {EventPrio::HIGHEST, EventPrio::HIGH, EventPrio::NORMAL, EventPrio::LOW})
    {
        EXPECT_EQ(&m_control.getCcSyncEvent(priority), &cc.getSyncEvent(priority));
        EXPECT_EQ(&m_control.getDpSyncEvent(priority), &dp.getSyncEvent(priority));
    }
    m_control.setCcEventLoop(nullptr);
    m_control.setDpEventLoop(nullptr);
    EXPECT_EQ(m_control.getCcEventLoop(), nullptr);
    EXPECT_EQ(m_control.getDpEventLoop(), nullptr);
}

TEST_F(CallControl_Test, ARepositorySetTwiceIsHeldOnceAndNullGivesItUp)
{
    bool isAlive = false;
    EXPECT_EQ(m_control.getMgContextRepository(), nullptr);
    auto* const contexts = new CountedContextRepository(isAlive);
    m_control.setMgContextRepository(contexts);
    m_control.setMgContextRepository(contexts);
    EXPECT_EQ(m_control.getMgContextRepository(), contexts);
    m_control.setMgContextRepository(nullptr);
    EXPECT_FALSE(isAlive);
    EXPECT_EQ(m_control.getMgContextRepository(), nullptr);

    EXPECT_EQ(m_control.getMgTerminationRepository(), nullptr);
    auto* const terminations = new CountedRepository<MG_ITerminationRepository>(isAlive);
    m_control.setMgTerminationRepository(terminations);
    m_control.setMgTerminationRepository(terminations);
    EXPECT_EQ(m_control.getMgTerminationRepository(), terminations);
    m_control.setMgTerminationRepository(nullptr);
    EXPECT_FALSE(isAlive);
    EXPECT_EQ(m_control.getMgTerminationRepository(), nullptr);
}

TEST_F(CallControl_Test, ANewRepositoryTakesTheOldOnesPlace)
{
    bool isOldAlive = false;
    bool isNewAlive = false;
    m_control.setMgContextRepository(new CountedContextRepository(isOldAlive));
    auto* const next = new CountedContextRepository(isNewAlive);
    m_control.setMgContextRepository(next);
    EXPECT_FALSE(isOldAlive);
    EXPECT_TRUE(isNewAlive);
    EXPECT_EQ(m_control.getMgContextRepository(), next);
    m_control.setMgContextRepository(nullptr);
    EXPECT_FALSE(isNewAlive);
}

TEST(CallControl, ItsEndGivesItsRepositoriesUp)
{
    bool isContextsAlive = false;
    bool isTerminationsAlive = false;
    {
        CallControl control;
        control.setMgContextRepository(new CountedContextRepository(isContextsAlive));
        control.setMgTerminationRepository(new CountedRepository<MG_ITerminationRepository>(isTerminationsAlive));
    }
    EXPECT_FALSE(isContextsAlive);
    EXPECT_FALSE(isTerminationsAlive);
}

TEST(CallControl, ItsEndTellsTheContextsObserversAndNotItsOwn)
{
    Journal journal;
    RecordingRegistryObserver ofContexts("of contexts", &journal);
    RecordingContextObserver ofOne("of one", &journal);
    CallControl const* duringEnd = nullptr;
    CC_Context const* found = nullptr;
    {
        CallControl control;
        ASSERT_TRUE(control.createContext("lab").isOk());
        control.registerContextObserver(ofContexts);
        ASSERT_TRUE(control.getContext("lab")->addContextObserver(ofOne).isOk());
        ofOne.m_onDestroy = [&](CC_Context&)
        {
            duringEnd = &control;
            found = control.getContext("lab");
        };
    }
    EXPECT_EQ(journal.take(), Lines{"of one: lab destroyed"});
    EXPECT_NE(duringEnd, nullptr);
    EXPECT_EQ(found, nullptr) << "it is out of the table before it ends";
}

// --- property factories ----------------------------------------------------------------------------------------------

TEST_F(CallControl_Test, AnIdWithoutAFactoryMakesNoProperty) { EXPECT_EQ(m_control.createProperty(NAME), nullptr); }

TEST_F(CallControl_Test, NoFactoryIsRefused)
{
    EXPECT_EQ(m_control.addPropertyFactory(nullptr), XCode::REFUSED);
    m_control.removePropertyFactory(nullptr);
}

TEST_F(CallControl_Test, TheFactoryOfAnIdIsAskedForThatId)
{
    RecordingPropertyFactory factory("f", {NAME, NAME + 32, NAME + 64}); // all in one bucket
    EXPECT_EQ(m_control.addPropertyFactory(&factory), XCode::OK);
    for (unsigned int const id : {NAME, NAME + 32, NAME + 64})
    {
        std::unique_ptr<CC_Property> const property(m_control.createProperty(id));
        ASSERT_NE(property, nullptr);
        EXPECT_EQ(property->getId(), id);
    }
    EXPECT_EQ(m_control.createProperty(NAME + 96), nullptr);
    EXPECT_EQ(factory.take().size(), 3u) << "it was not asked for what it does not make";
}

TEST_F(CallControl_Test, AFactoryThatMakesNothingHasNoStandIn)
{
    RecordingPropertyFactory silent("silent", {NAME});
    RecordingPropertyFactory other("other", {DISPLAY});
    silent.m_create = [](unsigned int) { return nullptr; };
    ASSERT_TRUE(m_control.addPropertyFactory(&silent).isOk());
    ASSERT_TRUE(m_control.addPropertyFactory(&other).isOk());
    EXPECT_EQ(m_control.createProperty(NAME), nullptr);
    EXPECT_EQ(other.take(), Lines());
}

TEST_F(CallControl_Test, AFactoryThatOverlapsIsRefusedAsAWhole)
{
    RecordingPropertyFactory first("first", {NAME, DISPLAY});
    RecordingPropertyFactory second("second", {URI, DISPLAY, HOPS});
    EXPECT_EQ(m_control.addPropertyFactory(&first), XCode::OK);
    EXPECT_EQ(m_control.addPropertyFactory(&second), XCode::REFUSED);
    EXPECT_EQ(m_control.addPropertyFactory(&first), XCode::REFUSED) << "it overlaps with itself";
    EXPECT_EQ(makes({NAME, DISPLAY, URI, HOPS}), "1100");
    EXPECT_EQ(second.take(), Lines()) << "the first to claim an id keeps it";
}

TEST_F(CallControl_Test, AnIdThatOneFactoryListsTwiceIsOneEntry)
{
    RecordingPropertyFactory factory("f", {NAME, NAME, DISPLAY});
    EXPECT_EQ(m_control.addPropertyFactory(&factory), XCode::OK);
    EXPECT_EQ(makes({NAME, DISPLAY}), "11");
    m_control.removePropertyFactory(&factory);
    EXPECT_EQ(makes({NAME, DISPLAY}), "00");
    EXPECT_EQ(m_control.addPropertyFactory(&factory), XCode::OK);
}

TEST_F(CallControl_Test, AFactoryWithoutIdsIsTaken)
{
    RecordingPropertyFactory factory("f", {});
    EXPECT_EQ(m_control.addPropertyFactory(&factory), XCode::OK);
    EXPECT_EQ(m_control.addPropertyFactory(&factory), XCode::OK);
}

TEST_F(CallControl_Test, RemovingAFactoryRemovesTheIdsThatItNamesWhoeverHoldsThem)
{
    RecordingPropertyFactory first("first", {NAME, DISPLAY});
    RecordingPropertyFactory stranger("stranger", {DISPLAY, URI});
    ASSERT_TRUE(m_control.addPropertyFactory(&first).isOk());
    m_control.removePropertyFactory(&stranger); // was never added
    EXPECT_EQ(makes({NAME, DISPLAY, URI}), "100");
    EXPECT_EQ(m_control.addPropertyFactory(&stranger), XCode::OK);
    EXPECT_EQ(makes({NAME, DISPLAY, URI}), "111");
}

TEST_F(CallControl_Test, WithoutMemoryNoneOfTheIdsIsRegistered)
{
    RecordingPropertyFactory factory("f", {NAME, DISPLAY, URI});
    bool wasRefused = false;
    for (unsigned long n = 1; n < 100; ++n)
    {
        FailingAllocator::failNth(n);
        XCode const result = m_control.addPropertyFactory(&factory);
        FailingAllocator::stop();
        EXPECT_EQ(makes({NAME, DISPLAY, URI}), result.isOk() ? "111" : "000") << "allocation " << n;
        if (result.isOk())
            m_control.removePropertyFactory(&factory);
        else
        {
            EXPECT_EQ(result, XCode::FAILURE) << "allocation " << n;
            wasRefused = true;
        }
        if (!FailingAllocator::hasFailed())
            break;
    }
    EXPECT_TRUE(wasRefused);
}

TEST_F(CallControl_Test, TheBuiltInFactoryMakesItsProperties)
{
    CC_Factory factory;
    EXPECT_EQ(m_control.addPropertyFactory(&factory), XCode::OK);
    EXPECT_EQ(makes({NAME, STATE, CONTEXT, 0x12345}), "1110");
}

// --- contexts --------------------------------------------------------------------------------------------------------

TEST_F(CallControl_Test, AContextIsFoundWhenTheObserversHearOfIt)
{
    RecordingRegistryObserver observer("o");
    CC_Context const* then = nullptr;
    observer.m_onAdded = [&](String const& name) { then = m_control.getContext(name); };
    m_control.registerContextObserver(observer);
    EXPECT_EQ(m_control.createContext("lab"), XCode::OK);
    EXPECT_EQ(observer.take(), Lines{"o: context lab added"});
    ASSERT_NE(then, nullptr);
    EXPECT_EQ(then, m_control.getContext("lab"));
    EXPECT_EQ(then->getName(), "lab");
}

TEST_F(CallControl_Test, ATakenContextNameIsRefusedAndNobodyIsTold)
{
    RecordingRegistryObserver observer("o");
    ASSERT_TRUE(m_control.createContext("lab").isOk());
    CC_Context const* const lab = m_control.getContext("lab");
    m_control.registerContextObserver(observer);
    EXPECT_EQ(m_control.createContext("lab"), XCode::REFUSED);
    EXPECT_EQ(observer.take(), Lines());
    EXPECT_EQ(m_control.getContext("lab"), lab);
    EXPECT_EQ(m_control.createContext("LAB"), XCode::OK) << "names compare byte by byte";
}

TEST_F(CallControl_Test, ADestroyedContextIsStillThereWhenTheObserversHearOfIt)
{
    Journal journal;
    RecordingRegistryObserver ofContexts("of contexts", &journal);
    RecordingContextObserver ofOne("of one", &journal);
    ASSERT_TRUE(m_control.createContext("lab").isOk());
    m_control.registerContextObserver(ofContexts);
    ASSERT_TRUE(m_control.getContext("lab")->addContextObserver(ofOne).isOk());
    CC_Context const* then = nullptr;
    ofContexts.m_onDestroyed = [&](String const& name) { then = m_control.getContext(name); };
    m_control.destroyContext("lab");
    EXPECT_EQ(journal.take(), (Lines{"of contexts: context lab destroyed", "of one: lab destroyed"}));
    EXPECT_NE(then, nullptr);
    EXPECT_EQ(m_control.getContext("lab"), nullptr);
    m_control.unregisterContextObserver(ofContexts);
}

TEST_F(CallControl_Test, DestroyingAnUnknownContextTellsEveryObserver)
{
    RecordingRegistryObserver observer("o");
    m_control.registerContextObserver(observer);
    m_control.destroyContext("nobody");
    EXPECT_EQ(observer.take(), Lines{"o: context nobody destroyed"});
}

TEST_F(CallControl_Test, WithoutMemoryNoContextIsCreatedAndNobodyIsTold)
{
    RecordingRegistryObserver observer("o");
    m_control.registerContextObserver(observer);
    bool wasRefused = false;
    for (unsigned long n = 1; n < 100; ++n)
    {
        FailingAllocator::failNth(n);
        XCode const result = m_control.createContext("lab");
        FailingAllocator::stop();
        if (result.isOk())
            break;
        wasRefused = true;
        EXPECT_EQ(result, XCode::FAILURE) << "allocation " << n;
        EXPECT_EQ(m_control.getContext("lab"), nullptr) << "allocation " << n;
        EXPECT_EQ(observer.take(), Lines()) << "allocation " << n;
    }
    EXPECT_TRUE(wasRefused);
    EXPECT_EQ(observer.take(), Lines{"o: context lab added"});
    m_control.unregisterContextObserver(observer);
}
