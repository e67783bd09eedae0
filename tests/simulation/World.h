#pragma once

#include "calls/CC_Call.h"
#include "testing/DrivenClock.h"
#include "testing/DrivenLoop.h"
#include "testing/LeakCheck.h"
#include "tests/simulation/CallOut.h"
#include "tests/simulation/Memory.h"
#include "tests/simulation/Operation.h"
#include "tests/simulation/Parties.h"
#include "tests/simulation/Reactions.h"

#include <array>
#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace Simulation
{
class Journal;

/// Everything that takes part in one run: contexts, modules with two lines each, legs that nobody's adapter drives,
/// guests that observe, the media layer, the reboot management and the log. One at a time.
///
/// It is made by the first operation and changed by the others (Interpreter). Its end takes everything back.
class World
{
public:
    static constexpr unsigned int NUMBER_OF_CONTEXTS = 3;
    static constexpr unsigned int MOST_MODULES = 12;
    static constexpr unsigned int LINES_OF_A_MODULE = 2;
    static constexpr unsigned int NUMBER_OF_LEGS = 8;
    static constexpr unsigned int NUMBER_OF_GUESTS = 6;

    explicit World(Operation const& first);
    ~World();
    World(World const&) = delete;
    World& operator=(World const&) = delete;

    /// Somebody's code was called by the library: does what was asked for there. Outside the library nothing happens.
    static void CALL_OUT(CallOut kind)
    {
        if (s_current != nullptr && Memory::IS_IN_LIBRARY() && s_current->m_reactions.isAwaited(kind))
            s_current->strike(kind);
    }
    static World* CURRENT() { return s_current; }

    /// The first failure stays; nothing more is carried out then.
    void fail(std::string const& what);
    bool hasFailed() const { return !m_failure.empty(); }
    std::string const& getFailure() const { return m_failure; }

    /// Something was heard: by whom, what, and a number for what came with it.
    void hear(unsigned int who, CallOut what, unsigned long long with = 0);
    /// A line's module was told of changes, or asked for a service.
    void hearChange(unsigned int line, CC_CallAdapter const* adapter, bool isEmpty, unsigned long long sum);
    void hearService(unsigned int line, CC_CallAdapter const* adapter, unsigned int type);
    static unsigned int WHO_GUEST(unsigned int index) { return index; }
    static unsigned int WHO_LINE(unsigned int index) { return 0x100 + index; }
    static constexpr unsigned int WHO_REBOOT = 0x200;

    static char const* CONTEXT_NAME(unsigned int index);
    /// What a line says of itself: a Call-Leg-ID, which would else be an address, and others.
    static Properties OWN_PROPERTIES(unsigned int line, unsigned int seed);
    static constexpr unsigned int REJECTING_LINE = 0xff; // an endpoint's passing adapter

    // --- whom an operation means -------------------------------------------------------------------------------------

    unsigned int getNumberOfModules() const { return static_cast<unsigned int>(m_modules.size()); }
    Module& module(unsigned int index) { return *m_modules[index % m_modules.size()]; }
    Line& line(unsigned int index);
    unsigned int lineNumber(unsigned int index) const { return index % (getNumberOfModules() * LINES_OF_A_MODULE); }
    CC_CallLeg*& leg(unsigned int index) { return m_legs[index % NUMBER_OF_LEGS]; }
    Guest& guest(unsigned int index) { return *m_guests[index % NUMBER_OF_GUESTS]; }
    /// A call that is certainly alive, or null.
    CC_Call* call(unsigned int way, unsigned int index);
    /// The same for a leg: a guest's or any of a call.
    CC_CallLeg* anyLeg(unsigned int way, unsigned int index);

    // --- what the operations change ----------------------------------------------------------------------------------

    void makeModule(unsigned int index);
    void destroyModule(unsigned int index);
    void makeAdapter(unsigned int line, unsigned int kind);
    void giveUpLeg(unsigned int index);
    bool isBlank(CC_Call const& call) const;
    /// An operation may have run out of memory.
    void noteMemory() { m_wasShortOfMemory = m_wasShortOfMemory || Memory::HAS_FAILED(); }
    /// A guest leg was sent into the call (null: into none), and the library said that this is done, or will be.
    void noteMove(unsigned int leg, CC_Call* to);
    /// Ends everything of the run, so that nothing may be left.
    void takeDown();

    Operation const m_first;
    DrivenClock m_clock;
    DrivenLoop m_loop;
    MediaRepository m_media;
    RebootManagement m_reboot{*this};
    LogWriter m_log;
    Reactions m_reactions;
    std::vector<std::unique_ptr<Module>> m_modules;
    std::array<CC_CallLeg*, NUMBER_OF_LEGS> m_legs{};
    std::array<std::unique_ptr<Guest>, NUMBER_OF_GUESTS> m_guests;
    /// Acquired by an operation and never seen with a leg: nobody has to give them back but their acquirer.
    std::vector<std::unique_ptr<CallWatch>> m_blankCalls;
    std::vector<unsigned long long> m_heard;
    /// Carries the operations [begin, end) of the stream out inside a call-out.
    std::function<void(std::size_t begin, std::size_t end)> m_carryOut;

    /// Where guest legs were sent last since the operation of the stream began; the last that is asked for is made.
    struct Sent
    {
        bool isSent = false;
        bool isIntoCall = false;
        CallWatch to;
    };
    std::array<Sent, NUMBER_OF_LEGS> m_sent;
    bool m_areLegsDisturbed = false; // somebody else moved legs, too
    CC_Call* m_telling = nullptr;    // the call that tells of its end
    CallWatch m_made;                // by a guest, without a context
    CallWatch m_released;            // given back without a leg while somebody held it; it takes none any more

    unsigned int m_depth = 0;        // of call-outs with a reaction
    unsigned int m_strikes = 0;      // reactions so far
    bool m_hasFailingFilter = false; // an input filter that keeps RELEASED from a leg: such a call may stay
    bool m_hasLostContext = false;   // a context was destroyed, maybe with calls
    int m_lostPools = 0;             // destroyed with calls, whose reload lock stays
    bool m_wasShortOfMemory = false;
    bool m_hadInputFilters = false;  // somebody's, at some time
    bool m_hadOutputFilters = false; // the same
    /// An adapter may have chosen its peer by a State that is not the leg's: one that changed while the leg's joining
    /// was told, before the observers of the call's legs hear of that leg; or one that a line wrote into its view of an
    /// ended peer, or of one behind filters.
    bool m_mayPeersBeStale = false;
    unsigned int m_logLevel = 0;
    unsigned int m_lastGivenMedia = 1000; // ids of media contexts that operations bring along
    unsigned long long m_added = 0;       // of the statistics, at the beginning
    unsigned long long m_removed = 0;

private:
    void strike(CallOut kind);
    using Levels = std::vector<std::pair<CC_CallLeg const*, int>>;
    static bool HAVE_RISEN(Levels const& before, Levels const& after);
    Levels getActivityLevels() const;
    void releaseWhatMayStay();

    static World* s_current;
    std::string m_failure;
};
} // namespace Simulation
