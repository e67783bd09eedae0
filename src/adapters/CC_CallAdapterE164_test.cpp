#include "adapters/CC_CallAdapterE164.h"

#include "testing/FailingAllocator.h"
#include "testing/FakeMediaContext.h"
#include "testing/LeakCheck.h"
#include "testing/PropertyNames.h"
#include "tests/support/TestLineE164.h"

#include <functional>
#include <vector>

namespace
{
using namespace CC_PropertyId;

/// Notes which of the base's operations the new ones end in.
class NotingAdapter : public CC_CallAdapterE164
{
public:
    using CC_CallAdapterE164::accept;
    using CC_CallAdapterE164::dial;

    XCode dial(String const& contextName, String const& providerName, String const& destination,
               CC_PropertyContainer const& own, CC_PropertyContainer const& offer, CC_PropertyContainer const& call,
               MG_IContext* media) override
    {
        note(contextName, providerName, destination, own);
        return result.isOk() ? CC_CallAdapterE164::dial(contextName, providerName, destination, own, offer, call, media)
                             : result;
    }
    XCode accept(CC_Call& call, CC_PropertyContainer const& own) override
    {
        ++accepted;
        return result.isOk() ? CC_CallAdapterE164::accept(call, own) : result;
    }

    void note(String const& contextName, String const& providerName, String const& destination,
              CC_PropertyContainer const& own)
    {
        FailingAllocator::Pause const unseen;
        ownNames.clear();
        for (CC_Property const& property : own)
            ownNames.emplace_back(property.getPropertyName());
        dialled.emplace_back((contextName + "/" + providerName + "/" + destination).c_str());
    }

    Lines dialled;
    Lines ownNames; ///< of the last dial's own properties, in their order
    unsigned int accepted = 0;
    XCode result = XCode::OK;
};

struct Extras
{
    CC_PropertyContainer const* own = nullptr;
    CC_PropertyContainer const* offer = nullptr;
    CC_PropertyContainer const* call = nullptr;
};

class CC_CallAdapterE164_Test : public TestLinesE164<NotingAdapter>
{
protected:
    XCode dial(bool sendingComplete = false, Extras const& extras = {}, MG_IContext* media = nullptr,
               String const& providerName = "isdn")
    {
        return a.adapter->dial(
            "SWITCH", providerName, "trunk", "4420791234", QTypeOfNumber::INTERNATIONAL, QNumberingPlan::ISDN,
            QPresentationIndicator::RESTRICTED, QScreeningIndicator::NETWORK_PROVIDED, "Ada", "89123",
            QTypeOfNumber::NATIONAL, QNumberingPlan::PRIVATE, "Bob", sendingComplete,
            QInformationTransferCapability::AUDIO_3_1_KHZ, media, extras.own, extras.offer, extras.call);
    }
    XCode acceptByNumber(CC_Call& call)
    {
        return b.adapter->accept(call, "89123", QTypeOfNumber::NATIONAL, QNumberingPlan::PRIVATE,
                                 QPresentationIndicator::RESTRICTED, QScreeningIndicator::USER_PROVIDED_PASSED, "Bob");
    }
    static CC_PropertyContainer WITH(CC_Property const& property)
    {
        CC_PropertyContainer container;
        EXPECT_EQ(container.set(property), XCode::OK);
        return container;
    }
    /// The names of the properties of a container, in their order.
    static Lines NAMES(CC_PropertyContainer const& container)
    {
        Lines names;
        for (CC_Property const& property : container)
            names.emplace_back(property.getPropertyName());
        return names;
    }
};
} // namespace

// --- dial ------------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapterE164_Test, ADialByNumberDescribesTheCallingPartyOnTheOwnLeg)
{
    ASSERT_EQ(dial(), XCode::OK);
    EXPECT_EQ(a.leg(E164_NUMBER), "4420791234");
    EXPECT_EQ(a.adapter->getOwnTypeOfNumber(), QTypeOfNumber::INTERNATIONAL);
    EXPECT_EQ(a.adapter->getOwnNumberingPlan(), QNumberingPlan::ISDN);
    EXPECT_EQ(a.adapter->getOwnPresentationIndicator(), QPresentationIndicator::RESTRICTED);
    EXPECT_EQ(a.adapter->getOwnScreeningIndicator(), QScreeningIndicator::NETWORK_PROVIDED);
    EXPECT_EQ(a.leg(NAME), "Ada");
    EXPECT_TRUE(a.adapter->getOwnSupportsOverlapSending());
    EXPECT_EQ(a.leg(STATE), "CONNECTED");
}

