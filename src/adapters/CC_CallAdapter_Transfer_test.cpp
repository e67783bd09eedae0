#include "testing/FailingAllocator.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/TestLine.h"

#include <algorithm>
#include <utility>

namespace
{
using namespace CC_PropertyId;
using LogLine = RecordingMonitor::Line;

/// a talks with b in one call, c with d in another.
class CC_CallAdapter_Transfer_Test : public TestLines
{
protected:
    CC_CallAdapter_Transfer_Test()
    {
        connect();
        provider.m_dial = [this](CC_Call& call, String const&, String const&, CC_PropertyContainer const&)
        { return d.accept(call); };
        EXPECT_EQ(c.dial(), XCode::OK);
        d.become(State::CONNECTED);
        m_first = a.adapter.getCall();
        m_second = c.adapter.getCall();
        listen();
        d.module.take();
    }
    /// Who is in the call, by the endpoints' names in the order of joining.
    static std::string IN(CC_Call const& call)
    {
        std::string names;
        for (unsigned int i = 0; i < call.getNumberOfCallLegs(); ++i)
            names += *call.getCallLeg(i)->getName().c_str();
        return names;
    }
    std::vector<LogLine> failed() const
    {
        String line;
        line.format("[EP %s/%s] TRANSFER FAILED", "a", "line");
        return {{1, line.c_str()}};
    }
    String transferLine(char const* suffix) const
    {
        String line;
        return line.format("[EP %s/%s] Transfer call %s to %s%s", "a", "line", m_second->getName().c_str(),
                           m_first->getName().c_str(), suffix);
    }

    TestLine d{"d"};
    CC_Call* m_first = nullptr;
    CC_Call* m_second = nullptr;
};
} // namespace

TEST_F(CC_CallAdapter_Transfer_Test, ATransferConnectsTheTwoPeersAndLeavesBothOwnLegsUp)
{
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(a.adapter.transfer(c.adapter, true), XCode::OK);
    EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{2, transferLine("").c_str()}}));
    EXPECT_EQ(IN(*m_first), "bd");
    EXPECT_EQ(IN(*m_second), "c");
    EXPECT_EQ(a.adapter.getCall(), nullptr);
    EXPECT_EQ(c.adapter.getCall(), m_second);
    EXPECT_EQ(b.peer(NETWORK), "d-net");
    EXPECT_EQ(d.peer(NETWORK), "b-net");
    EXPECT_EQ(a.leg(STATE) + "," + c.leg(STATE), "CONNECTED,CONNECTED") << "neither was released";
    EXPECT_EQ(a.adapter.getCallLegName() + c.adapter.getCallLegName(), "a/linec/line");
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 2u) << "the other call survives with its one leg";
    EXPECT_EQ(IN(*m_second), "c");
}

TEST_F(CC_CallAdapter_Transfer_Test, AMovedLinesCallIsLookedAtBeforeItIsObservedAndAgainIfItChangedMeanwhile)
{
    unsigned int depth = 0, deepest = 0;
    bool hasWritten = false;
    d.filterOutput(
        [&](CC_PropertyContainer&)
        {
            deepest = std::max(deepest, ++depth);
            if (d.adapter.getCall() == m_first && !std::exchange(hasWritten, true))
            {
                EXPECT_EQ(m_first->setProperty(CC_PropertyString(DISPLAY, "late")), XCode::OK);
            }
            --depth;
            return XCode::OK;
        });
    EXPECT_EQ(a.adapter.transfer(c.adapter, true), XCode::OK);
    EXPECT_TRUE(hasWritten);
    EXPECT_EQ(deepest, 1u) << "the call tells it nothing yet";
    EXPECT_EQ(d.call(DISPLAY), "late");
}

TEST_F(CC_CallAdapter_Transfer_Test, AfterATransferTheOthersDropAndTheTwoPeersGoOn)
{
    EXPECT_EQ(a.adapter.transfer(c.adapter, true), XCode::OK);
    a.drop();
    c.drop();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 1u);
    b.say(NAME, "Bob");
    settle();
    EXPECT_EQ(d.peer(NAME), "Bob");
}

TEST_F(CC_CallAdapter_Transfer_Test, AConferenceKeepsTheOwnLegAndSaysSo)
{
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(a.adapter.transfer(c.adapter, false), XCode::OK);
    EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{2, transferLine(" ==> conference").c_str()}}));
    EXPECT_EQ(IN(*m_first), "abd");
    EXPECT_EQ(IN(*m_second), "c");
    EXPECT_EQ(a.adapter.getCall(), m_first);
    EXPECT_EQ(m_first->getState(), CC_Call::CONFERENCE);
}

TEST_F(CC_CallAdapter_Transfer_Test, AllOtherLegsOfTheOtherCallAreMovedInTheirOrder)
{
    TestLine e("e");
    ASSERT_TRUE(e.accept(*m_second).isOk());
    EXPECT_EQ(a.adapter.transfer(c.adapter, true), XCode::OK);
    EXPECT_EQ(IN(*m_first), "bde");
    EXPECT_EQ(IN(*m_second), "c");
    e.drop();
    settle();
}

