#include "callcontrol/CC_CallPool.h"

#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyId.h"
#include "testing/DrivenLoop.h"
#include "testing/FailingAllocator.h"
#include "testing/FakeMediaContext.h"
#include "testing/FakeMediaContextRepository.h"
#include "testing/FakeRebootMgmt.h"
#include "testing/RecordingCallObserver.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <memory>
#include <random>
#include <vector>

namespace
{
char const* const LOCK_TAKEN = "reboot: add Call-Control (Calls are ongoing, 0)";
char const* const LOCK_GIVEN_BACK = "reboot: release Call-Control";

MG_IContext* CONTEXT_OF(CC_Call const& call)
{
    auto const* const context =
        dynamic_cast<CC_PropertyContextId const*>(call.getProperties().get(CC_PropertyId::CONTEXT));
    return context != nullptr ? context->getContext() : nullptr;
}

class CC_CallPool_Test : public testing::Test
{
protected:
    CC_Call* acquire() { return m_pool->acquireCall(); }
    void release(CC_Call* call) { m_pool->releaseCall(call); }
    /// Of no pool. It counts as removed without having been added, which is made good for the other tests.
    void releaseForeignCall()
    {
        release(new CC_Call);
        CC_CallPool::s_statistics.onCallAdded();
    }
    /// A leg in the call, held by the call alone; alive until its state is RELEASED or it is taken out.
    static CC_CallLeg* addLeg(CC_Call& call)
    {
        auto* const leg = new CC_CallLeg;
        EXPECT_TRUE(call.addCallLeg(*leg).isOk());
        leg->removeReference();
        return leg;
    }
    std::vector<CC_Call*> calls() const
    {
        std::vector<CC_Call*> all;
        while (CC_Call* const call = m_pool->getAcquiredCall(static_cast<unsigned int>(all.size())))
            all.push_back(call);
        return all;
    }

    DrivenLoop m_loop;
    std::unique_ptr<CC_CallPool> m_pool = std::make_unique<CC_CallPool>();
};

/// With a reboot management to be asked.
class CC_CallPool_Lock_Test : public CC_CallPool_Test
{
protected:
    Lines took() const { return {LOCK_TAKEN}; }
    Lines gaveBack() const { return {LOCK_GIVEN_BACK}; }

    FakeRebootMgmt m_reboot;
};
} // namespace

// --- the reload lock -------------------------------------------------------------------------------------------------

TEST_F(CC_CallPool_Lock_Test, TheFirstCallTakesTheLockAndTheLastGivesItBack)
{
    CC_Call* const first = acquire();
    EXPECT_EQ(m_reboot.take(), took());
    CC_Call* const second = acquire();
    EXPECT_EQ(m_reboot.take(), Lines()) << "it is held already";
    release(first);
    EXPECT_EQ(m_reboot.take(), Lines()) << "one call is still up";
    release(second);
    EXPECT_EQ(m_reboot.take(), gaveBack());
    release(acquire());
    EXPECT_EQ(m_reboot.take(), (Lines{LOCK_TAKEN, LOCK_GIVEN_BACK})) << "and so again";
}

TEST_F(CC_CallPool_Lock_Test, TheLockIsTakenBeforeTheCallIsCounted)
{
    auto const addedBefore = CC_CallPool::s_statistics.m_callsAdded;
    unsigned int callsThen = 99;
    unsigned long long addedThen = 0;
    m_reboot.m_onAdd = [&]
    {
        callsThen = m_pool->getNumberOfAcquiredCalls();
        addedThen = CC_CallPool::s_statistics.m_callsAdded;
    };
    release(acquire());
    EXPECT_EQ(callsThen, 0u);
    EXPECT_EQ(addedThen, addedBefore);
}

TEST_F(CC_CallPool_Lock_Test, TheLockIsGivenBackAfterTheCallIsDeleted)
{
    CC_Call* const call = acquire();
    unsigned int callsThen = 99;
    m_reboot.m_onRelease = [&] { callsThen = CC_Call::s_numberOfInstances; };
    unsigned int const callsBefore = CC_Call::s_numberOfInstances;
    release(call);
    EXPECT_EQ(callsThen, callsBefore - 1);
}

