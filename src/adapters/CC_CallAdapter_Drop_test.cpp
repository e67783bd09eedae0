#include "properties/CC_PropertyBoolean.h"
#include "testing/RecordingCallLegObserver.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/TestLine.h"

namespace
{
using namespace CC_PropertyId;
using LogLine = RecordingMonitor::Line;

/// a and b talk, and a has announced that it provides data.
class CC_CallAdapter_Drop_Test : public TestLines
{
protected:
    CC_CallAdapter_Drop_Test()
    {
        connect();
        EXPECT_TRUE(a.adapter.setOwnProperty(CC_PropertyBoolean(PROVIDES_DATA, true)).isOk());
        listen();
    }
    CC_PropertyCause const* causeSeenByB() const
    {
        return dynamic_cast<CC_PropertyCause const*>(b.adapter.getPeerProperty(CAUSE));
    }
};
} // namespace

TEST_F(CC_CallAdapter_Drop_Test, TheOthersSeeDataCauseAndStateInThisOrder)
{
    RecordingCallLegObserver witness("w");
    CC_CallLeg* const leg = theCall().getCallLeg(0);
    ASSERT_TRUE(leg->addCallLegObserver(&witness).isOk());
    a.adapter.drop(QCause::USER_BUSY, 486);
    EXPECT_EQ(witness.take(),
              (Lines{"w: a/line changed (Provides Data)", "w: a/line changed (Cause)", "w: a/line changed (State)"}));
    leg->removeCallLegObserver(&witness);
    EXPECT_EQ(b.peer(PROVIDES_DATA), "false");
    EXPECT_EQ(b.peer(STATE), "RELEASED");
    ASSERT_NE(causeSeenByB(), nullptr);
    EXPECT_EQ(causeSeenByB()->getCause(), QCause::USER_BUSY);
    EXPECT_EQ(causeSeenByB()->getSipCode(), 486u);
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (Provides Data, Cause, State)"});
}

TEST_F(CC_CallAdapter_Drop_Test, ACauseIsLeftOutOnlyWhenBothValuesSaySo)
{
    struct Case
    {
        QCause cause;
        unsigned int sipCode;
        bool isWritten;
    };
    for (Case const& row : {Case{QCause::UNSPECIFIED, 0, false}, Case{QCause::UNSPECIFIED, 486, true},
                            Case{QCause::NORMAL_CALL_CLEARING, 0, true}, Case{QCause::NORMAL_CALL_CLEARING, 200, true}})
    {
        CC_Call* const call = CallControl::ACQUIRE_CALL("");
        TestLine left("left");
        TestLine right("right");
        ASSERT_TRUE(left.accept(*call).isOk());
        ASSERT_TRUE(right.accept(*call).isOk());
        listen();
        right.module.take();
        left.adapter.drop(row.cause, row.sipCode);
        EXPECT_EQ(heardBy(right),
                  Lines{row.isWritten ? "right: peer changed (Cause, State)" : "right: peer changed (State)"});
        auto const* const cause = dynamic_cast<CC_PropertyCause const*>(right.adapter.getPeerProperty(CAUSE));
        ASSERT_NE(cause, nullptr);
        EXPECT_EQ(cause->getCause(), row.isWritten ? row.cause : QCause::NONE);
        EXPECT_EQ(cause->getSipCode(), row.isWritten ? row.sipCode : 0u);
        EXPECT_EQ(right.peer(STATE), "RELEASED");
    }
}

TEST_F(CC_CallAdapter_Drop_Test, WithoutACauseDataAndStateAreStillWritten)
{
    a.adapter.drop(QCause::UNSPECIFIED, 0); // -1, which is 0xffffffff
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (Provides Data, State)"});
    ASSERT_NE(causeSeenByB(), nullptr);
    EXPECT_EQ(causeSeenByB()->getCause(), QCause::NONE);
}

