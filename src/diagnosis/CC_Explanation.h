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
/// some seconds for all. Belongs to the call-control loop's thread. Throws std::bad_alloc when memory is out.
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
    using Lines = std::vector<std::string>;

    /// How long ago something was.
    struct Age
    {
        bool isKnown = false; ///< otherwise there was no call-control loop at that time
        long long nanoseconds = 0;
        unsigned long long turns = 0; ///< of the loop that have begun since
    };

    /// The endpoint's name is taken from the leg's, which the adapter gave it; empty when it cannot be told.
    struct Adapter
    {
        std::string name;
        std::string endpoint;
    };

    /// Who holds references on a leg.
    struct Holder
    {
        enum Kind
        {
            CALL,         ///< the call lists it
            OWN_ADAPTER,  ///< drives it
            PEER_ADAPTER, ///< takes it for its peer
            MOVE,         ///< between calls, under way
            NOBODY_KNOWN
        };
        Kind kind;
        int references;
        unsigned long long call = 0; ///< of CALL, its serial number
        Adapter adapter;             ///< of OWN_ADAPTER, PEER_ADAPTER
        unsigned int untold = 0;     ///< of these: how many changed properties its module is still to be told of
    };

    /// Who observes a call, a leg, or all legs of a call.
    struct Observer
    {
        enum Kind
        {
            CALL,
            ADAPTER,
            FOREIGN ///< nothing is known of it but the address, not even whether it still exists
        };
        Kind kind;
        int registrations; ///< below 0: removed more often than added, and so still told
        int surplus;       ///< of these, what the adapter or call did not do itself and will not take back
        unsigned long long call = 0;
        Adapter adapter;
        void const* address = nullptr;
    };

    struct Leg
    {
        unsigned long long serial;
        std::string name; ///< its address when it has none
        int state;        ///< CC_PropertyCallLegState::State
        Age age;
        Age inState;
        int references;
        std::vector<Holder> holders; ///< in the order of Holder::Kind, with NOBODY_KNOWN for the rest
        std::vector<Observer> observers;
        bool isMoving;           ///< between calls, so that this was asked inside the move
        bool isBusy;             ///< an operation on it is under way
        std::string viewedState; ///< the state in its module's view when that is another: filters stand between
        std::string end;         ///< what it takes for it to end
    };

    struct Call
    {
        unsigned long long serial;
        std::string name;
        int state; ///< CC_Call::State
        Age age;
        Age inState;
        bool hasPool;
        bool isReleased;       ///< and ends with the operation that is under way
        bool isCleanUpPending; ///< for the loop's next turn
        bool hasCleanUp;       ///< otherwise memory was out when it was made
        unsigned int holds;    ///< operations under way, or somebody's CC_Call::Hold
        std::vector<Leg> legs;
        std::vector<Observer> observers;
        std::vector<Observer> legObservers; ///< of all its legs
        std::string end;                    ///< what it takes for it to end
    };

    static CC_Explanation OF_CALL(CC_Call const& call);
    /// Empty when no call of that number is alive.
    static CC_Explanation OF_CALL(unsigned long long serial);
    /// Of all calls alive whose age is that or more, those without a pool and of contexts that have ended included.
    static CC_Explanation OF_CALLS_OLDER_THAN(unsigned int seconds);
    /// Of all legs that no call lists and whose age is that or more.
    static CC_Explanation OF_LEGS_WITHOUT_CALL(unsigned int seconds = 0);

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
    static std::string TEXT_OF(Observer const& observer);

private:
    std::vector<Call> m_calls;
    std::vector<Leg> m_legs;
};
