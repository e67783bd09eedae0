// What calls back besides observers: the media layer, the reboot management, filters. Each of these once touched freed
// memory or left something behind for ever.
#include "adapters/CC_CallAdapterE164.h"
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "calls/CC_Monitor.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "testing/FakeRebootMgmt.h"
#include "testing/RecordingCallLegObserver.h"
#include "testing/RecordingCallObserver.h"
#include "testing/RecordingMonitor.h"
#include "testing/RecordingPropertyFilter.h"
#include "tests/support/PartyTest.h"

#include <functional>
#include <gtest/gtest.h>

namespace
{
class HostileCallbacks : public PartyTest
{
protected:
    static CC_CallPool& pool() { return *CallControl::GET_CALL_POOL("SWITCH"); }
};

/// A filter container with one filter that does what the test says.
class Filters : public CC_PropertyFilterContainer
{
public:
    using Apply = std::function<XCode(CC_PropertyContainer&)>;
    explicit Filters(Apply apply = nullptr)
    {
        if (apply)
            m_filter.onApply(std::move(apply));
        EXPECT_EQ(addFilter(m_filter), XCode::OK);
    }
    void onApply(Apply apply) { m_filter.onApply(std::move(apply)); }

private:
    RecordingPropertyFilter m_filter{"filter"};
};

void RENAME(CC_PropertyContainer& properties, char const* name)
{
    EXPECT_EQ(properties.set(CC_PropertyString(CC_PropertyId::NAME, name)), XCode::OK);
}
} // namespace

// --- the pool and its context ----------------------------------------------------------------------------------------

TEST_F(HostileCallbacks, ALegThatJoinsWhileItsCallIsDroppedIsTakenOutToo)
{
    Party anna("anna"), bert("bert");
    RecordingCallObserver observer("observer");
    connect(anna, bert);
    CC_Call* const call = anna.getCall();
    auto* const late = new CC_CallLeg;
    ASSERT_EQ(call->addCallObserver(&observer), XCode::OK);
    observer.m_onLegRemoved = [&](CC_EvCallCallLegModified const&)
    {
        observer.m_onLegRemoved = nullptr;
        EXPECT_EQ(call->addCallLeg(*late), XCode::OK);
    };
    pool().dropCalls(String::s_empty, call->getName());
    EXPECT_EQ(call->getNumberOfCallLegs(), 0u);
    late->removeReference();
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileCallbacks, DroppingACallEndsThoughALegComesBackForEverAndTheLogSaysSo)
{
    Party anna("anna"), bert("bert");
    RecordingCallObserver observer("observer");
    connect(anna, bert);
    CC_Call* const call = anna.getCall();
    String line;
    line.format("[Call %s] Legs come back for ever: some stay", call->getName().c_str());
    ASSERT_EQ(call->addCallObserver(&observer), XCode::OK);
    observer.m_onLegRemoved = [call](CC_EvCallCallLegModified const& event)
    { EXPECT_EQ(call->addCallLeg(*event.getCallLeg()), XCode::OK); };
    RecordingMonitor monitor(RTD::LEVEL_FAILURE);
    pool().dropCalls(String::s_empty, call->getName());
    EXPECT_EQ(monitor.getLines(), (std::vector<RecordingMonitor::Line>{{1, line.c_str()}}));
    EXPECT_EQ(call->getNumberOfCallLegs(), 2u);
    call->removeCallObserver(&observer);
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileCallbacks, TheLegsThatJoinDuringATransferAreMovedToo)
{
    Party anna("anna"), bert("bert"), carl("carl"), dora("dora");
    RecordingCallObserver observer("observer");
    connect(anna, bert);
    connect(carl, dora);
    CC_Call* const from = carl.getCall();
    auto* const late = new CC_CallLeg;
    ASSERT_EQ(from->addCallObserver(&observer), XCode::OK);
    observer.m_onLegRemoved = [&](CC_EvCallCallLegModified const&)
    {
        observer.m_onLegRemoved = nullptr;
        EXPECT_EQ(from->addCallLeg(*late), XCode::OK);
    };
    EXPECT_EQ(anna.adapter->transfer(*carl.adapter, false), XCode::OK);
    EXPECT_EQ(late->getCall(), anna.getCall());
    EXPECT_EQ(from->getNumberOfCallLegs(), 1u) << "carl's own";
    EXPECT_EQ(late->setProperty(State(CC_PropertyId::STATE, State::RELEASED)), XCode::OK);
    late->removeReference();
    expectNothingLeft({&anna, &bert, &carl, &dora});
}

