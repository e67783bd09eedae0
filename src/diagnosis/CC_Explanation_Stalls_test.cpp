// Calls that stay up and legs that stay, each made so on purpose: is it put down to whoever made it so, and to nobody
// else?
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "testing/RecordingPropertyFilter.h"
#include "tests/support/ExplanationTest.h"

namespace
{
using Kind = CC_Explanation::Holder::Kind;

class CC_Explanation_Stalls_Test : public ExplanationTest
{
protected:
    /// A leg of nobody's, with its creator's reference.
    CC_CallLeg& newLeg(char const* name, State::State state)
    {
        auto* const leg = new CC_CallLeg;
        EXPECT_TRUE(leg->setName(name).isOk());
        EXPECT_TRUE(leg->setProperty(State(CC_PropertyId::STATE, state)).isOk());
        return *leg;
    }
    CC_Call& newCall()
    {
        CC_Call* const call = CallControl::ACQUIRE_CALL("");
        m_call = call->getSerial();
        return *call;
    }
};

/// Registers itself with the call once more and takes a reference on its leg; its end forgets both.
class ForgetfulAdapter : public CC_CallAdapter
{
public:
    void register2()
    {
        EXPECT_TRUE(getCall()->addCallLegObserver(this).isOk());
        getCall()->getCallLeg(0)->addReference();
    }
};
/// Counts how often it is asked for its name.
class AskedEndpoint : public RecordingEndpoint
{
public:
    using RecordingEndpoint::RecordingEndpoint;
    String const& getName() const override
    {
        ++m_asked;
        return RecordingEndpoint::getName();
    }

    mutable unsigned int m_asked = 0;
};
} // namespace

// --- calls -----------------------------------------------------------------------------------------------------------

TEST_F(CC_Explanation_Stalls_Test, AModuleThatNeverDrops)
{
    CC_Call& call = connect(anna, bert);
    anna.hangUp();
    pass(42);
    CC_Explanation::Call const explained = explain(call);
    EXPECT_EQ(explained.end, HELD_BY("bert", "CONNECTED"));
    EXPECT_EQ(holdersOf(legOf(explained, "anna/line")), (Lines{"call X", PEER("bert")})) << "gone, and kept to be read";
    EXPECT_EQ(holdersOf(legOf(explained, "bert/line")), (Lines{"call X", OWN("bert")}));
    EXPECT_EQ(legOf(explained, "anna/line").inState.nanoseconds, 42000000000);
    EXPECT_EQ(legOf(explained, "anna/line").end,
              "leg anna/line is RELEASED and held by adapter `line` of endpoint `bert` as its peer: it ends when that "
              "adapter drops or chooses another");
}

TEST_F(CC_Explanation_Stalls_Test, NeitherSideDrops)
{
    CC_Call const& call = connect(anna, bert);
    pass(42);
    EXPECT_EQ(explain(call).end, HELD_BY("anna", "CONNECTED") + "; " + HELD_BY("bert", "CONNECTED"));
}

TEST_F(CC_Explanation_Stalls_Test, AnOfferThatIsNeverAnswered)
{
    bert.endpoint.m_handleOffer = [](CC_Call&, String const&, CC_PropertyContainer const&) { return XCode::OK; };
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    pass(42);
    EXPECT_EQ(explain(*anna.getCall()).end, HELD_BY("anna", "CONNECTED"));
}

TEST_F(CC_Explanation_Stalls_Test, ACalledSideThatNeverGetsAnyFurther)
{
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    pass(42);
    EXPECT_EQ(explain(*anna.getCall()).end, HELD_BY("anna", "CONNECTED") + "; " + HELD_BY("bert", "TRYING"));
}

