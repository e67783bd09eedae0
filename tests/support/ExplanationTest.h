#pragma once

#include "diagnosis/CC_Explanation.h"
#include "testing/DrivenClock.h"
#include "testing/RecordingCallLegObserver.h"
#include "testing/RecordingCallObserver.h"
#include "tests/support/PartyTest.h"

#include <string>
#include <vector>

/// Calls among three parties that go wrong, and what an explanation says of them. The serial numbers in its texts are
/// replaced: "call X" is the call that the test speaks of.
class ExplanationTest : public testing::Test
{
protected:
    using Lines = std::vector<std::string>;
    using Leg = CC_Explanation::Leg;

    void settle() { m_fixture.m_loop.settle(); }
    /// The loop has done its work, and then nothing happens for so long.
    void pass(long long seconds)
    {
        settle();
        m_clock.advance(seconds * 1000);
    }
    /// The call of which the texts speak.
    CC_Call& connect(Party& caller, Party& callee)
    {
        EXPECT_EQ(caller.dial(callee), XCode::OK);
        EXPECT_EQ(callee.become(State::CONNECTED), XCode::OK);
        settle();
        m_call = caller.getCall()->getSerial();
        return *caller.getCall();
    }

    static CC_Explanation::Call explain(CC_Call const& call)
    {
        CC_Explanation const explanation = CC_Explanation::OF_CALL(call);
        EXPECT_EQ(explanation.getCalls().size(), 1u);
        return explanation.getCalls().empty() ? CC_Explanation::Call() : explanation.getCalls().front();
    }
    /// The only leg that is in no call.
    static Leg explainLeg()
    {
        CC_Explanation const explanation = CC_Explanation::OF_LEGS_WITHOUT_CALL();
        EXPECT_EQ(explanation.getLegs().size(), 1u);
        return explanation.getLegs().empty() ? Leg() : explanation.getLegs().front();
    }
    /// The leg of that name.
    static Leg legOf(CC_Explanation::Call const& call, std::string const& name)
    {
        for (Leg const& leg : call.legs)
            if (leg.name == name)
                return leg;
        ADD_FAILURE() << "no leg " << name;
        return {};
    }
    Lines holdersOf(Leg const& leg) const
    {
        Lines lines;
        int sum = 0;
        for (CC_Explanation::Holder const& holder : leg.holders)
        {
            sum += holder.references;
            lines.push_back(named(CC_Explanation::TEXT_OF(holder)));
        }
        EXPECT_EQ(sum, leg.references) << "each reference is somebody's";
        return lines;
    }
    /// The same where what modules are still to be told does not matter.
    Lines plainHoldersOf(Leg leg) const
    {
        for (CC_Explanation::Holder& holder : leg.holders)
            holder.untold = 0;
        return holdersOf(leg);
    }
    Lines observersOf(std::vector<CC_Explanation::Observer> const& observers) const
    {
        Lines lines;
        for (CC_Explanation::Observer const& observer : observers)
            lines.push_back(named(CC_Explanation::TEXT_OF(observer)));
        return lines;
    }
    std::string named(std::string text) const
    {
        std::string const number = "call " + std::to_string(m_call);
        if (std::size_t const found = text.find(number); m_call != 0 && found != std::string::npos)
            text.replace(found, number.size(), "call X");
        return text;
    }
    static std::string FOREIGN(void const* observer)
    {
        return std::string("an observer at ") + String::addressOf(observer).c_str() + ", not one of call control's";
    }
    static std::string HELD_BY(char const* party, char const* state)
    {
        return std::string("leg ") + party + "/line is " + state + " and held by adapter `line` of endpoint `" + party +
               "`: it ends when that adapter drops";
    }
    static std::string OWN(char const* party)
    {
        return std::string("adapter `line` of endpoint `") + party + "` (own)";
    }
    static std::string PEER(char const* party)
    {
        return std::string("adapter `line` of endpoint `") + party + "` (peer)";
    }

    DrivenClock m_clock;
    CallControlFixture m_fixture;
    unsigned long long m_call = 0;
    Party anna{"anna"};
    Party bert{"bert"};
    Party carl{"carl"};
};
