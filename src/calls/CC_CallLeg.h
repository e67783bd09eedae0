#pragma once

#include "calls/CC_CallLegObserver.h"
#include "calls/CC_ObserverContainer.h"
#include "environment/CC_Moment.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/TYInstances.h"
#include "platform/base/TYRecycled.h"
#include "platform/base/XCode.h"
#include "properties/CC_PropertyContainer.h"

#include <atomic>

class CC_Call;
class CC_Service;

/// One side of a call: what one endpoint's call adapter drives.
///
/// Shared by reference count between its creator, the call that it is in and whoever else holds it; born with the
/// creator's reference. Its State property is its activity level, on which the call's state, the choice of the most
/// active leg and the call's end rest. Belongs to the call-control loop's thread; only references may be given up
/// elsewhere.
///
///     using State = CC_PropertyCallLegState;
///     CC_CallLeg* const leg = new CC_CallLeg;
///     std::ignore = leg->setName("sip/7");
///     std::ignore = call.addCallLeg(*leg);
///     std::ignore = leg->setProperty(State(CC_PropertyId::STATE, State::ALERTING));
///     leg->removeReference();
class CC_EXPORT CC_CallLeg : public TYRecycled
{
public:
    /// In no call, without a name, with the properties State (IDLE), Provides Data (false) and Cause (none).
    CC_CallLeg();
    CC_CallLeg(CC_CallLeg const&) = delete;
    CC_CallLeg& operator=(CC_CallLeg const&) = delete;

    /// From any thread.
    void addReference();
    /// Gives one reference up; the last one destroys the leg. From any thread, except for the last.
    void removeReference();

    /// The call that the leg is in, or null.
    CC_Call* getCall() const { return m_call; }
    /// Sets the pointer alone: a leg is put into a call by `CC_Call::addCallLeg`.
    void setCall(CC_Call* call) { m_call = call; }

    /// The leg's number in this process, from 1 on in the order of their making; never used again.
    unsigned long long getSerial() const { return m_serial; }
    /// When the leg was made.
    CC_Moment const& getStart() const { return m_start; }
    /// When its State was last stored by an operation of the leg. The first one counts from the leg's start as long as
    /// nobody observes the leg: who makes one says at once how far it is.
    CC_Moment const& getStateSince() const { return m_stateSince; }
    /// Empty until it was named.
    String const& getName() const { return m_name; }
    /// The text after "EP" in the leg's log lines. OK, or FAILURE when memory is out.
    XCode setName(String const& name);

    /// OK, or NO_ELEMENT when memory is out. Registrations are counted.
    XCode addCallLegObserver(CC_CallLegObserver* observer);
    /// Counts one registration less; an observer that was never added is ignored.
    void removeCallLegObserver(CC_CallLegObserver const* observer);

    /// The value of the State property (`CC_PropertyCallLegState::State`); RELEASED (-1) when the leg has none.
    int getState() const;
    /// The same as the state: IDLE -2, RELEASED -1, DISCONNECTING 0 and upward to CONNECTED 6.
    int getActivityLevel() const { return getState(); }

    /// To be read.
    CC_PropertyContainer const& getProperties() const { return m_properties; }
    /// For who writes to the properties without telling anybody. Whoever keeps a copy of them compares everything from
    /// then on (`mayChangeUntold`), so read through the other.
    CC_PropertyContainer& getPropertiesToWrite()
    {
        m_mayChangeUntold = true;
        return m_properties;
    }
    /// Whether the properties may differ from what was told of them: somebody has had them to write, or has stored one
    /// without notification. Otherwise who keeps a copy of them and has heard every notification need look only at what
    /// an event names.
    bool mayChangeUntold() const { return m_mayChangeUntold; }
    /// How often changed properties were told so far, the notification under way included.
    unsigned int getNumberOfNotifications() const { return m_numberOfNotifications; }
    /// Whether that is the one under way. Otherwise another was told inside it, of which who observes the leg only
    /// since then has not heard.
    bool isTellingTheLast() const;