TEST_F(CC_Explanation_Stalls_Test, AnInputFilterThatAlwaysFails)
{
    CC_Call const& call = connect(anna, bert);
    CC_PropertyFilterContainer filters;
    RecordingPropertyFilter filter("f");
    filter.onApply([](CC_PropertyContainer&) { return XCode::FAILURE; });
    ASSERT_TRUE(filters.addFilter(filter).isOk());
    anna.endpoint.setInputFilterContainer(&filters);
    bert.hangUp();
    EXPECT_EQ(anna.become(State::RELEASED), XCode::FAILURE) << "and the module takes no notice";
    pass(42);
    EXPECT_EQ(explain(call).end,
              HELD_BY("anna", "CONNECTED") + "; its module's view says RELEASED, so a filter stands between the two");
    anna.endpoint.setInputFilterContainer(nullptr);
}

TEST_F(CC_Explanation_Stalls_Test, AnEventLoopThatIsNotRun)
{
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    m_clock.advance(42000);
    CC_Explanation::Call const dialled = explain(*anna.getCall());
    EXPECT_TRUE(dialled.isCleanUpPending);
    std::string const stall = ", and the loop has begun no turn for 42.000 s";
    EXPECT_NE(dialled.end.find("it ends when that adapter drops; its module is still to be told of "),
              std::string::npos)
        << dialled.end;
    EXPECT_NE(dialled.end.find(stall), std::string::npos) << dialled.end;
    CC_Call const& call = *anna.getCall();
    anna.hangUp();
    bert.hangUp();
    EXPECT_EQ(explain(call).end, "no leg is live and the clean-up is pending: it ends in the loop's next turn" + stall);
    settle();
}

TEST_F(CC_Explanation_Stalls_Test, ANotificationThatIsNeverDelivered)
{
    CC_Call const& call = connect(anna, bert);
    ASSERT_TRUE(bert.say(CC_PropertyId::NAME, "Bert").isOk());
    m_clock.advance(42000);
    CC_Explanation::Call const explained = explain(call);
    EXPECT_EQ(holdersOf(legOf(explained, "anna/line")),
              (Lines{"call X", OWN("anna") + ", its module still to be told of 1", PEER("bert")}));
    EXPECT_EQ(explained.end, HELD_BY("anna", "CONNECTED") + "; its module is still to be told of 1 change; " +
                                 HELD_BY("bert", "CONNECTED"))
        << "whether the loop has stood still or has only had nothing to do cannot be told: turns have begun since";
    settle();
    EXPECT_EQ(explain(call).end, HELD_BY("anna", "CONNECTED") + "; " + HELD_BY("bert", "CONNECTED"));
}

TEST_F(CC_Explanation_Stalls_Test, ACallWithoutAPool)
{
    auto* const call = new CC_Call;
    CC_CallLeg& leg = newLeg("own", State::CONNECTED);
    ASSERT_TRUE(call->addCallLeg(leg).isOk());
    pass(42);
    CC_Explanation::Call const explained = explain(*call);
    EXPECT_FALSE(explained.hasPool);
    EXPECT_EQ(explained.end,
              "leg own is CONNECTED and driven by no adapter: it ends when whoever holds the 1 reference "
              "that nobody is known for stores RELEASED and gives up");
    ASSERT_TRUE(leg.setProperty(State(CC_PropertyId::STATE, State::RELEASED)).isOk());
    leg.removeReference();
    settle();
}

TEST_F(CC_Explanation_Stalls_Test, ACallThatNobodyJoined)
{
    CC_Call& call = newCall();
    pass(42);
    EXPECT_EQ(explain(call).end,
              "no leg has joined: it ends when who made it asks for the clean-up (CC_Call::defer) or releases it");
    EXPECT_TRUE(explain(call).hasPool);
    call.defer();
    EXPECT_EQ(explain(call).end, "no leg is live and the clean-up is pending: it ends in the loop's next turn");
    settle();
}

TEST_F(CC_Explanation_Stalls_Test, AContextDestroyedWithItsCalls)
{
    CC_Call const& call = connect(anna, bert);
    CallControl::DESTROY_CONTEXT("SWITCH");
    pass(42);
    CC_Explanation const explanation = CC_Explanation::OF_CALLS_OLDER_THAN(42);
    ASSERT_EQ(explanation.getCalls().size(), 1u) << "though no context lists it any more";
    EXPECT_EQ(explanation.getCalls()[0].serial, call.getSerial());
    EXPECT_FALSE(explanation.getCalls()[0].hasPool);
    EXPECT_EQ(explanation.getCalls()[0].end, HELD_BY("anna", "CONNECTED") + "; " + HELD_BY("bert", "CONNECTED"));
    anna.hangUp();
    bert.hangUp();
    settle();
}

