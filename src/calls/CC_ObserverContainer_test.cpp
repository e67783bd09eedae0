#include "calls/CC_ObserverContainer.h"

#include "testing/FailingAllocator.h"
#include "tests/support/CallsTest.h"

namespace
{
using CallObservers = CC_ObserverContainer<CC_CallObserver, CC_Call>;

struct CC_ObserverContainerTest : CallsTest
{
    CC_ObserverContainerTest() : m_call(newCall("X")) {}

    void add(RecordingCallObserver& observer) { EXPECT_EQ(m_observers.addObserver(&observer), XCode::OK); }
    Lines tell()
    {
        m_observers.broadcastEvent(CC_EvCallObservationEnded(m_call), &CC_CallObserver::onCallObservationEnded);
        return m_journal.take();
    }

    CC_Call& m_call;
    CallObservers m_observers;
    RecordingCallObserver a{"a", &m_journal};
    RecordingCallObserver b{"b", &m_journal};
};
} // namespace

TEST_F(CC_ObserverContainerTest, TellsInTheOrderOfTheFirstRegistrations)
{
    add(a);
    add(b);
    m_observers.removeObserver(&a);
    add(a);
    EXPECT_EQ(tell(), (Lines{"a: X ended", "b: X ended"}));
}

TEST_F(CC_ObserverContainerTest, TheThirdRemovalOfATwiceAddedObserverWrapsItsCount)
{
    add(a);
    add(a);
    m_observers.removeObserver(&a);
    EXPECT_EQ(tell(), Lines{"a: X ended"});
    m_observers.removeObserver(&a);
    EXPECT_EQ(tell(), Lines());
    m_observers.removeObserver(&a);
    EXPECT_EQ(tell(), Lines{"a: X ended"});
}

TEST_F(CC_ObserverContainerTest, AnObserverThatRemovesTheNextKeepsItFromBeingTold)
{
    add(a);
    add(b);
    a.m_onEnded = [&](auto const&) { m_observers.removeObserver(&b); };
    EXPECT_EQ(tell(), Lines{"a: X ended"});
}

TEST_F(CC_ObserverContainerTest, AnObserverAddedDuringADeliveryIsToldOfIt)
{
    add(a);
    a.m_onEnded = [&](auto const&) { add(b); };
    EXPECT_EQ(tell(), (Lines{"a: X ended", "b: X ended"}));
}

TEST_F(CC_ObserverContainerTest, HandsTheEventItselfToTheChosenOperation)
{
    add(a);
    CC_Flags flags;
    EXPECT_TRUE(flags.set(CC_PropertyId::NAME, true).isOk());
    CC_EvCallPropertyChanged const event(m_call, flags);
    CC_Event<CC_Call> const* told = nullptr;
    a.m_onChanged = [&](CC_EvCallPropertyChanged const& changed) { told = &changed; };
    m_observers.broadcastEvent(event, &CC_CallObserver::onCallPropertyChanged);
    EXPECT_EQ(told, &event);
    EXPECT_EQ(m_journal.take(), Lines{"a: X changed (Name)"});
}

TEST_F(CC_ObserverContainerTest, ASilencedOneTellsNobody)
{
    add(a);
    add(b);
    m_observers.silence();
    EXPECT_EQ(tell(), Lines());
    EXPECT_EQ(m_observers.getNumberOfEntries(), 2u);
}

TEST_F(CC_ObserverContainerTest, ForEachVisitsThoseWhoWouldBeTold)
{
    add(a);
    add(b);
    m_observers.removeObserver(&a);
    std::vector<CC_CallObserver*> visited;
    m_observers.forEach([&](CC_CallObserver& observer) { visited.push_back(&observer); });
    EXPECT_EQ(visited, std::vector<CC_CallObserver*>{&b});
}

TEST_F(CC_ObserverContainerTest, FourObserversNeedNoMemory)
{
    RecordingCallObserver c("c", &m_journal);
    RecordingCallObserver d("d", &m_journal);
    RecordingCallObserver e("e", &m_journal);
    FailingAllocator::failNth(1);
    XCode const fourth[] = {m_observers.addObserver(&a), m_observers.addObserver(&b), m_observers.addObserver(&c),
                            m_observers.addObserver(&d)};
    XCode const fifth = m_observers.addObserver(&e);
    FailingAllocator::stop();
    for (XCode const result : fourth)
        EXPECT_EQ(result, XCode::OK);
    EXPECT_EQ(fifth, XCode::NO_ELEMENT);
    EXPECT_EQ(tell().size(), 4u);
}