TEST_F(CC_CallAdapterE164_Test, ADialByNumberSetsItsPropertiesInTheStatedOrder)
{
    ASSERT_EQ(dial(), XCode::OK);
    EXPECT_EQ(a.adapter->ownNames, (Lines{"E164-Number", "Type-Of-Number", "Numbering-Plan", "Presentation-Indicator",
                                          "Screening-Indicator", "Name", "Supports Overlap-Sending"}));
    EXPECT_EQ(NAMES(offered), (Lines{"E164-Number", "Type-Of-Number", "Numbering-Plan", "Name"}));
}

TEST_F(CC_CallAdapterE164_Test, ADialByNumberOffersTheCalledParty)
{
    ASSERT_EQ(dial(), XCode::OK);
    EXPECT_EQ(provider.take(), (Lines{"isdn: dial isdn trunk (E164-Number, Type-Of-Number, Numbering-Plan, Name)"}));
    EXPECT_EQ(a.TEXT(offered.get(E164_NUMBER)), "89123");
    EXPECT_EQ(a.TEXT(offered.get(TYPE_OF_NUMBER)), QTYPE_OF_NUMBER_NAME(QTypeOfNumber::NATIONAL));
    EXPECT_EQ(a.TEXT(offered.get(NUMBERING_PLAN)), QNUMBERING_PLAN_NAME(QNumberingPlan::PRIVATE));
    EXPECT_EQ(a.TEXT(offered.get(NAME)), "Bob");
}

TEST_F(CC_CallAdapterE164_Test, ADialByNumberGivesTheCallItsCapabilityAndTheHopLimitOfTheContext)
{
    ASSERT_EQ(CallControl::SET_MAX_HOPS("SWITCH", 7), XCode::OK);
    ASSERT_EQ(dial(), XCode::OK);
    EXPECT_EQ(a.adapter->getInformationTransferCapability(), QInformationTransferCapability::AUDIO_3_1_KHZ);
    EXPECT_EQ(b.adapter->getInformationTransferCapability(), QInformationTransferCapability::AUDIO_3_1_KHZ);
    auto const* const hops = dynamic_cast<CC_PropertyUnsigned const*>(a.adapter->getCallProperty(HOPS));
    ASSERT_NE(hops, nullptr);
    EXPECT_EQ(hops->getValue(), 7U);
}

TEST_F(CC_CallAdapterE164_Test, SendingCompleteMeansNoOverlapSending)
{
    ASSERT_EQ(dial(true), XCode::OK);
    EXPECT_EQ(a.leg(SUPPORTS_OVERLAP_SENDING), "false");
    EXPECT_FALSE(b.adapter->getPeerSupportsOverlapSending());
}

TEST_F(CC_CallAdapterE164_Test, ExtraPropertiesOverrideTheArguments)
{
    CC_PropertyContainer own = WITH(CC_PropertyString(E164_NUMBER, "000"));
    ASSERT_EQ(own.set(CC_PropertyString(DISPLAY, "more")), XCode::OK);
    CC_PropertyContainer const offer = WITH(CC_PropertyString(E164_NUMBER, "111"));
    CC_PropertyContainer const call = WITH(CC_PropertyUnsigned(HOPS, 3));
    ASSERT_EQ(dial(false, {&own, &offer, &call}), XCode::OK);
    EXPECT_EQ(a.leg(E164_NUMBER), "000");
    EXPECT_EQ(a.leg(DISPLAY), "more");
    EXPECT_EQ(a.leg(NAME), "Ada") << "the others stay";
    EXPECT_EQ(a.TEXT(offered.get(E164_NUMBER)), "111");
    EXPECT_EQ(a.call(HOPS), "0x00000003");
}

