#include "IsdnFixture.h"
#include "isdn/element/IsdnCharge.h"
#include "isdn/element/IsdnUserUser.h"

namespace
{
using Properties = CC_PropertyContainer;

/// The user's side of a line, whose network calls and is called.
struct IsdnPropertiesTest : IsdnFixture
{
    /// The far side calls; what the other side of call control is told then.
    void callFromWire(std::function<void(pri_sr*)> const& change)
    {
        side->call("4989123", true, 20, false, change);
        ASSERT_TRUE(watch.runUntil([&] { return other.getCall() != nullptr; }));
        settle();
    }
    std::string peer(unsigned int id) const { return other.getPeerValue(id); }

    /// The other side calls; what the far side is told with the SETUP.
    void callToWire(Properties const& own, Properties const& offer = {}, Properties const& call = {})
    {
        side->onEvent = [this](pri_event const& event)
        {
            if (event.e == PRI_EVENT_RING)
            {
                ring = event.ring;
                for (int i = 0; i < event.ring.subcmds->counter_subcmd; ++i)
                    if (event.ring.subcmds->subcmd[i].cmd == PRI_SUBCMD_REDIRECTING)
                        redirecting = event.ring.subcmds->subcmd[i].u.redirecting;
            }
        };
        ASSERT_TRUE(other.dial(NAME, "4989123", own, offer, call).isOk());
        ASSERT_TRUE(watch.runUntil([&] { return side->getCall() != nullptr; }));
        settle();
    }

    pri_event_ring ring = {};
    pri_party_redirecting redirecting = {};
};

/// The network's side, which charges.
struct IsdnChargingTest : IsdnFixture
{
    IsdnChargingTest() : IsdnFixture(true) {}

    void answerCallToWire()
    {
        side->onEvent = [this](pri_event const& event)
        {
            pri_subcommands const* const commands = event.e == PRI_EVENT_FACILITY ? event.facility.subcmds
                                                    : event.e == PRI_EVENT_HANGUP_REQ || event.e == PRI_EVENT_HANGUP
                                                        ? event.hangup.subcmds
                                                        : nullptr;
            for (int i = 0; commands != nullptr && i < commands->counter_subcmd; ++i)
                advice.push_back(commands->subcmd[i]);
        };
        side->call("4989123");
        ASSERT_TRUE(watch.runUntil([&] { return other.getCall() != nullptr; }));
        std::ignore = other.become(FakeModule::State::CONNECTED);
        ASSERT_TRUE(waitFor("ANSWER"));
    }
    static CC_PropertyCharge CHARGE(int amount, Q956::ETypeOfChargingInfo::Type type)
    {
        CC_PropertyCharge::Charge charge;
        auto& specific = charge.select(charge.m_specific);
        specific.m_typeOfChargingInfo = type;
        auto& currency = specific.m_recorded.select(specific.m_recorded.m_currency);
        currency.m_rCurrency = "EUR";
        currency.m_rAmount.m_currencyAmount = amount;
        currency.m_rAmount.m_multiplier = Q956::EMultiplier::ONE_HUNDREDTH;
        return CC_PropertyCharge(CC_PropertyId::CHARGE, charge);
    }

    std::vector<pri_subcommand> advice;
};
} // namespace

TEST_F(IsdnPropertiesTest, WhoCallsIsToldInEachWay)
{
    open();
    for (int type : {0, 1, 2, 3, 4, 6})
        for (int presentation : {0, 1})
            for (int screening : {0, 1, 2, 3})
            {
                callFromWire(
                    [&](pri_sr* request)
                    {
                        pri_party_id caller = {};
                        caller.number.valid = 1;
                        caller.number.plan = type << 4 | 1;
                        caller.number.presentation = presentation << 5 | screening;
                        std::strcpy(caller.number.str, "30123456");
                        pri_sr_set_caller_party(request, &caller);
                    });
                EXPECT_EQ(peer(CC_PropertyId::E164_NUMBER), "30123456");
                auto const& adapter = *other.m_adapter;
                EXPECT_EQ(static_cast<int>(adapter.getPeerTypeOfNumber()), type);
                EXPECT_EQ(adapter.getPeerNumberingPlan(), QNumberingPlan::ISDN);
                EXPECT_EQ(static_cast<int>(adapter.getPeerPresentationIndicator(QPresentationIndicator::RESERVED)),
                          presentation);
                EXPECT_EQ(
                    static_cast<int>(adapter.getPeerScreeningIndicator(QScreeningIndicator::USER_PROVIDED_FAILED)),
                    screening);
                other.hangUp();
                expectNothingLeft();
            }
}

