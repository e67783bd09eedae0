#include "calls/CC_Call.h"

#include "callcontrol/CC_CallPool.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/NameOf.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/CallsTest.h"

#include <string>
#include <typeinfo>

namespace
{
using LegState = CC_PropertyCallLegState;

struct CC_CallTest : CallsTest
{
    CC_CallTest() : m_call(newCall("X")) {}

    std::string dump(unsigned int maxLevel, unsigned int maxDetail)
    {
        InfoContainer info;
        return m_call.getInfo(info, maxLevel, 0, maxDetail, 0, "").getString_TreeFormat().c_str();
    }
    std::string name() const { return m_call.getName().c_str(); }

    CC_Call& m_call;
};

CC_PropertyString NAME(char const* name) { return {CC_PropertyId::NAME, name}; }
} // namespace

TEST_F(CC_CallTest, IsNamedAfterItsAddressAndCountedWhileItLives)
{
    unsigned int const before = CC_Call::s_numberOfInstances;
    CC_Call* const call = new CC_Call;
    EXPECT_EQ(CC_Call::s_numberOfInstances, before + 1);
    EXPECT_EQ(call->getName(), String::addressOf(call));
    EXPECT_EQ(call->getCallPool(), nullptr);
    EXPECT_EQ(call->getNumberOfCallLegs(), 0u);
    EXPECT_EQ(call->getState(), CC_Call::INACTIVE);
    EXPECT_EQ(call->getProperties().getNumberOfProperties(), 0u);
    call->destroy();
    EXPECT_EQ(CC_Call::s_numberOfInstances, before);
}

TEST_F(CC_CallTest, NoTwoHaveTheSameNumberThoughAnAddressComesBack)
{
    unsigned long long last = m_call.getSerial();
    for (int i = 0; i < 3; ++i)
    {
        CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
        EXPECT_GT(call->getSerial(), last);
        last = call->getSerial();
        CallControl::RELEASE_CALL("SWITCH", call);
    }
}

TEST_F(CC_CallTest, StatesHaveNames)
{
    EXPECT_STREQ(CC_Call::STATE_NAME(CC_Call::INACTIVE), "INACTIVE");
    EXPECT_STREQ(CC_Call::STATE_NAME(CC_Call::ACTIVE), "ACTIVE");
    EXPECT_STREQ(CC_Call::STATE_NAME(CC_Call::CONFERENCE), "CONFERENCE");
    EXPECT_STREQ(CC_Call::STATE_NAME(static_cast<CC_Call::State>(3)), ERROR::INVALID);
    EXPECT_STREQ(CC_Call::STATE_NAME(static_cast<CC_Call::State>(-1)), ERROR::INVALID);
    EXPECT_STREQ(CC_Call::LIVE_STATE_NAME(CC_Call::RELEASED), "RELEASED");
    EXPECT_STREQ(CC_Call::LIVE_STATE_NAME(CC_Call::ACQUIRED), "ACQUIRED");
    EXPECT_STREQ(CC_Call::LIVE_STATE_NAME(static_cast<CC_Call::LiveState>(2)), ERROR::INVALID);
}

TEST_F(CC_CallTest, ItsStateCountsTheActiveLegsDisconnectingOnesIncluded)
{
    EXPECT_EQ(m_call.getState(), CC_Call::INACTIVE);
    join(m_call, "A", LegState::CONNECTED);
    EXPECT_EQ(m_call.getState(), CC_Call::INACTIVE);
    CC_CallLeg& second = join(m_call, "B", LegState::DISCONNECTING);
    EXPECT_EQ(m_call.getState(), CC_Call::ACTIVE);
    CC_CallLeg& third = join(m_call, "C", LegState::IDLE);
    EXPECT_EQ(m_call.getState(), CC_Call::ACTIVE);
    setState(third, LegState::TRYING);
    EXPECT_EQ(m_call.getState(), CC_Call::CONFERENCE);
    setState(third, LegState::RELEASED);
    EXPECT_EQ(m_call.getState(), CC_Call::ACTIVE);
    second.getPropertiesToWrite().remove(CC_PropertyId::STATE);
    EXPECT_EQ(m_call.getState(), CC_Call::INACTIVE);
}