TEST_F(CC_CallAdapter_Transfer_Test, TheOwnLegLeavesBeforeTheOthersCome)
{
    Lines seen;
    b.module.m_onPeerPropertyChange = [&](CC_CallAdapter&, CC_Flags const&) { seen.push_back(b.peer(NETWORK)); };
    EXPECT_EQ(a.adapter.transfer(c.adapter, true), XCode::OK);
    settle();
    EXPECT_EQ(seen, Lines{"d-net"}) << "one notification of both steps";
    EXPECT_EQ(b.module.getFlagSets().back(),
              (std::vector<unsigned int>{NETWORK, CALL_LEG_ID, PROVIDES_DATA, CAUSE, STATE}))
        << "in between there was no peer at all: every former id";
}

TEST_F(CC_CallAdapter_Transfer_Test, AnOtherCallWithoutOtherLegsIsNothingToMove)
{
    d.drop();
    settle();
    c.drop();
    settle();
    CC_Call* const lonely = CallControl::ACQUIRE_CALL("");
    ASSERT_TRUE(c.accept(*lonely).isOk());
    EXPECT_EQ(a.adapter.transfer(c.adapter, false), XCode::OK);
    EXPECT_EQ(IN(*m_first), "ab");
    EXPECT_EQ(IN(*lonely), "c");
}

// --- refusals --------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Transfer_Test, TwoAdaptersOfOneCallAreRefused)
{
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(a.adapter.transfer(b.adapter, true), XCode::REFUSED);
    EXPECT_EQ(monitor.getLines(), failed());
    EXPECT_EQ(a.adapter.transfer(a.adapter, false), XCode::REFUSED) << "with itself";
    EXPECT_EQ(IN(*m_first), "ab");
    EXPECT_EQ(heardBy(b), Lines());
}

TEST_F(CC_CallAdapter_Transfer_Test, WithoutLegsOrCallsItIsRefusedAndNothingChanges)
{
    TestLine idle("i");
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(a.adapter.transfer(idle.adapter, true), XCode::REFUSED) << "the other has no leg";
    EXPECT_EQ(monitor.getLines(), failed());
    EXPECT_EQ(IN(*m_first), "ab");
    monitor.clear();

    EXPECT_EQ(idle.adapter.transfer(c.adapter, true), XCode::REFUSED) << "this has no leg";
    EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{1, "[EP i/line] TRANSFER FAILED"}}));
    monitor.clear();

    m_second->removeCallLeg(*m_second->getCallLeg(0));
    EXPECT_EQ(a.adapter.transfer(c.adapter, true), XCode::REFUSED) << "the other's leg is in no call";
    EXPECT_EQ(monitor.getLines(), failed());
    monitor.clear();

    m_first->removeCallLeg(*m_first->getCallLeg(0));
    EXPECT_EQ(a.adapter.transfer(d.adapter, true), XCode::REFUSED) << "this leg is in no call";
    EXPECT_EQ(monitor.getLines(), failed());
    EXPECT_EQ(IN(*m_first) + IN(*m_second), "bd");
}

TEST_F(CC_CallAdapter_Transfer_Test, ALegThatCannotBeMovedIsAFailureAndThoseBeforeItStayMoved)
{
    bool wasRefused = false;
    for (unsigned long n = 1; n < 100 && !wasRefused; ++n)
    {
        // four legs in a call need no memory, the fifth does
        TestLine p("p"), q("q"), r("r"), s("s"), t("t"), u("u");
        CC_Call* const first = CallControl::ACQUIRE_CALL("");
        CC_Call* const second = CallControl::ACQUIRE_CALL("");
        for (TestLine* const line : {&p, &q, &r})
            ASSERT_TRUE(line->accept(*first).isOk());
        for (TestLine* const line : {&s, &t, &u})
            ASSERT_TRUE(line->accept(*second).isOk());
        settle();
        RecordingMonitor monitor(RTD::LEVEL_FAILURE);
        FailingAllocator::failNth(n);
        XCode const result = p.adapter.transfer(s.adapter, false);
        FailingAllocator::stop();
        ASSERT_TRUE(FailingAllocator::hasFailed()) << "no allocation made it fail";
        if (result.isOk())
        {
            EXPECT_EQ(IN(*first) + IN(*second), "pqrtus") << "allocation " << n;
            continue;
        }
        wasRefused = true;
        EXPECT_EQ(result, XCode::FAILURE);
        EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{1, "[EP p/line] TRANSFER FAILED"}}));
        EXPECT_EQ(IN(*first), "pqrt");
        EXPECT_EQ(IN(*second), "su");
        EXPECT_EQ(p.adapter.getCall(), first) << "no leg was dropped";
        EXPECT_EQ(p.leg(STATE) + u.leg(STATE), "TRYINGTRYING");
    }
    EXPECT_TRUE(wasRefused);
}
