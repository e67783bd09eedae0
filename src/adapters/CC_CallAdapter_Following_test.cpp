// The views look only at what they are told of, as long as that is enough: nobody may see a difference to views that
// compare everything with every change.
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyKind.h"
#include "tests/support/TestLine.h"

#include <algorithm>
#include <functional>
#include <random>
#include <set>
#include <vector>

namespace
{
using namespace CC_PropertyId;

/// A module's value, of a class that is declared.
class Stamp : public CC_PropertyClass<Stamp>
{
public:
    static constexpr char const* TYPE_NAME = "Stamp";
    static TypeId s_typeId;
    using CC_PropertyClass::CC_PropertyClass;
    Stamp(unsigned int id, unsigned int number, String const& remark)
        : CC_PropertyClass(id), m_number(number), m_remark(remark)
    {
    }
    String& getValueString(String& out) const override { return out.format("%u %s", m_number, m_remark.c_str()); }
    bool hasSameValue(Stamp const& other) const { return m_number == other.m_number && m_remark == other.m_remark; }

private:
    unsigned int m_number = 0;
    String m_remark;
};
Stamp::TypeId Stamp::s_typeId;

/// What the two adapters of a call know of one leg, brought up to date by comparing everything.
class ReferenceViews : public CC_CallLegObserver
{
public:
    explicit ReferenceViews(CC_CallLeg const& leg) : m_leg(leg) {}

    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const&) override {}
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) override {}
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const&) override {}
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const&) override
    {
        CC_PropertyContainer const& current = m_leg.getProperties();
        own = current;
        for (CC_Property const& property : current)
        {
            CC_Property const* const seen = std::as_const(peer).get(property.getId());
            if (seen != nullptr && property.isEqual(*seen))
                continue;
            EXPECT_TRUE(peer.set(property).isOk());
            marked.insert(property.getId());
        }
        for (unsigned int i = 0; i < peer.getNumberOfProperties();)
        {
            unsigned int const id = peer.getByIndex(i)->getId();
            if (current.get(id) != nullptr)
                ++i;
            else
            {
                peer.removeByIndex(i);
                marked.insert(id);
            }
        }
    }

    CC_PropertyContainer own;
    CC_PropertyContainer peer;
    std::set<unsigned int> marked;

private:
    CC_CallLeg const& m_leg;
};

/// Changes a leg that joins the call, after the adapters there were told that it comes and before they hear of it.
class Guest : public CC_CallObserver
{
public:
    using Change = std::function<XCode(CC_CallLeg&)>;

    Guest(CC_Call& call, Change change) : m_call(call), m_change(std::move(change))
    {
        EXPECT_TRUE(call.addCallObserver(this).isOk());
    }
    ~Guest() override { m_call.removeCallObserver(this); }

    void onCallObservationEnded(CC_Event<CC_Call> const&) override {}
    void onCallCallLegRemoved(CC_Event<CC_Call> const&) override {}
    void onCallPropertyChanged(CC_Event<CC_Call> const&) override {}
    void onCallCallLegAdded(CC_Event<CC_Call> const& event) override
    {
        EXPECT_TRUE(m_change(*CC_EvCallCallLegModified::FROM(event).getCallLeg()).isOk());
    }

private:
    CC_Call& m_call;
    Change m_change;
};

/// A leg without an adapter, in the call for as long as this lives.
class JoinedLeg
{
public:
    JoinedLeg(CC_Call& call, char const* name, State::State state) : leg(*new CC_CallLeg), m_call(call)
    {
        EXPECT_TRUE(leg.setProperty(CC_PropertyString(NAME, name)).isOk());
        EXPECT_TRUE(leg.setProperty(State(STATE, state)).isOk());
        EXPECT_TRUE(call.addCallLeg(leg).isOk());
    }
    ~JoinedLeg()
    {
        m_call.removeCallLeg(leg);
        leg.removeReference();
    }
    JoinedLeg(JoinedLeg const&) = delete;
    JoinedLeg& operator=(JoinedLeg const&) = delete;