TEST_F(CC_CallTest, TheMostActiveLegIsTheFirstOfTheHighestUnlessAnotherIsPreferred)
{
    EXPECT_EQ(m_call.getMostActiveCallLeg(nullptr), nullptr);
    CC_CallLeg& alerting = join(m_call, "A", LegState::ALERTING);
    CC_CallLeg& first = join(m_call, "B", LegState::CONNECTED);
    CC_CallLeg& second = join(m_call, "C", LegState::CONNECTED);
    EXPECT_EQ(m_call.getMostActiveCallLeg(nullptr), &first);
    EXPECT_EQ(m_call.getMostActiveCallLeg(&second), &second);
    EXPECT_EQ(m_call.getMostActiveCallLeg(&first), &first);
    EXPECT_EQ(m_call.getMostActiveCallLeg(&alerting), &first) << "the preferred one must be among the equals";
}

TEST_F(CC_CallTest, TheOtherMostActiveLegLeavesOneOut)
{
    CC_CallLeg& first = join(m_call, "A", LegState::CONNECTED);
    EXPECT_EQ(m_call.getOtherMostActiveCallLeg(first, nullptr), nullptr);
    CC_CallLeg& second = join(m_call, "B", LegState::CONNECTED);
    CC_CallLeg& third = join(m_call, "C", LegState::CONNECTED);
    EXPECT_EQ(m_call.getOtherMostActiveCallLeg(first, nullptr), &second);
    EXPECT_EQ(m_call.getOtherMostActiveCallLeg(first, &third), &third);
    EXPECT_EQ(m_call.getOtherMostActiveCallLeg(second, &second), &first) << "excluded, although preferred";
    CC_CallLeg& outside = newLeg("D", LegState::CONNECTED);
    EXPECT_EQ(m_call.getOtherMostActiveCallLeg(outside, nullptr), &first);
}

TEST_F(CC_CallTest, IdleAndReleasedLegsCanBeTheMostActive)
{
    CC_CallLeg& idle = join(m_call, "A", LegState::IDLE);
    EXPECT_EQ(m_call.getMostActiveCallLeg(nullptr), &idle);
    CC_CallLeg& released = join(m_call, "B", LegState::RELEASED);
    EXPECT_EQ(m_call.getMostActiveCallLeg(nullptr), &released);
}

TEST_F(CC_CallTest, LegsAreCountedAndFoundInTheOrderOfJoining)
{
    CC_CallLeg& first = join(m_call, "A");
    CC_CallLeg& second = join(m_call, "B");
    CC_CallLeg& outside = newLeg("C");
    EXPECT_EQ(m_call.getNumberOfCallLegs(), 2u);
    EXPECT_EQ(m_call.getCallLeg(1), &second);
    EXPECT_EQ(m_call.getCallLeg(2), nullptr);
    EXPECT_EQ(m_call.getNumberOfOtherCallLegs(first), 1u);
    EXPECT_EQ(m_call.getNumberOfOtherCallLegs(outside), 2u);
    EXPECT_EQ(m_call.getOtherCallLeg(0, first), &second);
    EXPECT_EQ(m_call.getOtherCallLeg(0, second), &first);
    EXPECT_EQ(m_call.getOtherCallLeg(1, first), nullptr);
    EXPECT_EQ(m_call.getOtherCallLeg(1, outside), &second);
}

