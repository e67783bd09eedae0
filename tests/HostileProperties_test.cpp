// What a module's property class does when it is cloned, assigned, compared, logged or ended: it may change or destroy
// what it is just being stored into, and the adapter, leg or call that owns that. Each of these once touched freed
// memory.
#include "properties/CC_PropertyUnsigned.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/PartyTest.h"
#include "tests/support/PropertyTesting.h"

#include <functional>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace
{
using namespace CC_PropertyId;

class HostileProperties : public PartyTest
{
protected:
    using Write = std::function<XCode(CC_CallAdapter&, CC_PropertyContainer const&)>;

    static inline Write const EACH_WAY_TO_WRITE[] = {
        [](CC_CallAdapter& by, CC_PropertyContainer const& from) { return by.setOwnProperty(*from.get(NAME)); },
        [](CC_CallAdapter& by, CC_PropertyContainer const& from) { return by.setPeerProperty(*from.get(NAME)); },
        [](CC_CallAdapter& by, CC_PropertyContainer const& from) { return by.setCallProperty(*from.get(NAME)); },
        [](CC_CallAdapter& by, CC_PropertyContainer const& from) { return by.setOwnProperties(from); },
        [](CC_CallAdapter& by, CC_PropertyContainer const& from) { return by.setPeerProperties(from); },
        [](CC_CallAdapter& by, CC_PropertyContainer const& from) { return by.setCallProperties(from); },
    };

    ~HostileProperties() override { *deeds = {}; }

    /// A party whose adapter was destroyed gets another one.
    void reconnect(Party& caller, Party& callee)
    {
        *deeds = {};
        callee.hangUp();
        settle();
        caller.adapter = std::make_unique<CC_CallAdapter>();
        caller.setup();
        connect(caller, callee);
    }
    ActingProperty acting(int value, unsigned int id = NAME) const { return ActingProperty(id, value, deeds); }
    /// An acting property between two others.
    CC_PropertyContainer several(int value) const
    {
        CC_PropertyContainer properties;
        EXPECT_EQ(properties.set(CC_PropertyString(DISPLAY, "before")), XCode::OK);
        EXPECT_EQ(properties.set(acting(value)), XCode::OK);
        EXPECT_EQ(properties.set(CC_PropertyString(ALERT_INFO, "behind")), XCode::OK);
        return properties;
    }
    static int NUMBER_IN(CC_PropertyContainer const& properties, unsigned int id = NAME)
    {
        auto const* const property = dynamic_cast<ActingProperty const*>(properties.get(id));
        return property != nullptr ? property->getNumber() : -1;
    }
    using Getter = XCode (CC_CallAdapter::*)(CC_PropertyContainer&, unsigned int) const;
    static CC_PropertyContainer READ(CC_CallAdapter const& adapter, Getter read)
    {
        CC_PropertyContainer properties;
        std::ignore = (adapter.*read)(properties, CC_PropertyContainer::ALL_GROUPS);
        return properties;
    }
    static void expectHolds(CC_PropertyContainer const& all, CC_PropertyContainer const& some, std::string const& what)
    {
        for (CC_Property const& property : some)
        {
            CC_Property const* const held = all.get(property.getId());
            EXPECT_TRUE(held != nullptr && held->isEqual(property)) << what << ", id " << property.getId();
        }
    }
    /// Without filters an adapter sees what its peer and its call hold, and of its own leg nothing that is not there.
    static void expectTrueViews(Party const& party, std::string const& when)
    {
        using A = CC_CallAdapter;
        CC_CallAdapter const& adapter = *party.adapter;
        CC_PropertyContainer const peer = READ(adapter, &A::getPeerPropertiesUnfiltered);
        CC_PropertyContainer const call = READ(adapter, &A::getCallPropertiesUnfiltered);
        expectHolds(READ(adapter, &A::getOwnPropertiesUnfiltered), READ(adapter, &A::getOwnProperties), "own, " + when);
        expectHolds(peer, READ(adapter, &A::getPeerProperties), "peer, " + when);
        expectHolds(READ(adapter, &A::getPeerProperties), peer, "of the peer, " + when);
        expectHolds(call, READ(adapter, &A::getCallProperties), "call, " + when);
        expectHolds(READ(adapter, &A::getCallProperties), call, "of the call, " + when);
    }
    std::shared_ptr<ActingProperty::Deeds> const deeds = std::make_shared<ActingProperty::Deeds>();
};
} // namespace

