#pragma once

#include "calls/CC_CallLegObserver.h"
#include "calls/CC_CallObserver.h"
#include "calls/CC_ObserverContainer.h"
#include "environment/CC_Moment.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/TYInstances.h"
#include "platform/base/TYList.h"
#include "platform/base/TYRecycled.h"
#include "platform/base/TYSmallVector.h"
#include "platform/base/XCode.h"
#include "platform/eventloop/TYEvent.h"
#include "properties/CC_PropertyContainer.h"

#include <utility>

class CC_CallLeg;
class CC_CallOwner;
class CC_CallPool;

/// Joins the legs of one call.
///
/// Handed out by a context's pool (`CallControl::ACQUIRE_CALL`) and given back to it by `deferred()`, the clean-up that
/// runs from the call-control loop one turn after it was asked for, when no leg is live any more. It holds one
/// reference on each of its legs and watches them itself. Belongs to the call-control loop's thread.
///
///     CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
///     std::ignore = call->addCallObserver(&observer);
///     std::ignore = call->addCallLeg(*leg);
///
/// Any observer may do anything inside a notification. A call that is released there lives on until the operation that
/// notified has ended.
class CC_EXPORT CC_Call : public CC_CallLegObserver, public TYRecycled
{
public:
    /// Derived from the legs at each request: fewer than two active, two, or more.
    enum State : int
    {
        INACTIVE = 0,
        ACTIVE = 1,
        CONFERENCE = 2
    };
    /// A call's standing in its pool. Names only: the pool knows it by what it holds.
    enum LiveState : int
    {
        RELEASED = 0,
        ACQUIRED = 1
    };

    /// REQUIRES: `CallControl::SET_CC_EVENT_LOOP` was called.
    CC_Call();
    ~CC_Call() override;
    CC_Call(CC_Call const&) = delete;
    CC_Call& operator=(CC_Call const&) = delete;
    /// Deletes the call, or, when one of its operations is under way, sees to it that the call is deleted as that ends.
    void destroy();

    /// The call's identity in logs and dumps: its address, which another call may get once this one has ended.
    String const& getName() const { return m_name; }
    /// The call's number in this process, from 1 on in the order of their making; never used again.
    unsigned long long getSerial() const { return m_serial; }
    /// When the call was made.
    CC_Moment const& getStart() const { return m_start; }
    /// When its state last changed: a leg became active or ceased to be, joined or left. Its start before that.
    CC_Moment const& getStateSince() const { return m_stateSince; }
    /// The pool that handed the call out and takes it back; null: the call destroys itself when it is over. @{
    CC_CallOwner* getCallPool() const { return m_callPool; }
    void setCallPool(CC_CallOwner* callPool) { m_callPool = callPool; }
    /// @}

    /// OK, or NO_ELEMENT when memory is out. Registrations are counted (CC_CountedObservers).
    XCode addCallObserver(CC_CallObserver* observer);
    /// Counts one registration less; an observer that was never added is ignored.
    void removeCallObserver(CC_CallObserver const* observer);
    /// Adds the observer to every leg of the call, those that join later included. OK, or NO_ELEMENT when memory is
    /// out; it is registered nowhere then. A leg that is just joining tells it from now on; the observers that were
    /// there before hear that leg only from the end of its move, after `onCallCallLegAdded`.
    XCode addCallLegObserver(CC_CallLegObserver* observer);
    /// Counts one registration less, at the call and at each leg.
    void removeCallLegObserver(CC_CallLegObserver const* observer);

    /// To be read; they change through the operations below.
    CC_PropertyContainer const& getProperties() const { return m_properties; }
    /// Stores the property unless it equals the stored one, and tells nobody; `changed` says whether it was stored.
    /// OK, or REFUSED when memory is out; the old value stays.
    XCode setPropertyNoNotification(CC_Property const& property, bool& changed);
    /// Stores the property and tells the observers if it changed. OK, or FAILURE.
    XCode setProperty(CC_Property const& property);
    /// Stores each property and always tells the observers once, of the ids that changed, even of none: observers count
    /// on one event for each such request. OK, or the first failure (REFUSED); the others are stored all the same.
    XCode setProperties(CC_PropertyContainer const& properties);

    /// The places of `getCallLeg` are those below it.
    unsigned int getNumberOfCallLegs() const { return m_callLegs.getSize(); }
    /// The leg at that place in the order of joining, from 0; null past the end.
    CC_CallLeg* getCallLeg(unsigned int index) const;
    /// The places of `getOtherCallLeg` are those below it: `leg` is left out, if it is in the call.
    unsigned int getNumberOfOtherCallLegs(CC_CallLeg const& leg) const;
    /// The same, with `leg` left out; null when there are not that many.
    CC_CallLeg* getOtherCallLeg(unsigned int index, CC_CallLeg const& leg) const;
    /// The leg of the highest activity level. Among equals `preferred` (may be null), else the first; null without
    /// legs.
    CC_CallLeg* getMostActiveCallLeg(CC_CallLeg const* preferred) const;
    /// The same, with `excluded` left out.
    CC_CallLeg* getOtherMostActiveCallLeg(CC_CallLeg const& excluded, CC_CallLeg const* preferred) const;
    /// A leg counts as active from DISCONNECTING (0) on.
    State getState() const;