TEST_F(CC_CallAdapterE164_Test, ADialByNumberHandsOverTheMediaContext)
{
    TYPtr<MG_IContext> const media(new FakeMediaContext(77));
    ASSERT_EQ(dial(false, {}, media.get()), XCode::OK);
    EXPECT_EQ(a.adapter->getDatapathContext(), media.get());
}

TEST_F(CC_CallAdapterE164_Test, ADialByNumberEndsInTheVirtualDial)
{
    ASSERT_EQ(dial(), XCode::OK);
    EXPECT_EQ(a.adapter->dialled, (Lines{"SWITCH/isdn/trunk"}));
}

TEST_F(CC_CallAdapterE164_Test, EveryFailureOfADialByNumberIsTheSame)
{
    EXPECT_EQ(dial(false, {}, nullptr, "nobody"), XCode::FAILURE);
    a.adapter->result = XCode::NO_ELEMENT;
    EXPECT_EQ(dial(), XCode::FAILURE) << "not the inner code";
    a.adapter->result = XCode::OK;
    ASSERT_EQ(dial(), XCode::OK);
    CC_Call const* const call = a.adapter->getCall();
    EXPECT_EQ(dial(), XCode::FAILURE) << "not REFUSED, which the other dial gives";
    EXPECT_EQ(a.dial(), XCode::REFUSED);
    EXPECT_EQ(a.adapter->getCall(), call);
}

TEST_F(CC_CallAdapterE164_Test, ArgumentsMayComeFromTheAdaptersOwnViews)
{
    ASSERT_EQ(dial(), XCode::OK);
    String const& number = b.adapter->getPeerE164();
    ASSERT_EQ(b.adapter->setOwnE164(number), XCode::OK);
    EXPECT_EQ(b.own(E164_NUMBER), "4420791234");
    EXPECT_EQ(b.adapter->setOwnE164(b.adapter->getOwnE164()), XCode::OK);
    EXPECT_EQ(a.peer(E164_NUMBER), "4420791234");
}

TEST_F(CC_CallAdapterE164_Test, ADialReadsLikeAForm)
{
    CC_PropertyContainer extra;
    ASSERT_EQ(extra.set(CC_PropertyString(DISPLAY, "extra")), XCode::OK);
    ASSERT_EQ(CallControl::SET_MAX_HOPS("SWITCH", 7), XCode::OK);
    XCode const result = a.adapter->dial({.providerName = "isdn",
                                          .destination = "trunk 2",
                                          .calling = {.number = "4420791234",
                                                      .typeOfNumber = QTypeOfNumber::INTERNATIONAL,
                                                      .presentation = QPresentationIndicator::RESTRICTED,
                                                      .screening = QScreeningIndicator::NETWORK_PROVIDED,
                                                      .name = "Ada"},
                                          .called = {.number = "4989", .name = "Bob"},
                                          .sendingComplete = true,
                                          .extraOwnProperties = &extra});
    ASSERT_EQ(result, XCode::OK);
    EXPECT_EQ(destinations, Lines{"trunk 2"});
    EXPECT_EQ(a.leg(E164_NUMBER) + a.leg(NAME) + a.leg(DISPLAY), "4420791234Adaextra");
    EXPECT_EQ(a.adapter->getOwnTypeOfNumber(), QTypeOfNumber::INTERNATIONAL);
    EXPECT_EQ(a.adapter->getOwnNumberingPlan(), QNumberingPlan::ISDN);
    EXPECT_EQ(a.adapter->getOwnPresentationIndicator(), QPresentationIndicator::RESTRICTED);
    EXPECT_EQ(a.adapter->getOwnScreeningIndicator(), QScreeningIndicator::NETWORK_PROVIDED);
    EXPECT_FALSE(a.adapter->getOwnSupportsOverlapSending());
    EXPECT_EQ(TestLineE164<>::TEXT(offered.get(E164_NUMBER)) + TestLineE164<>::TEXT(offered.get(NAME)), "4989Bob");
    EXPECT_EQ(a.call(HOPS), "0x00000007");
}