    CC_CallLeg& leg;

private:
    CC_Call& m_call;
};

class CC_CallAdapter_Following_Test : public TestLines
{
protected:
    static constexpr unsigned int IDS[] = {E164_NUMBER, NAME, ALERT_INFO, DISPLAY, PROVIDES_DATA};

    static std::string TEXT_OF(CC_PropertyContainer const& properties)
    {
        std::string text;
        for (CC_Property const& property : properties)
            text += std::string(property.getPropertyName()) + "=" + TestLine::TEXT(&property) + " ";
        return text;
    }
    /// All that the adapter shows, in its order; `get` is one of its getters of several.
    static std::string SHOWN(CC_CallAdapter const& adapter,
                             XCode (CC_CallAdapter::*get)(CC_PropertyContainer&, unsigned int) const)
    {
        CC_PropertyContainer shown;
        EXPECT_TRUE((adapter.*get)(shown, CC_PropertyContainer::ALL_GROUPS).isOk());
        return TEXT_OF(shown);
    }

    /// a's call with nobody in it yet.
    void dialNobody()
    {
        provider.m_dial = [](CC_Call&, String const&, String const&, CC_PropertyContainer const&) { return XCode::OK; };
        ASSERT_TRUE(a.dial().isOk());
    }

    unsigned int random(unsigned int below) { return static_cast<unsigned int>(m_random() % below); }
    CC_PropertyString randomText()
    {
        return {IDS[random(4)], random(2) == 0 ? "x" : "a text too long to be kept inline"};
    }
    CC_PropertyContainer several()
    {
        CC_PropertyContainer properties;
        for (unsigned int i = 0; i < 3; ++i)
            EXPECT_TRUE(properties.set(randomText()).isOk());
        EXPECT_TRUE(properties.set(State(STATE, State::ALERTING)).isOk());
        return properties;
    }

    /// One of the ways in which b's leg and the views of it change. The last ones tell nobody.
    void change(CC_CallLeg& leg, ReferenceViews& reference, bool alsoUntold)
    {
        CC_PropertyString const text = randomText();
        CC_PropertyBoolean const data(PROVIDES_DATA, random(2) == 0);
        CC_PropertyBoolean const ofAnotherClass(NAME, true);
        Stamp const stamp(random(2) == 0 ? DISPLAY : ALERT_INFO, random(3), "of a module's class");
        CC_Property const& one = random(3) == 0 ? static_cast<CC_Property const&>(stamp) : text;
        CC_PropertyContainer const many = several();
        bool changed = false;
        switch (random(alsoUntold ? 11 : 8))
        {
        case 0:
        case 1:
            EXPECT_TRUE(reference.own.set(one).isOk());
            EXPECT_TRUE(b.adapter.setOwnProperty(one).isOk());
            break;
        case 2:
            EXPECT_TRUE(reference.own.set(data).isOk());
            EXPECT_TRUE(b.adapter.setOwnPropertyUnfiltered(data).isOk());
            break;
        case 3:
            EXPECT_TRUE(reference.own.set(many).isOk());
            EXPECT_TRUE(b.adapter.setOwnProperties(many).isOk());
            break;
        case 4:
            EXPECT_TRUE(reference.peer.set(text).isOk());
            EXPECT_TRUE(a.adapter.setPeerProperty(text).isOk());
            break;
        case 5:
            EXPECT_TRUE(reference.peer.set(ofAnotherClass).isOk());
            EXPECT_TRUE(a.adapter.setPeerProperty(ofAnotherClass).isOk());
            break;
        case 6: // refused by the leg: the module sees it until the next change
            EXPECT_TRUE(reference.own.set(State(STATE, State::IDLE)).isOk());
            EXPECT_FALSE(b.adapter.setOwnProperty(State(STATE, State::IDLE)).isOk());
            break;
        case 7:
            EXPECT_TRUE(leg.setProperty(text).isOk());
            break;
        case 8:
            std::ignore = leg.setPropertyNoNotification(text, changed);
            break;
        case 9:
            leg.getPropertiesToWrite().remove(text.getId());
            break;
        default:
            leg.getPropertiesToWrite().removeByIndex(leg.getProperties().getNumberOfProperties() - 1);
            break;
        }
    }

