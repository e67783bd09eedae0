#pragma once

#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"

#include <string>
#include <vector>

class CC_Call;

/// Why calls and legs are still there: how long, in which state, who holds each reference, who observes, what is
/// pending, and who has to do what for them to end.
///
/// What it tells is a copy of the moment that it was made. Making one calls nobody, changes nothing and touches nothing
/// that is not known to be alive: an observer that is neither an adapter nor a call is told by its address. It looks at
/// every call and adapter, and the loop waits meanwhile: with 100,000 calls up a tenth of a second for one of them,
/// a second or two for all. Belongs to the call-control loop's thread. Throws std::bad_alloc when memory is out.
///
/// References that nobody is known for are a module's (CC_CallLeg::addReference, CC_CallLeg::Reference). Asked from
/// inside a notification, those of operations under way are among them (`isBusy`).
///
///     CC_Explanation const explanation = CC_Explanation::OF_CALLS_OLDER_THAN(3600);
///     InfoContainer info;
///     std::puts(explanation.getInfo(info, 9, 0, 9, 0, "").getString_TreeFormat().c_str());
///     for (std::string const& line : explanation.getJson())
///         ...
class CC_EXPORT CC_Explanation
{
public:
    using Lines = std::vector<std::string>; ///< of text

    /// How long ago something was.
    struct Age
    {
        bool isKnown = false;         ///< otherwise there was no call-control loop at that time
        long long nanoseconds = 0;    ///< of the monotonic clock
        unsigned long long turns = 0; ///< of the loop that have begun since
    };

    /// A call adapter by its names.
    struct Adapter
    {
        std::string name;     ///< its own
        std::string endpoint; ///< taken from the name that it gave its leg; empty when that does not tell
    };

    /// Who holds references on a leg.
    struct Holder
    {
        /// In the order in which they are told.
        enum Kind
        {
            CALL,         ///< the call lists it
            OWN_ADAPTER,  ///< drives it
            PEER_ADAPTER, ///< takes it for its peer
            MOVE,         ///< between calls, under way
            NOBODY_KNOWN  ///< the rest
        };
        Kind kind;                   ///< what it is
        int references;              ///< how many
        unsigned long long call = 0; ///< of CALL, its serial number
        Adapter adapter;             ///< of OWN_ADAPTER, PEER_ADAPTER
        unsigned int untold = 0;     ///< of these: how many changed properties its module is still to be told of
    };

    /// Who observes a call, a leg, or all legs of a call.
    struct Observer
    {
        /// Who it is.
        enum Kind
        {
            CALL,    ///< a call
            ADAPTER, ///< a call adapter
            FOREIGN  ///< nothing is known of it but the address, not even whether it still exists
        };
        Kind kind;                     ///< what it is
        int registrations;             ///< below 0: removed more often than added, and so still told
        int surplus;                   ///< of these, what it did not do itself and will not take back
        unsigned long long call = 0;   ///< of CALL, its serial number
        Adapter adapter;               ///< of ADAPTER
        void const* address = nullptr; ///< as it was registered
    };

    /// A leg.
    struct Leg
    {
        unsigned long long serial;       ///< CC_CallLeg::getSerial
        std::string name;                ///< its address when it has none
        int state;                       ///< CC_PropertyCallLegState::State
        Age age;                         ///< since it was made
        Age inState;                     ///< since its State was stored
        int references;                  ///< all together
        std::vector<Holder> holders;     ///< of all references, those of nobody known included
        std::vector<Observer> observers; ///< in the order of their coming
        bool isMoving;                   ///< between calls, so that this was asked inside the move
        bool isBusy;                     ///< an operation on it is under way
        std::string viewedState;         ///< the state in its module's view when that is another: filters stand between
        std::string end;                 ///< what it takes for it to end
    };

    /// A call.
    struct Call
    {
        unsigned long long serial;          ///< CC_Call::getSerial
        std::string name;                   ///< CC_Call::getName
        int state;                          ///< CC_Call::State
        Age age;                            ///< since it was made
        Age inState;                        ///< since its state changed
        bool hasPool;                       ///< otherwise it never had one, or its context has ended
        bool isReleased;                    ///< and ends with the operation that is under way
        bool isCleanUpPending;              ///< for the loop's next turn
        bool hasCleanUp;                    ///< otherwise memory was out when it was made
        unsigned int holds;                 ///< operations under way, or somebody's CC_Call::Hold
        std::vector<Leg> legs;              ///< in the order of their joining
        std::vector<Observer> observers;    ///< of the call
        std::vector<Observer> legObservers; ///< of all its legs
        std::string end;                    ///< what it takes for it to end
    };

    /// Of that call.
    static CC_Explanation OF_CALL(CC_Call const& call);
    /// Empty when no call of that number is alive.
    static CC_Explanation OF_CALL(unsigned long long serial);
    /// Of all calls alive whose age is that or more, those without a pool and of contexts that have ended included.
    static CC_Explanation OF_CALLS_OLDER_THAN(unsigned int seconds);
    /// Of all legs that no call lists and whose age is that or more.
    static CC_Explanation OF_LEGS_WITHOUT_CALL(unsigned int seconds = 0);

    /// In the order of their making, as the legs.
    std::vector<Call> const& getCalls() const { return m_calls; }
    /// Those without a call.
    std::vector<Leg> const& getLegs() const { return m_legs; }

    /// For operators; characters that would steer a terminal are shown as "\x1b". Returns `info`. Of each call and leg
    /// without a call one entry at `level` and, below, what it takes for it to end; the observers are one detail finer.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const;
    /// One JSON object for each call and for each leg without one. Times are in nanoseconds, null when unknown.
    Lines getJson() const;

    /// As one reads it: "adapter `9` of endpoint `trunk` (own)", "nobody known: 2".
    static std::string TEXT_OF(Holder const& holder);
    /// The same: "call 7", "an observer at 0x55d2, not one of call control's".
    static std::string TEXT_OF(Observer const& observer);

private:
    std::vector<Call> m_calls;
    std::vector<Leg> m_legs;
};