// --- accept ----------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapterE164_Test, AnAcceptReadsLikeAForm)
{
    onOffer = [this](CC_Call& call)
    {
        return b.adapter->acceptAs(call, {.number = "89123",
                                          .typeOfNumber = QTypeOfNumber::NATIONAL,
                                          .numberingPlan = QNumberingPlan::PRIVATE,
                                          .name = "Bob"});
    };
    ASSERT_EQ(dial(), XCode::OK);
    EXPECT_EQ(a.peer(E164_NUMBER) + a.peer(NAME), "89123Bob");
    EXPECT_EQ(a.adapter->getPeerTypeOfNumber(), QTypeOfNumber::NATIONAL);
    EXPECT_EQ(a.adapter->getPeerNumberingPlan(), QNumberingPlan::PRIVATE);
    EXPECT_EQ(a.adapter->getPeerPresentationIndicator(QPresentationIndicator::RESERVED),
              QPresentationIndicator::ALLOWED);
}

TEST_F(CC_CallAdapterE164_Test, AnAcceptByNumberDescribesTheAnsweringParty)
{
    onOffer = [this](CC_Call& call) { return acceptByNumber(call); };
    ASSERT_EQ(dial(), XCode::OK);
    EXPECT_EQ(a.adapter->getPeerE164(), "89123");
    EXPECT_EQ(a.adapter->getPeerTypeOfNumber(), QTypeOfNumber::NATIONAL);
    EXPECT_EQ(a.adapter->getPeerNumberingPlan(), QNumberingPlan::PRIVATE);
    EXPECT_EQ(a.adapter->getPeerPresentationIndicator(QPresentationIndicator::ALLOWED),
              QPresentationIndicator::RESTRICTED);
    EXPECT_EQ(a.adapter->getPeerScreeningIndicator(QScreeningIndicator::NETWORK_PROVIDED),
              QScreeningIndicator::USER_PROVIDED_PASSED);
    EXPECT_EQ(a.adapter->getPeerName(), "Bob");
    EXPECT_EQ(b.leg(STATE), "TRYING");
}

TEST_F(CC_CallAdapterE164_Test, AnAcceptByNumberEndsInTheVirtualAcceptWhoseFailuresBecomeOne)
{
    onOffer = [](CC_Call&) { return XCode::OK; };
    ASSERT_EQ(b.dial(), XCode::OK);
    CC_Call& call = *b.adapter->getCall();
    auto const accept = [this, &call]
    {
        return a.adapter->accept(call, "1", QTypeOfNumber::UNKNOWN, QNumberingPlan::ISDN,
                                 QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED, "Ada");
    };
    a.adapter->result = XCode::ABSENT;
    EXPECT_EQ(accept(), XCode::FAILURE);
    a.adapter->result = XCode::OK;
    EXPECT_EQ(accept(), XCode::OK);
    EXPECT_EQ(accept(), XCode::FAILURE) << "not REFUSED: it has a leg";
    EXPECT_EQ(a.adapter->accepted, 3U);
}

// --- memory ----------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapterE164_Test, ADialByNumberThatLacksMemoryFailsAndLeavesNothing)
{
    onOffer = [](CC_Call&) { return XCode::OK; };
    CC_PropertyContainer const extra = WITH(CC_PropertyString(DISPLAY, "a text that does not fit without memory"));
    ASSERT_EQ(dial(false, {&extra, &extra, &extra}), XCode::OK); // statics that live for ever are made once
    a.adapter->drop(QCause::NORMAL_CALL_CLEARING, 0);
    settle();
    unsigned int refused = 0;
    for (unsigned long n = 1;; ++n)
    {
        a.renew();
        offered.clear();
        LeakCheck const check;
        FailingAllocator::failNth(n);
        XCode const result = dial(false, {&extra, &extra, &extra});
        FailingAllocator::stop();
        bool const hasFailed = FailingAllocator::hasFailed();
        ASSERT_TRUE(result.isOk() || result == XCode::FAILURE) << "allocation " << n;
        refused += result.isOk() ? 0 : 1;
        a.renew();
        offered.clear();
        settle();
        ASSERT_EQ(check.compare(), "") << "allocation " << n;
        ASSERT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0U) << "allocation " << n;
        if (!hasFailed)
            break;
    }
    EXPECT_GT(refused, 20U);
}