TEST_F(CC_CallPool_Lock_Test, ARefusedLockStopsNoCall)
{
    m_reboot.m_result = XCode::FAILURE;
    CC_Call* const call = acquire();
    ASSERT_NE(call, nullptr);
    release(call);
    EXPECT_EQ(m_reboot.take(), (Lines{LOCK_TAKEN, LOCK_GIVEN_BACK}));
}

TEST_F(CC_CallPool_Lock_Test, OnlyTheFirstOfSeveralDriversIsAsked)
{
    FakeRebootMgmt second("second");
    release(acquire());
    EXPECT_EQ(m_reboot.take().size(), 2u);
    EXPECT_EQ(second.take(), Lines());
}

TEST_F(CC_CallPool_Lock_Test, ReleasingAForeignCallGivesTheLockOfAnEmptyPoolBackAgain)
{
    release(acquire());
    EXPECT_EQ(m_reboot.take().size(), 2u);
    releaseForeignCall();
    EXPECT_EQ(m_reboot.take(), gaveBack());
}

TEST_F(CC_CallPool_Lock_Test, ReleasingAForeignCallKeepsTheLockWhileOwnCallsAreUp)
{
    CC_Call* const own = acquire();
    EXPECT_EQ(m_reboot.take(), took());
    releaseForeignCall();
    EXPECT_EQ(m_reboot.take(), Lines());
    EXPECT_EQ(calls(), std::vector<CC_Call*>{own});
    release(own);
}

TEST_F(CC_CallPool_Lock_Test, APoolDestroyedWithACallUpKeepsTheLock)
{
    addLeg(*acquire());
    EXPECT_EQ(m_reboot.take(), took());
    CC_Call* const call = m_pool->getAcquiredCall(0);
    m_pool.reset();
    call->removeCallLeg(*call->getCallLeg(0));
    m_loop.settle();
    EXPECT_EQ(m_reboot.take(), Lines());
    EXPECT_EQ(m_reboot.getNumberOfLocks(), 1);
}

TEST_F(CC_CallPool_Lock_Test, AnEmptyPoolIsDestroyedWithoutAWord)
{
    release(acquire());
    EXPECT_EQ(m_reboot.take().size(), 2u);
    m_pool.reset();
    EXPECT_EQ(m_reboot.take(), Lines());
}

TEST_F(CC_CallPool_Lock_Test, TheLockIsGivenBackWhenTheLastCallsObserverDestroysThePool)
{
    RecordingCallObserver observer("o");
    observer.m_onEnded = [&](CC_EvCallObservationEnded const&) { m_pool.reset(); };
    CC_Call* const call = acquire();
    ASSERT_TRUE(call->addCallObserver(&observer).isOk());
    release(call);
    EXPECT_EQ(m_pool, nullptr);
    EXPECT_EQ(m_reboot.getNumberOfLocks(), 0);
}

TEST_F(CC_CallPool_Lock_Test, WithoutMemoryNoCallComesAndNoLockStays)
{
    unsigned long n = 1;
    for (;; ++n)
    {
        auto const before = CC_CallPool::s_statistics.m_callsAdded;
        FailingAllocator::failNth(n);
        CC_Call* const call = acquire();
        FailingAllocator::stop();
        if (call != nullptr)
        {
            release(call);
            if (!FailingAllocator::hasFailed())
                break;
        }
        else
        {
            EXPECT_EQ(CC_CallPool::s_statistics.m_callsAdded, before) << "allocation " << n;
        }
        EXPECT_EQ(m_pool->getNumberOfAcquiredCalls(), 0u) << "allocation " << n;
        EXPECT_EQ(m_reboot.getNumberOfLocks(), 0) << "allocation " << n;
    }
    EXPECT_GT(n, 3u) << "the call, its event and its place in the pool need memory";
}

TEST_F(CC_CallPool_Test, WithoutADriverCallsComeAndGo)
{
    CC_Call* const call = acquire();
    ASSERT_NE(call, nullptr);
    EXPECT_EQ(m_pool->getNumberOfAcquiredCalls(), 1u);
    release(call);
    EXPECT_EQ(m_pool->getNumberOfAcquiredCalls(), 0u);
    m_pool->releaseReloadGracefulLock(); // nothing is held, nobody is asked
}