TEST_F(CC_CallTest, AChangedPropertyIsStoredLoggedAndTold)
{
    observe(m_call, "o");
    RecordingMonitor const monitor;
    EXPECT_EQ(m_call.setProperty(NAME("n")), XCode::OK);
    using Line = RecordingMonitor::Line;
    EXPECT_EQ(monitor.getLines(),
              std::vector<Line>({Line{RTD::LEVEL_CHANGE, "[Call " + name() + "] Set call property: Name -> n"}}));
    EXPECT_EQ(m_journal.take(), Lines{"o: X changed (Name)"});
    EXPECT_TRUE(m_call.getProperties().get(CC_PropertyId::NAME)->isEqual(NAME("n")));
}

TEST_F(CC_CallTest, AnEqualPropertyIsSilentAloneAndToldAmongSeveral)
{
    EXPECT_EQ(m_call.setProperty(NAME("n")), XCode::OK);
    observe(m_call, "o");
    RecordingMonitor const monitor;
    bool changed = true;
    EXPECT_EQ(m_call.setPropertyNoNotification(NAME("n"), changed), XCode::OK);
    EXPECT_FALSE(changed);
    EXPECT_EQ(m_call.setProperty(NAME("n")), XCode::OK);
    EXPECT_EQ(m_journal.take(), Lines());
    CC_PropertyContainer same;
    EXPECT_EQ(same.set(NAME("n")), XCode::OK);
    EXPECT_EQ(m_call.setProperties(same), XCode::OK);
    EXPECT_EQ(m_journal.take(), Lines{"o: X changed ()"});
    EXPECT_TRUE(monitor.getLines().empty());
}

TEST_F(CC_CallTest, SeveralPropertiesAreToldInOneEvent)
{
    observe(m_call, "o");
    CC_PropertyContainer properties;
    EXPECT_EQ(properties.set(NAME("n")), XCode::OK);
    EXPECT_EQ(properties.set(CC_PropertyString(CC_PropertyId::NETWORK, "pstn")), XCode::OK);
    EXPECT_EQ(m_call.setProperties(properties), XCode::OK);
    EXPECT_EQ(m_call.setProperties(CC_PropertyContainer::EMPTY()), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"o: X changed (Network, Name)", "o: X changed ()"}));
}

TEST_F(CC_CallTest, SetPropertyNoNotificationTellsNobody)
{
    observe(m_call, "o");
    bool changed = false;
    EXPECT_EQ(m_call.setPropertyNoNotification(NAME("n"), changed), XCode::OK);
    EXPECT_TRUE(changed);
    EXPECT_EQ(m_journal.take(), Lines());
}

TEST_F(CC_CallTest, APropertyThatMemoryRefusesIsAFailureAloneAndRefusedAmongSeveral)
{
    observe(m_call, "o");
    CC_PropertyString const longName(CC_PropertyId::NAME, std::string(100, 'n').c_str());
    CC_PropertyContainer properties;
    EXPECT_EQ(properties.set(longName), XCode::OK);
    EXPECT_EQ(properties.set(CC_PropertyString(CC_PropertyId::NETWORK, "pstn")), XCode::OK);
    bool changed = true;
    FailingAllocator::failNth(1);
    XCode const stored = m_call.setPropertyNoNotification(longName, changed);
    FailingAllocator::failNth(1);
    XCode const alone = m_call.setProperty(longName);
    FailingAllocator::failNth(1);
    XCode const among = m_call.setProperties(properties);
    FailingAllocator::stop();
    EXPECT_EQ(stored, XCode::REFUSED);
    EXPECT_FALSE(changed);
    EXPECT_EQ(alone, XCode::FAILURE);
    EXPECT_EQ(among, XCode::REFUSED);
    EXPECT_EQ(m_journal.take(), Lines{"o: X changed (Network)"});
    EXPECT_EQ(m_call.getProperties().get(CC_PropertyId::NAME), nullptr);
}

TEST_F(CC_CallTest, APropertyOfAnotherClassUnderAKnownIdIsToldEachTimeAndLeavesTheValue)
{
    EXPECT_EQ(m_call.setProperty(NAME("n")), XCode::OK);
    observe(m_call, "o");
    for (int i = 0; i < 2; ++i)
        EXPECT_EQ(m_call.setProperty(CC_PropertyUnsigned(CC_PropertyId::NAME, 1)), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"o: X changed (Name)", "o: X changed (Name)"}));
    EXPECT_TRUE(m_call.getProperties().get(CC_PropertyId::NAME)->isEqual(NAME("n")));
}