TEST_F(CC_Explanation_Stalls_Test, AConferenceThatLostItsOwner)
{
    CC_Call& call = connect(anna, bert);
    CC_CallAdapter second;
    ASSERT_TRUE(second.setup("second", anna.endpoint, nullptr).isOk());
    ASSERT_TRUE(second
                    .dial("SWITCH", "carl", "1", CC_PropertyContainer::EMPTY(), CC_PropertyContainer::EMPTY(),
                          CC_PropertyContainer::EMPTY(), nullptr)
                    .isOk());
    ASSERT_TRUE(carl.become(State::CONNECTED).isOk());
    ASSERT_TRUE(anna.adapter->transfer(second, false).isOk());
    anna.adapter.reset();
    second.cleanup();
    pass(42);
    CC_Explanation::Call const explained = explain(call);
    EXPECT_EQ(explained.end, HELD_BY("bert", "CONNECTED") + "; " + HELD_BY("carl", "CONNECTED"));
    for (char const* const other : {"bert", "carl"})
        EXPECT_EQ(holdersOf(legOf(explained, std::string(other) + "/line")).at(1), OWN(other));
}

TEST_F(CC_Explanation_Stalls_Test, AMoveUnderWay)
{
    CC_Call& from = connect(anna, bert);
    CC_Call& to = newCall();
    m_call = from.getSerial();
    std::string const target = "call " + std::to_string(to.getSerial());
    std::string const move = "the move between calls that is under way";
    Lines removed;
    Lines added;
    RecordingCallObserver observer("o");
    observer.m_onLegRemoved = [&](CC_EvCallCallLegModified const&)
    { removed = plainHoldersOf(legOf(explain(to), "anna/line")); };
    RecordingCallObserver other("p");
    other.m_onLegAdded = [&](CC_EvCallCallLegModified const&)
    {
        added = plainHoldersOf(legOf(explain(to), "anna/line"));
        observer.m_onLegRemoved = [](CC_EvCallCallLegModified const&) {};
    };
    ASSERT_TRUE(observer.observe(from).isOk());
    ASSERT_TRUE(other.observe(to).isOk());
    ASSERT_TRUE(CC_Call::TRANSFER_CALL_LEG(&to, *from.getCallLeg(0)).isOk());
    EXPECT_EQ(removed, (Lines{target, OWN("anna"), move})) << "the move has the old call's reference, too";
    EXPECT_EQ(added, (Lines{target, OWN("anna"), move}));
    EXPECT_EQ(plainHoldersOf(legOf(explain(to), "anna/line")), (Lines{target, OWN("anna")}));
}

TEST_F(CC_Explanation_Stalls_Test, AMoveThatEndsInNoCall)
{
    CC_Call& call = connect(anna, bert);
    RecordingCallObserver observer("o");
    std::string end;
    observer.m_onLegRemoved = [&](CC_EvCallCallLegModified const& event)
    {
        if (event.getCallLeg()->getName() == "raw")
            end = explainLeg().end;
    };
    ASSERT_TRUE(observer.observe(call).isOk());
    CC_CallLeg& leg = newLeg("raw", State::CONNECTED);
    ASSERT_TRUE(call.addCallLeg(leg).isOk());
    call.removeCallLeg(leg);
    EXPECT_EQ(end, "leg raw is CONNECTED and on its way between calls: it goes on when that move has ended");
    leg.removeReference();
}

