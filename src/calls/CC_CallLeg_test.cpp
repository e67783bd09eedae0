#include "calls/CC_CallLeg.h"

#include "platform/base/InfoContainer.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCause.h"
#include "services/CC_ServicePushBack.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/CallsTest.h"

#include <string>
#include <thread>

namespace
{
struct CC_CallLegTest : CallsTest
{
    /// A leg with the observer `o`.
    CC_CallLeg& newObservedLeg(State state = CC_PropertyCallLegState::IDLE)
    {
        CC_CallLeg& leg = newLeg("L", state);
        EXPECT_EQ(leg.addCallLegObserver(&m_observer), XCode::OK);
        return leg;
    }
    static std::string dump(CC_CallLeg const& leg, unsigned int maxLevel, unsigned int maxDetail)
    {
        InfoContainer info;
        return leg.getInfo(info, maxLevel, 0, maxDetail, 0, "").getString_TreeFormat().c_str();
    }

    static std::string causeText()
    {
        String text;
        return CC_PropertyCause(CC_PropertyId::CAUSE).getValueString(text).c_str();
    }

    RecordingCallLegObserver m_observer{"o", &m_journal};
};

CC_PropertyCallLegState STATE(CC_PropertyCallLegState::State state) { return {CC_PropertyId::STATE, state}; }
CC_PropertyString NETWORK(char const* network) { return {CC_PropertyId::NETWORK, network}; }
CC_PropertyString NAME(char const* name) { return {CC_PropertyId::NAME, name}; }
} // namespace

TEST_F(CC_CallLegTest, ANewOneIsIdleInNoCallAndHasThreeProperties)
{
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_EQ(leg->getState(), -2);
    EXPECT_EQ(leg->getActivityLevel(), -2);
    EXPECT_EQ(leg->getCall(), nullptr);
    EXPECT_EQ(leg->getName(), "");
    EXPECT_EQ(PROPERTY_VALUES(leg->getProperties()).substr(0, 34), "State: IDLE, Provides Data: false,");
    EXPECT_EQ(PROPERTY_NAMES(leg->getProperties()), "State, Provides Data, Cause");
    EXPECT_TRUE(leg->getProperties().get(CC_PropertyId::CAUSE)->isEqual(CC_PropertyCause(CC_PropertyId::CAUSE)));
    leg->removeReference();
}

TEST_F(CC_CallLegTest, NoTwoHaveTheSameNumberThoughAnAddressComesBack)
{
    unsigned long long last = 0;
    for (int i = 0; i < 3; ++i)
    {
        CC_CallLeg* const leg = new CC_CallLeg;
        EXPECT_GT(leg->getSerial(), last);
        last = leg->getSerial();
        leg->removeReference();
    }
}

TEST_F(CC_CallLegTest, OnceItsOwnerLetsItGoItTakesNoStateButReleased)
{
    CC_CallLeg& leg = newObservedLeg(CC_PropertyCallLegState::CONNECTED);
    leg.fixState();
    m_journal.clear();
    EXPECT_EQ(leg.setProperty(STATE(CC_PropertyCallLegState::HELD)), XCode::OK);
    EXPECT_EQ(leg.getState(), CC_PropertyCallLegState::CONNECTED);
    EXPECT_EQ(leg.setProperty(STATE(CC_PropertyCallLegState::RELEASED)), XCode::OK);
    CC_PropertyContainer stale;
    ASSERT_EQ(stale.set(NAME("Anna")), XCode::OK);
    ASSERT_EQ(stale.set(STATE(CC_PropertyCallLegState::CONNECTED)), XCode::OK);
    EXPECT_EQ(leg.setProperties(stale), XCode::OK);
    EXPECT_EQ(leg.getState(), CC_PropertyCallLegState::RELEASED);
    EXPECT_EQ(m_journal.take(), (Lines{"o: L changed (State)", "o: L changed (Name)"}));
}

