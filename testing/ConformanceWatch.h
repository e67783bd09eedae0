#pragma once

#include "callcontrol/CC_Context.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "platform/signalling/QCause.h"
#include "testing/ConformanceLadder.h"

#include <functional>
#include <string>
#include <vector>

/// Observes every call of the context and all their legs, and keeps what the rules are about: who joined, which states
/// a leg had, what was written after RELEASED. Writes all of it into a ladder.
class ConformanceWatch : public CC_Context::Observer, public CC_CallObserver, public CC_CallLegObserver
{
public:
    /// A leg since it joined its first call, until its end when it is the module's.
    struct Leg
    {
        CC_CallLeg* leg; ///< not to be touched once it has left
        bool isModules;
        unsigned int releases = 0;         ///< how often it became RELEASED
        QCause cause = QCause::NONE;       ///< when it did so first
        std::string writtenAfterRelease{}; ///< names of properties; empty: nothing
        bool hasLeft = false;              ///< is in no call
    };

    /// `isModules` tells the module's legs by their names.
    ConformanceWatch(CC_Context& context, ConformanceLadder& ladder, std::function<bool(String const&)> isModules);
    ~ConformanceWatch() override;

    std::vector<Leg> const& getLegs() const { return m_legs; }
    /// The module's alone.
    std::vector<Leg const*> getModules() const;
    /// Forgets the legs that are in no call.
    void forget();

    void aboutDestroy(CC_Context& context) override;
    void aboutAddProvider(CC_Context&, String const&) override {}
    void aboutRemoveProvider(CC_Context&, String const&) override {}
    void aboutCreateCall(CC_Context& context, CC_Call* call) override;
    void aboutDestroyCall(CC_Context&, CC_Call*) override {}

    void onCallObservationEnded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegAdded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegRemoved(CC_Event<CC_Call> const& event) override;
    void onCallPropertyChanged(CC_Event<CC_Call> const&) override {}

    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) override {}
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event) override;

private:
    Leg* find(CC_CallLeg const& leg);
    void note(Leg const& leg, std::string const& text);
    void noteChange(Leg& leg, CC_Flags const& flags);

    CC_Context* m_context;
    ConformanceLadder& m_ladder;
    std::function<bool(String const&)> m_isModules;
    std::vector<CC_Call*> m_calls;
    std::vector<Leg> m_legs;
    std::vector<CC_CallLeg*> m_observed; // legs of the module's that are in no call, and still have to be dropped
};