// --- legs and calls --------------------------------------------------------------------------------------------------

TEST_F(HostileProperties, AStoredPropertyMayLeaveTheLegThatComparesIt)
{
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(leg->setProperty(acting(1)), XCode::OK);
    deeds->onIsEqual = [leg] { leg->getPropertiesToWrite().remove(NAME); };
    EXPECT_EQ(leg->setProperty(acting(2)), XCode::OK);
    EXPECT_EQ(NUMBER_IN(leg->getProperties()), 2);
    leg->removeReference();
}

TEST_F(HostileProperties, AStoredPropertyMayGiveUpTheLegThatComparesIt)
{
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(leg->setProperty(acting(1)), XCode::OK);
    deeds->onIsEqual = [leg] { leg->removeReference(); };
    EXPECT_EQ(leg->setProperty(acting(2)), XCode::OK);
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
}

TEST_F(HostileProperties, AClonedPropertyMayGiveUpTheLegThatStoresIt)
{
    auto* const leg = new CC_CallLeg;
    deeds->onClone = [leg] { leg->removeReference(); };
    EXPECT_EQ(leg->setProperty(acting(1)), XCode::OK);
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
}

TEST_F(HostileProperties, APropertyMayChangeOrEndWhatALegTakesSeveralFrom)
{
    for (bool const isEnding : {false, true})
        for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onIsEqual})
        {
            auto* const leg = new CC_CallLeg;
            ASSERT_EQ(leg->setProperty(acting(1)), XCode::OK);
            auto source = std::make_unique<CC_PropertyContainer>(several(2));
            ASSERT_EQ(source->set(State(STATE, State::CONNECTED)), XCode::OK);
            (*deeds).*event = [&] { isEnding ? source.reset() : source->clear(); };
            std::ignore = leg->setProperties(*source);
            EXPECT_FALSE((*deeds).*event) << "it has happened";
            EXPECT_EQ(NUMBER_IN(leg->getProperties()), 2);
            leg->removeReference();
            *deeds = {};
        }
}

TEST_F(HostileProperties, AStoredPropertyMayTakeTheStateOutOfWhatTheLegTakes)
{
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(leg->setProperty(acting(1)), XCode::OK);
    CC_PropertyContainer source;
    ASSERT_EQ(source.set(State(STATE, State::CONNECTED)), XCode::OK);
    ASSERT_EQ(source.set(CC_PropertyUnsigned(NAME, 7)), XCode::OK) << "of a class that the stored one compares with";
    deeds->onIsEqual = [&] { source.remove(STATE); };
    EXPECT_EQ(leg->setProperties(source), XCode::OK);
    EXPECT_EQ(leg->getState(), State::CONNECTED) << "it was there when the leg was asked";
    leg->removeReference();
}

TEST_F(HostileProperties, APropertyMayChangeOrEndWhatACallTakesSeveralFrom)
{
    for (bool const isEnding : {false, true})
        for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onIsEqual})
        {
            CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
            ASSERT_EQ(call->setProperty(acting(1)), XCode::OK);
            auto source = std::make_unique<CC_PropertyContainer>(several(2));
            (*deeds).*event = [&] { isEnding ? source.reset() : source->clear(); };
            std::ignore = call->setProperties(*source);
            EXPECT_FALSE((*deeds).*event) << "it has happened";
            EXPECT_EQ(NUMBER_IN(call->getProperties()), 2);
            CallControl::RELEASE_CALL("SWITCH", call);
            *deeds = {};
        }
}

TEST_F(HostileProperties, APropertyMayReleaseTheCallThatStoresIt)
{
    for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onIsEqual,
                             &ActingProperty::Deeds::onAssign, &ActingProperty::Deeds::onEnd})
    {
        CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
        ASSERT_EQ(call->setProperty(acting(1)), XCode::OK);
        CC_PropertyContainer const source = several(2); // before anything happens
        (*deeds).*event = [call] { CallControl::RELEASE_CALL("SWITCH", call); };
        std::ignore = call->setProperties(source);
        EXPECT_FALSE((*deeds).*event) << "it has happened";
        EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
    }
}

