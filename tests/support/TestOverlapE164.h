#pragma once

#include "properties/CC_Flags.h"
#include "services/CC_ServiceUserInputUpdate.h"
#include "testing/RecordingCallLegObserver.h"
#include "tests/support/TestLineE164.h"

#include <functional>
#include <utility>

/// Overrides what the re-dial calls where there is no media context to dial with.
class HearingAdapter : public CC_CallAdapterE164
{
public:
    void notifyPeerPropertyChange(CC_Flags const& flags) override
    {
        std::function<void(CC_Flags const&)> const running = onNotify; // it may destroy the adapter
        if (running)
            running(flags);
    }
    std::function<void(CC_Flags const&)> onNotify;
};

/// The line `a` dials `b`, which may want the number en bloc.
class TestOverlapE164 : public TestLinesE164<HearingAdapter>
{
protected:
    /// The line `b` accepts each call with a new adapter, says whether it takes single digits, and becomes that.
    void accepting(State::State state, bool supportsOverlapReceiving)
    {
        onOffer = [this, state, supportsOverlapReceiving](CC_Call& call)
        {
            b.renew();
            XCode const result = b.accept(call);
            std::ignore = b.adapter->setOwnSupportsOverlapReceiving(supportsOverlapReceiving);
            std::ignore = b.adapter->setOwnProperty(State(CC_PropertyId::STATE, state));
            return result;
        };
    }
    /// `b` wants more digits than it was offered, all in one.
    void dialEnBloc(MG_IContext* media = nullptr)
    {
        accepting(State::ADDRESS_INCOMPLETE, false);
        ASSERT_EQ(a.dial("49", media), XCode::OK);
    }
    void update()
    {
        CC_ServiceUserInputUpdate update(500);
        a.adapter->invokeSynchronousService(update);
    }
    /// Runs that once, when the peers of `a` hear the end of its attempt.
    void atTheDrop(std::function<void()> what)
    {
        witness.m_onChanged = [this, what = std::move(what)](CC_EvCallLegPropertyChanged const&)
        {
            std::function<void()> const once = what;
            abandoned->removeCallLegObserver(&witness);
            once();
        };
        abandoned = a.adapter->getCall();
        ASSERT_EQ(abandoned->addCallLegObserver(&witness), XCode::OK);
    }

    CC_Call* abandoned = nullptr;
    RecordingCallLegObserver witness{"w"};
};