TEST_F(CC_CallAdapter_Drop_Test, TheFinalPropertiesPassTheInputFilters)
{
    a.filterInput(
        [](CC_PropertyContainer& properties)
        {
            if (dynamic_cast<CC_PropertyCause const*>(properties.get(CAUSE)) == nullptr)
                return XCode::OK;
            return properties.set(CC_PropertyCause(CAUSE, QCause::INTERWORKING, 0));
        });
    a.adapter.drop(QCause::USER_BUSY, 0);
    ASSERT_NE(causeSeenByB(), nullptr);
    EXPECT_EQ(causeSeenByB()->getCause(), QCause::INTERWORKING);
}

TEST_F(CC_CallAdapter_Drop_Test, FiltersThatRefuseEverythingDoNotKeepTheCallUp)
{
    a.filterInput([](CC_PropertyContainer&) { return XCode::FAILURE; });
    a.adapter.drop(QCause::USER_BUSY, 0);
    EXPECT_EQ(a.adapter.getCall(), nullptr);
    EXPECT_EQ(b.peer(STATE), "RELEASED");
    ASSERT_NE(causeSeenByB(), nullptr);
    EXPECT_EQ(causeSeenByB()->getCause(), QCause::NONE) << "that failure is ignored";
    b.drop();
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u);
}

TEST_F(CC_CallAdapter_Drop_Test, TheAdapterIsIdleAfterwardsAndHearsNothingMore)
{
    unsigned int const eventsBefore = TYEvent::s_numberOfInstances.load();
    a.drop();
    EXPECT_EQ(TYEvent::s_numberOfInstances.load(), eventsBefore - 2) << "its two events are gone";
    EXPECT_EQ(a.adapter.getCall(), nullptr);
    EXPECT_EQ(a.own(STATE) + a.peer(STATE) + a.call(CONTEXT), "---");
    EXPECT_EQ(a.adapter.getOwnPropertyUnfiltered(STATE), nullptr);
    b.say(NAME, "Bob");
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(NAME, "x")), XCode::OK);
    EXPECT_EQ(heardBy(a), Lines());
    EXPECT_EQ(a.adapter.getName(), "line") << "but its setup stays";
    EXPECT_EQ(a.adapter.getEndpoint(), &a.endpoint);
}

TEST_F(CC_CallAdapter_Drop_Test, TheLegGoesWhenItsPeerHasLetItGoToo)
{
    unsigned int const legsBefore = CC_CallLeg::s_numberOfInstances;
    a.drop();
    settle();
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, legsBefore) << "b still looks at it";
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 1u);
    b.drop();
    settle();
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, legsBefore - 2);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u);
}

TEST_F(CC_CallAdapter_Drop_Test, OneLineTellsOfItAtTheFlowLevel)
{
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    String expected;
    expected.format("[EP %s/%s] Drop call %s", "a", "line", theCall().getName().c_str());
    a.drop();
    EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{2, expected.c_str()}}));
}

TEST_F(CC_CallAdapter_Drop_Test, DroppingTheLegAloneIsNotLogged)
{
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    a.adapter.dropOwnCallLeg(QCause::USER_BUSY, 0);
    EXPECT_EQ(a.adapter.getCall(), nullptr);
    EXPECT_EQ(monitor.getLines().size(), 0u);
    EXPECT_EQ(b.peer(STATE), "RELEASED");
}

TEST_F(CC_CallAdapter_Drop_Test, AnIdleAdapterDropsNothingAndSaysNothing)
{
    RecordingMonitor monitor;
    c.adapter.drop(QCause::USER_BUSY, 0);
    EXPECT_EQ(monitor.getLines().size(), 0u);
    a.drop();
    monitor.clear();
    a.adapter.drop(QCause::USER_BUSY, 0);
    EXPECT_EQ(monitor.getLines().size(), 0u);
}

TEST_F(CC_CallAdapter_Drop_Test, ALegInNoCallIsDroppedWithoutAWord)
{
    CC_Call& call = theCall();
    call.removeCallLeg(*call.getCallLeg(0));
    unsigned int const legsBefore = CC_CallLeg::s_numberOfInstances;
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    a.drop();
    EXPECT_EQ(monitor.getLines().size(), 0u);
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, legsBefore - 1);
}