TEST_F(HostileProperties, ALoggedPropertyMayGiveUpTheLegThatStoresIt)
{
    RecordingMonitor monitor(RTD::LEVEL_CHANGE);
    auto* const leg = new CC_CallLeg;
    ASSERT_EQ(leg->setProperty(acting(1)), XCode::OK);
    deeds->onText = [leg]
    {
        leg->getPropertiesToWrite().clear();
        leg->removeReference();
    };
    EXPECT_EQ(leg->setProperty(acting(2)), XCode::OK);
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
}

// --- adapters --------------------------------------------------------------------------------------------------------

TEST_F(HostileProperties, APropertyMayDestroyTheAdapterThatItIsWrittenWith)
{
    Party anna("anna"), bert("bert");
    Write const writes[] = {
        [](CC_CallAdapter& adapter, CC_PropertyContainer const& from)
        { return adapter.setOwnProperty(*from.get(NAME)); },
        [](CC_CallAdapter& adapter, CC_PropertyContainer const& from)
        { return adapter.setPeerProperty(*from.get(NAME)); },
        [](CC_CallAdapter& adapter, CC_PropertyContainer const& from)
        { return adapter.setCallProperty(*from.get(NAME)); },
        [](CC_CallAdapter& adapter, CC_PropertyContainer const& from)
        { return adapter.setOwnPropertyUnfiltered(*from.get(NAME)); },
        [](CC_CallAdapter& adapter, CC_PropertyContainer const& from) { return adapter.setOwnProperties(from); },
        [](CC_CallAdapter& adapter, CC_PropertyContainer const& from) { return adapter.setPeerProperties(from); },
        [](CC_CallAdapter& adapter, CC_PropertyContainer const& from) { return adapter.setCallProperties(from); },
    };
    CC_PropertyContainer const first = several(1);
    CC_PropertyContainer const second = several(2);
    for (Write const& write : writes)
        for (bool const isThereBefore : {false, true})
        {
            reconnect(anna, bert);
            if (isThereBefore)
            {
                ASSERT_EQ(write(*anna.adapter, first), XCode::OK);
                settle();
            }
            auto const event = isThereBefore ? &ActingProperty::Deeds::onAssign : &ActingProperty::Deeds::onClone;
            (*deeds).*event = [&] { anna.adapter.reset(); };
            EXPECT_EQ(write(*anna.adapter, second), XCode::FAILURE);
            EXPECT_EQ(anna.adapter, nullptr);
        }
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileProperties, APropertyMayDestroyTheAdapterWhoseViewFollows)
{
    for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onIsEqual,
                             &ActingProperty::Deeds::onAssign, &ActingProperty::Deeds::onEnd})
        for (unsigned int skipped = 0; skipped < 8; ++skipped)
        {
            Party anna("anna"), bert("bert");
            connect(anna, bert);
            ASSERT_EQ(bert.adapter->setOwnProperty(acting(1)), XCode::OK);
            ASSERT_EQ(bert.adapter->setCallProperty(acting(1)), XCode::OK);
            settle();
            unsigned int left = skipped;
            std::function<void()> act;
            act = [&]
            {
                if (left-- > 0)
                    (*deeds).*event = act; // the next one
                else
                    anna.adapter.reset();
            };
            (*deeds).*event = act;
            CC_CallLeg& leg = *anna.getCall()->getCallLeg(1);
            std::ignore = leg.setProperty(acting(2));
            if (anna.adapter != nullptr)
                std::ignore = anna.getCall()->setProperty(acting(2));
            if (anna.adapter != nullptr)
            {
                leg.getPropertiesToWrite().remove(NAME);
                std::ignore = leg.setProperty(CC_PropertyString(DISPLAY, "x"));
            }
            *deeds = {};
            expectNothingLeft({&anna, &bert});
        }
}

TEST_F(HostileProperties, APropertyMayDestroyTheAdapterWhoseOwnViewFollows)
{
    for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onEnd})
        for (unsigned int skipped = 0; skipped < 6; ++skipped)
        {
            Party anna("anna"), bert("bert");
            connect(anna, bert);
            ASSERT_EQ(anna.adapter->setOwnProperty(acting(1)), XCode::OK);
            settle();
            unsigned int left = skipped;
            std::function<void()> act;
            act = [&]
            {
                if (left-- > 0)
                    (*deeds).*event = act;
                else
                    anna.adapter.reset();
            };
            (*deeds).*event = act;
            std::ignore = anna.getCall()->getCallLeg(0)->setProperty(CC_PropertyString(DISPLAY, "x"));
            *deeds = {};
            expectNothingLeft({&anna, &bert});
        }
}