TEST_F(CC_Explanation_Stalls_Test, ACallReleasedWhileAnOperationOnItIsUnderWay)
{
    CC_Call& call = connect(anna, bert);
    RecordingCallObserver observer("o");
    std::string end;
    observer.m_onChanged = [&](CC_EvCallPropertyChanged const&)
    {
        CallControl::RELEASE_CALL("", &call);
        end = explain(call).end;
    };
    ASSERT_TRUE(observer.observe(call).isOk());
    std::ignore = call.setProperty(CC_PropertyString(CC_PropertyId::NAME, "n"));
    EXPECT_EQ(end.find("the call was released: it ends when the "), 0u) << end;
}

TEST_F(CC_Explanation_Stalls_Test, AHoldThatIsNeverGivenUp)
{
    CC_Call& call = newCall();
    auto hold = std::make_unique<CC_Call::Hold>(&call);
    CallControl::RELEASE_CALL("", &call);
    pass(42);
    EXPECT_EQ(explain(call).end, "the call was released: it ends when the 1 hold on it (an operation under way, or "
                                 "somebody's CC_Call::Hold) let go");
    EXPECT_EQ(CC_Explanation::OF_CALL(m_call).getCalls().size(), 1u) << "though no pool lists it any more";
}

TEST_F(CC_Explanation_Stalls_Test, ALiveLegWhoseMakerHasGone)
{
    CC_Call& call = newCall();
    CC_CallLeg& leg = newLeg("orphan", State::CONNECTED);
    ASSERT_TRUE(call.addCallLeg(leg).isOk());
    leg.removeReference();
    pass(42);
    EXPECT_EQ(explain(call).end, "leg orphan is CONNECTED and held by its call alone: it ends when somebody takes it "
                                 "out (CC_Call::removeCallLeg)");
    call.removeCallLeg(leg); // does
    settle();
}

TEST_F(CC_Explanation_Stalls_Test, AReleaseThatNobodyWasToldOf)
{
    CC_Call& call = newCall();
    CC_CallLeg& leg = newLeg("quiet", State::CONNECTED);
    ASSERT_TRUE(call.addCallLeg(leg).isOk());
    settle();
    bool changed = false;
    ASSERT_TRUE(leg.setPropertyNoNotification(State(CC_PropertyId::STATE, State::RELEASED), changed).isOk());
    leg.removeReference();
    pass(42);
    EXPECT_EQ(explain(call).end,
              "no leg is live, but nobody has asked for the clean-up: it ends when somebody does (CC_Call::defer)");
    call.defer(); // does
    settle();
}

TEST_F(CC_Explanation_Stalls_Test, ADialThatDoesNotReturn)
{
    CC_Explanation::Call dialling;
    bert.provider.m_dial = [&](CC_Call& call, String const&, String const&, CC_PropertyContainer const&)
    {
        m_call = call.getSerial();
        dialling = explain(call);
        return XCode::OK;
    };
    ASSERT_EQ(anna.dial(bert), XCode::OK);
    EXPECT_EQ(plainHoldersOf(legOf(dialling, "anna/line")), (Lines{"call X", OWN("anna")}));
    EXPECT_TRUE(legOf(dialling, "anna/line").isBusy);
    EXPECT_NE(dialling.holds, 0u);
    EXPECT_EQ(dialling.end.find(HELD_BY("anna", "CONNECTED")), 0u);
    EXPECT_FALSE(legOf(explain(*anna.getCall()), "anna/line").isBusy);
}

// --- references ------------------------------------------------------------------------------------------------------

TEST_F(CC_Explanation_Stalls_Test, ALegReferenceThatIsNeverGivenBack)
{
    CC_CallLeg& leg = *connect(anna, bert).getCallLeg(0);
    leg.addReference();
    anna.hangUp();
    bert.hangUp();
    pass(42);
    Leg const explained = explainLeg();
    EXPECT_EQ(holdersOf(explained), Lines{"nobody known: 1"});
    EXPECT_EQ(explained.end, "leg anna/line is RELEASED and driven by no adapter: it ends when whoever holds the 1 "
                             "reference that nobody is known for gives up");
    leg.removeReference();
}

