#pragma once

#include "tests/simulation/CallOut.h"
#include "tests/simulation/FilterRule.h"
#include "tests/simulation/Operation.h"
#include "tests/simulation/Values.h"

#include <array>
#include <deque>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace Simulation
{
/// Call control as its words tell it, in standard containers alone: what every operation gives, who is in which call,
/// who is whose peer, what every leg, call and view holds, and who hears what, in which order. Made of numbers: -1 is
/// nobody.
///
/// It predicts honest runs. Once anything is done inside a call-out, or memory runs out, it is not asked any more.
class Model
{
public:
    static constexpr int NOBODY = -1;
    static constexpr unsigned int NO_RESULT = 0xfffffffe;

    /// Properties with unique ids, in the order in which they came.
    struct Container
    {
        Properties list;

        Value const* find(unsigned int id) const;
        /// A value of another class is not taken, and nobody says so.
        void set(Property const& property);
        void setAllOfGroups(Container const& other);
        void remove(unsigned int id);
        std::string text(unsigned int id) const; // empty for none, or one of another class
    };

    enum class Who : unsigned char
    {
        CALL,
        ADAPTER,
        GUEST
    };
    struct Observer
    {
        Who who;
        int index;
        unsigned int count; // wraps
        bool is(Who otherWho, int otherIndex) const { return who == otherWho && index == otherIndex; }
    };
    struct Observers
    {
        std::vector<Observer> list;
        void add(Who who, int index);
        void remove(Who who, int index);
        void silence();
        bool holds(Who who, int index) const;
    };

    struct Leg
    {
        int references = 1;
        int call = NOBODY;
        Observers observers{};
        Container properties{};
        bool isFixed = false; // its adapter is letting it go
        bool isAlive = true;
        int getState() const;
    };
    struct Call
    {
        int context = NOBODY;
        bool isPending = false;
        bool isEnding = false;
        bool isAlive = true;
        Container properties{};
        Observers callObservers{};
        Observers legObservers{};
        std::vector<int> legs{};
    };
    struct LastDial
    {
        unsigned int context = 0;
        unsigned int called = 0xffffffff; // nobody
        Container own{};
        Container offered{};
        Container ofCall{};
        unsigned long long media = 0; // 0: none
    };
    struct Adapter
    {
        int line = NOBODY;
        bool isE164 = false;
        bool isOverriding = false;
        bool isObserved = false;
        bool isAlive = true;
        bool hasEvents = false;
        bool isPending = false;
        bool isPeerToBeChosen = false;
        int module = NOBODY;
        int own = NOBODY;
        int peer = NOBODY;
        Container ownView{};
        Container peerView{};
        Container callView{};
        std::set<unsigned int> marked{};
        LastDial last{};
    };
    struct Module
    {
        bool exists = false;
        bool usesInput = false;
        bool usesOutput = false;
        std::vector<FilterRule> input{};
        std::vector<FilterRule> output{};
        unsigned int answerMode = 2;
        unsigned int cause = 16;
        int held = NOBODY;
        std::array<int, 2> adapters{NOBODY, NOBODY};
        Observers ofEndpoint{};
        Observers ofProvider{};
    };
    struct Context
    {
        bool exists = false;
        unsigned int maxHops = 0;
        std::vector<unsigned int> providers{}; // by their modules
        std::vector<int> calls{};
        Observers observers{};
    };

    explicit Model(Operation const& first);

    /// What the operation gives; whatever is heard is added to `heard`.
    unsigned int carryOut(Operation const& operation);
    /// Whether there was something that is not predicted.
    bool isLost() const { return m_isLost; }

    unsigned int getNumberOfLines() const { return static_cast<unsigned int>(m_modules.size()) * 2; }
    /// -1 for a line without one.
    int adapterOf(unsigned int line) const { return m_modules[line / 2].adapters[line % 2]; }

    std::vector<Leg> m_legs;
    std::vector<Call> m_calls;
    std::vector<Adapter> m_adapters;
    std::vector<Module> m_modules;
    std::array<Context, 3> m_contexts;
    std::array<int, 8> m_guestLegs;
    std::vector<unsigned long long> m_heard;
    unsigned int m_callsAdded = 0;
    unsigned int m_callsRemoved = 0;
    unsigned int m_maxActiveCalls = 0;
    unsigned long long m_callTime = 0;

private:
    enum class Target : unsigned char
    {
        OWN,
        PEER,
        CALL
    };

    // whom an operation means
    unsigned int lineOf(unsigned int index) const { return index % getNumberOfLines(); }
    Module& moduleOf(unsigned int index) { return m_modules[index % m_modules.size()]; }
    int callOf(unsigned int way, unsigned int index) const;
    int anyLegOf(unsigned int way, unsigned int index) const;
    static Container CONTAINER(Properties const& properties);

    // who hears
    void hear(unsigned int who, CallOut what, std::set<unsigned int> const& ids = {});
    void hearGuests(Observers const& observers, CallOut what);
    void hearLine(Adapter const& adapter, CallOut what, std::set<unsigned int> const& ids = {});

    // legs and calls
    int newLeg();
    void removeReference(int leg);
    void giveUp(int leg);
    int newCall(int context);
    void defer(int call);
    void deferred(int call);
    void destroyCall(int call);
    void release(int call);
    void removeAllLegs(int call);
    void pushBack(int call);
    bool hasLiveLeg(int call) const;
    void transfer(int to, int leg);
    void addCallLeg(int call, int leg);
    void addLegObserver(int call, Who who, int index);
    void removeLegObserver(int call, Who who, int index);
    int otherMostActive(int call, int excluded, int preferred) const;
    unsigned int storeOnLeg(int leg, Property const& property, std::set<unsigned int>& changed);
    unsigned int setOnLeg(int leg, Property const& property);
    unsigned int setSeveralOnLeg(int leg, Properties const& properties);
    void tellLeg(int leg, std::set<unsigned int> const& changed);
    void setOnCall(int call, Property const& property);
    void setSeveralOnCall(int call, Properties const& properties);
    void tellCall(int call, std::set<unsigned int> const& changed);
    void deliverService(int leg);

    // adapters
    int newAdapter(int line, int module);
    bool apply(std::vector<FilterRule> const& filters, Container& properties);
    std::vector<FilterRule> const* inputOf(Adapter const& adapter) const;
    std::vector<FilterRule> const* outputOf(Adapter const& adapter) const;
    unsigned int write(int adapter, Target target, Container const& written, bool isOne, bool isFiltered);
    unsigned int writeOne(int adapter, Target target, Property const& property, bool isFiltered = true);
    unsigned int writeThrough(int adapter, Target target, Properties const& properties, bool isOne);
    void updateOwn(int adapter);
    void updatePeer(int adapter, std::set<unsigned int> const* told);
    void updateCall(int adapter);
    bool follow(int adapter, Container& view, Container const& source);
    void mark(int adapter, unsigned int id);
    void post(int adapter);
    bool linkPeer(int adapter);
    void unlinkPeer(int adapter);
    void onLegChanged(int adapter, int leg, std::set<unsigned int> const& changed);
    void onRelinked(int adapter, int leg, int newCall, int oldCall);
    void handle(int adapter);
    void destroyEvents(Adapter& adapter);
    unsigned int dial(int adapter, unsigned int context, unsigned int called, Container const& own,
                      Container const& offered, Container const& ofCall, unsigned long long media);
    unsigned int goOnDialling(int adapter, unsigned int context, unsigned int called, Container const& own,
                              Container const& offered, Container const& ofCall, unsigned long long media);
    unsigned int accept(int adapter, int call, Container const& own);
    bool startOwnLeg(int adapter, Container& properties, int state);
    unsigned int fail(int adapter, unsigned int result);
    void drop(int adapter, int cause, unsigned int value);
    unsigned int transferCalls(int adapter, int other, bool isRemoving);
    unsigned int offer(unsigned int module, int call);
    void reject(unsigned int module, int call, unsigned int cause);
    void service(int adapter, unsigned int which, unsigned int text);
    bool keyIn(int adapter, unsigned int which, unsigned int text);
    int acquire(unsigned int context, unsigned long long media);
    unsigned long long requestMedia();

    // operations
    void turn();
    void settle();
    void advance(unsigned int milliseconds);
    unsigned int dialBy(Operation const& operation);
    unsigned int dialE164(int adapter, Operation const& operation, Container const& own, Container const& offered,
                          Container const& ofCall, unsigned long long media);
    unsigned int setBy(Operation const& operation);
    unsigned int accessor(Operation const& operation);
    void setup(Operation const& operation);
    void observe(Operation const& operation, bool isMore);
    void changeFilters(Operation const& operation);
    void makeModule(unsigned int index);
    void makeAdapter(unsigned int line, unsigned int kind);
    void destroyAdapter(unsigned int line);
    void destroyModule(unsigned int index);
    void answerHeld(Operation const& operation);
    void newGuestLeg(Operation const& operation);
    unsigned int createContext(unsigned int index);
    void destroyContext(unsigned int index);
    unsigned int addProvider(unsigned int context, unsigned int module);
    void removeProvider(unsigned int context, unsigned int module);
    void changeUntold(Operation const& operation);
    unsigned int moveLeg(Operation const& operation);

    Operation const m_first;
    std::vector<int> m_registry; // guests, in the order of their registration
    std::deque<std::pair<Who, int>> m_queue;
    unsigned long long m_lastMedia = 0;
    unsigned long long m_lastGivenMedia = 1000;
    bool m_isMediaFailing = false;
    bool m_hasMedia = true;
    bool m_isLost = false;
};
} // namespace Simulation