TEST_F(IsdnPropertiesTest, TheWireIsToldWhoCallsInEachWay)
{
    open();
    for (int type : {0, 1, 2, 3, 4, 6})
        for (int presentation : {0, 1})
            for (int screening : {0, 1, 2, 3})
            {
                Properties own;
                std::ignore = own.set(Key::E164_NUMBER, "30123456");
                std::ignore = own.set(Key::TYPE_OF_NUMBER, static_cast<QTypeOfNumber>(type));
                std::ignore = own.set(Key::NUMBERING_PLAN, QNumberingPlan::ISDN);
                std::ignore = own.set(Key::PRESENTATION_INDICATOR, static_cast<QPresentationIndicator>(presentation));
                std::ignore = own.set(Key::SCREENING_INDICATOR, static_cast<QScreeningIndicator>(screening));
                ring = {};
                callToWire(own);
                EXPECT_STREQ(ring.callingnum, "30123456");
                EXPECT_EQ(ring.callingplan, type << 4 | 1);
                EXPECT_EQ(ring.callingpres, presentation << 5 | screening);
                side->proceed();
                settle();
                other.hangUp();
                expectNothingLeft();
            }
}

TEST_F(IsdnPropertiesTest, ARedirectedCallComesFromTheWire)
{
    open();
    for (int const code : {PRI_REDIR_FORWARD_ON_BUSY, PRI_REDIR_FORWARD_ON_NO_REPLY, PRI_REDIR_UNCONDITIONAL})
    {
        callFromWire(
            [&](pri_sr* request)
            {
                pri_party_redirecting redirected = {};
                redirected.from.number.valid = 1;
                redirected.from.number.plan = PRI_INTERNATIONAL_ISDN;
                std::strcpy(redirected.from.number.str, "4989200");
                redirected.count = 1;
                redirected.reason = code;
                pri_sr_set_redirecting_parties(request, &redirected);
            });
        EXPECT_EQ(peer(CC_PropertyId::REDIRECTING_E164_NUMBER), "+4989200");
        EXPECT_EQ(static_cast<int>(other.m_adapter->getPeerRedirectingReason()), code);
        EXPECT_EQ(other.m_adapter->getPeerRedirectingCounter(), 1u);
        other.hangUp();
        expectNothingLeft();
    }
}

TEST_F(IsdnPropertiesTest, ARedirectedCallGoesToTheWire)
{
    open();
    Properties own;
    std::ignore = own.set(Key::REDIRECTING_E164_NUMBER, "+4989200");
    std::ignore = own.set(Key::REDIRECTING_REASON, QReasonForRedirection::FORWARDING_NO_REPLY);
    std::ignore = own.set(Key::REDIRECTING_COUNTER, 1u);
    callToWire(own);
    EXPECT_STREQ(redirecting.from.number.str, "4989200");
    EXPECT_EQ(redirecting.from.number.plan, PRI_INTERNATIONAL_ISDN);
    EXPECT_EQ(redirecting.reason, PRI_REDIR_FORWARD_ON_NO_REPLY);
}

TEST_F(IsdnPropertiesTest, TheBearerIsToldBothWays)
{
    open();
    for (int const capability : {0, 8, 9, 16, 17, 24})
    {
        callFromWire([&](pri_sr* request)
                     { pri_sr_set_bearer(request, capability, capability == 0 || capability == 16 ? 0x23 : -1); });
        EXPECT_EQ(static_cast<int>(other.m_adapter->getInformationTransferCapability()), capability);
        other.hangUp();
        expectNothingLeft();
        Properties call;
        std::ignore =
            call.set(Key::INFORMATION_TRANSFER_CAPABILITY, static_cast<QInformationTransferCapability>(capability));
        callToWire({}, {}, call);
        EXPECT_EQ(ring.ctype, capability);
        side->proceed();
        settle();
        other.hangUp();
        expectNothingLeft();
    }
}

TEST_F(IsdnPropertiesTest, TextBetweenUsersIsToldBothWays)
{
    open();
    callFromWire([](pri_sr* request) { pri_sr_set_useruser(request, "hello"); });
    EXPECT_EQ(IsdnUserUser::TO_WIRE(other.m_adapter->getPeerUserToUser()), "hello");
    other.hangUp();
    expectNothingLeft();
    Properties own;
    std::ignore =
        own.set(CC_PropertyParametrizedString(CC_PropertyId::USER_TO_USER_INFORMATION, IsdnUserUser::FROM_WIRE("hi")));
    callToWire(own);
    EXPECT_STREQ(ring.useruserinfo, "hi");
}