    void expectSame(ReferenceViews& reference)
    {
        EXPECT_EQ(SHOWN(b.adapter, &CC_CallAdapter::getOwnProperties), TEXT_OF(reference.own));
        EXPECT_EQ(SHOWN(a.adapter, &CC_CallAdapter::getPeerProperties), TEXT_OF(reference.peer));
    }
    void expectSameHeard(ReferenceViews& reference)
    {
        std::size_t const before = a.module.getFlagSets().size();
        settle();
        std::vector<unsigned int> const expected(reference.marked.begin(), reference.marked.end());
        reference.marked.clear();
        if (expected.empty())
            EXPECT_EQ(a.module.getFlagSets().size(), before);
        else
            EXPECT_EQ(a.module.getFlagSets().back(), expected);
    }

    std::minstd_rand m_random;
};
} // namespace

TEST_F(CC_CallAdapter_Following_Test, HoweverALegChangesItsViewsAreThoseOfAFullComparison)
{
    for (unsigned int round = 0; round < 400 && !HasFailure(); ++round)
    {
        bool const isDeclared = round >= 200; // until then its class may do anything
        ASSERT_TRUE(!isDeclared || CC_PropertyKind::DECLARE<Stamp>().isOk());
        SCOPED_TRACE("round " + std::to_string(round));
        connect(State::ALERTING);
        CC_CallLeg& leg = *theCall().getCallLeg(1);
        ReferenceViews reference(leg);
        reference.own = leg.getProperties();
        reference.peer = reference.own;
        ASSERT_TRUE(leg.addCallLegObserver(&reference).isOk());
        b.become(State::CONNECTED); // from here on all views are in step
        expectSameHeard(reference);
        for (unsigned int i = 0; i < 30 && !HasFailure(); ++i)
        {
            SCOPED_TRACE("change " + std::to_string(i));
            change(leg, reference, round % 4 == 3 && i > 10);
            expectSame(reference);
            if (random(3) == 0)
                expectSameHeard(reference);
        }
        leg.removeCallLegObserver(&reference);
        a.drop();
        b.drop();
        settle();
    }
}

TEST_F(CC_CallAdapter_Following_Test, AChangeThatComesBeforeTheAdapterHearsOfTheLegIsSeenWhenTheModuleIsTold)
{
    dialNobody();
    Guest guest(theCall(), [](CC_CallLeg& leg) { return leg.setProperty(CC_PropertyString(NAME, "by the guest")); });
    ASSERT_TRUE(b.accept(theCall()).isOk());
    listen();
    EXPECT_EQ(a.peer(NAME), "by the guest");
    b.say(DISPLAY, "B");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Display)"});
}

TEST_F(CC_CallAdapter_Following_Test, AChangeOfAJoiningLegThatLooksLikeTheFormerPeerIsSeenToo)
{
    dialNobody();
    JoinedLeg const former(theCall(), "alike", State::CONNECTED);
    settle();
    Guest guest(theCall(),
                [&](CC_CallLeg& leg)
                {
                    EXPECT_TRUE(former.leg.setProperty(State(STATE, State::RELEASED)).isOk()); // makes way
                    return leg.setProperty(CC_PropertyString(NAME, "by the guest"));
                });
    JoinedLeg const next(theCall(), "alike", State::CONNECTED);
    settle();
    EXPECT_EQ(a.peer(NAME), "by the guest");
}