TEST_F(HostileCallbacks, TheMediaLayerMayDestroyTheContextInsideAnAcquisition)
{
    FakeRebootMgmt reboot;
    fixture.m_mediaContexts.m_onRequest = [] { CallControl::DESTROY_CONTEXT("SWITCH"); };
    EXPECT_EQ(CallControl::ACQUIRE_CALL("SWITCH"), nullptr);
    settle();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(HostileCallbacks, TheMediaLayerMayReleaseTheCallThatAsksIt)
{
    fixture.m_mediaContexts.m_onRequest = []
    { CallControl::RELEASE_CALL("SWITCH", CallControl::GET_CALL("SWITCH", 0)); };
    EXPECT_EQ(CallControl::ACQUIRE_CALL("SWITCH"), nullptr);
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(HostileCallbacks, TheMediaLayerMayDestroyTheContextInsideADial)
{
    Party anna("anna"), bert("bert");
    fixture.m_mediaContexts.m_onRequest = [] { CallControl::DESTROY_CONTEXT("SWITCH"); };
    EXPECT_EQ(anna.dial(bert), XCode::NO_ELEMENT);
    EXPECT_EQ(anna.getCall(), nullptr);
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileCallbacks, TheRebootManagementMayDestroyTheContextThatAsksForTheLock)
{
    FakeRebootMgmt reboot;
    reboot.m_onAdd = [] { CallControl::DESTROY_CONTEXT("SWITCH"); };
    EXPECT_EQ(CallControl::ACQUIRE_CALL("SWITCH"), nullptr);
    settle();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0) << "the pool that asked for it never had a call";
}

TEST_F(HostileCallbacks, ALockThatEndsItsContextLeavesThatOfTheCallsThatWereAcquiredMeanwhile)
{
    FakeRebootMgmt reboot;
    CC_Call* inside = nullptr;
    reboot.m_onAdd = [&]
    {
        reboot.m_onAdd = nullptr;
        inside = CallControl::ACQUIRE_CALL("SWITCH");
        CallControl::DESTROY_CONTEXT("SWITCH");
    };
    EXPECT_EQ(CallControl::ACQUIRE_CALL("SWITCH"), nullptr);
    ASSERT_NE(inside, nullptr);
    EXPECT_EQ(reboot.getNumberOfLocks(), 1) << "a call outlives its pool, and the lock stays with it";
    inside->defer();
    settle();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(HostileCallbacks, TheRebootManagementMayDestroyTheContextThatGivesTheLockBack)
{
    FakeRebootMgmt reboot;
    reboot.m_onRelease = [] { CallControl::DESTROY_CONTEXT("SWITCH"); };
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    ASSERT_NE(call, nullptr);
    CallControl::RELEASE_CALL("SWITCH", call);
    EXPECT_EQ(CallControl::GET_CONTEXT("SWITCH"), nullptr);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

TEST_F(HostileCallbacks, ACallAcquiredWhileTheLockIsBeingTakenLeavesNoSecondLock)
{
    FakeRebootMgmt reboot;
    CC_Call* inside = nullptr;
    reboot.m_onAdd = [&]
    {
        reboot.m_onAdd = nullptr;
        inside = CallControl::ACQUIRE_CALL("SWITCH");
    };
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    ASSERT_NE(call, nullptr);
    EXPECT_EQ(reboot.getNumberOfLocks(), 1);
    CallControl::RELEASE_CALL("SWITCH", inside);
    EXPECT_EQ(reboot.getNumberOfLocks(), 1);
    CallControl::RELEASE_CALL("SWITCH", call);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

TEST_F(HostileCallbacks, ACallAcquiredWhileTheLockIsBeingTakenMayEndWhileTheSecondIsGivenBack)
{
    FakeRebootMgmt reboot;
    CC_Call* inside = nullptr;
    reboot.m_onAdd = [&]
    {
        reboot.m_onAdd = nullptr;
        inside = CallControl::ACQUIRE_CALL("SWITCH");
    };
    reboot.m_onRelease = [&]
    {
        reboot.m_onRelease = nullptr;
        CallControl::RELEASE_CALL("SWITCH", inside);
    };
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    ASSERT_NE(call, nullptr);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 1u);
    EXPECT_EQ(reboot.getNumberOfLocks(), 1) << "that of the call that is there";
    CallControl::RELEASE_CALL("SWITCH", call);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

TEST_F(HostileCallbacks, WhileTheSecondLockIsGivenBackTheCallItselfMayEnd)
{
    FakeRebootMgmt reboot;
    reboot.m_onAdd = [&]
    {
        reboot.m_onAdd = nullptr;
        std::ignore = CallControl::ACQUIRE_CALL("SWITCH");
    };
    reboot.m_onRelease = [&]
    {
        reboot.m_onRelease = nullptr;
        while (CC_Call* const call = CallControl::GET_CALL("SWITCH", 0))
            CallControl::RELEASE_CALL("SWITCH", call);
    };
    EXPECT_EQ(CallControl::ACQUIRE_CALL("SWITCH"), nullptr);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
    settle();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(HostileCallbacks, WhileTheSecondLockIsGivenBackTheContextMayBeDestroyed)
{
    FakeRebootMgmt reboot;
    CC_Call* inside = nullptr;
    reboot.m_onAdd = [&]
    {
        reboot.m_onAdd = nullptr;
        inside = CallControl::ACQUIRE_CALL("SWITCH");
    };
    reboot.m_onRelease = [] { CallControl::DESTROY_CONTEXT("SWITCH"); };
    EXPECT_EQ(CallControl::ACQUIRE_CALL("SWITCH"), nullptr);
    EXPECT_EQ(reboot.getNumberOfLocks(), 1) << "a call outlives its pool, and the lock stays with it";
    ASSERT_NE(inside, nullptr);
    inside->defer();
    settle();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}

TEST_F(HostileCallbacks, ACallAcquiredAtTheEndOfTheLastOneLeavesNoSecondLock)
{
    FakeRebootMgmt reboot;
    RecordingCallObserver observer("observer");
    CC_Call* const last = CallControl::ACQUIRE_CALL("SWITCH");
    ASSERT_EQ(last->addCallObserver(&observer), XCode::OK);
    CC_Call* next = nullptr;
    observer.m_onEnded = [&](CC_EvCallObservationEnded const&) { next = CallControl::ACQUIRE_CALL("SWITCH"); };
    pool().releaseCall(last);
    ASSERT_NE(next, nullptr);
    EXPECT_EQ(reboot.getNumberOfLocks(), 1);
    CallControl::RELEASE_CALL("SWITCH", next);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

TEST_F(HostileCallbacks, TheLockIsGivenBackOnceThoughTheLastCallEndsInsideTheEndOfAnother)
{
    FakeRebootMgmt reboot;
    RecordingCallObserver observer("observer");
    CC_Call* const first = CallControl::ACQUIRE_CALL("SWITCH");
    CC_Call* const last = CallControl::ACQUIRE_CALL("SWITCH");
    ASSERT_EQ(first->addCallObserver(&observer), XCode::OK);
    observer.m_onEnded = [&](CC_EvCallObservationEnded const&) { pool().releaseCall(last); };
    pool().releaseCall(first);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

TEST_F(HostileCallbacks, ACallGivenBackToAnotherContextIsListedNowhereAndNoLockStays)
{
    FakeRebootMgmt reboot;
    ASSERT_EQ(CallControl::CREATE_CONTEXT("other"), XCode::OK);
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    EXPECT_EQ(reboot.getNumberOfLocks(), 1);
    CallControl::RELEASE_CALL("other", call);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
    EXPECT_EQ(CallControl::GET_CALL("SWITCH", 0), nullptr);
    EXPECT_EQ(reboot.take(), (Lines{"reboot: add Call-Control (Calls are ongoing, 0)", "reboot: release Call-Control"}))
        << "the other pool never found the driver";
    CallControl::DESTROY_CONTEXT("other");
}

// --- adapters --------------------------------------------------------------------------------------------------------

TEST_F(HostileCallbacks, ADialGoesOnWithTheInputFiltersThatItBeganWith)
{
    Filters noted([](CC_PropertyContainer& properties) { return RENAME(properties, "noted"), XCode::OK; });
    Filters later([](CC_PropertyContainer& properties) { return RENAME(properties, "later"), XCode::OK; });
    Party anna("anna", "", nullptr, &noted), bert("bert");
    fixture.m_mediaContexts.m_onRequest = [&] { anna.endpoint.setInputFilterContainer(&later); };
    std::string offeredName;
    bert.endpoint.m_handleOffer = [&](CC_Call& call, String const&, CC_PropertyContainer const& offered)
    {
        String text;
        offeredName = offered.get(CC_PropertyId::NAME)->getValueString(text).c_str();
        EXPECT_EQ(call.getProperties().get(CC_PropertyId::NAME)->getValueString(text), "noted");
        return bert.adapter->accept(call, {});
    };
    EXPECT_EQ(anna.dial(bert), XCode::OK);
    EXPECT_EQ(offeredName, "noted");
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileCallbacks, ASetupInsideTheEndOfTheLegDoesNotLetADialIn)
{
    RecordingCallLegObserver guest("guest");
    Party anna("anna"), bert("bert"), carl("carl");
    for (bool const isSetup : {true, false})
        for (bool const isNestedSetup : {true, false})
        {
            anna.setup();
            connect(anna, bert);
            ASSERT_EQ(anna.getCall()->getCallLeg(0)->addCallLegObserver(&guest), XCode::OK);
            std::vector<XCode> results;
            guest.m_onChanged = [&](CC_Event<CC_CallLeg> const& event)
            {
                if (event.getSource()->getState() != State::RELEASED)
                    return;
                isNestedSetup ? anna.setup() : anna.adapter->cleanup();
                results.push_back(anna.dial(carl));
            };
            isSetup ? anna.setup() : anna.adapter->cleanup();
            EXPECT_EQ(results, std::vector<XCode>(results.size(), XCode::REFUSED));
            EXPECT_FALSE(results.empty());
            EXPECT_EQ(anna.getCall(), nullptr);
            EXPECT_EQ(anna.adapter->getEndpoint(), isSetup ? &anna.endpoint : nullptr);
            bert.hangUp();
            settle();
        }
    expectNothingLeft({&anna, &bert, &carl});
}

TEST_F(HostileCallbacks, ASetupInsideTheDestructionLetsNoLegThrough)
{
    RecordingCallLegObserver guest("guest");
    Party anna("anna"), bert("bert"), carl("carl");
    connect(anna, bert);
    ASSERT_EQ(anna.getCall()->getCallLeg(0)->addCallLegObserver(&guest), XCode::OK);
    CC_CallAdapter& adapter = *anna.adapter;
    guest.m_onChanged = [&](CC_Event<CC_CallLeg> const& event)
    {
        if (event.getSource()->getState() != State::RELEASED)
            return;
        EXPECT_EQ(adapter.setup("again", anna.endpoint, nullptr), XCode::OK);
        EXPECT_EQ(adapter.dial("SWITCH", "carl", "1", {}, {}, {}, nullptr), XCode::REFUSED);
    };
    expectNothingLeft({&anna, &bert, &carl});
}

TEST_F(HostileCallbacks, ADroppedLegIsReleasedThoughItsOwnModuleWritesAnotherState)
{
    FakeRebootMgmt reboot;
    RecordingCallLegObserver guest("guest");
    Party anna("anna"), bert("bert");
    connect(anna, bert);
    CC_CallLeg& leg = *anna.getCall()->getCallLeg(0);
    CC_CallLeg::Reference const keep(leg);
    ASSERT_EQ(leg.addCallLegObserver(&guest), XCode::OK);
    guest.m_onChanged = [&](CC_Event<CC_CallLeg> const& event)
    {
        if (event.getSource()->getState() == State::RELEASED)
        {
            EXPECT_EQ(anna.become(State::CONNECTED), XCode::OK);
        }
    };
    anna.hangUp();
    EXPECT_EQ(leg.getState(), State::RELEASED);
    EXPECT_EQ(bert.peerState(), "RELEASED");
    bert.hangUp();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

TEST_F(HostileCallbacks, ALegThatIsDroppedWhileItsNewStateIsLoggedStaysReleased)
{
    struct Dropping : RTD::Writer
    {
        explicit Dropping(Party& module) : party(module) { RTD::REPOSITORY::SET_WRITER(this); }
        ~Dropping() override { RTD::REPOSITORY::SET_WRITER(nullptr); }
        void write(unsigned int, unsigned int, char const*) override
        {
            RTD::REPOSITORY::ENABLE(CC_Monitor::ID, RTD::LEVEL_OFF);
            party.hangUp();
        }
        Party& party;
    };
    Party anna("anna"), bert("bert");
    connect(anna, bert);
    CC_CallLeg& leg = *anna.getCall()->getCallLeg(0);
    leg.addReference();
    Dropping writer(anna);
    RTD::REPOSITORY::ENABLE(CC_Monitor::ID, RTD::LEVEL_CHANGE);
    EXPECT_EQ(anna.become(State::HELD), XCode::OK) << "left out";
    EXPECT_EQ(leg.getState(), State::RELEASED);
    leg.removeReference();
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileCallbacks, ADroppedLegIsReleasedThoughAPeerWritesItsStaleViewBack)
{
    FakeRebootMgmt reboot;
    RecordingCallLegObserver guest("guest");
    Filters plain;
    Party anna("anna");
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    ASSERT_EQ(call->addCallLegObserver(&guest), XCode::OK); // before bert's adapter
    Party bert("bert", "", nullptr, &plain);
    ASSERT_EQ(anna.adapter->accept(*call, {}), XCode::OK);
    ASSERT_EQ(bert.adapter->accept(*call, {}), XCode::OK);
    ASSERT_EQ(anna.become(State::CONNECTED), XCode::OK);
    settle();
    guest.m_onChanged = [&](CC_Event<CC_CallLeg> const& event)
    {
        if (event.getSource()->getState() != State::RELEASED || event.getSource() == call->getCallLeg(1))
            return;
        guest.m_onChanged = nullptr;
        EXPECT_EQ(bert.adapter->setPeerProperty(CC_PropertyString(CC_PropertyId::NAME, "x")), XCode::OK);
    };
    anna.hangUp();
    EXPECT_FALSE(guest.m_onChanged) << "the peer did write";
    EXPECT_EQ(bert.peerState(), "RELEASED");
    bert.hangUp();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
    guest.m_onChanged = nullptr;
}

TEST_F(HostileCallbacks, TheMediaLayerMayDestroyTheAdapterThatAsksItForAContext)
{
    Party anna("anna"), bert("bert");
    connect(anna, bert);
    fixture.m_mediaContexts.m_onRequest = [&] { anna.adapter.reset(); };
    anna.adapter->setDatapathContext(nullptr);
    EXPECT_EQ(anna.adapter, nullptr);
    EXPECT_EQ(bert.peerState(), "RELEASED");
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileCallbacks, TheEndOfARememberedMediaContextMayDestroyTheAdapterThatDialsAnew)
{
    struct Ending : MG_IContext
    {
        explicit Ending(std::function<void()> deed) : onEnd(std::move(deed)) {}
        ~Ending() override { onEnd(); }
        unsigned int getId() const override { return 1; }
        std::function<void()> onEnd;
    };
    Party anna("anna"), bert("bert");
    anna.adapter = std::make_unique<CC_CallAdapterE164>();
    anna.setup();
    {
        TYPtr<MG_IContext> const context(new Ending([&] { anna.adapter.reset(); }));
        ASSERT_EQ(anna.adapter->dial("SWITCH", "bert", "1", {}, {}, {}, context.get()), XCode::OK);
        anna.hangUp();
        bert.hangUp();
        settle();
    }
    EXPECT_EQ(anna.dial(bert), XCode::FAILURE);
    EXPECT_EQ(anna.adapter, nullptr);
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileCallbacks, TheMediaLayerMayGoInsideItsOwnRequest)
{
    fixture.m_mediaContexts.m_onRequest = [] { CallControl::SET_MG_CONTEXT_REPOSITORY(nullptr); };
    CC_PropertyContextId const property(CC_PropertyId::CONTEXT);
    EXPECT_NE(property.getContext(), nullptr);
}

TEST_F(HostileCallbacks, AnInputFilterMayDropItsAdapterOrDestroyIt)
{
    enum class Deed
    {
        DROP,
        DESTROY,
        DROP_AND_DIAL
    };
    for (Deed const deed : {Deed::DROP, Deed::DESTROY, Deed::DROP_AND_DIAL})
    {
        Filters filters;
        Party anna("anna", "", nullptr, &filters), bert("bert"), carl("carl");
        bool isArmed = false;
        filters.onApply(
            [&](CC_PropertyContainer&)
            {
                if (!std::exchange(isArmed, false))
                    return XCode::OK;
                if (deed == Deed::DESTROY)
                    anna.adapter.reset();
                else
                    anna.hangUp();
                if (deed == Deed::DROP_AND_DIAL)
                {
                    EXPECT_EQ(anna.dial(carl), XCode::OK);
                }
                return XCode::OK;
            });
        using Write = std::function<XCode()>;
        CC_PropertyString const name(CC_PropertyId::NAME, "x");
        for (Write const& write : std::initializer_list<Write>{[&] { return anna.adapter->setOwnProperty(name); },
                                                               [&] { return anna.adapter->setPeerProperty(name); },
                                                               [&] { return anna.adapter->setCallProperty(name); }})
        {
            if (anna.adapter == nullptr)
            {
                anna.adapter = std::make_unique<CC_CallAdapter>();
                anna.setup();
            }
            connect(anna, bert);
            isArmed = true;
            EXPECT_EQ(write(), XCode::FAILURE);
            EXPECT_FALSE(isArmed);
            if (deed == Deed::DROP_AND_DIAL)
            {
                EXPECT_EQ(carl.peerText(CC_PropertyId::NAME), "none") << "it was not meant for the next call";
            }
            for (Party* const party : {&anna, &bert, &carl})
                party->hangUp();
            settle();
        }
        expectNothingLeft({&anna, &bert, &carl});
    }
}

TEST_F(HostileCallbacks, AnInputFilterMayEndTheDialOrAcceptThatUsesIt)
{
    for (unsigned int use = 1; use <= 3; ++use)
        for (bool const isDestroying : {false, true})
        {
            Filters filters;
            Party anna("anna", "", nullptr, &filters), bert("bert");
            unsigned int uses = 0;
            filters.onApply(
                [&](CC_PropertyContainer&)
                {
                    if (++uses == use)
                        isDestroying ? anna.adapter.reset() : anna.hangUp();
                    return XCode::OK;
                });
            EXPECT_EQ(anna.dial(bert), XCode::FAILURE) << use << ". use";
            expectNothingLeft({&anna, &bert});
        }
}

TEST_F(HostileCallbacks, AnOutputFilterMayDropItsAdapterOrDestroyIt)
{
    for (bool const isDestroying : {false, true})
    {
        Filters filters;
        Party anna("anna", "", nullptr, nullptr, &filters), bert("bert");
        bool isArmed = false;
        filters.onApply(
            [&](CC_PropertyContainer&)
            {
                if (std::exchange(isArmed, false))
                    isDestroying ? anna.adapter.reset() : anna.hangUp();
                return XCode::OK;
            });
        using Event = std::function<XCode()>;
        CC_PropertyString const name(CC_PropertyId::NAME, "x");
        for (Event const& event : std::initializer_list<Event>{[&] { return bert.say(CC_PropertyId::NAME, "x"); },
                                                               [&] { return bert.adapter->setCallProperty(name); },
                                                               [&] { return anna.say(CC_PropertyId::NAME, "x"); },
                                                               [&] { return bert.become(State::HELD); }})
        {
            if (anna.adapter == nullptr)
            {
                anna.adapter = std::make_unique<CC_CallAdapter>();
                anna.setup();
            }
            connect(anna, bert);
            isArmed = true;
            std::ignore = event();
            EXPECT_FALSE(isArmed);
            if (!isDestroying)
            {
                CC_PropertyContainer seen;
                EXPECT_EQ(anna.adapter->getOwnProperties(seen, 0xffff), XCode::OK);
                EXPECT_EQ(anna.adapter->getPeerProperties(seen, 0xffff), XCode::OK);
                EXPECT_EQ(anna.adapter->getCallProperties(seen, 0xffff), XCode::OK);
                EXPECT_TRUE(seen.isEmpty()) << "an idle adapter has empty views";
            }
            bert.hangUp();
            settle();
        }
        expectNothingLeft({&anna, &bert});
    }
}

TEST_F(HostileCallbacks, AnOutputFilterMayDropOrDestroyItsAdapterAsTheLegJoins)
{
    for (unsigned int use = 1; use <= 4; ++use)
        for (bool const isDestroying : {false, true})
        {
            Filters filters;
            Party anna("anna", "", nullptr, nullptr, &filters), bert("bert");
            CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
            ASSERT_EQ(bert.adapter->accept(*call, {}), XCode::OK);
            unsigned int uses = 0;
            filters.onApply(
                [&](CC_PropertyContainer&)
                {
                    if (++uses == use)
                        isDestroying ? anna.adapter.reset() : anna.hangUp();
                    return XCode::OK;
                });
            std::ignore = anna.adapter->accept(*call, {});
            if (anna.adapter != nullptr && uses >= use)
            {
                EXPECT_EQ(anna.getCall(), nullptr);
            }
            expectNothingLeft({&anna, &bert});
        }
}

TEST_F(HostileCallbacks, APeersFallThatARefreshHidesIsMadeUpForWhenTheModuleIsTold)
{
    RecordingCallLegObserver guest("guest");
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    ASSERT_EQ(call->addCallLegObserver(&guest), XCode::OK); // hears before anna's adapter
    Party anna("anna"), bert("bert"), carl("carl");
    for (Party* const party : {&anna, &bert, &carl})
        ASSERT_EQ(party->adapter->accept(*call, {}), XCode::OK);
    ASSERT_EQ(bert.become(State::CONNECTED), XCode::OK);
    ASSERT_EQ(carl.become(State::HELD), XCode::OK);
    settle();
    ASSERT_EQ(anna.peerState(), "CONNECTED");
    guest.m_onChanged = [&](CC_Event<CC_CallLeg> const&)
    {
        guest.m_onChanged = nullptr;
        EXPECT_EQ(bert.say(CC_PropertyId::NAME, "x"), XCode::OK); // a refresh without State, inside the fall
    };
    ASSERT_EQ(bert.become(State::RELEASED), XCode::OK);
    anna.observer.m_onPeerPropertyChange = [&](CC_CallAdapter&, CC_Flags const& flags)
    {
        EXPECT_EQ(anna.peerState(), "HELD") << "carl, who is live";
        EXPECT_TRUE(flags.get(CC_PropertyId::STATE));
    };
    settle();
    EXPECT_EQ(anna.peerState(), "HELD");
    expectNothingLeft({&anna, &bert, &carl});
}

TEST_F(HostileCallbacks, APeerWhoseStateTheModuleItselfLowersMakesWayInTheNextTurn)
{
    Party anna("anna"), bert("bert"), carl("carl");
    CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
    for (Party* const party : {&anna, &bert, &carl})
        ASSERT_EQ(party->adapter->accept(*call, {}), XCode::OK);
    ASSERT_EQ(bert.become(State::CONNECTED), XCode::OK);
    ASSERT_EQ(carl.become(State::HELD), XCode::OK);
    settle();
    ASSERT_EQ(anna.adapter->setPeerProperty(State(CC_PropertyId::STATE, State::RELEASED)), XCode::OK);
    EXPECT_EQ(anna.peerState(), "RELEASED") << "what was written to the view is what it was last seen in";
    settle();
    EXPECT_EQ(anna.peerState(), "HELD") << "carl";
    expectNothingLeft({&anna, &bert, &carl});
}