TEST_F(IsdnPropertiesTest, WhoAnswersIsToldBothWays)
{
    open();
    callToWire({});
    pri_party_connected_line connected = {};
    connected.id.number.valid = 1;
    connected.id.number.plan = PRI_NATIONAL_ISDN;
    connected.id.number.presentation = PRI_PRES_RESTRICTED | PRI_PRES_NETWORK_NUMBER;
    std::strcpy(connected.id.number.str, "89124");
    side->ask([&](pri* stack) { return pri_connected_line_update(stack, side->getCall(), &connected); });
    side->answer();
    ASSERT_TRUE(waitForPeer("CONNECTED"));
    EXPECT_EQ(peer(CC_PropertyId::E164_NUMBER), "89124");
    EXPECT_EQ(other.m_adapter->getPeerTypeOfNumber(), QTypeOfNumber::NATIONAL);
    EXPECT_EQ(other.m_adapter->getPeerPresentationIndicator(QPresentationIndicator::ALLOWED),
              QPresentationIndicator::RESTRICTED);
    other.hangUp();
    expectNothingLeft();

    std::string answering;
    side->onEvent = [&](pri_event const& event)
    {
        for (int i = 0; event.e == PRI_EVENT_ANSWER && i < event.answer.subcmds->counter_subcmd; ++i)
            if (event.answer.subcmds->subcmd[i].cmd == PRI_SUBCMD_CONNECTED_LINE)
                answering = event.answer.subcmds->subcmd[i].u.connected_line.id.number.str;
    };
    callFromWire({});
    std::ignore = other.say(CC_PropertyId::E164_NUMBER, "4930999");
    std::ignore = other.become(FakeModule::State::CONNECTED);
    ASSERT_TRUE(waitFor("ANSWER"));
    EXPECT_EQ(answering, "4930999");
}

TEST_F(IsdnPropertiesTest, WhoHasTheCallNowIsToldBothWays)
{
    open();
    callToWire({});
    side->answer();
    ASSERT_TRUE(waitForPeer("CONNECTED"));
    std::string told;
    side->onEvent = [&](pri_event const& event)
    {
        for (int i = 0; event.e == PRI_EVENT_FACILITY && i < event.facility.subcmds->counter_subcmd; ++i)
            if (event.facility.subcmds->subcmd[i].cmd == PRI_SUBCMD_CONNECTED_LINE)
                told += std::string(" ") + event.facility.subcmds->subcmd[i].u.connected_line.id.number.str;
    };
    std::ignore = other.say(CC_PropertyId::E164_NUMBER, "4930777");
    ASSERT_TRUE(watch.runUntil([&] { return !told.empty(); }));
    std::ignore = other.become(FakeModule::State::HELD);
    ASSERT_TRUE(waitFor("NOTIFY " + std::to_string(PRI_NOTIFY_REMOTE_HOLD)));
    EXPECT_EQ(told, " 4930777") << "once";

    pri_party_connected_line connected = {};
    connected.id.number.valid = 1;
    connected.id.number.plan = PRI_INTERNATIONAL_ISDN;
    std::strcpy(connected.id.number.str, "4989777");
    side->ask([&](pri* stack) { return pri_connected_line_update(stack, side->getCall(), &connected); });
    EXPECT_TRUE(watch.runUntil([&] { return peer(CC_PropertyId::E164_NUMBER) == "4989777"; }));
    EXPECT_EQ(other.m_adapter->getPeerTypeOfNumber(), QTypeOfNumber::INTERNATIONAL);
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnChargingTest, ChargesAreToldDuringTheCallAndAtItsEnd)
{
    open();
    answerCallToWire();
    std::ignore = other.say(CHARGE(25, Q956::ETypeOfChargingInfo::SUB_TOTAL));
    ASSERT_TRUE(watch.runUntil([&] { return !advice.empty(); }));
    EXPECT_EQ(advice[0].cmd, PRI_SUBCMD_AOC_D);
    EXPECT_EQ(advice[0].u.aoc_d.recorded.money.amount.cost, 25);
    EXPECT_STREQ(advice[0].u.aoc_d.recorded.money.currency, "EUR");
    std::ignore = other.say(CHARGE(50, Q956::ETypeOfChargingInfo::TOTAL));
    other.hangUp();
    ASSERT_TRUE(waitFor("HANGUP_REQ 16"));
    ASSERT_EQ(advice.size(), 2u);
    EXPECT_EQ(advice[1].cmd, PRI_SUBCMD_AOC_E);
    EXPECT_EQ(advice[1].u.aoc_e.recorded.money.amount.cost, 50);
}