TEST_F(CC_Explanation_Stalls_Test, ALegThatTwoUnknownHold)
{
    CC_Call& call = connect(anna, bert);
    CC_CallLeg& leg = *call.getCallLeg(1);
    leg.addReference();
    auto const second = std::make_unique<CC_CallLeg::Reference>(leg);
    EXPECT_EQ(holdersOf(legOf(explain(call), "bert/line")),
              (Lines{"call X", OWN("bert"), PEER("anna"), "nobody known: 2"}));
    EXPECT_FALSE(legOf(explain(call), "bert/line").isBusy) << "so it is nobody's operation";
    leg.removeReference();
}

TEST_F(CC_Explanation_Stalls_Test, AReleasedLegWhoseAdapterDidNotDrop)
{
    connect(anna, bert);
    ASSERT_TRUE(bert.become(State::RELEASED).isOk());
    anna.hangUp();
    pass(42);
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
    EXPECT_EQ(holdersOf(explainLeg()), Lines{OWN("bert")});
    EXPECT_EQ(explainLeg().end, HELD_BY("bert", "RELEASED"));
}

TEST_F(CC_Explanation_Stalls_Test, ALegInNoCall)
{
    CC_CallLeg& leg = *new CC_CallLeg;
    pass(42);
    EXPECT_EQ(explainLeg().end, std::string("leg ") + String::addressOf(&leg).c_str() +
                                    " is IDLE and driven by no adapter: it ends when whoever holds the 1 reference "
                                    "that nobody is known for stores RELEASED and gives up");
    EXPECT_EQ(CC_Explanation::OF_LEGS_WITHOUT_CALL(43).getLegs().size(), 0u);
    leg.removeReference();
}

TEST_F(CC_Explanation_Stalls_Test, ALegTakenOutOfItsCallWhoseModuleTakesNoNotice)
{
    connect(anna, bert);
    m_fixture.getPool()->dropCalls("", "");
    anna.hangUp();
    pass(42);
    EXPECT_EQ(holdersOf(explainLeg()), Lines{OWN("bert")});
    EXPECT_EQ(explainLeg().end, HELD_BY("bert", "CONNECTED"));
}

TEST_F(CC_Explanation_Stalls_Test, ALegWhosePointerLeadsToACallThatHasEnded)
{
    CC_CallLeg& leg = newLeg("astray", State::CONNECTED);
    auto* const call = new CC_Call;
    leg.setCall(call);
    call->destroy();
    EXPECT_EQ(holdersOf(explainLeg()), Lines{"nobody known: 1"});
    leg.setCall(nullptr);
    leg.removeReference();
}

// --- observers -------------------------------------------------------------------------------------------------------

TEST_F(CC_Explanation_Stalls_Test, AnObserverThatIsNeverRemoved)
{
    CC_Call& call = connect(anna, bert);
    RecordingCallLegObserver ofLeg("o");
    RecordingCallObserver ofCall("p");
    ASSERT_TRUE(ofLeg.observe(*call.getCallLeg(0)).isOk());
    ASSERT_TRUE(ofCall.observe(call).isOk());
    std::string const lineOf[] = {"adapter `line` of endpoint `anna`", "adapter `line` of endpoint `bert`"};
    CC_Explanation::Call const explained = explain(call);
    EXPECT_EQ(observersOf(legOf(explained, "anna/line").observers),
              (Lines{lineOf[0], "call X", lineOf[1], FOREIGN(static_cast<CC_CallLegObserver*>(&ofLeg))}));
    EXPECT_EQ(observersOf(explained.observers),
              (Lines{lineOf[0], lineOf[1], FOREIGN(static_cast<CC_CallObserver*>(&ofCall))}));
    EXPECT_EQ(observersOf(explained.legObservers), (Lines{"call X", lineOf[0], lineOf[1]}));
    EXPECT_EQ(explained.end, HELD_BY("anna", "CONNECTED") + "; " + HELD_BY("bert", "CONNECTED"))
        << "observers keep nothing up";
}

