// The re-dial of collected digits while modules drop, dial and destroy meanwhile, and while memory runs out.
#include "testing/FailingAllocator.h"
#include "testing/LeakCheck.h"
#include "tests/support/TestOverlapE164.h"

namespace
{
using namespace CC_PropertyId;

using CC_CallAdapterE164_OverlapDisruption_Test = TestOverlapE164;
} // namespace

// --- what happens meanwhile ------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, WhoIsToldOfTheChangedContextMayDestroyTheAdapter)
{
    a.adapter->onNotify = [this](CC_Flags const&) { a.adapter.reset(); };
    m_mediaContexts.setFailing(true);
    dialEnBloc();
    a.key("8");
    EXPECT_EQ(a.adapter, nullptr);
    EXPECT_EQ(numbers, (Lines{"49"}));
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, WhoIsToldOfTheChangedContextMayDialElsewhere)
{
    a.adapter->onNotify = [this](CC_Flags const&) { EXPECT_EQ(a.dial("7"), XCode::OK); };
    m_mediaContexts.setFailing(true);
    dialEnBloc();
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "7"}));
    a.adapter->onNotify = nullptr;
    a.key("6");
    EXPECT_EQ(numbers.back(), "76") << "that dial is the one remembered";
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, WhoHearsOfTheDropMayDestroyTheAdapter)
{
    dialEnBloc();
    atTheDrop([this] { a.adapter.reset(); });
    a.key("8");
    EXPECT_EQ(a.adapter, nullptr);
    EXPECT_EQ(numbers, (Lines{"49"}));
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, WhoHearsOfTheDropMayDialElsewhere)
{
    dialEnBloc();
    atTheDrop(
        [this]
        {
            a.adapter->drop(QCause::USER_BUSY, 0);
            EXPECT_EQ(a.dial("7"), XCode::OK);
        });
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "7"}));
    a.key("6");
    EXPECT_EQ(numbers.back(), "76");
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, WhoHearsOfTheDropMayDialElsewhereInVain)
{
    dialEnBloc();
    atTheDrop(
        [this]
        {
            a.adapter->drop(QCause::USER_BUSY, 0);
            EXPECT_EQ(a.dial("7", nullptr, "nobody"), XCode::FAILURE);
        });
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49"})) << "what is remembered by now is another dial";
    EXPECT_EQ(a.adapter->getCall(), nullptr);
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, WhoHearsOfTheDropMayAcceptAnotherCall)
{
    unsigned int notified = 0;
    a.adapter->onNotify = [&notified](CC_Flags const&) { ++notified; };
    m_mediaContexts.setFailing(true);
    dialEnBloc();
    TestLineE164<> other("c");
    onOffer = [](CC_Call&) { return XCode::OK; };
    ASSERT_EQ(other.dial("1"), XCode::OK);
    atTheDrop(
        [this, &other]
        {
            a.adapter->drop(QCause::USER_BUSY, 0);
            EXPECT_EQ(a.accept(*other.adapter->getCall()), XCode::OK);
        });
    a.key("8");
    EXPECT_EQ(a.adapter->getCall(), other.adapter->getCall());
    EXPECT_EQ(notified, 1U) << "the attempt that ended had none";
    EXPECT_EQ(numbers, (Lines{"49", "1"}));
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, WhoHearsOfTheDropMayCleanTheAdapterUp)
{
    dialEnBloc();
    atTheDrop([this] { a.adapter->cleanup(); });
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49"}));
    EXPECT_EQ(a.adapter->getEndpoint(), nullptr);
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, AnAdapterThatIsCleanedUpMeanwhileIsToldOfNoContext)
{
    unsigned int notified = 0;
    a.adapter->onNotify = [&notified](CC_Flags const&) { ++notified; };
    m_mediaContexts.setFailing(true);
    dialEnBloc();
    atTheDrop([this] { a.adapter->cleanup(); });
    a.key("8");
    EXPECT_EQ(notified, 0U);
    EXPECT_EQ(numbers, (Lines{"49"}));
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, ADigitThatComesWhileTheAttemptEndsIsDialledToo)
{
    dialEnBloc();
    atTheDrop([this] { a.key("9"); });
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "4989"}));
    EXPECT_NE(a.adapter->getCall(), nullptr);
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, ADigitThatComesInsideTheDialChangesNotWhatIsBeingOffered)
{
    accepting(State::ADDRESS_INCOMPLETE, true);
    std::function<XCode(CC_Call&)> const accept = onOffer;
    provider.m_dial = [&](CC_Call& call, String const&, String const&, CC_PropertyContainer const& offer)
    {
        XCode const result = accept(call);
        a.key("8");
        numbers.push_back(TestLineE164<>::TEXT(offer.get(E164_NUMBER)));
        return result;
    };
    ASSERT_EQ(a.dial("49"), XCode::OK);
    EXPECT_EQ(numbers, (Lines{"49"}));
    accepting(State::ADDRESS_INCOMPLETE, false);
    provider.m_dial = [&](CC_Call& call, String const&, String const&, CC_PropertyContainer const& offer)
    {
        numbers.push_back(TestLineE164<>::TEXT(offer.get(E164_NUMBER)));
        return onOffer(call);
    };
    EXPECT_EQ(b.adapter->setOwnSupportsOverlapReceiving(false), XCode::OK);
    settle();
    a.key("7");
    EXPECT_EQ(numbers, (Lines{"49", "4987"})) << "but it is remembered";
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, TheDestinationDialledAgainMayDestroyTheAdapter)
{
    dialEnBloc();
    onOffer = [this](CC_Call&)
    {
        a.adapter.reset();
        return XCode::OK;
    };
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "498"}));
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test,
       TheDestinationDialledAgainMayMakeTheAdapterDialWhichIsRefusedButRemembered)
{
    dialEnBloc();
    onOffer = [this](CC_Call& call)
    {
        EXPECT_EQ(a.dial("7"), XCode::REFUSED);
        b.renew();
        EXPECT_EQ(b.accept(call), XCode::OK);
        EXPECT_EQ(b.adapter->setOwnSupportsOverlapReceiving(false), XCode::OK);
        b.become(State::ADDRESS_INCOMPLETE);
        return XCode::OK;
    };
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "498"}));
    onOffer = [](CC_Call&) { return XCode::OK; };
    a.key("6");
    EXPECT_EQ(numbers.back(), "76");
}

