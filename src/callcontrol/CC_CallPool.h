#pragma once

#include "calls/CC_CallOwner.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/TYLifeline.h"
#include "platform/base/TYList.h"
#include "platform/base/TYMutex.h"
#include "platform/base/TYPtr.h"
#include "platform/base/TYTime.h"
#include "platform/driver/IRebootMgmt.h"

class CC_Call;
class MG_IContext;

/// The calls of one context: makes them, keeps them in the order of their acquisition and destroys them when they come
/// back. While it holds a call it keeps a graceful lock on reloads of the device.
///
/// Owned by its context; belongs to the call-control loop's thread. Destroying a pool leaves its calls alive: they end
/// when their legs are gone, and the reload lock stays held.
///
///     CC_Call* const call = pool.acquireCall();
///     ...
///     pool.releaseCall(call);
class CC_EXPORT CC_CallPool : public CC_CallOwner
{
public:
    /// Counts over all pools of the process since its start. Read them after `prepareGet()`.
    class CC_EXPORT Statistics
    {
    public:
        /// A call was acquired, a call was removed. Both take the lock. @{
        void onCallAdded();
        void onCallRemoved();
        /// @}
        /// Accounts for the time up to now. With the lock held; the first update only starts the clock.
        void updateCallTime();
        /// With the lock held.
        void updateMaxActiveCalls();
        /// Restarts the highest number of simultaneous calls. Takes no lock.
        void resetMax() { m_maxActiveCalls = 0; }
        /// Brings the counters up to date for a reader. Takes the lock.
        void prepareGet();

        /// Calls that were acquired, and those of them that are gone again: the difference is up. @{
        unsigned long long m_callsAdded = 0;
        unsigned long long m_callsRemoved = 0;
        /// @}
        unsigned long long m_callTime = 0;       ///< call-milliseconds: the number of active calls, summed over time
        unsigned long long m_maxActiveCalls = 0; ///< the most that were up at once, since the start or `resetMax()`

        /// Up to when the call time is accounted for (MONOTONIC; 0: not begun), and the lock of all counters. @{
        static TY::Time s_tLastUpdate;
        static TYMutex s_mutex;
        /// @}
    };

    CC_CallPool() = default;
    ~CC_CallPool() override;
    CC_CallPool(CC_CallPool const&) = delete;
    CC_CallPool& operator=(CC_CallPool const&) = delete;

    /// A new call of this pool with the property Context (0x400400) for `mgContext`; null: the media layer is asked for
    /// a new one. Null when memory is out, and when the media layer or the reboot management, asked meanwhile, have
    /// destroyed the pool or released the call. @{
    CC_Call* acquireCall() { return acquireCall(nullptr); }
    CC_Call* acquireCall(MG_IContext* mgContext);
    /// @}
    /// Takes the call back and destroys it. Counts and destroys also a call of another pool, which then forgets it, so
    /// hand back only its own. Null is ignored.
    void releaseCall(CC_Call* call) override;

    /// Calls that are up. The places of `getAcquiredCall` are those below it.
    unsigned int getNumberOfAcquiredCalls() const { return m_calls.getCount(); }
    /// The call at that place in the order of acquisition; null past the end.
    CC_Call* getAcquiredCall(unsigned int index);
    /// Takes the legs out of every call, or of the calls of that name, those that join meanwhile included; the calls
    /// then end by themselves. The first text is not used. The modules find themselves without peer and call, and drop.
    /// Where an observer brings legs back for ever, some stay in the end; the log says so (level 1).
    void dropCalls(String const& unused, String const& callName);

    /// Takes and gives back the lock on reloads, "Call-Control" / "Calls are ongoing"; without a reboot management
    /// driver nothing happens. @{
    void addReloadGracefulLock();
    void releaseReloadGracefulLock();
    /// @}

    /// Diagnostic dump; returns `info`.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const;

    /// Of all pools together.
    static Statistics s_statistics;
    /// Not used: stays 0. The moment that counts is the statistics' own.
    static TY::Time s_tLastUpdate;

private:
    bool list(CC_Call& call);
    class Lock;

    void unlist(CC_Call& call);
    void end(CC_Call& call);
    static void giveContext(CC_Call& call, MG_IContext* mgContext);
    static void dropCall(CC_Call& call);

    /// What a walk does when the call that is next was released.
    enum class Lost
    {
        FROM_START,
        GO_ON, ///< behind as many as it has visited
    };
    template <class Visit>
    void forEachCall(Visit const& visit, Lost whenNextIsLost) const;
    static CC_Call* AT(TYList<CC_Call*>::Element const* element);
    TYList<CC_Call*>::Element* getElement(unsigned int index) const;

    TYList<CC_Call*> m_calls;
    TYPPtr<IRebootMgmt> m_rebootMgmt;
    TYLifeline m_lifeline;
};