TEST_F(CC_CallTest, ACallObserverIsCounted)
{
    RecordingCallObserver& observer = observe(m_call, "o");
    EXPECT_EQ(m_call.addCallObserver(&observer), XCode::OK);
    m_call.removeCallObserver(&observer);
    EXPECT_EQ(m_call.setProperty(NAME("1")), XCode::OK);
    m_call.removeCallObserver(&observer);
    EXPECT_EQ(m_call.setProperty(NAME("2")), XCode::OK);
    EXPECT_EQ(m_journal.take(), Lines{"o: X changed (Name)"});
}

TEST_F(CC_CallTest, WithoutMemoryALegObserverIsRegisteredNowhere)
{
    CC_CallLeg& leg = join(m_call, "L", LegState::CONNECTED);
    for (char const* const name : {"1", "2", "3"}) // with the call itself: four
        observeLegs(m_call, name);
    RecordingCallLegObserver& refused = newLegObserver("refused");
    for (unsigned long n = 1; n <= 2; ++n)
    {
        FailingAllocator::failNth(n);
        XCode const result = m_call.addCallLegObserver(&refused);
        FailingAllocator::stop();
        EXPECT_EQ(result, XCode::NO_ELEMENT);
        EXPECT_FALSE(hears(leg, "refused")) << "allocation " << n << " failed";
        CC_CallLeg& late = join(m_call, "late", LegState::CONNECTED);
        EXPECT_FALSE(hears(late, "refused"));
        m_call.removeCallLeg(late);
    }
}

TEST_F(CC_CallTest, ReleasedInsideItsOwnNotificationItEndsWhenThatIsOver)
{
    RecordingCallObserver& first = observe(m_call, "first");
    observe(m_call, "second");
    first.m_onChanged = [](CC_EvCallPropertyChanged const& event)
    {
        CallControl::RELEASE_CALL("SWITCH", event.getSource());
        EXPECT_EQ(event.getSource()->getCallPool(), nullptr);
        EXPECT_EQ(numberOfCalls(), 0u);
    };
    CC_PropertyContainer properties;
    EXPECT_EQ(properties.set(NAME("n")), XCode::OK);
    EXPECT_EQ(m_call.setProperties(properties), XCode::OK);
    EXPECT_EQ(m_journal.take(),
              (Lines{"first: X changed (Name)", "second: X changed (Name)", "first: X ended", "second: X ended"}));
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(CC_CallTest, ReleasedTwiceInsideItsOwnNotificationItEndsOnce)
{
    RecordingCallObserver& observer = newCallObserver("o");
    observer.m_onChanged = [&](CC_EvCallPropertyChanged const& event)
    {
        event.getSource()->destroy();
        event.getSource()->destroy();
        observer.m_onChanged = [](auto const&) {};
        EXPECT_EQ(event.getSource()->setProperty(NAME("inner")), XCode::OK);
    };
    CC_Call* const own = new CC_Call;
    m_journal.name(own, "Y");
    EXPECT_EQ(own->addCallObserver(&observer), XCode::OK);
    EXPECT_EQ(own->setProperty(NAME("n")), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"o: Y changed (Name)", "o: Y changed (Name)", "o: Y ended"}));
}

TEST_F(CC_CallTest, AHoldPutsTheEndOff)
{
    CC_Call* const call = new CC_Call;
    unsigned int const alive = CC_Call::s_numberOfInstances;
    {
        CC_Call::Hold const outer(call);
        {
            CC_Call::Hold const inner(call);
            EXPECT_FALSE(inner.isReleased());
            call->destroy();
            EXPECT_TRUE(inner.isReleased());
        }
        EXPECT_EQ(CC_Call::s_numberOfInstances, alive);
        EXPECT_EQ(outer.get(), call);
    }
    EXPECT_EQ(CC_Call::s_numberOfInstances, alive - 1);
    CC_Call::Hold const none(nullptr);
    EXPECT_FALSE(none.isReleased());
}