TEST_F(CC_CallLegTest, AsLongAsEveryChangeIsToldNothingChangesUntold)
{
    CC_CallLeg& leg = newObservedLeg();
    EXPECT_EQ(leg.setProperty(NAME("Anna")), XCode::OK);
    CC_PropertyContainer many;
    ASSERT_EQ(many.set(NETWORK("isdn")), XCode::OK);
    EXPECT_EQ(leg.setProperties(many), XCode::OK);
    EXPECT_NE(leg.getProperties().get(CC_PropertyId::NAME), nullptr);
    EXPECT_FALSE(leg.mayChangeUntold());
}

TEST_F(CC_CallLegTest, WhoHasHadThePropertiesToWriteMayChangeThemUntold)
{
    CC_CallLeg& leg = newObservedLeg();
    std::ignore = leg.getProperties().get(CC_PropertyId::NAME);
    EXPECT_FALSE(leg.mayChangeUntold()) << "who reads changes nothing";
    std::ignore = leg.getPropertiesToWrite();
    EXPECT_TRUE(leg.mayChangeUntold());
}

TEST_F(CC_CallLegTest, APropertyStoredWithoutNotificationIsAnUntoldChange)
{
    CC_CallLeg& leg = newObservedLeg();
    bool changed = false;
    EXPECT_EQ(leg.setPropertyNoNotification(NAME("Anna"), changed), XCode::OK);
    EXPECT_TRUE(leg.mayChangeUntold());
}

TEST_F(CC_CallLegTest, NotificationsOfChangesAreNumbered)
{
    CC_CallLeg& leg = newObservedLeg();
    std::vector<unsigned int> seen;
    m_observer.m_onChanged = [&](CC_EvCallLegPropertyChanged const&)
    {
        seen.push_back(leg.getNumberOfNotifications());
        std::ignore = leg.setProperty(NAME("Anna")); // told once: it then is equal
    };
    EXPECT_EQ(leg.getNumberOfNotifications(), 0u);
    EXPECT_EQ(leg.setProperty(NETWORK("isdn")), XCode::OK);
    EXPECT_EQ(seen, (std::vector<unsigned int>{1, 2}));
    EXPECT_EQ(leg.setProperty(NETWORK("isdn")), XCode::OK);
    EXPECT_EQ(leg.getNumberOfNotifications(), 2u) << "nothing changed";
    EXPECT_EQ(leg.setProperties(CC_PropertyContainer::EMPTY()), XCode::OK);
    EXPECT_EQ(leg.getNumberOfNotifications(), 3u) << "told of none";
}

TEST_F(CC_CallLegTest, IsCountedWhileItLives)
{
    unsigned int const before = CC_CallLeg::s_numberOfInstances;
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, before + 1);
    leg->addReference();
    leg->removeReference();
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, before + 1);
    leg->removeReference();
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, before);
}

TEST_F(CC_CallLegTest, ReferencesMayBeGivenUpOnAnotherThread)
{
    CC_CallLeg& leg = newObservedLeg();
    for (int i = 0; i < 1000; ++i)
        leg.addReference();
    std::thread other(
        [&]
        {
            for (int i = 0; i < 500; ++i)
                leg.removeReference();
        });
    for (int i = 0; i < 500; ++i)
        leg.removeReference();
    other.join();
    EXPECT_EQ(m_journal.take(), Lines());
    letGo(leg);
    EXPECT_EQ(m_journal.take(), Lines{"o: L ended"});
}

TEST_F(CC_CallLegTest, SettingIdleIsRefusedAndChangesNothing)
{
    CC_CallLeg& leg = newObservedLeg(CC_PropertyCallLegState::TRYING);
    bool changed = true;
    EXPECT_EQ(leg.setPropertyNoNotification(STATE(CC_PropertyCallLegState::IDLE), changed), XCode::REFUSED);
    EXPECT_FALSE(changed);
    EXPECT_EQ(leg.setProperty(STATE(CC_PropertyCallLegState::IDLE)), XCode::FAILURE);
    EXPECT_EQ(leg.getState(), CC_PropertyCallLegState::TRYING);
    EXPECT_EQ(m_journal.take(), Lines());
}

