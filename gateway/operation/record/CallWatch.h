#pragma once

#include "callcontrol/CC_Context.h"
#include "calls/CC_CallLegObserver.h"
#include "calls/CC_CallObserver.h"
#include "operation/record/CallRecord.h"

#include <functional>
#include <unordered_map>
#include <vector>

/// Makes a record of every call of a context, out of what call control tells anybody: no module need do anything for
/// it. On the call-control loop's thread.
///
///     CallWatch watch; // before the context, which may have calls to its end
///     watch.tell([](CallRecord const& record) { ... });
///     watch.watch("SWITCH");
class CallWatch : private CC_Context::Observer, private CC_CallObserver, private CC_CallLegObserver
{
public:
    using Sink = std::function<void(CallRecord const&)>;

    CallWatch() = default;
    CallWatch(CallWatch const&) = delete;
    CallWatch& operator=(CallWatch const&) = delete;

    /// From now on until the context ends, which must be before this does. Throws std::runtime_error without memory.
    void watch(String const& contextName);
    /// Tells of each call when it is over. A sink that throws std::bad_alloc has heard of the call in vain.
    void tell(Sink sink) { m_sinks.push_back(std::move(sink)); }
    /// Tells of each call that is up, whenever it is more than before: a party has joined, it rang, it was answered or
    /// is being cleared. The sink does not throw.
    void tellChange(Sink sink) { m_changeSinks.push_back(std::move(sink)); }
    /// It was not a party that ended the call, or all that are up. @{
    void noteCleared(unsigned long long serial);
    void noteAllCleared();
    /// @}
    /// Null when no such call is up.
    CallRecord const* find(unsigned long long serial) const;
    /// Tells of each call that is up, with its age in seconds.
    template <class Visitor>
    void visit(Visitor const& visitor) const
    {
        for (auto const& known : m_calls)
            visitor(known.second.record, known.second.getAge());
    }
    /// As the leg has it now; nothing where it has no record.
    static std::optional<CallRecord::Quality> GET_QUALITY(CC_CallLeg const& leg);
    /// Calls of which nothing could be told: memory was out.
    unsigned long long getNumberOfLost() const { return m_lost; }

private:
    struct Call
    {
        CallRecord record;
        std::int64_t begin; ///< of the monotonic clock, in nanoseconds

        double getAge() const; ///< seconds
    };

    // --- CC_Context::Observer
    void aboutDestroy(CC_Context& context) override;
    void aboutAddProvider(CC_Context&, String const&) override {}
    void aboutRemoveProvider(CC_Context&, String const&) override {}
    void aboutCreateCall(CC_Context& context, CC_Call* call) override;
    void aboutDestroyCall(CC_Context&, CC_Call*) override {}
    // --- CC_CallObserver
    void onCallObservationEnded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegAdded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegRemoved(CC_Event<CC_Call> const& event) override;
    void onCallPropertyChanged(CC_Event<CC_Call> const&) override {}
    // --- CC_CallLegObserver
    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const&) override {}
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) override {}
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const&) override {}

    /// Runs what needs memory; without it the call's record is not whole, and is not told.
    template <class Work>
    void note(unsigned long long serial, Work const& work);
    void end(unsigned long long serial);
    void tellChangeOf(Call const& call) const;

    std::unordered_map<unsigned long long, Call> m_calls; // by serial number
    std::vector<Sink> m_sinks;
    std::vector<Sink> m_changeSinks;
    unsigned long long m_lost = 0;
};
