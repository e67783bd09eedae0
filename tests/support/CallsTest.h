#pragma once

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "testing/CallControlFixture.h"
#include "testing/Journal.h"
#include "testing/RecordingCallLegObserver.h"
#include "testing/RecordingCallObserver.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

/// What the tests of calls and legs share: calls of the context "SWITCH" and legs under short names, one journal. The
/// fixture holds the creator's reference of each leg until the test lets go of it, and clears away what is left.
struct CallsTest : testing::Test, CallControlFixture
{
    using State = CC_PropertyCallLegState::State;

    void TearDown() override
    {
        while (!m_legs.empty())
            letGo(*m_legs.back());
        settle();
        while (CC_Call* const call = CallControl::GET_CALL("SWITCH", 0))
            CallControl::RELEASE_CALL("SWITCH", call);
    }

    /// Observers that outlive the legs and calls of the test.
    RecordingCallLegObserver& newLegObserver(char const* name)
    {
        return *m_legObservers.emplace_back(std::make_unique<RecordingCallLegObserver>(name, &m_journal));
    }
    RecordingCallObserver& newCallObserver(char const* name)
    {
        return *m_callObservers.emplace_back(std::make_unique<RecordingCallObserver>(name, &m_journal));
    }
    /// The same, observing already: the leg itself, the call, or all legs of the call.
    RecordingCallLegObserver& observe(CC_CallLeg& leg, char const* name)
    {
        RecordingCallLegObserver& observer = newLegObserver(name);
        EXPECT_EQ(leg.addCallLegObserver(&observer), XCode::OK);
        return observer;
    }
    RecordingCallObserver& observe(CC_Call& call, char const* name)
    {
        RecordingCallObserver& observer = newCallObserver(name);
        EXPECT_EQ(call.addCallObserver(&observer), XCode::OK);
        return observer;
    }
    RecordingCallLegObserver& observeLegs(CC_Call& call, char const* name)
    {
        RecordingCallLegObserver& observer = newLegObserver(name);
        EXPECT_EQ(call.addCallLegObserver(&observer), XCode::OK);
        return observer;
    }

    CC_Call& newCall(char const* name)
    {
        CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
        m_journal.name(call, name);
        return *call;
    }

    CC_CallLeg& newLeg(char const* name, State state = CC_PropertyCallLegState::IDLE)
    {
        CC_CallLeg* const leg = new CC_CallLeg;
        EXPECT_TRUE(leg->setName(name).isOk());
        m_legs.push_back(leg);
        setState(*leg, state);
        return *leg;
    }

    /// A new leg that has joined the call.
    CC_CallLeg& join(CC_Call& call, char const* name, State state = CC_PropertyCallLegState::IDLE)
    {
        CC_CallLeg& leg = newLeg(name, state);
        EXPECT_EQ(call.addCallLeg(leg), XCode::OK);
        return leg;
    }

    void setState(CC_CallLeg& leg, State state)
    {
        EXPECT_EQ(leg.setProperty(CC_PropertyCallLegState(CC_PropertyId::STATE, state)), XCode::OK);
    }
    void setNetwork(CC_CallLeg& leg, char const* network)
    {
        EXPECT_EQ(leg.setProperty(CC_PropertyString(CC_PropertyId::NETWORK, network)), XCode::OK);
    }
    void setId(CC_CallLeg& leg, unsigned long long id)
    {
        EXPECT_EQ(leg.setProperty(CC_PropertyUnsigned(CC_PropertyId::CALL_LEG_ID, id)), XCode::OK);
    }

    /// Gives the creator's reference up.
    void letGo(CC_CallLeg& leg)
    {
        m_legs.erase(std::find(m_legs.begin(), m_legs.end(), &leg));
        leg.removeReference();
    }

    /// Whether the observer hears of the leg.
    bool hears(CC_CallLeg& leg, char const* observer)
    {
        m_journal.clear();
        EXPECT_EQ(leg.setProperties(CC_PropertyContainer::EMPTY()), XCode::OK);
        return m_journal.contains(std::string(observer) + ": " + leg.getName().c_str() + " changed ()");
    }

    /// The names of the call's legs, in order.
    static Lines legsOf(CC_Call const& call)
    {
        Lines names;
        for (unsigned int i = 0; i < call.getNumberOfCallLegs(); ++i)
            names.push_back(call.getCallLeg(i)->getName().c_str());
        return names;
    }

    static unsigned int numberOfCalls() { return CallControl::GET_NUMBER_OF_CALLS(); }

    Journal m_journal;
    std::vector<CC_CallLeg*> m_legs;
    std::vector<std::unique_ptr<RecordingCallLegObserver>> m_legObservers;
    std::vector<std::unique_ptr<RecordingCallObserver>> m_callObservers;
};