TEST_F(CC_CallLegTest, IdleOntoIdleIsSilentSuccess)
{
    CC_CallLeg& leg = newObservedLeg();
    RecordingMonitor const monitor;
    bool changed = true;
    EXPECT_EQ(leg.setPropertyNoNotification(STATE(CC_PropertyCallLegState::IDLE), changed), XCode::OK);
    EXPECT_FALSE(changed);
    EXPECT_EQ(leg.setProperty(STATE(CC_PropertyCallLegState::IDLE)), XCode::OK);
    EXPECT_TRUE(monitor.getLines().empty());
    EXPECT_EQ(m_journal.take(), Lines());
}

TEST_F(CC_CallLegTest, AStateOfAnotherClassIsRefused)
{
    CC_CallLeg& leg = newObservedLeg(CC_PropertyCallLegState::TRYING);
    bool changed = true;
    EXPECT_EQ(leg.setPropertyNoNotification(CC_PropertyUnsigned(CC_PropertyId::STATE, 6), changed), XCode::REFUSED);
    EXPECT_FALSE(changed);
    EXPECT_EQ(leg.getState(), CC_PropertyCallLegState::TRYING);
}

TEST_F(CC_CallLegTest, ARefusedStateHasBeenLogged)
{
    CC_CallLeg& leg = newObservedLeg(CC_PropertyCallLegState::TRYING);
    RecordingMonitor const monitor;
    EXPECT_EQ(leg.setProperty(STATE(CC_PropertyCallLegState::IDLE)), XCode::FAILURE);
    EXPECT_EQ(monitor.linesOfLevel(RTD::LEVEL_CHANGE), Lines{"[EP L] Set call-leg property: State -> IDLE"});
}

TEST_F(CC_CallLegTest, WithoutAStateOrWithAStateOfAnotherClassItCountsAsReleased)
{
    CC_CallLeg& leg = newLeg("L", CC_PropertyCallLegState::CONNECTED);
    leg.getPropertiesToWrite().remove(CC_PropertyId::STATE);
    EXPECT_EQ(leg.getState(), -1);
    EXPECT_EQ(leg.getActivityLevel(), -1);
    EXPECT_EQ(leg.getPropertiesToWrite().set(CC_PropertyUnsigned(CC_PropertyId::STATE, 6)), XCode::OK);
    EXPECT_EQ(leg.getState(), -1);
}

TEST_F(CC_CallLegTest, AnEqualPropertyIsNeitherStoredNorLoggedNorTold)
{
    CC_CallLeg& leg = newObservedLeg();
    EXPECT_EQ(leg.setProperty(NETWORK("pstn")), XCode::OK);
    m_journal.clear();
    RecordingMonitor const monitor;
    EXPECT_EQ(leg.setProperty(NETWORK("pstn")), XCode::OK);
    EXPECT_TRUE(monitor.getLines().empty());
    EXPECT_EQ(m_journal.take(), Lines());
}

TEST_F(CC_CallLegTest, AChangedPropertyIsLoggedAtLevelThreeInOneLine)
{
    CC_CallLeg& leg = newObservedLeg();
    RecordingMonitor const monitor;
    EXPECT_EQ(leg.setProperty(NETWORK("pstn")), XCode::OK);
    using Line = RecordingMonitor::Line;
    EXPECT_EQ(monitor.getLines(),
              std::vector<Line>({Line{RTD::LEVEL_CHANGE, "[EP L] Set call-leg property: Network -> pstn"}}));
    EXPECT_EQ(m_journal.take(), Lines{"o: L changed (Network)"});
}