TEST_F(CC_CallAdapterE164_Test, AnAcceptByNumberThatLacksMemoryFailsAndLeavesNothing)
{
    onOffer = [](CC_Call&) { return XCode::OK; };
    unsigned int refused = 0;
    for (unsigned long n = 1;; ++n)
    {
        a.renew();
        b.renew();
        ASSERT_EQ(dial(), XCode::OK);
        CC_Call& call = *a.adapter->getCall();
        LeakCheck const check;
        FailingAllocator::failNth(n);
        XCode const result = acceptByNumber(call);
        FailingAllocator::stop();
        bool const hasFailed = FailingAllocator::hasFailed();
        ASSERT_TRUE(result.isOk() || result == XCode::FAILURE) << "allocation " << n;
        refused += result.isOk() ? 0 : 1;
        a.adapter->drop(QCause::NORMAL_CALL_CLEARING, 0);
        b.renew();
        settle();
        ASSERT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0U) << "allocation " << n;
        if (!hasFailed)
            break;
    }
    EXPECT_GT(refused, 8U);
}

// --- the adapter as a base class sees it -----------------------------------------------------------------------------

TEST_F(CC_CallAdapterE164_Test, ThroughItsBaseItIsAnAdapterLikeAnyOther)
{
    CC_CallAdapter& base = *b.adapter;
    onOffer = [&base](CC_Call& call) { return base.accept(call, CC_PropertyContainer::EMPTY()); };
    ASSERT_EQ(dial(), XCode::OK);
    EXPECT_EQ(base.getCall(), a.adapter->getCall());
    base.cleanup();
    EXPECT_EQ(base.getCall(), nullptr);
    EXPECT_EQ(base.setup("again", b.endpoint, nullptr), XCode::OK);
    EXPECT_EQ(base.getName(), "again");
    EXPECT_EQ(base.getObserver(), nullptr);
}

TEST_F(CC_CallAdapterE164_Test, TheMediaContextOfTheLastDialIsHeldUntilTheAdapterEnds)
{
    unsigned int const before = FakeMediaContext::s_numberOfInstances;
    ASSERT_EQ(dial(false, {}, TYPtr<MG_IContext>(new FakeMediaContext(77)).get()), XCode::OK);
    a.adapter->cleanup();
    b.adapter->cleanup();
    settle();
    EXPECT_EQ(FakeMediaContext::s_numberOfInstances, before + 1);
    a.adapter.reset();
    EXPECT_EQ(FakeMediaContext::s_numberOfInstances, before);
}

TEST_F(CC_CallAdapterE164_Test, WhoHearsOfItsEndMayStillCallItsOperations)
{
    ASSERT_EQ(dial(), XCode::OK);
    std::string seen;
    class Witness : public CC_CallLegObserver
    {
    public:
        explicit Witness(std::function<void()> what) : m_what(std::move(what)) {}
        void onCallLegObservationEnded(CC_Event<CC_CallLeg> const&) override {}
        void onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) override {}
        void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const&) override { m_what(); }
        void onCallLegSynchronousService(CC_Event<CC_CallLeg> const&) override {}

    private:
        std::function<void()> m_what;
    };
    CC_CallAdapterE164& ending = *a.adapter;
    CC_Call& call = *ending.getCall();
    XCode dialled;
    Witness witness(
        [&]
        {
            seen = ending.getOwnE164().c_str();
            dialled = ending.dial("SWITCH", "isdn", "trunk", "1", QTypeOfNumber::UNKNOWN, QNumberingPlan::ISDN,
                                  QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED, "", "2",
                                  QTypeOfNumber::UNKNOWN, QNumberingPlan::ISDN, "", true,
                                  QInformationTransferCapability::SPEECH, nullptr, nullptr, nullptr, nullptr);
        });
    ASSERT_EQ(call.addCallLegObserver(&witness), XCode::OK);
    a.adapter.reset();
    EXPECT_EQ(seen, "4420791234");
    EXPECT_EQ(dialled, XCode::FAILURE) << "it still has its leg";
    call.removeCallLegObserver(&witness);
}