TEST_F(HostileProperties, APropertyMayDestroyTheAdapterWhosePropertiesAreCopied)
{
    using Read = std::function<XCode(CC_CallAdapter const&, CC_PropertyContainer&)>;
    Read const reads[] = {
        [](CC_CallAdapter const& adapter, CC_PropertyContainer& to) { return adapter.getOwnProperties(to, 0xffff); },
        [](CC_CallAdapter const& adapter, CC_PropertyContainer& to) { return adapter.getPeerProperties(to, 0xffff); },
        [](CC_CallAdapter const& adapter, CC_PropertyContainer& to) { return adapter.getCallProperties(to, 0xffff); },
        [](CC_CallAdapter const& adapter, CC_PropertyContainer& to)
        { return adapter.getOwnPropertiesUnfiltered(to, 0xffff); },
        [](CC_CallAdapter const& adapter, CC_PropertyContainer& to)
        { return adapter.getCallPropertiesUnfiltered(to, 0xffff); },
    };
    Party anna("anna"), bert("bert");
    for (Read const& read : reads)
        for (bool const isThereBefore : {false, true})
        {
            reconnect(anna, bert);
            ASSERT_EQ(anna.adapter->setOwnProperty(acting(1)), XCode::OK);
            ASSERT_EQ(bert.adapter->setOwnProperty(acting(1)), XCode::OK);
            ASSERT_EQ(bert.adapter->setCallProperty(acting(1)), XCode::OK);
            settle();
            CC_PropertyContainer to;
            if (isThereBefore)
            {
                ASSERT_EQ(to.set(acting(0)), XCode::OK);
            }
            auto const event = isThereBefore ? &ActingProperty::Deeds::onAssign : &ActingProperty::Deeds::onClone;
            (*deeds).*event = [&] { anna.adapter.reset(); };
            std::ignore = read(*anna.adapter, to);
            EXPECT_EQ(anna.adapter, nullptr);
            EXPECT_EQ(NUMBER_IN(to), 1);
        }
    expectNothingLeft({&anna, &bert});
}

TEST_F(HostileProperties, AnEndingPropertyMayDestroyTheAdapterThatDropsIt)
{
    for (unsigned int skipped = 0; skipped < 8; ++skipped)
    {
        Party anna("anna"), bert("bert");
        connect(anna, bert);
        ASSERT_EQ(anna.adapter->setOwnProperty(acting(1)), XCode::OK);
        ASSERT_EQ(bert.adapter->setOwnProperty(acting(1)), XCode::OK);
        ASSERT_EQ(bert.adapter->setCallProperty(acting(1)), XCode::OK);
        settle();
        unsigned int left = skipped;
        std::function<void()> act;
        act = [&]
        {
            if (left-- > 0)
                deeds->onEnd = act;
            else
                anna.adapter.reset();
        };
        deeds->onEnd = act;
        anna.hangUp();
        *deeds = {};
        expectNothingLeft({&anna, &bert});
    }
}

TEST_F(HostileProperties, AnEndingPropertyMayWriteToThePeerThatTheAdapterIsLeaving)
{
    using Written = XCode (CC_CallAdapter::*)(CC_PropertyContainer const&);
    for (Written const write : {&CC_CallAdapter::setPeerProperties, &CC_CallAdapter::setPeerPropertiesUnfiltered})
        for (unsigned int skipped = 0; skipped < 8; ++skipped)
        {
            Party anna("anna"), bert("bert");
            connect(anna, bert);
            ASSERT_EQ(anna.adapter->setCallProperty(acting(1)), XCode::OK);
            settle();
            unsigned int left = skipped;
            std::function<void()> act;
            act = [&]
            {
                if (left-- > 0)
                    deeds->onEnd = act;
                else
                    std::ignore = ((*anna.adapter).*write)(several(2)); // in no call any more, or still with its peer
            };
            deeds->onEnd = act;
            anna.hangUp();
            *deeds = {};
            EXPECT_EQ(READ(*anna.adapter, &CC_CallAdapter::getPeerProperties).getNumberOfProperties(), 0u);
            bert.hangUp();
            expectNothingLeft({&anna, &bert});
        }
}