TEST_F(CC_CallTest, ItsEndTakesTheLegsOutThenTellsItOnceAndSilencesItself)
{
    CC_CallLeg& leg = join(m_call, "A", LegState::CONNECTED);
    CC_CallLeg& last = join(m_call, "B", LegState::CONNECTED);
    letGo(last); // the call holds it alone
    observe(leg, "leg");
    observe(last, "last");
    observeLegs(m_call, "all");
    RecordingCallObserver& observer = observe(m_call, "call");
    observer.m_onLegRemoved = [](CC_EvCallCallLegModified const& event)
    { EXPECT_EQ(event.getCallLeg()->getCall(), event.getSource()); };
    observer.m_onEnded = [&](CC_EvCallObservationEnded const& event)
    {
        EXPECT_EQ(event.getSource()->getNumberOfCallLegs(), 0u);
        EXPECT_EQ(event.getSource()->addCallLeg(leg), XCode::FAILURE) << "it takes no leg any more";
        EXPECT_EQ(event.getSource()->setProperty(NAME("n")), XCode::OK);
        event.getSource()->defer();
        event.getSource()->destroy();
    };
    m_journal.clear();
    CallControl::RELEASE_CALL("SWITCH", &m_call);
    EXPECT_EQ(m_journal.take(),
              (Lines{"call: A left X", "leg: A moved from X to none", "call: B left X", "last: B moved from X to none",
                     "last: B ended", "call: X ended", "call: X changed (Name)"}));
    EXPECT_EQ(leg.getCall(), nullptr);
    EXPECT_FALSE(turn()) << "the clean-up went with the call";
}

TEST_F(CC_CallTest, AfterItsEndItsLegsTellItNothing)
{
    CC_CallLeg& leg = join(m_call, "A", LegState::CONNECTED);
    observeLegs(m_call, "all");
    CallControl::RELEASE_CALL("SWITCH", &m_call);
    m_journal.clear();
    setState(leg, LegState::RELEASED);
    EXPECT_EQ(m_journal.take(), Lines());
}

TEST_F(CC_CallTest, AWrongEventFromALegCannotBeCast)
{
    CC_CallLeg& leg = join(m_call, "A");
    settle();
    EXPECT_THROW(m_call.onCallLegPropertyChanged(CC_EvCallLegObservationEnded(leg)), std::bad_cast);
    m_call.onCallLegObservationEnded(CC_EvCallLegObservationEnded(leg));
    m_call.onCallLegCallRelinked(CC_EvCallLegCallRelinked(leg, nullptr, nullptr));
    EXPECT_FALSE(turn()) << "neither asks for anything";
}