TEST_F(IsdnChargingTest, WhoHangsUpHearsTheTotalWithTheRelease)
{
    open();
    answerCallToWire();
    std::ignore = other.say(CHARGE(25, Q956::ETypeOfChargingInfo::SUB_TOTAL));
    ASSERT_TRUE(watch.runUntil([&] { return !advice.empty(); }));
    side->clear(31);
    ASSERT_TRUE(waitForPeer("DISCONNECTING"));
    EXPECT_EQ(other.getPeerValue(CC_PropertyId::CAUSE), "Normal, unspecified");
    EXPECT_FALSE(side->has("HANGUP 31")) << "not before it is known";
    std::ignore = other.say(CHARGE(50, Q956::ETypeOfChargingInfo::TOTAL));
    other.hangUp();
    ASSERT_TRUE(waitFor("HANGUP 31"));
    ASSERT_EQ(advice.size(), 2u);
    EXPECT_EQ(advice[1].cmd, PRI_SUBCMD_AOC_E);
    EXPECT_EQ(advice[1].u.aoc_e.recorded.money.amount.cost, 50);
    expectNothingLeft();
}

TEST_F(IsdnChargingTest, WhoHangsUpDoesNotWaitForATotalForLong)
{
    open();
    for (bool const isByUs : {false, true})
    {
        answerCallToWire();
        std::ignore = other.say(CHARGE(25, Q956::ETypeOfChargingInfo::SUB_TOTAL));
        ASSERT_TRUE(watch.runUntil([&] { return !advice.empty(); }));
        side->clear(31);
        ASSERT_TRUE(waitForPeer("DISCONNECTING"));
        if (isByUs)
            interface->clearCalls(QCause::TEMPORARY_FAILURE);
        EXPECT_TRUE(waitFor("HANGUP 31"));
        EXPECT_TRUE(waitForPeer("RELEASED"));
        EXPECT_EQ(advice.size(), 1u);
        other.hangUp();
        expectNothingLeft();
        side->take();
        advice.clear();
    }
}

TEST_F(IsdnPropertiesTest, APeerThatHangsUpAndWaitsHearsTheTotal)
{
    open();
    callToWire({});
    side->answer();
    ASSERT_TRUE(waitForPeer("CONNECTED"));
    std::ignore = other.say(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, false));
    std::ignore = other.say(CC_PropertyCause(CC_PropertyId::CAUSE, QCause::NORMAL_UNSPECIFIED, 0));
    side->onEvent = [&](pri_event const& event)
    {
        pri_subcmd_aoc_e bill = {};
        bill.charge = PRI_AOC_DE_CHARGE_UNITS;
        bill.recorded.unit.num_items = 1;
        bill.recorded.unit.item[0] = {7, -1};
        if (event.e == PRI_EVENT_HANGUP_REQ)
            side->ask([&](pri* stack) { return pri_aoc_e_send(stack, side->getCall(), &bill); });
    };
    std::ignore = other.become(FakeModule::State::DISCONNECTING);
    EXPECT_TRUE(waitFor("HANGUP_REQ 31"));
    EXPECT_TRUE(waitForPeer("RELEASED"));
    auto const* const charge = other.m_adapter->getPeerCharge();
    ASSERT_NE(charge, nullptr);
    EXPECT_TRUE(IsdnCharge::IS_TOTAL(*charge));
    other.hangUp();
    expectNothingLeft();
}

TEST_F(IsdnChargingTest, ATariffIsTold)
{
    open();
    answerCallToWire();
    CC_PropertyTariff::Tariff tariff;
    auto* const entry = tariff.select(tariff.m_currencyInfoList).append();
    entry->m_chargedItem = Q956::EChargedItem::CALL_SETUP;
    entry->m_aOCSCurrencyInfo.select(entry->m_aOCSCurrencyInfo.m_freeOfCharge);
    std::ignore = other.say(CC_PropertyTariff(CC_PropertyId::TARIFF, tariff));
    ASSERT_TRUE(watch.runUntil([&] { return !advice.empty(); }, std::chrono::seconds(3)));
    EXPECT_EQ(advice[0].cmd, PRI_SUBCMD_AOC_S);
    ASSERT_EQ(advice[0].u.aoc_s.num_items, 1);
    EXPECT_EQ(advice[0].u.aoc_s.item[0].chargeable, PRI_AOC_CHARGED_ITEM_CALL_SETUP);
    EXPECT_EQ(advice[0].u.aoc_s.item[0].rate_type, PRI_AOC_RATE_TYPE_FREE);
}