TEST_F(HostileProperties, AnEndingPropertyMayDialAnewWithoutLosingTheNewCallsProperties)
{
    for (unsigned int skipped = 0; skipped < 8; ++skipped)
    {
        Party anna("anna"), bert("bert"), carl("carl");
        connect(anna, bert);
        ASSERT_EQ(anna.adapter->setCallProperty(acting(1)), XCode::OK);
        settle();
        unsigned int left = skipped;
        std::function<void()> act;
        act = [&]
        {
            if (left-- > 0)
                deeds->onEnd = act;
            else
                std::ignore = anna.dial(carl); // refused as long as anything of the old call is left
        };
        deeds->onEnd = act;
        anna.hangUp();
        *deeds = {};
        if (anna.getCall() != nullptr)
        {
            EXPECT_NE(anna.adapter->getCallProperty(CONTEXT), nullptr);
        }
        bert.hangUp();
        expectNothingLeft({&anna, &bert, &carl});
    }
}

TEST_F(HostileProperties, APropertyMayDialWithTheAdapterThatCopiesItForADial)
{
    Party anna("anna"), bert("bert"), carl("carl");
    CC_PropertyContainer own;
    ASSERT_EQ(own.set(acting(1)), XCode::OK);
    XCode inside = XCode::FAILURE;
    deeds->onClone = [&] { inside = anna.dial(carl); };
    EXPECT_EQ(anna.dial(bert, own), XCode::REFUSED);
    EXPECT_EQ(inside, XCode::OK);
    EXPECT_NE(carl.getCall(), nullptr);
    EXPECT_EQ(anna.getCall(), carl.getCall()) << "the refused dial has dropped nothing";
    expectNothingLeft({&anna, &bert, &carl});
}

TEST_F(HostileProperties, WhatAPropertyWritesInsideADialIsNotThereTwice)
{
    Party anna("anna"), bert("bert");
    CC_PropertyContainer own;
    ASSERT_EQ(own.set(acting(1, ALERT_INFO)), XCode::OK);
    std::function<void()> act = [&]
    {
        deeds->onClone = act;
        if (anna.adapter->getOwnCallLeg() == nullptr)
            return;
        deeds->onClone = nullptr;
        EXPECT_EQ(anna.say(DISPLAY, "early"), XCode::OK);
    };
    deeds->onClone = act;
    ASSERT_EQ(own.set(CC_PropertyString(DISPLAY, "given")), XCode::OK);
    ASSERT_EQ(anna.dial(bert, own), XCode::OK);
    String text;
    EXPECT_EQ(anna.adapter->getOwnCallLeg()->getProperties().get(DISPLAY)->getValueString(text), "given");
    EXPECT_EQ(anna.adapter->getOwnProperty(DISPLAY)->getValueString(text), "given") << "the only one";
    *deeds = {};
    act = nullptr;
    expectNothingLeft({&anna, &bert});
}

// --- containers ------------------------------------------------------------------------------------------------------

TEST_F(HostileProperties, APropertyMayDestroyTheContainerThatStoresAssignsOrClearsIt)
{
    for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onEnd})
        for (unsigned int way = 0; way < 4; ++way)
        {
            *deeds = {};
            CC_PropertyContainer const source = several(2);
            auto container = std::make_unique<CC_PropertyContainer>();
            ASSERT_EQ(container->set(acting(1, DISPLAY)), XCode::OK);
            (*deeds).*event = [&] { delete container.release(); };
            CC_PropertyContainer& used = *container;
            if (way == 0)
                std::ignore = used.set(source);
            else if (way == 1)
                used = source;
            else if (way == 2)
                used.clear();
            else
                std::ignore = used.set(*source.get(NAME));
            EXPECT_EQ(container == nullptr, !((*deeds).*event));
            *deeds = {};
        }
}

TEST_F(HostileProperties, ClearingEndsThoughAnEndingPropertyComesBackForEver)
{
    CC_PropertyContainer properties;
    std::function<void()> act = [&]
    {
        EXPECT_EQ(properties.set(acting(1)), XCode::OK);
        deeds->onEnd = act;
    };
    ASSERT_EQ(properties.set(acting(1)), XCode::OK);
    properties.clear();
    EXPECT_TRUE(properties.isEmpty());
    ASSERT_EQ(properties.set(acting(1)), XCode::OK);
    deeds->onEnd = act;
    properties.clear();
    EXPECT_LE(properties.getNumberOfProperties(), 1u) << "one stays";
    *deeds = {};
    act = nullptr;
}

