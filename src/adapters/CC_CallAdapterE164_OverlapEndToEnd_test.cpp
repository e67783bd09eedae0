// Overlap sending from end to end: a telephone keys digit by digit, the other module's network takes numbers en bloc.
#include "services/CC_ServiceUserInputUpdate.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/TestLineE164.h"

#include <memory>
#include <vector>

namespace
{
using namespace CC_PropertyId;

/// A module whose network takes numbers of seven digits and only en bloc: a fixed network's trunk.
class EnBlocModule
{
public:
    EnBlocModule()
    {
        provider.m_dial =
            [this](CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offer)
        { return endpoint.offer(call, destination, offer); };
        endpoint.m_handleOffer = [this](CC_Call& call, String const&, CC_PropertyContainer const& offer)
        { return answer(call, TestLineE164<>::TEXT(offer.get(E164_NUMBER))); };
        observer.m_onPeerPropertyChange = [](CC_CallAdapter& adapter, CC_Flags const&)
        {
            auto const* const state = dynamic_cast<State const*>(adapter.getPeerProperty(STATE));
            if (state != nullptr && state->getState() == State::RELEASED)
                adapter.drop(QCause::NORMAL_CALL_CLEARING, 0);
        };
        EXPECT_EQ(CallControl::ADD_PROVIDER("SWITCH", "trunk", provider), XCode::OK);
    }
    ~EnBlocModule()
    {
        adapters.clear();
        CallControl::REMOVE_PROVIDER("SWITCH", "trunk");
    }
    CC_CallAdapterE164& current() { return *adapters.back(); }
    unsigned int getNumberOfCalls() const
    {
        unsigned int count = 0;
        for (auto const& adapter : adapters)
            count += adapter->getCall() != nullptr ? 1 : 0;
        return count;
    }

    Lines numbers;
    std::vector<MG_IContext const*> media;

private:
    XCode answer(CC_Call& call, std::string const& number)
    {
        numbers.push_back(number);
        adapters.push_back(std::make_unique<CC_CallAdapterE164>());
        EXPECT_EQ(current().setup(String::stringOf(adapters.size()), endpoint, &observer), XCode::OK);
        EXPECT_EQ(current().accept(call, number.c_str(), QTypeOfNumber::UNKNOWN, QNumberingPlan::ISDN,
                                   QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED, "trunk"),
                  XCode::OK);
        media.push_back(current().getDatapathContext());
        EXPECT_EQ(current().setOwnSupportsOverlapReceiving(false), XCode::OK);
        return current().setOwnProperty(
            State(STATE, number.size() < 7 ? State::ADDRESS_INCOMPLETE : State::PROCEEDING));
    }

    RecordingProvider provider{"trunk"};
    RecordingEndpoint endpoint{"trunk"};
    RecordingAdapterObserver observer{"trunk"};
    std::vector<std::unique_ptr<CC_CallAdapterE164>> adapters;
};

/// A module whose users key digit by digit: a telephone.
class Telephone
{
public:
    Telephone() { EXPECT_EQ(adapter.setup("phone", endpoint, &observer), XCode::OK); }
    XCode lift(String const& firstDigits)
    {
        return adapter.dial("SWITCH", "trunk", "any", "201", QTypeOfNumber::UNKNOWN, QNumberingPlan::PRIVATE,
                            QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED, "Ada", firstDigits,
                            QTypeOfNumber::UNKNOWN, QNumberingPlan::ISDN, "", false,
                            QInformationTransferCapability::SPEECH, nullptr, nullptr, nullptr, nullptr);
    }
    void key(char const* digit)
    {
        CC_ServiceUserInput input(digit);
        adapter.invokeSynchronousService(input);
        CC_ServiceUserInputUpdate released(120);
        adapter.invokeSynchronousService(released);
    }

    RecordingEndpoint endpoint{"phone"};
    RecordingAdapterObserver observer{"phone"};
    CC_CallAdapterE164 adapter;
};
} // namespace

TEST(CC_CallAdapterE164_OverlapEndToEnd, ATelephoneReachesANetworkThatTakesNumbersEnBloc)
{
    CallControlFixture callControl;
    {
        EnBlocModule trunk;
        Telephone phone;
        ASSERT_EQ(phone.lift("49"), XCode::OK);
        callControl.settle();
        for (char const* const digit : {"8", "9", "1", "2", "3"})
        {
            phone.key(digit);
            callControl.settle();
            EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 1U) << "abandoned attempts are cleared";
            EXPECT_EQ(trunk.getNumberOfCalls(), 1U);
        }
        EXPECT_EQ(trunk.numbers, (Lines{"49", "498", "4989", "49891", "498912", "4989123"}));
        for (MG_IContext const* const media : trunk.media)
            EXPECT_EQ(media, trunk.media.front()) << "the caller's media stay where they are";
        EXPECT_EQ(trunk.current().getPeerE164(), "201");
        EXPECT_EQ(trunk.current().getPeerName(), "Ada");
        EXPECT_TRUE(trunk.current().getPeerSupportsOverlapSending());
        EXPECT_EQ(trunk.current().getInformationTransferCapability(), QInformationTransferCapability::SPEECH);

        ASSERT_EQ(trunk.current().setOwnProperty(State(STATE, State::CONNECTED)), XCode::OK);
        callControl.settle();
        EXPECT_EQ(phone.adapter.getPeerE164(), "4989123");
        phone.key("5");
        EXPECT_EQ(trunk.numbers.size(), 6U) << "once connected, digits are the application's";

        phone.adapter.drop(QCause::NORMAL_CALL_CLEARING, 0);
        callControl.settle();
        EXPECT_EQ(trunk.getNumberOfCalls(), 0U);
    }
    callControl.settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0U);
}

TEST(CC_CallAdapterE164_OverlapEndToEnd, TheLogTellsOfTheAttemptsInTurn)
{
    CallControlFixture callControl;
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    EnBlocModule trunk;
    Telephone phone;
    ASSERT_EQ(phone.lift("49"), XCode::OK);
    monitor.clear();
    phone.key("8");
    std::vector<std::string> kinds;
    for (std::string const& line : monitor.linesOfLevel(RTD::LEVEL_FLOW))
        kinds.push_back(line.substr(0, line.find(" call")));
    EXPECT_EQ(kinds, (Lines{"[EP phone/phone] Drop", "[EP phone/phone] Dial to provider trunk (any) using",
                            "[EP trunk/2] Accept"}));
}