TEST_F(CC_CallAdapter_Following_Test, ALegThatRisesWhileItJoinsTakesOver)
{
    dialNobody();
    JoinedLeg const first(theCall(), "the first", State::TRYING);
    settle();
    EXPECT_EQ(a.peer(NAME), "the first");
    Guest guest(theCall(), [](CC_CallLeg& leg) { return leg.setProperty(State(STATE, State::CONNECTED)); });
    JoinedLeg const second(theCall(), "the second", State::TRYING); // no peer yet when a's adapter is told
    settle();
    EXPECT_EQ(a.peer(NAME), "the second");
}

TEST_F(CC_CallAdapter_Following_Test, AChangeInsideTheNewsThroughWhichTheLegJoinsIsSeenToo)
{
    /// Brings a leg into a call when it changes, and changes it again as soon as it is there.
    struct Guest : CC_CallObserver, CC_CallLegObserver
    {
        explicit Guest(CC_Call& joined) : call(joined) {}
        void onCallObservationEnded(CC_Event<CC_Call> const&) override {}
        void onCallLegObservationEnded(CC_Event<CC_CallLeg> const&) override {}
        void onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) override {}
        void onCallLegSynchronousService(CC_Event<CC_CallLeg> const&) override {}
        void onCallCallLegRemoved(CC_Event<CC_Call> const&) override {}
        void onCallPropertyChanged(CC_Event<CC_Call> const&) override {}
        void onCallCallLegAdded(CC_Event<CC_Call> const& event) override
        {
            CC_CallLeg* const leg = CC_EvCallCallLegModified::FROM(event).getCallLeg();
            EXPECT_TRUE(leg->setProperty(CC_PropertyString(NAME, "inside")).isOk());
        }
        void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override
        {
            if (event.getSource()->getCall() == nullptr)
            {
                EXPECT_TRUE(call.addCallLeg(*event.getSource()).isOk());
            }
        }
        CC_Call& call;
    };
    provider.m_dial = [](CC_Call&, String const&, String const&, CC_PropertyContainer const&) { return XCode::OK; };
    ASSERT_TRUE(a.dial().isOk());
    auto* const leg = new CC_CallLeg;
    for (unsigned int const id : {NAME, DISPLAY})
        ASSERT_TRUE(leg->setProperty(CC_PropertyString(id, "before")).isOk());
    ASSERT_TRUE(leg->setProperty(CC_PropertyCallLegState(STATE, CC_PropertyCallLegState::CONNECTED)).isOk());
    Guest guest(theCall());
    ASSERT_TRUE(theCall().addCallObserver(&guest).isOk()); // told after a's adapter
    ASSERT_TRUE(leg->addCallLegObserver(&guest).isOk());
    ASSERT_TRUE(leg->setProperty(CC_PropertyString(DISPLAY, "outside")).isOk());
    EXPECT_EQ(a.peer(NAME) + " " + a.peer(DISPLAY), "inside outside");
    leg->removeCallLegObserver(&guest);
    theCall().removeCallObserver(&guest);
    theCall().removeCallLeg(*leg);
    leg->removeReference();
}

TEST_F(CC_CallAdapter_Following_Test, WhatChangedBehindAFailingFilterIsSeenWithoutIt)
{
    connect();
    b.say(NAME, "x");
    bool isFailing = true;
    b.filterOutput([&](CC_PropertyContainer&) { return isFailing ? XCode::FAILURE : XCode::OK; });
    ASSERT_TRUE(theCall().getCallLeg(1)->setProperty(CC_PropertyString(NAME, "y")).isOk());
    EXPECT_EQ(b.own(NAME), "x") << "the filter keeps the view as it was";
    b.endpoint.setOutputFilterContainer(nullptr);
    ASSERT_TRUE(theCall().getCallLeg(1)->setProperty(CC_PropertyString(DISPLAY, "z")).isOk());
    EXPECT_EQ(b.own(NAME) + b.own(DISPLAY), "yz");
    isFailing = false;
}