TEST_F(CC_CallLegTest, AQualityOfServiceIsLoggedAtLevelFiveInTwoLines)
{
    CC_CallLeg& leg = newLeg("L");
    RecordingMonitor const monitor;
    EXPECT_EQ(leg.setProperty(CC_PropertyString(CC_PropertyId::QUALITY_OF_SERVICE, "jitter 3\nlost 0")), XCode::OK);
    using Line = RecordingMonitor::Line;
    EXPECT_EQ(monitor.getLines(),
              std::vector<Line>(
                  {Line{RTD::LEVEL_BULK, "[EP L] Set call-leg property: Quality-Of-Service\njitter 3\nlost 0"}}));
}

TEST_F(CC_CallLegTest, ALevelThatIsOffLogsNothing)
{
    CC_CallLeg& leg = newLeg("L");
    RecordingMonitor const monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(leg.setProperty(NETWORK("pstn")), XCode::OK);
    EXPECT_TRUE(monitor.getLines().empty());
}

TEST_F(CC_CallLegTest, ALineWithoutALegNameHasAnEmptyPlaceForIt)
{
    CC_CallLeg& leg = newLeg("");
    RecordingMonitor const monitor;
    EXPECT_EQ(leg.setProperty(NETWORK("pstn")), XCode::OK);
    EXPECT_EQ(monitor.linesOfLevel(RTD::LEVEL_CHANGE), Lines{"[EP ] Set call-leg property: Network -> pstn"});
}

TEST_F(CC_CallLegTest, WhoLogsOneOfSeveralMayRemoveTheNextOnesFromTheLeg)
{
    class RemovingMonitor : public RecordingMonitor
    {
    public:
        explicit RemovingMonitor(CC_CallLeg& leg) : m_leg(leg) {}
        void write(unsigned int monitorId, unsigned int level, char const* text) override
        {
            RecordingMonitor::write(monitorId, level, text);
            if (getLines().size() > 1)
                return;
            for (unsigned int const id : {CC_PropertyId::NAME, CC_PropertyId::DISPLAY})
                EXPECT_TRUE(m_leg.getPropertiesToWrite().remove(id));
        }

    private:
        CC_CallLeg& m_leg;
    };
    CC_CallLeg& leg = newObservedLeg();
    CC_PropertyContainer properties;
    for (unsigned int const id : {CC_PropertyId::NETWORK, CC_PropertyId::NAME, CC_PropertyId::DISPLAY})
        ASSERT_EQ(properties.set(CC_PropertyString(id, "x")), XCode::OK);
    ASSERT_EQ(leg.setProperties(properties), XCode::OK);
    m_journal.clear();
    ASSERT_EQ(properties.set(NETWORK("pstn")), XCode::OK);
    RemovingMonitor const monitor(leg);
    EXPECT_EQ(leg.setProperties(properties), XCode::OK);
    EXPECT_EQ(m_journal.take(), Lines{"o: L changed (Network, Name, Display)"});
    EXPECT_EQ(monitor.linesOfLevel(RTD::LEVEL_CHANGE),
              (Lines{"[EP L] Set call-leg property: Network -> pstn", "[EP L] Set call-leg property: Name -> x",
                     "[EP L] Set call-leg property: Display -> x"}));
}

TEST_F(CC_CallLegTest, SetPropertyNoNotificationTellsNobody)
{
    CC_CallLeg& leg = newObservedLeg();
    bool changed = false;
    EXPECT_EQ(leg.setPropertyNoNotification(NAME("n"), changed), XCode::OK);
    EXPECT_TRUE(changed);
    EXPECT_EQ(m_journal.take(), Lines());
    EXPECT_EQ(PROPERTY_NAMES(leg.getProperties()), "State, Provides Data, Cause, Name");
}