TEST_F(HostileProperties, AnAdapterDroppedByAnyOfTheClonesOfAPropertySeesNothing)
{
    for (bool const isCalleeDropped : {false, true})
        for (bool const areSeveral : {false, true})
            for (unsigned int last = 1; last < 12; ++last)
            {
                Party anna("anna"), bert("bert");
                connect(anna, bert);
                Party& dropped = isCalleeDropped ? bert : anna;
                unsigned int left = last;
                deeds->onClone = [&]
                {
                    if (--left == 0)
                        dropped.hangUp();
                };
                std::ignore = areSeveral ? anna.adapter->setOwnProperties(several(1))
                                         : anna.adapter->setOwnProperty(acting(1)); // refused if its leg went
                settle();
                *deeds = {};
                for (Party const* const party : {&anna, &bert})
                {
                    CC_PropertyContainer seen;
                    EXPECT_EQ(party->adapter->getOwnProperties(seen, CC_PropertyContainer::ALL_GROUPS), XCode::OK);
                    EXPECT_EQ(party->adapter->getPeerProperties(seen, CC_PropertyContainer::ALL_GROUPS), XCode::OK);
                    EXPECT_EQ(party->adapter->getCallProperties(seen, CC_PropertyContainer::ALL_GROUPS), XCode::OK);
                    bool const isIdle = party->adapter->getOwnCallLeg() == nullptr;
                    EXPECT_TRUE(!isIdle || seen.isEmpty())
                        << party->name.c_str() << ", clone " << last << ", of several: " << areSeveral;
                }
                expectNothingLeft({&anna, &bert});
            }
}

TEST_F(HostileProperties, AnAdapterThatDialsAnewInsideAnyDeedOfAPropertySeesTheNewCallAlone)
{
    constexpr unsigned int MOST = 30;
    for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onAssign,
                             &ActingProperty::Deeds::onIsEqual, &ActingProperty::Deeds::onEnd})
        for (Write const& write : EACH_WAY_TO_WRITE)
            for (bool const isThereBefore : {false, true})
                for (bool const isSeenByTheOther : {false, true})
                    for (unsigned int skipped = 0; skipped < MOST; ++skipped)
                    {
                        Party anna("anna"), bert("bert"), carl("carl");
                        connect(anna, bert);
                        CC_PropertyContainer const first = several(1);
                        CC_PropertyContainer const second = several(2);
                        if (isThereBefore)
                        {
                            ASSERT_EQ(write(*anna.adapter, first), XCode::OK);
                            settle();
                        }
                        bool hasDialled = false;
                        unsigned int left = skipped;
                        Party& leaving = isSeenByTheOther ? bert : anna;
                        std::function<void()> act = [&]
                        {
                            if (left-- > 0)
                            {
                                (*deeds).*event = act; // the next one
                                return;
                            }
                            leaving.hangUp();
                            hasDialled = leaving.dial(carl).isOk();
                        };
                        (*deeds).*event = act;
                        std::ignore = write(*anna.adapter, second);
                        bool const isOver = (*deeds).*event != nullptr; // so many there are not
                        *deeds = {};
                        settle();
                        if (hasDialled)
                        {
                            expectTrueViews(leaving, "deed " + std::to_string(skipped));
                            expectTrueViews(carl, "deed " + std::to_string(skipped) + ", the called one");
                        }
                        expectNothingLeft({&anna, &bert, &carl});
                        if (isOver)
                            break;
                        ASSERT_LT(skipped + 1, MOST);
                    }
}

TEST_F(HostileProperties, WhatIsWrittenInsideAnyDeedOfAPropertyIsSeenInTheEnd)
{
    constexpr unsigned int MOST = 40;
    for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onAssign,
                             &ActingProperty::Deeds::onIsEqual, &ActingProperty::Deeds::onEnd})
        for (bool const isOfCall : {false, true})
            for (unsigned int skipped = 0; skipped < MOST; ++skipped)
            {
                Party anna("anna"), bert("bert");
                connect(anna, bert);
                auto const write = isOfCall ? &CC_CallAdapter::setCallProperties : &CC_CallAdapter::setOwnProperties;
                ASSERT_EQ((*bert.adapter.*write)(several(1)), XCode::OK);
                settle();
                CC_PropertyContainer const second = several(2);
                CC_PropertyContainer late;
                ASSERT_EQ(late.set(CC_PropertyString(DISPLAY, "late")), XCode::OK);
                unsigned int left = skipped;
                std::function<void()> act = [&]
                {
                    if (left-- > 0)
                        (*deeds).*event = act; // the next one
                    else
                        EXPECT_EQ((*bert.adapter.*write)(late), XCode::OK);
                };
                (*deeds).*event = act;
                EXPECT_EQ((*bert.adapter.*write)(second), XCode::OK);
                bool const isOver = (*deeds).*event != nullptr; // so many there are not
                *deeds = {};
                settle();
                expectTrueViews(anna, "deed " + std::to_string(skipped));
                expectTrueViews(bert, "deed " + std::to_string(skipped) + ", who writes");
                using testing::Contains;
                EXPECT_THAT(anna.observer.getFlagSets().back(), Contains(unsigned{NAME})) << "deed " << skipped;
                if (!isOver)
                {
                    EXPECT_THAT(anna.observer.getFlagSets().back(), Contains(unsigned{DISPLAY})) << "deed " << skipped;
                }
                expectNothingLeft({&anna, &bert});
                if (isOver)
                    break;
                ASSERT_LT(skipped + 1, MOST);
            }
}