// --- memory ----------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, ADigitThatCannotBeCollectedIsNotPassedOn)
{
    accepting(State::PROCEEDING, true);
    ASSERT_EQ(a.dial("49"), XCode::OK);
    CC_ServiceUserInput input("8912345678901234567890");
    FailingAllocator::failNth(1);
    a.adapter->invokeSynchronousService(input);
    FailingAllocator::stop();
    ASSERT_TRUE(FailingAllocator::hasFailed());
    EXPECT_EQ(b.module.getServices(), Lines());
    ASSERT_EQ(b.adapter->setOwnSupportsOverlapReceiving(false), XCode::OK);
    b.become(State::ADDRESS_INCOMPLETE);
    a.key("2");
    EXPECT_EQ(numbers, (Lines{"49", "492"})) << "nor is half of it remembered";
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, ADigitThatCannotBeCollectedEndsNoAttempt)
{
    dialEnBloc();
    CC_Call const* const call = a.adapter->getCall();
    CC_ServiceUserInput input("8912345678901234567890");
    FailingAllocator::failNth(1);
    a.adapter->invokeSynchronousService(input);
    FailingAllocator::stop();
    EXPECT_EQ(a.adapter->getCall(), call);
    EXPECT_EQ(numbers, (Lines{"49"}));
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, WithoutMemoryNoOtherNumberThanTheLongerOneIsDialled)
{
    std::string const longer = "498912345678901234567890";
    unsigned int ended = 0;
    dialEnBloc();
    a.key("8"); // what lives for ever is made once
    for (unsigned long n = 1;; ++n)
    {
        a.renew();
        b.renew();
        settle();
        offered.clear();
        numbers.clear();
        LeakCheck const check;
        accepting(State::ADDRESS_INCOMPLETE, false);
        ASSERT_EQ(a.dial("49"), XCode::OK);
        CC_Call const* const call = a.adapter->getCall();
        {
            CC_ServiceUserInput input("8912345678901234567890");
            onOffer = [](CC_Call&) { return XCode::OK; };
            FailingAllocator::failNth(n);
            a.adapter->invokeSynchronousService(input);
            FailingAllocator::stop();
        }
        bool const hasFailed = FailingAllocator::hasFailed();
        EXPECT_EQ(numbers, numbers.size() > 1 ? (Lines{"49", longer}) : Lines{"49"}) << "allocation " << n;
        if (numbers.size() == 1 && a.adapter->getCall() == call)
        {
            a.key("");
            EXPECT_EQ(numbers, (Lines{"49", "49"})) << "the digits were not taken, allocation " << n;
        }
        ended += a.adapter->getCall() == nullptr ? 1 : 0;
        a.renew();
        b.renew();
        settle();
        offered.clear();
        ASSERT_EQ(check.compare(), "") << "allocation " << n;
        ASSERT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0U) << "allocation " << n;
        if (!hasFailed)
        {
            EXPECT_EQ(numbers, (Lines{"49", longer}));
            break;
        }
    }
    EXPECT_GT(ended, 5U) << "a dial that fails leaves the adapter idle";
}

TEST_F(CC_CallAdapterE164_OverlapDisruption_Test, ADialThatCannotBeRememberedWholeIsForgotten)
{
    CC_PropertyContainer own;
    ASSERT_EQ(own.set(CC_PropertyString(NAME, "a name too long to be kept without memory")), XCode::OK);
    unsigned int refused = 0;
    for (unsigned long n = 1; refused + 1 == n; ++n) // until the whole dial is remembered
    {
        a.renew();
        numbers.clear();
        dialEnBloc();
        CC_PropertyContainer offer;
        ASSERT_EQ(offer.set(CC_PropertyString(E164_NUMBER, "a number too long to be kept without memory")), XCode::OK);
        FailingAllocator::failNth(n);
        XCode const result =
            a.adapter->dial("SWITCH", "isdn", "trunk", own, offer, CC_PropertyContainer::EMPTY(), nullptr);
        FailingAllocator::stop();
        refused += result == XCode::FAILURE ? 1 : 0;
        ASSERT_TRUE(result == XCode::FAILURE || result == XCode::REFUSED) << "allocation " << n;
        a.key("8");
        EXPECT_EQ(numbers.size(), result == XCode::FAILURE ? 1U : 2U) << "no mixture of two dials, allocation " << n;
    }
    EXPECT_GE(refused, 2U) << "each text at least, before the base is asked";
}