    /// Moves the leg out of its call (if any) into `to` (null: into none) and tells, in this order, the old call's
    /// observers, the new call's, and the leg's. OK; NO_ELEMENT when memory is out, or `to` or the leg is ending;
    /// nothing has moved then.
    /// A move asked for inside a move of the same leg is OK and made when that one has ended, unless `to` ends before.
    static XCode TRANSFER_CALL_LEG(CC_Call* to, CC_CallLeg& leg);
    /// Moves the leg here and defers. OK, or FAILURE.
    XCode addCallLeg(CC_CallLeg& leg);
    /// Takes the leg out of the call that it is in, and defers this one.
    void removeCallLeg(CC_CallLeg& leg);
    /// Takes every leg out, each once: one that an observer puts back stays.
    void destroyParticipatingCallLegs();

    /// Asks for `deferred()` in the loop's next turn, once however often it is asked.
    void defer();
    /// What the event of `defer` calls, with the call.
    static void DEFERRED(void* call);
    /// Clean-up: takes out released legs that nobody else holds; gives the call back when no leg is live; and asks the
    /// less active of two legs of the same Network to step back when both are up (CC_ServicePushBack).
    void deferred();

    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event) override;

    /// Diagnostic dump; returns `info`.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const;

    /// ERROR::INVALID for other values. @{
    static char const* STATE_NAME(State state);
    static char const* LIVE_STATE_NAME(LiveState state);
    /// @}

    /// The number of calls alive.
    static unsigned int s_numberOfInstances;

    /// How often changed properties were told so far, by all calls together.
    static unsigned int GET_NUMBER_OF_CHANGES();

    /// How many legs an operation that takes out "all" takes at most: far beyond any honest use, it ends what an
    /// observer that always brings one back would keep going for ever.
    static constexpr unsigned int MOST_MOVES = 100000;

    /// Keeps a call from being deleted while an operation that uses it is under way. Holding null is allowed.
    class CC_EXPORT Hold
    {
    public:
        /// The call lives at least as long as the hold, or the last of several.
        explicit Hold(CC_Call* call = nullptr);
        ~Hold();
        Hold(Hold const&) = delete;
        Hold& operator=(Hold const&) = delete;
        /// Exchanges what the two hold.
        void swap(Hold& other) { std::swap(m_call, other.m_call); }
        /// Null when it holds none.
        CC_Call* get() const { return m_call; }
        /// Whether the call was released meanwhile and ends with the hold.
        bool isReleased() const { return m_call != nullptr && m_call->m_isReleased; }

    private:
        CC_Call* m_call;
    };

private:
    friend class CC_CallLeg;
    friend class CC_CallPool;
    friend class CC_Inside;
    friend class TYInstances<CC_Call>;

    /// Whether the call takes part in nothing any more: it is in its destructor, or will be when the last hold ends.
    bool isOver() const { return m_isEnding || m_isReleased; }
    XCode replace(CC_Property const& property);
    XCode replaceRecorded(CC_Property const& property);
    void tellChange(CC_Flags& flags);
    void noticeState(CC_Moment const* moment = nullptr);
    XCode storeAll(CC_PropertyContainer const& properties, XCode result);
    static XCode MOVE(CC_Call* to, CC_CallLeg& leg);
    XCode addLegObserver(CC_CallLeg& leg, CC_CallLegObserver* observer);
    void removeLegObserver(CC_CallLeg& leg, CC_CallLegObserver const* observer);
    void giveObserversTo(CC_CallLeg& leg);
    void takeObserversFrom(CC_CallLeg& leg);
    void unlist(CC_CallLeg const& leg);
    bool isListed(CC_CallLeg const& leg) const;
    void removeReleasedCallLegs();
    bool removeAllCallLegs();
    CC_CallLeg* findCallLegAtRest() const;
    void deferIfAbandoned();
    bool hasLiveCallLeg() const;
    template <class IsToGo>
    void takeOutCallLegs(IsToGo&& isToGo);
    void giveBack();
    void pushBackOnLoop();
    CC_CallLeg* findPushBackTarget() const;

    static TYInstances<CC_Call> s_instances;

    String m_name;
    CC_CallOwner* m_callPool = nullptr;
    CC_PropertyContainer m_properties;
    TYEvent* m_deferredEvent = nullptr;
    CC_ObserverContainer<CC_CallObserver, CC_Call> m_callObservers;
    CC_ObserverContainer<CC_CallLegObserver, CC_CallLeg> m_callLegObservers;
    TYSmallVector<CC_CallLeg*, 4> m_callLegs;
    CC_CallPool* m_listedIn = nullptr; // the pool whose list m_poolElement is in
    TYList<CC_Call*>::Element* m_poolElement = nullptr;
    unsigned int m_holds = 0;
    bool m_isReleased = false;   // delete when the last hold ends
    bool m_isEnding = false;     // in the destructor: takes no leg any more
    bool m_isCleaningUp = false; // looks itself whether a live leg is left
    State m_noticedState = INACTIVE;
    unsigned long long const m_serial;
    CC_Moment const m_start;
    CC_Moment m_stateSince; // of m_noticedState
    TYInstances<CC_Call>::Links m_links;
};