TEST_F(HostileProperties, WhatIsWrittenAnewInsideAnyDeedOfTheSamePropertyIsSeenAsItIsHeld)
{
    constexpr unsigned int MOST = 40;
    for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onAssign,
                             &ActingProperty::Deeds::onIsEqual, &ActingProperty::Deeds::onEnd})
        for (Write const& write : EACH_WAY_TO_WRITE)
            for (bool const isThereBefore : {false, true})
                for (unsigned int skipped = 0; skipped < MOST; ++skipped)
                {
                    Party anna("anna"), bert("bert");
                    connect(anna, bert);
                    CC_PropertyContainer const values[] = {several(1), several(2), several(3)};
                    if (isThereBefore)
                    {
                        ASSERT_EQ(write(*bert.adapter, values[0]), XCode::OK);
                        settle();
                    }
                    unsigned int left = skipped;
                    std::function<void()> act = [&]
                    {
                        if (left-- > 0)
                            (*deeds).*event = act; // the next one
                        else
                            EXPECT_EQ(write(*bert.adapter, values[2]), XCode::OK);
                    };
                    (*deeds).*event = act;
                    EXPECT_EQ(write(*bert.adapter, values[1]), XCode::OK);
                    bool const isOver = (*deeds).*event != nullptr; // so many there are not
                    *deeds = {};
                    settle();
                    std::string const when = "deed " + std::to_string(skipped);
                    expectTrueViews(anna, when);
                    expectTrueViews(bert, when + ", who writes");
                    expectNothingLeft({&anna, &bert});
                    if (isOver)
                        break;
                    ASSERT_LT(skipped + 1, MOST);
                }
}

TEST_F(HostileProperties, WhatIsWrittenToACallInsideAnyDeedWhileALegJoinsItIsSeen)
{
    constexpr unsigned int MOST = 40;
    for (auto const event : {&ActingProperty::Deeds::onClone, &ActingProperty::Deeds::onAssign,
                             &ActingProperty::Deeds::onIsEqual, &ActingProperty::Deeds::onEnd})
        for (bool const isByWhoIsMoved : {false, true})
            for (unsigned int skipped = 0; skipped < MOST; ++skipped)
            {
                Party anna("anna"), bert("bert"), carl("carl"), dora("dora");
                connect(anna, bert);
                connect(carl, dora);
                ASSERT_EQ(bert.adapter->setCallProperty(acting(1)), XCode::OK);
                ASSERT_EQ(dora.adapter->setCallProperties(several(1)), XCode::OK);
                settle();
                unsigned int left = skipped;
                std::function<void()> act = [&]
                {
                    if (left-- > 0)
                        (*deeds).*event = act; // the next one
                    else
                        std::ignore =
                            (isByWhoIsMoved ? dora : bert).adapter->setCallProperty(CC_PropertyString(DISPLAY, "late"));
                };
                (*deeds).*event = act;
                EXPECT_EQ(anna.adapter->transfer(*carl.adapter, true), XCode::OK);
                bool const isOver = (*deeds).*event != nullptr; // so many there are not
                *deeds = {};
                settle();
                expectTrueViews(bert, "deed " + std::to_string(skipped));
                expectTrueViews(dora, "deed " + std::to_string(skipped) + ", who is moved");
                expectNothingLeft({&anna, &bert, &carl, &dora});
                if (isOver)
                    break;
                ASSERT_LT(skipped + 1, MOST);
            }
}