TEST_F(CC_CallTest, AnObserverThatAlwaysPutsALegBackCannotKeepTheCallFromEnding)
{
    join(m_call, "A", LegState::CONNECTED);
    join(m_call, "B", LegState::CONNECTED);
    unsigned int refused = 0;
    observe(m_call, "o").m_onLegRemoved = [&](CC_EvCallCallLegModified const& event)
    {
        EXPECT_EQ(event.getSource()->addCallLeg(*event.getCallLeg()), XCode::FAILURE) << "it takes no leg any more";
        ++refused;
    };
    CallControl::RELEASE_CALL("SWITCH", &m_call);
    EXPECT_EQ(refused, 2u);
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(CC_CallTest, TheContextMayBeDestroyedInsideItsEnd)
{
    observe(m_call, "o").m_onEnded = [](auto const&) { CallControl::DESTROY_CONTEXT("SWITCH"); };
    m_call.defer();
    turn();
    EXPECT_EQ(m_journal.take(), Lines{"o: X ended"});
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(CC_CallTest, WhosePoolIsGoneDestroysItselfAfterItsLastLeg)
{
    CC_CallLeg& leg = join(m_call, "L", LegState::CONNECTED);
    CallControl::DESTROY_CONTEXT("SWITCH");
    EXPECT_EQ(m_call.getCallPool(), nullptr);
    turn();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 1u);
    setState(leg, LegState::RELEASED);
    turn();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(CC_CallTest, ADumpGrowsWithLevelAndDetail)
{
    join(m_call, "A", LegState::ALERTING);
    EXPECT_EQ(dump(0, 9), "Call: " + name() + "\n");
    EXPECT_EQ(dump(1, 0), "Call: " + name() + "\n");
    EXPECT_EQ(dump(1, 1), "Call: " + name() + "\n  State: INACTIVE\n  Properties\n  Call Legs\n");
    EXPECT_EQ(dump(1, 3), dump(1, 1));
    String pool = String::addressOf(m_call.getCallPool());
    EXPECT_EQ(dump(1, 4),
              "Call: " + name() + "\n  State: INACTIVE\n  Properties\n  Pool: " + pool.c_str() + "\n  Call Legs\n");
    EXPECT_EQ(dump(2, 1), "Call: " + name() +
                              "\n  State: INACTIVE\n  Properties\n    Context: 0x00000001\n  Call Legs\n"
                              "    Call Leg: A\n");
    EXPECT_EQ(dump(2, 2), "Call: " + name() +
                              "\n  State: INACTIVE\n  Properties\n    Context: 0x00000001 (ContextId)\n  Call Legs\n"
                              "    Call Leg: A\n");
}

TEST_F(CC_CallTest, ADumpPrintsACallInsideItsOwnLegWithoutItsLegs)
{
    join(m_call, "A", LegState::ALERTING);
    std::string const text = dump(9, 3);
    EXPECT_EQ(text.substr(0, text.find("      Properties\n        State")),
              "Call: " + name() +
                  "\n  State: INACTIVE\n  Properties\n    Context: 0x00000001 (ContextId)\n  Call Legs\n"
                  "    Call Leg: A\n      Call: " +
                  name() + "\n        State: INACTIVE\n        Call Legs\n");
    EXPECT_NE(text.find("      Properties\n        State: ALERTING (Call-Leg-State)\n"), std::string::npos);
    EXPECT_EQ(text.find("Call Leg: A"), text.rfind("Call Leg: A"));
}

TEST_F(CC_CallTest, ADumpBeginsWithItsPrefixAtItsLevelAndDetail)
{
    InfoContainer info;
    EXPECT_EQ(&m_call.getInfo(info, 3, 3, 9, 2, "The "), &info);
    ASSERT_EQ(info.getNumberOfEntries(), 1u);
    EXPECT_EQ(info.getEntry(0).level, 3u);
    EXPECT_EQ(info.getEntry(0).detail, 2u);
    EXPECT_EQ(info.getEntry(0).key, "The Call");
    m_call.getInfo(info, 2, 3, 9, 2, "");
    EXPECT_EQ(info.getNumberOfEntries(), 1u);
}

TEST_F(CC_CallTest, ADumpWithoutDetailForTheCallStillShowsNothingOfItsLegs)
{
    join(m_call, "A", LegState::ALERTING);
    InfoContainer info;
    m_call.getInfo(info, 9, 0, 1, 2, "");
    EXPECT_EQ(info.getNumberOfEntries(), 0u);
}

TEST(CC_CallDeathTest, MadeBeforeTheEventLoopIsSetIsAClearMistake)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    ASSERT_EQ(CallControl::GET_CC_EVENT_LOOP(), nullptr);
#ifdef NDEBUG
    CC_Call* const call = new CC_Call;
    call->defer(); // nowhere to run: nothing happens
    call->destroy();
#else
    EXPECT_DEATH(new CC_Call, "a call before CallControl::SET_CC_EVENT_LOOP");
#endif
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}