TEST_F(CC_CallLegTest, StateIsStoredLastInWhateverOrderItCame)
{
    CC_PropertyContainer stateFirst;
    EXPECT_EQ(stateFirst.set(STATE(CC_PropertyCallLegState::CONNECTED)), XCode::OK);
    EXPECT_EQ(stateFirst.set(NETWORK("pstn")), XCode::OK);
    CC_PropertyContainer stateLast;
    EXPECT_EQ(stateLast.set(NETWORK("pstn")), XCode::OK);
    EXPECT_EQ(stateLast.set(STATE(CC_PropertyCallLegState::CONNECTED)), XCode::OK);
    for (CC_PropertyContainer const* const properties : {&stateFirst, &stateLast})
    {
        CC_CallLeg& leg = newObservedLeg();
        RecordingMonitor const monitor;
        EXPECT_EQ(leg.setProperties(*properties), XCode::OK);
        EXPECT_EQ(m_journal.take(), Lines{"o: L changed (Network, State)"});
        EXPECT_EQ(monitor.linesOfLevel(RTD::LEVEL_CHANGE), (Lines{"[EP L] Set call-leg property: Network -> pstn",
                                                                  "[EP L] Set call-leg property: State -> CONNECTED"}));
    }
}

TEST_F(CC_CallLegTest, SetPropertiesAlwaysTellsEvenOfNothing)
{
    CC_CallLeg& leg = newObservedLeg();
    EXPECT_EQ(leg.setProperties(CC_PropertyContainer::EMPTY()), XCode::OK);
    EXPECT_EQ(m_journal.take(), Lines{"o: L changed ()"});
    CC_PropertyContainer same;
    EXPECT_EQ(same.set(STATE(CC_PropertyCallLegState::IDLE)), XCode::OK);
    EXPECT_EQ(leg.setProperties(same), XCode::OK);
    EXPECT_EQ(m_journal.take(), Lines{"o: L changed ()"});
}

TEST_F(CC_CallLegTest, ARefusedStateAmongOthersIsTheResultAndTheOthersAreStored)
{
    CC_CallLeg& leg = newObservedLeg(CC_PropertyCallLegState::TRYING);
    CC_PropertyContainer properties;
    EXPECT_EQ(properties.set(STATE(CC_PropertyCallLegState::IDLE)), XCode::OK);
    EXPECT_EQ(properties.set(NAME("n")), XCode::OK);
    EXPECT_EQ(leg.setProperties(properties), XCode::REFUSED);
    EXPECT_EQ(m_journal.take(), Lines{"o: L changed (Name)"});
    EXPECT_EQ(leg.getState(), CC_PropertyCallLegState::TRYING);
}

TEST_F(CC_CallLegTest, APropertyOfAnotherClassUnderAKnownIdIsToldEachTimeAndLeavesTheValue)
{
    CC_CallLeg& leg = newObservedLeg();
    EXPECT_EQ(leg.setProperty(NAME("n")), XCode::OK);
    m_journal.clear();
    for (int i = 0; i < 2; ++i)
        EXPECT_EQ(leg.setProperty(CC_PropertyBoolean(CC_PropertyId::NAME, true)), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"o: L changed (Name)", "o: L changed (Name)"}));
    EXPECT_TRUE(leg.getProperties().get(CC_PropertyId::NAME)->isEqual(NAME("n")));
}

TEST_F(CC_CallLegTest, AServiceReachesItsObserversAtOnce)
{
    CC_CallLeg& leg = newObservedLeg();
    CC_ServicePushBack pushBack(7);
    CC_Service const* seen = nullptr;
    m_observer.m_onService = [&](CC_EvCallLegSynchronousService const& event) { seen = event.getService(); };
    leg.invokeSynchronousService(pushBack);
    EXPECT_EQ(seen, &pushBack);
    EXPECT_EQ(m_journal.take(), Lines{"o: L asked (Push Back: 7)"});
}