    /// Stores the property unless it equals the stored one, and tells nobody; `changed` says whether it was stored.
    /// OK; REFUSED for a State that is IDLE or of another class (a leg never goes back to IDLE), or when memory is out.
    XCode setPropertyNoNotification(CC_Property const& property, bool& changed);
    /// Stores the property and tells the observers if it changed. OK, or FAILURE; nothing is told then.
    XCode setProperty(CC_Property const& property);
    /// Stores each property, State last whatever its place, so that who reacts to the state sees what came with it; of
    /// several States the last counts. The observers are always told once, of the ids that changed, even of none.
    /// OK, or the first failure (REFUSED); the others are stored all the same.
    XCode setProperties(CC_PropertyContainer const& properties);

    /// Its owner is letting the leg go: from now on it takes no State but RELEASED. Any other is left out, as if it
    /// equalled the stored one, so that who writes back a stale copy of the properties does not bring the leg to life.
    void fixState() { m_isStateFixed = true; }

    /// Hands the service to the leg's observers at once. The adapters of the call's other legs are among them.
    void invokeSynchronousService(CC_Service& service);

    /// Diagnostic dump; returns `info`.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const;

    /// The number of legs alive.
    static unsigned int s_numberOfInstances;

    /// A reference for as long as it lives.
    class Reference
    {
    public:
        /// REQUIRES: somebody else holds a reference meanwhile.
        explicit Reference(CC_CallLeg& leg) : m_leg(leg) { m_leg.addReference(); }
        ~Reference() { m_leg.removeReference(); }
        Reference(Reference const&) = delete;
        Reference& operator=(Reference const&) = delete;

    private:
        CC_CallLeg& m_leg;
    };

private:
    friend class CC_Call;
    friend class CC_CallAdapter;
    friend class CC_Inside;
    friend class TYInstances<CC_CallLeg>;
    struct Move;
    using Marks = CC_PropertyContainer::Marks;

    ~CC_CallLeg();
    /// As `setProperties`, for who has written nearly the same before and knows that nobody has written to the leg
    /// since: at most the marked ones differ. `marks` becomes what is to be marked the next time at least.
    XCode setMarked(CC_PropertyContainer const& properties, Marks& marks);
    bool storeMarked(CC_PropertyContainer const& properties, Marks& marks, CC_Flags& flags, XCode& result);
    Marks differencesTo(CC_PropertyContainer const& properties) const;
    XCode storeAny(CC_PropertyContainer const& properties, CC_Flags& flags);
    XCode store(CC_Property const& property, bool& changed, bool isNew = false);
    XCode storeAll(CC_PropertyContainer const& properties, XCode result, CC_Flags& flags);
    XCode storeAndMark(CC_Property const& property, CC_Flags& flags, bool& changed, bool isNew = false);
    void markChanged(unsigned int id, CC_Flags& flags);
    int findState() const;
    /// Whether the State that was last stored is an active one: enough to notice when that changes.
    bool isSeenActive() const { return m_state >= 0; } // from DISCONNECTING on
    XCode replaceState(CC_Property* stored, CC_Property const& property);
    XCode replace(CC_Property* stored, CC_Property const& property);
    XCode replaceRecorded(CC_Property* stored, CC_Property const& property);
    void tell(CC_Flags& flags);
    void tellRecorded(CC_Flags& flags);
    unsigned long long getCallSerial() const;
    void notifyPropertyChange(CC_Flags& flags);

    static TYInstances<CC_CallLeg> s_instances;

    std::atomic<int> m_referenceCount{1};
    CC_Call* m_call = nullptr;
    CC_ObserverContainer<CC_CallLegObserver, CC_CallLeg> m_observers;
    String m_name;
    CC_PropertyContainer m_properties;
    CC_Call const* m_observedBy = nullptr; // the call whose leg observers are among ours
    Move* m_move = nullptr;                // the move between calls that is under way
    bool m_isMissedByCall = false;         // our call is not among our observers: memory was out
    bool m_isEnding = false;               // in the destructor: goes into no call any more
    bool m_mayChangeUntold = false;        // for good
    bool m_isStateFixed = false;           // at RELEASED, for good
    int m_state;                           // of the State property, unless it may have changed past us
    unsigned int m_numberOfNotifications = 0;
    unsigned long long m_lastWalk = 0; // the last of a call's walks over its legs that took this one out
    unsigned long long const m_serial;
    CC_Moment const m_start;
    CC_Moment m_stateSince;
    TYInstances<CC_CallLeg>::Links m_links;
};