TEST_F(CC_CallPool_Test, ADriverThatCameLaterIsFoundByTheNextFirstCall)
{
    CC_Call* const first = acquire();
    FakeRebootMgmt reboot;
    CC_Call* const second = acquire();
    release(first);
    release(second);
    EXPECT_EQ(reboot.take(), Lines());
    release(acquire());
    EXPECT_EQ(reboot.take(), (Lines{LOCK_TAKEN, LOCK_GIVEN_BACK}));
}

// --- acquiring and releasing -----------------------------------------------------------------------------------------

TEST_F(CC_CallPool_Test, ACallKnowsItsPoolAndHoldsTheGivenMediaContext)
{
    TYPtr<MG_IContext> const context(new FakeMediaContext(7));
    CC_Call* const call = m_pool->acquireCall(context.get());
    EXPECT_EQ(call->getCallPool(), m_pool.get());
    EXPECT_EQ(CONTEXT_OF(*call), context.get());
    release(call);
}

TEST_F(CC_CallPool_Test, ACallWithoutAMediaContextHasThePropertyAllTheSame)
{
    CC_Call* const call = acquire(); // no repository is set
    ASSERT_NE(call->getProperties().get(CC_PropertyId::CONTEXT), nullptr);
    EXPECT_EQ(CONTEXT_OF(*call), nullptr);
    release(call);
}

TEST_F(CC_CallPool_Test, AMissingMediaContextIsAskedForOnce)
{
    FakeMediaContextRepository mediaContexts;
    CC_Call* const call = acquire();
    EXPECT_EQ(mediaContexts.getNumberOfRequests(), 1u);
    ASSERT_NE(CONTEXT_OF(*call), nullptr);
    EXPECT_EQ(CONTEXT_OF(*call)->getId(), 1u);
    release(call);
    EXPECT_EQ(mediaContexts.getNumberOfRequests(), 1u);
}

TEST_F(CC_CallPool_Test, CallsStandInTheOrderOfTheirAcquisition)
{
    CC_Call* const a = acquire();
    CC_Call* const b = acquire();
    CC_Call* const c = acquire();
    EXPECT_EQ(calls(), (std::vector<CC_Call*>{a, b, c}));
    EXPECT_EQ(m_pool->getNumberOfAcquiredCalls(), 3u);
    EXPECT_EQ(m_pool->getAcquiredCall(3), nullptr);
    EXPECT_EQ(m_pool->getAcquiredCall(0xffffffff), nullptr);
    release(b);
    EXPECT_EQ(calls(), (std::vector<CC_Call*>{a, c}));
    release(a);
    release(c);
    EXPECT_EQ(m_pool->getAcquiredCall(0), nullptr);
}

TEST_F(CC_CallPool_Test, ManyCallsAreReleasedInAnyOrder)
{
    std::vector<CC_Call*> left;
    for (int i = 0; i < 300; ++i)
        left.push_back(acquire());
    std::mt19937 random(7);
    while (!left.empty())
    {
        auto const chosen = left.begin() + static_cast<std::ptrdiff_t>(random() % left.size());
        release(*chosen);
        left.erase(chosen);
        if (left.size() % 50 == 0)
        {
            EXPECT_EQ(calls(), left);
        }
    }
    EXPECT_EQ(m_pool->getNumberOfAcquiredCalls(), 0u);
}

TEST_F(CC_CallPool_Test, ReleasingNullDoesNothing)
{
    auto const before = CC_CallPool::s_statistics.m_callsRemoved;
    release(nullptr);
    EXPECT_EQ(CC_CallPool::s_statistics.m_callsRemoved, before);
}

TEST_F(CC_CallPool_Test, ReleasingAForeignCallCountsAndDeletesIt)
{
    auto const removedBefore = CC_CallPool::s_statistics.m_callsRemoved;
    unsigned int const callsBefore = CC_Call::s_numberOfInstances;
    release(new CC_Call);
    EXPECT_EQ(CC_CallPool::s_statistics.m_callsRemoved, removedBefore + 1);
    EXPECT_EQ(CC_Call::s_numberOfInstances, callsBefore);
    CC_CallPool::s_statistics.onCallAdded(); // level again for the other tests
}