TEST_F(CC_CallLegTest, ItsEndIsToldOnceAndSilencesIt)
{
    CC_CallLeg& leg = newObservedLeg();
    RecordingCallLegObserver& late = newLegObserver("late");
    m_observer.m_onEnded = [&](CC_EvCallLegObservationEnded const& event)
    {
        EXPECT_EQ(event.getSource()->getCall(), nullptr);
        EXPECT_EQ(event.getSource()->addCallLegObserver(&late), XCode::OK);
    };
    letGo(leg);
    EXPECT_EQ(m_journal.take(), (Lines{"o: L ended", "late: L ended"}));
}

TEST_F(CC_CallLegTest, DestroyedWhileStillLinkedItTellsTheUnlinkingFirst)
{
    CC_Call& call = newCall("X");
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_EQ(leg->setName("L"), XCode::OK);
    EXPECT_EQ(leg->addCallLegObserver(&m_observer), XCode::OK);
    leg->setCall(&call); // the pointer alone
    m_observer.m_onRelinked = [&](CC_EvCallLegCallRelinked const& event)
    { EXPECT_EQ(event.getSource()->getCall(), &call) << "cleared after the delivery"; };
    m_observer.m_onEnded = [](CC_EvCallLegObservationEnded const& event)
    { EXPECT_EQ(event.getSource()->getCall(), nullptr); };
    leg->removeReference();
    EXPECT_EQ(m_journal.take(), (Lines{"o: L moved from X to none", "o: L ended"}));
}

TEST_F(CC_CallLegTest, AReferenceTakenAndGivenUpInItsLastDeliveriesEndsItOnce)
{
    CC_Call& call = newCall("X");
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_EQ(leg->addCallLegObserver(&m_observer), XCode::OK);
    leg->setCall(&call);
    m_observer.m_onRelinked = [&](CC_EvCallLegCallRelinked const& event)
    {
        event.getSource()->addReference();
        event.getSource()->removeReference();
    };
    m_observer.m_onEnded = [&](CC_EvCallLegObservationEnded const& event)
    {
        CC_CallLeg::Reference const held(*event.getSource());
        EXPECT_EQ(event.getSource()->setProperty(NAME("n")), XCode::OK);
    };
    leg->removeReference();
    EXPECT_EQ(m_journal.take(), (Lines{"o: leg moved from X to none", "o: leg ended", "o: leg changed (Name)"}));
}

TEST_F(CC_CallLegTest, AnObserverMayGiveUpTheLastReferenceInsideADelivery)
{
    CC_CallLeg& leg = newObservedLeg();
    observe(leg, "second");
    m_observer.m_onChanged = [&](auto const&) { letGo(leg); };
    EXPECT_EQ(leg.setProperty(NAME("n")), XCode::OK);
    EXPECT_EQ(m_journal.take(),
              (Lines{"o: L changed (Name)", "second: L changed (Name)", "o: L ended", "second: L ended"}));
}

TEST_F(CC_CallLegTest, MemoryThatRunsOutLeavesTheOldValue)
{
    CC_CallLeg& leg = newObservedLeg();
    std::string const longName(100, 'n');
    CC_PropertyString const name(CC_PropertyId::NAME, longName.c_str());
    CC_PropertyContainer properties;
    EXPECT_EQ(properties.set(name), XCode::OK);
    bool changed = true;
    FailingAllocator::failNth(1);
    XCode const first = leg.setPropertyNoNotification(name, changed);
    FailingAllocator::failNth(1);
    XCode const second = leg.setProperty(name);
    FailingAllocator::failNth(1);
    XCode const third = leg.setProperties(properties);
    String const newName(longName.c_str());
    FailingAllocator::failNth(1);
    XCode const fourth = leg.setName(newName);
    FailingAllocator::stop();
    EXPECT_EQ(first, XCode::REFUSED);
    EXPECT_FALSE(changed);
    EXPECT_EQ(second, XCode::FAILURE);
    EXPECT_EQ(third, XCode::REFUSED);
    EXPECT_EQ(m_journal.take(), Lines{"o: L changed ()"}) << "of the third alone";
    EXPECT_EQ(leg.getProperties().get(CC_PropertyId::NAME), nullptr);
    EXPECT_EQ(fourth, XCode::FAILURE);
    EXPECT_EQ(leg.getName(), "L");
}