TEST_F(CC_Explanation_Stalls_Test, AnObserverDeletedWithoutBeingRemoved)
{
    CC_Call& call = connect(anna, bert);
    auto observer = std::make_unique<RecordingCallLegObserver>("o");
    CC_CallLegObserver const* const address = observer.get();
    ASSERT_TRUE(call.addCallLegObserver(observer.get()).isOk());
    observer.reset(); // whoever touches it from now on is found out by the address sanitizer
    EXPECT_EQ(observersOf(explain(call).legObservers).back(), FOREIGN(address));
    EXPECT_EQ(observersOf(legOf(explain(call), "bert/line").observers).back(), FOREIGN(address));
    call.removeCallLegObserver(address);
    EXPECT_EQ(explain(call).legObservers.size(), 3u);
}

TEST_F(CC_Explanation_Stalls_Test, AnAdapterDestroyedByASubclassThatForgets)
{
    CC_Call& call = connect(anna, bert);
    auto forgetful = std::make_unique<ForgetfulAdapter>();
    ASSERT_TRUE(forgetful->setup("forgetful", carl.endpoint, nullptr).isOk());
    ASSERT_TRUE(forgetful->accept(call, CC_PropertyContainer::EMPTY()).isOk());
    forgetful->register2();
    CC_CallLegObserver const* const address = forgetful.get();
    EXPECT_EQ(observersOf(explain(call).legObservers).back(),
              "adapter `forgetful` of endpoint `carl`, 1 registered by somebody else")
        << "the subclass, past the adapter";
    forgetful.reset();
    settle();
    CC_Explanation::Call const explained = explain(call);
    EXPECT_EQ(observersOf(explained.legObservers).back(), FOREIGN(address));
    EXPECT_EQ(holdersOf(legOf(explained, "anna/line")),
              (Lines{"call X", OWN("anna"), PEER("bert"), "nobody known: 1"}));
    EXPECT_EQ(explained.legs.size(), 2u) << "its own leg has gone as it should";
    call.removeCallLegObserver(address);
    call.getCallLeg(0)->removeReference();
}

TEST_F(CC_Explanation_Stalls_Test, AnObserverRegisteredTwiceAndRemovedOnce)
{
    CC_Call& call = connect(anna, bert);
    RecordingCallObserver observer("o");
    for (int i = 0; i < 3; ++i)
        ASSERT_TRUE(call.addCallObserver(&observer).isOk());
    call.removeCallObserver(&observer);
    EXPECT_EQ(observersOf(explain(call).observers).back(),
              FOREIGN(static_cast<CC_CallObserver*>(&observer)) + ", 2 times");
    call.removeCallObserver(&observer);
    call.removeCallObserver(&observer);
}

TEST_F(CC_Explanation_Stalls_Test, AnObserverRemovedMoreOftenThanAdded)
{
    CC_Call& call = connect(anna, bert);
    RecordingCallObserver observer("o");
    ASSERT_TRUE(call.addCallObserver(&observer).isOk());
    call.removeCallObserver(&observer);
    call.removeCallObserver(&observer);
    EXPECT_EQ(observersOf(explain(call).observers).back(),
              FOREIGN(static_cast<CC_CallObserver*>(&observer)) +
                  ", removed more often than added (-1) and so still told");
    ASSERT_TRUE(call.addCallObserver(&observer).isOk());
}

TEST_F(CC_Explanation_Stalls_Test, AnEndpointThatMayHaveGoneIsNotAsked)
{
    CC_Call& call = connect(anna, bert);
    AskedEndpoint endpoint("gone");
    CC_CallAdapter adapter;
    ASSERT_TRUE(adapter.setup("9", endpoint, nullptr).isOk());
    ASSERT_TRUE(adapter.accept(call, CC_PropertyContainer::EMPTY()).isOk());
    unsigned int const asked = endpoint.m_asked;
    EXPECT_NE(asked, 0u);
    EXPECT_EQ(holdersOf(legOf(explain(call), "gone/9")).at(1).find("adapter `9` of endpoint `gone` (own)"), 0u);
    EXPECT_EQ(endpoint.m_asked, asked);
}