TEST_F(CC_CallPool_Test, CallsOfADestroyedPoolEndWithTheirLegs)
{
    CC_Call* const call = acquire();
    addLeg(*call);
    m_loop.settle();
    auto const before = CC_CallPool::s_statistics.m_callsRemoved;
    unsigned int const callsBefore = CC_Call::s_numberOfInstances;
    m_pool.reset();
    EXPECT_EQ(CC_CallPool::s_statistics.m_callsRemoved, before + 1);
    EXPECT_EQ(CC_Call::s_numberOfInstances, callsBefore) << "the call lives on";
    EXPECT_EQ(call->getCallPool(), nullptr);
    call->removeCallLeg(*call->getCallLeg(0));
    m_loop.settle();
    EXPECT_EQ(CC_Call::s_numberOfInstances, callsBefore - 1);
    EXPECT_EQ(CC_CallPool::s_statistics.m_callsRemoved, before + 1) << "it was counted as removed already";
}

// --- dropping calls --------------------------------------------------------------------------------------------------

TEST_F(CC_CallPool_Test, DropCallsTakesTheLegsOutOfTheCallsThatAreMeant)
{
    CC_Call* const a = acquire();
    CC_Call* const b = acquire();
    struct Case
    {
        String unused;
        String name;
        unsigned int legsOfA;
        unsigned int legsOfB;
    };
    Case const cases[] = {
        {"", "", 0, 0},
        {"anything", "", 0, 0},
        {"", a->getName(), 0, 2},
        {a->getName(), b->getName(), 2, 0},
        {a->getName(), "nobody", 2, 2},
        {"", a->getName() + String("", 1), 2, 2}, // one NUL byte more is another name
    };
    for (Case const& row : cases)
    {
        for (CC_Call* const call : {a, b})
            while (call->getNumberOfCallLegs() < 2)
                addLeg(*call);
        m_pool->dropCalls(row.unused, row.name);
        EXPECT_EQ(a->getNumberOfCallLegs(), row.legsOfA) << row.unused.c_str() << "," << row.name.c_str();
        EXPECT_EQ(b->getNumberOfCallLegs(), row.legsOfB) << row.unused.c_str() << "," << row.name.c_str();
        EXPECT_EQ(m_pool->getNumberOfAcquiredCalls(), 2u) << "the calls stay";
    }
    m_pool->dropCalls("", "");
    m_loop.settle();
    EXPECT_EQ(m_pool->getNumberOfAcquiredCalls(), 0u) << "and end by themselves";
}

TEST_F(CC_CallPool_Test, DropCallsTakesTheFirstLegFirst)
{
    Journal journal;
    RecordingCallObserver observer("o", &journal);
    CC_Call* const call = acquire();
    ASSERT_TRUE(call->addCallObserver(&observer).isOk());
    for (char const* const name : {"first", "second", "third"})
        journal.name(addLeg(*call), name);
    journal.clear();
    m_pool->dropCalls("", "");
    EXPECT_EQ(journal.take(), (Lines{"o: first left call", "o: second left call", "o: third left call"}));
    m_loop.settle();
}

TEST_F(CC_CallPool_Test, DropCallsSurvivesAnObserverThatReleasesTheNextCall)
{
    RecordingCallObserver observer("o");
    CC_Call* const a = acquire();
    CC_Call* const b = acquire();
    CC_Call* const c = acquire();
    for (CC_Call* const call : {a, b, c})
        addLeg(*call);
    ASSERT_TRUE(a->addCallObserver(&observer).isOk());
    observer.m_onLegRemoved = [&](CC_EvCallCallLegModified const&) { release(b); };
    m_pool->dropCalls("", "");
    EXPECT_EQ(calls(), (std::vector<CC_Call*>{a, c}));
    EXPECT_EQ(c->getNumberOfCallLegs(), 0u);
    m_loop.settle();
}