TEST_F(CC_CallLegTest, MadeWithoutMemoryForItsStateItCountsAsReleased)
{
    FailingAllocator::failNth(2); // the first is for the leg itself
    CC_CallLeg* const leg = new CC_CallLeg;
    FailingAllocator::stop();
    EXPECT_EQ(PROPERTY_NAMES(leg->getProperties()), "Provides Data, Cause");
    EXPECT_EQ(leg->getState(), CC_PropertyCallLegState::RELEASED);
    setState(*leg, CC_PropertyCallLegState::TRYING);
    EXPECT_EQ(leg->getState(), CC_PropertyCallLegState::TRYING);
    leg->removeReference();
}

TEST_F(CC_CallLegTest, AReleaseOfWhichMemoryKeepsTheTellingStillEndsItsCall)
{
    for (unsigned long n = 1;; ++n)
    {
        CC_CallLeg& leg = join(newCall("X"), "L", CC_PropertyCallLegState::CONNECTED);
        settle();
        FailingAllocator::failNth(n);
        XCode const result = leg.setProperty(STATE(CC_PropertyCallLegState::RELEASED));
        FailingAllocator::stop();
        if (!result.isOk())
            setState(leg, CC_PropertyCallLegState::RELEASED);
        letGo(leg);
        settle();
        EXPECT_EQ(numberOfCalls(), 0u) << "allocation " << n << " failed";
        if (!FailingAllocator::hasFailed())
            break;
    }
}

TEST_F(CC_CallLegTest, ADumpNamesTheLegThenItsCallAndProperties)
{
    CC_Call& call = newCall("X");
    CC_CallLeg& leg = join(call, "L", CC_PropertyCallLegState::ALERTING);
    std::string const name = call.getName().c_str();
    EXPECT_EQ(dump(leg, 0, 9), "Call Leg: L\n");
    EXPECT_EQ(dump(leg, 9, 0), "Call Leg: L\n");
    EXPECT_EQ(dump(leg, 1, 1), "Call Leg: L\n  Call: " + name + "\n  Properties\n");
    EXPECT_EQ(dump(leg, 2, 2), "Call Leg: L\n  Call: " + name +
                                   "\n    State: INACTIVE\n    Properties\n    Call Legs\n  Properties\n"
                                   "    State: ALERTING (Call-Leg-State)\n    Provides Data: false (Boolean)\n"
                                   "    Cause: " +
                                   causeText() + " (Cause)\n");
}

TEST_F(CC_CallLegTest, ADumpOfANamelessLegShowsItsAddress)
{
    CC_CallLeg& leg = newLeg("");
    InfoContainer info;
    EXPECT_EQ(&leg.getInfo(info, 5, 2, 3, 3, "The "), &info);
    ASSERT_EQ(info.getNumberOfEntries(), 1u) << "the detail allows no more";
    EXPECT_EQ(info.getEntry(0).level, 2u);
    EXPECT_EQ(info.getEntry(0).detail, 3u);
    EXPECT_EQ(info.getEntry(0).key, "The Call Leg");
    EXPECT_EQ(info.getEntry(0).text, String::addressOf(&leg));
}

TEST_F(CC_CallLegTest, ADumpBeyondItsLimitsIsEmpty)
{
    CC_CallLeg& leg = newLeg("L");
    InfoContainer info;
    leg.getInfo(info, 1, 2, 9, 0, "");
    leg.getInfo(info, 9, 0, 1, 2, "");
    EXPECT_EQ(info.getNumberOfEntries(), 0u);
}
