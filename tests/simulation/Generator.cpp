#include "tests/simulation/Generator.h"

#include "tests/simulation/CallOut.h"

#include <iterator>

namespace Simulation
{
namespace
{
/// Sebastiano Vigna's splitmix64: small, and the same everywhere.
class Random
{
public:
    explicit Random(std::uint64_t seed) : m_state(seed * 0x9e3779b97f4a7c15 + 0x1234567) {}
    std::uint64_t next()
    {
        std::uint64_t z = (m_state += 0x9e3779b97f4a7c15);
        z = (z ^ (z >> 30)) * 0xbf58476d1ce4e5b9;
        z = (z ^ (z >> 27)) * 0x94d049bb133111eb;
        return z ^ (z >> 31);
    }
    unsigned int below(unsigned int bound) { return static_cast<unsigned int>((next() >> 16) % bound); }
    bool isOneIn(unsigned int number) { return below(number) == 0; }

private:
    std::uint64_t m_state;
};

struct Weight
{
    Code code;
    unsigned int calm;
    unsigned int hostile;
};

constexpr Weight WEIGHTS[] = {
    {Code::TURN, 60, 50},
    {Code::SETTLE, 30, 30},
    {Code::ADVANCE_CLOCK, 6, 2},
    {Code::DIAL, 80, 80},
    {Code::ACCEPT, 24, 24},
    {Code::REJECT, 6, 6},
    {Code::ANSWER_MODE, 10, 8},
    {Code::BECOME, 80, 60},
    {Code::SET_OWN, 40, 40},
    {Code::SET_PEER, 20, 20},
    {Code::SET_CALL, 20, 20},
    {Code::SERVICE, 24, 16},
    {Code::TRANSFER, 24, 24},
    {Code::DROP, 50, 40},
    {Code::CLEANUP, 4, 6},
    {Code::SETUP, 8, 8},
    {Code::DESTROY_ADAPTER, 4, 8},
    {Code::MAKE_ADAPTER, 8, 14},
    {Code::ACQUIRE, 6, 6},
    {Code::RELEASE, 4, 6},
    {Code::DROP_CALLS, 3, 4},
    {Code::NEW_LEG, 16, 16},
    {Code::ADD_LEG, 16, 16},
    {Code::MOVE_LEG, 10, 10},
    {Code::REMOVE_LEG, 6, 6},
    {Code::SET_LEG, 24, 20},
    {Code::GIVE_UP_LEG, 10, 10},
    {Code::LEG_SERVICE, 4, 4},
    {Code::SET_ON_CALL, 8, 8},
    {Code::EMPTY_CALL, 2, 3},
    {Code::CLEAN_UP_CALL, 3, 5},
    {Code::CREATE_CONTEXT, 4, 5},
    {Code::DESTROY_CONTEXT, 2, 3},
    {Code::ADD_PROVIDER, 6, 6},
    {Code::REMOVE_PROVIDER, 3, 3},
    {Code::DESTROY_MODULE, 2, 3},
    {Code::MAKE_MODULE, 4, 6},
    {Code::CHANGE_FILTERS, 14, 14},
    {Code::USE_FILTERS, 8, 6},
    {Code::OBSERVE, 24, 40},
    {Code::STOP_OBSERVING, 8, 8},
    {Code::WHEN, 0, 80},
    {Code::FAIL_ALLOCATION, 0, 0}, // in runs of their own
    {Code::OTHER_THREAD, 1, 1},
    {Code::MEDIA_MODE, 2, 2},
    {Code::REBOOT_MODE, 1, 1},
    {Code::LOG_LEVEL, 2, 4},
    {Code::DUMP, 2, 8},
    {Code::READ, 6, 8},
    {Code::RESET_STATISTICS, 1, 1},
    {Code::SET_NAME, 2, 2},
    {Code::SET_DATAPATH, 4, 6},
    {Code::OFFER, 6, 6},
    {Code::ANSWER_HELD, 8, 8},
    {Code::NEW_CALL, 3, 3},
    {Code::CHANGE_UNTOLD, 4, 4},
    {Code::ACCESSOR, 10, 6},
    {Code::KEEP_BLOCKS, 1, 0},
    {Code::SET_OPTIONS, 1, 1},
};

class Generator
{
public:
    explicit Generator(std::uint64_t seed)
        : m_random(seed), m_isHostile(seed % 2 != 0), m_isShort(seed % 16 == 5), m_isNarrow(seed % 4 > 1)
    {
    }

    Operations generate()
    {
        unsigned int const length = 20 + m_random.below(m_random.isOneIn(4) ? 400 : 120);
        Operations operations{world()};
        while (operations.size() < length)
            if (m_isHostile && m_random.isOneIn(24))
                sendOnTheWay(operations);
            else if (m_isHostile && m_random.isOneIn(8))
                strikeInside(operations);
            else if (m_isHostile && m_random.isOneIn(80))
                strikeARelease(operations);
            else if (m_isHostile && m_random.isOneIn(80))
                resetInside(operations);
            else if (m_isHostile && m_random.isOneIn(80))
                dialInsideAProperty(operations);
            else if (m_isHostile && m_random.isOneIn(80))
                changeOnTheWayIn(operations);
            else if (m_isHostile && m_random.isOneIn(80))
                comeTooLate(operations);
            else if (m_isHostile && operations.front()[5] != 0 && m_random.isOneIn(80))
                dropInsideAFilter(operations);
            else if (m_random.isOneIn(80))
                leaveToTheCall(operations);
            else if (m_random.isOneIn(40))
                keyIn(operations);
            else
                operations.push_back(next());
        return operations;
    }

private:
    Operation world()
    {
        Operation operation = filled(Code::WORLD);
        if (!m_random.isOneIn(6))
            operation.arguments[0] = static_cast<std::uint8_t>(m_random.below(4)); // few, so that they meet
        if (m_random.isOneIn(2))
            operation.arguments[5] = 0; // without filters
        return operation;
    }
    /// A leg that is sent elsewhere while it is on its way.
    void sendOnTheWay(Operations& operations)
    {
        static constexpr CallOut PLACES[] = {CallOut::LEG_ADDED, CallOut::LEG_REMOVED, CallOut::LEG_RELINKED,
                                             CallOut::LEG_CHANGED};
        Operation when = filled(Code::WHEN);
        when.arguments[0] = static_cast<std::uint8_t>(PLACES[m_random.below(std::size(PLACES))]);
        when.arguments[1] = static_cast<std::uint8_t>(m_random.below(2));
        when.arguments[2] = static_cast<std::uint8_t>(m_random.below(2));
        auto const leg = static_cast<std::uint8_t>(m_random.below(3));
        operations.push_back(filled(Code::OBSERVE));
        operations.back().arguments[1] = static_cast<std::uint8_t>(m_random.below(3));
        operations.push_back(filled(Code::NEW_LEG));
        operations.back().arguments[0] = leg;
        operations.push_back(when);
        for (int i = 0; i < 4; ++i)
        {
            operations.push_back(filled(m_random.isOneIn(3) ? Code::ADD_LEG : Code::MOVE_LEG));
            operations.back().arguments[0] = leg;
        }
    }
    /// A call that is given back ends, or its context does, while its context tells of it.
    void strikeARelease(Operations& operations)
    {
        auto const guest = static_cast<std::uint8_t>(m_random.below(6));
        std::uint8_t const context = m_random.isOneIn(2) ? 0 : static_cast<std::uint8_t>(m_random.below(3));
        Operation const release{Code::RELEASE, {context, 0}};
        operations.push_back({Code::CREATE_CONTEXT, {context}});
        operations.push_back({Code::OBSERVE, {guest, 3, context}});
        operations.push_back({Code::ACQUIRE, {context, static_cast<std::uint8_t>(m_random.below(8))}});
        operations.push_back({Code::WHEN, {static_cast<std::uint8_t>(CallOut::CALL_RELEASED), 0, 1}});
        operations.push_back(m_random.isOneIn(2) ? release : Operation{Code::DESTROY_CONTEXT, {context}});
        operations.push_back(release);
    }
    /// A line that is being reset is set up again and dials while it gives its leg up.
    void resetInside(Operations& operations)
    {
        static constexpr CallOut PLACES[] = {CallOut::LEG_CHANGED, CallOut::LEG_REMOVED,  CallOut::CALL_CHANGED,
                                             CallOut::LOG_LINE,    CallOut::INPUT_FILTER, CallOut::ADAPTER_DROP};
        auto const line = static_cast<std::uint8_t>(m_random.below(4));
        Operation const dial = dialBy(line);
        CallOut const place = m_random.isOneIn(2) ? CallOut::LEG_CHANGED : PLACES[m_random.below(std::size(PLACES))];
        operations.push_back(dial);
        operations.push_back({Code::OBSERVE, {1, 2, 2, line}}); // the legs of its call
        operations.push_back(
            {Code::WHEN, {static_cast<std::uint8_t>(place), static_cast<std::uint8_t>(m_random.below(3)), 1}});
        operations.push_back({m_random.isOneIn(2) ? Code::SETUP : Code::CLEANUP, {line}});
        operations.push_back(dial);
        operations.push_back({m_random.isOneIn(2) ? Code::SETUP : Code::CLEANUP, {line}});
    }
    /// A line drops and dials anew inside what a property of a module's class does when it is written.
    void dialInsideAProperty(Operations& operations)
    {
        static constexpr CallOut PLACES[] = {CallOut::PROPERTY_CLONE, CallOut::PROPERTY_ASSIGN,
                                             CallOut::PROPERTY_COMPARE, CallOut::PROPERTY_END};
        static constexpr Code WRITES[] = {Code::SET_OWN, Code::SET_PEER, Code::SET_CALL};
        constexpr std::uint8_t ACTING = 40; // row 30
        auto const line = static_cast<std::uint8_t>(m_random.below(4));
        Code const write = WRITES[m_random.below(std::size(WRITES))];
        CallOut const place = PLACES[m_random.below(std::size(PLACES))];
        operations.push_back(dialBy(line));
        if (place != CallOut::PROPERTY_CLONE || m_random.isOneIn(2))
            operations.push_back({write, {line, ACTING, 0}});
        operations.push_back(
            {Code::WHEN, {static_cast<std::uint8_t>(place), static_cast<std::uint8_t>(m_random.below(6)), 1}});
        operations.push_back({Code::DROP, {line}});
        operations.push_back(dialBy(line));
        operations.push_back({write, {line, ACTING, 1}});
        operations.push_back({Code::SETTLE});
    }
    /// A leg changes after it has joined a call and before all hear of it who are going to.
    void changeOnTheWayIn(Operations& operations)
    {
        constexpr std::uint8_t STATE = 3;
        constexpr std::uint8_t CONNECTED = 8;
        auto const leg = static_cast<std::uint8_t>(m_random.below(3));
        auto const line = static_cast<std::uint8_t>(m_random.below(4));
        auto const guest = static_cast<std::uint8_t>(m_random.below(6));
        operations.push_back(dialBy(line));
        operations.push_back({Code::TURN});
        operations.push_back({Code::NEW_LEG, {leg, 1, CONNECTED}});
        operations.push_back({Code::OBSERVE, {guest, 0, 2, line}}); // its call
        operations.push_back({Code::OBSERVE, {static_cast<std::uint8_t>(m_random.below(6)), 2, 0, leg}});
        operations.push_back({Code::WHEN, {static_cast<std::uint8_t>(CallOut::LEG_ADDED), 0, 0}});
        operations.push_back({Code::SET_LEG, {leg, STATE, static_cast<std::uint8_t>(m_random.below(6))}});
        if (m_random.isOneIn(2))
        {
            operations.push_back({Code::WHEN, {static_cast<std::uint8_t>(CallOut::LEG_RELINKED), 0, 0}});
            operations.push_back({Code::SET_LEG, {leg, static_cast<std::uint8_t>(m_random.below(3)), m_last}});
        }
        operations.push_back({Code::ADD_LEG, {leg, 2, line}});
        operations.push_back({Code::SETTLE});
    }
    /// A leg is to come into a call that is given back meanwhile, or back into one that ends, or leaves one.
    void comeTooLate(Operations& operations)
    {
        constexpr std::uint8_t THAT_TELLS_OF_ITS_END = 7;
        auto const leg = static_cast<std::uint8_t>(m_random.below(4));
        auto const guest = static_cast<std::uint8_t>(2 * m_random.below(3)); // who observes legs one by one
        auto const call = static_cast<std::uint8_t>(m_random.below(3));
        operations.push_back({Code::NEW_LEG, {leg, 1, static_cast<std::uint8_t>(m_random.below(9))}});
        if (m_random.isOneIn(2))
        {
            operations.push_back({Code::NEW_CALL, {leg}});
            operations.push_back({Code::OBSERVE, {guest, 0, 3, leg}});
            operations.push_back({Code::WHEN, {static_cast<std::uint8_t>(CallOut::CALL_ENDED), 0, 0}});
            operations.push_back({Code::ADD_LEG, {leg, THAT_TELLS_OF_ITS_END}});
            operations.push_back({Code::NEW_CALL, {leg, 1}}); // which ends it
            return;
        }
        auto const inContext = static_cast<std::uint8_t>(3 * call);
        bool const isLeaving = m_random.isOneIn(2);
        operations.push_back({Code::ACQUIRE, {0}});
        operations.push_back({Code::ACQUIRE, {0}});
        if (isLeaving)
        {
            operations.push_back({Code::ADD_LEG, {leg, 0, inContext}});
            operations.push_back({Code::OBSERVE, {guest, 0, 0, inContext}});
            operations.push_back({Code::WHEN, {static_cast<std::uint8_t>(CallOut::LEG_REMOVED), 0, 0}});
        }
        else
        {
            operations.push_back({Code::OBSERVE, {guest, 2, 0, leg}});
            operations.push_back({Code::WHEN, {static_cast<std::uint8_t>(CallOut::LEG_RELINKED), 0, 1}});
            operations.push_back({Code::MOVE_LEG, {leg, 0, inContext}});
        }
        operations.push_back({Code::RELEASE, {0, call}});
        operations.push_back({Code::ADD_LEG, {leg, 0, static_cast<std::uint8_t>(3 * m_random.below(3))}});
    }
    /// A line goes while a filter looks at what it is to see, or at what it writes.
    void dropInsideAFilter(Operations& operations)
    {
        static constexpr Code ENDS[] = {Code::DROP, Code::CLEANUP, Code::DESTROY_ADAPTER};
        auto const line = static_cast<std::uint8_t>(m_random.below(4));
        auto const module = static_cast<std::uint8_t>(line / 2);
        auto const isOutput = static_cast<std::uint8_t>(m_random.below(2));
        CallOut const place = isOutput != 0 ? CallOut::OUTPUT_FILTER : CallOut::INPUT_FILTER;
        operations.push_back({Code::USE_FILTERS, {module, isOutput, 1}});
        operations.push_back({Code::CHANGE_FILTERS, {module, isOutput}});
        operations.push_back(dialBy(line));
        operations.push_back(
            {Code::WHEN, {static_cast<std::uint8_t>(place), static_cast<std::uint8_t>(m_random.below(4)), 1}});
        operations.push_back({m_random.isOneIn(2) ? Code::EMPTY_CALL : Code::OBSERVE, {2, line}});
        operations.push_back({ENDS[m_random.below(std::size(ENDS))], {line}});
        operations.push_back({Code::SET_OWN, {line, 0, 1}});
        operations.push_back({Code::SET_ON_CALL, {2, line}});
        operations.push_back({Code::SETTLE});
    }
    Operation dialBy(std::uint8_t line)
    {
        Operation dial = filled(Code::DIAL);
        dial.arguments[0] = line;
        return dial;
    }
    /// A live leg that nobody holds but its call, which then looks after itself.
    void leaveToTheCall(Operations& operations)
    {
        auto const leg = static_cast<std::uint8_t>(m_random.below(8));
        operations.push_back({Code::NEW_LEG, {leg}});
        Operation add = filled(Code::ADD_LEG);
        add.arguments[0] = leg;
        operations.push_back(add);
        operations.push_back({Code::SET_LEG, {leg, 0, static_cast<std::uint8_t>(m_random.below(9))}});
        operations.push_back({Code::CLEAN_UP_CALL, {add.arguments[1], add.arguments[2], 3}});
        operations.push_back({Code::GIVE_UP_LEG, {leg}});
        operations.push_back(filled(m_random.isOneIn(2) ? Code::CLEAN_UP_CALL : Code::DROP));
        operations.push_back(filled(Code::TURN));
    }
    /// Digits for a callee that wants the number en bloc and has not enough of it.
    void keyIn(Operations& operations)
    {
        auto const caller = static_cast<std::uint8_t>(m_random.below(4));
        auto const callee = static_cast<std::uint8_t>(m_random.below(2));
        auto const line = static_cast<std::uint8_t>(2 * callee + m_random.below(2));
        auto const media = static_cast<std::uint8_t>(m_random.below(8));
        operations.push_back({Code::DIAL, {caller, callee, 0, 0, 0, media, 2}});
        operations.push_back({Code::SET_OWN, {line, 29, 0}}); // Supports Overlap-Receiving: false
        operations.push_back({Code::BECOME, {line, 4}});      // ADDRESS_INCOMPLETE
        operations.push_back({Code::SERVICE, {caller, 0, static_cast<std::uint8_t>(m_random.below(12))}});
    }
    /// Something is done to somebody inside what is done to the same, and now and then something inside that again.
    void strikeInside(Operations& operations)
    {
        static constexpr Code OUTSIDE[] = {
            Code::SET_LEG,      Code::SET_OWN,      Code::SET_PEER, Code::SET_CALL, Code::BECOME,  Code::DIAL,
            Code::ACCEPT,       Code::DROP,         Code::ADD_LEG,  Code::SERVICE,  Code::SETUP,   Code::LEG_SERVICE,
            Code::SET_DATAPATH, Code::SET_ON_CALL,  Code::TRANSFER, Code::CLEANUP,  Code::ACQUIRE, Code::RELEASE,
            Code::DROP_CALLS,   Code::ADD_PROVIDER, Code::OFFER,    Code::MOVE_LEG};
        auto const whom = static_cast<std::uint8_t>(m_random.below(3));
        operations.push_back(filled(Code::OBSERVE));
        operations.back().arguments[1] = static_cast<std::uint8_t>(m_random.below(3));
        announceStrike(operations, whom, m_random.isOneIn(3) ? 1 + m_random.below(2) : 0);
        operations.push_back(doneTo(whom, OUTSIDE[m_random.below(std::size(OUTSIDE))]));
    }
    void announceStrike(Operations& operations, std::uint8_t whom, unsigned int depth)
    {
        static constexpr Code INSIDE[] = {
            Code::GIVE_UP_LEG, Code::MOVE_LEG,        Code::SET_LEG,    Code::DROP,          Code::DESTROY_ADAPTER,
            Code::CLEANUP,     Code::SETUP,           Code::DIAL,       Code::RELEASE,       Code::DESTROY_CONTEXT,
            Code::EMPTY_CALL,  Code::CLEAN_UP_CALL,   Code::TRANSFER,   Code::OBSERVE,       Code::STOP_OBSERVING,
            Code::BECOME,      Code::REMOVE_PROVIDER, Code::DROP_CALLS, Code::DESTROY_MODULE};
        std::size_t const when = operations.size();
        operations.push_back(filled(Code::WHEN));
        if (depth > 0)
            announceStrike(operations, whom, depth - 1);
        operations.push_back(doneTo(whom, INSIDE[m_random.below(std::size(INSIDE))]));
        operations[when].arguments[1] = static_cast<std::uint8_t>(m_random.below(3));
        operations[when].arguments[2] = static_cast<std::uint8_t>(operations.size() - when - 2);
    }
    Operation doneTo(std::uint8_t whom, Code code)
    {
        Operation operation = filled(code);
        bool const isOfContext =
            code == Code::RELEASE || code == Code::DESTROY_CONTEXT || code == Code::DROP_CALLS || code == Code::ACQUIRE;
        if (!isOfContext && code != Code::SET_ON_CALL && code != Code::EMPTY_CALL && code != Code::CLEAN_UP_CALL)
            operation.arguments[0] = whom;
        return operation;
    }
    Operation filled(Code code)
    {
        Operation operation;
        operation.code = code;
        for (std::uint8_t& argument : operation.arguments)
            argument = static_cast<std::uint8_t>(m_random.below(256));
        if (!m_random.isOneIn(4))
            aim(operation);
        return operation;
    }
    /// At the first context, which is always there, and its calls.
    void aim(Operation& operation)
    {
        switch (operation.code)
        {
        case Code::DIAL:
            operation.arguments[2] = 0;
            break;
        case Code::ACQUIRE:
        case Code::RELEASE:
        case Code::DROP_CALLS:
        case Code::CREATE_CONTEXT:
        case Code::DESTROY_CONTEXT:
            operation.arguments[0] = 0;
            break;
        case Code::SET_ON_CALL:
        case Code::EMPTY_CALL:
        case Code::CLEAN_UP_CALL:
            return aimAtCall(operation, 0);
        case Code::ACCEPT:
        case Code::REJECT:
        case Code::OFFER:
        case Code::ADD_LEG:
        case Code::MOVE_LEG:
        case Code::REMOVE_LEG:
            return aimAtCall(operation, 1);
        case Code::OBSERVE:
        case Code::STOP_OBSERVING:
            return aimAtCall(operation, 2);
        default:
            break;
        }
    }
    void aimAtCall(Operation& operation, std::size_t way)
    {
        operation.arguments[way] = static_cast<std::uint8_t>(operation[way] & ~3U);
        operation.arguments[way + 1] = static_cast<std::uint8_t>(3 * m_random.below(4));
    }
    Operation next()
    {
        if (m_isShort && m_random.isOneIn(12))
        {
            Operation failing = filled(Code::FAIL_ALLOCATION);
            failing.arguments[0] = static_cast<std::uint8_t>(m_random.below(m_random.isOneIn(3) ? 120 : 20));
            return failing;
        }
        Operation operation = filled(chooseCode());
        if (operation.code == Code::WHEN)
            operation.arguments[1] = static_cast<std::uint8_t>(m_random.below(m_random.isOneIn(3) ? 16 : 3));
        if (operation.code == Code::BECOME && m_random.isOneIn(2))
            operation.arguments[1] = static_cast<std::uint8_t>(6 + m_random.below(3)); // up
        if (operation.code == Code::MAKE_ADAPTER && m_random.isOneIn(2))
            operation.arguments[0] = m_random.isOneIn(2) ? m_last : operation.arguments[0];
        if (m_random.isOneIn(3))
            operation.arguments[0] = m_last; // somebody does several things
        if (m_isNarrow && operation.code != Code::WHEN)
            operation.arguments[0] %= 4; // few do everything
        m_last = operation.arguments[0];
        return operation;
    }
    Code chooseCode()
    {
        unsigned int sum = 0;
        for (Weight const& weight : WEIGHTS)
            sum += m_isHostile ? weight.hostile : weight.calm;
        unsigned int chosen = m_random.below(sum);
        for (Weight const& weight : WEIGHTS)
        {
            unsigned int const own = m_isHostile ? weight.hostile : weight.calm;
            if (chosen < own)
                return weight.code;
            chosen -= own;
        }
        return Code::TURN;
    }

    Random m_random;
    bool const m_isHostile;
    bool const m_isShort; // of memory
    bool const m_isNarrow;
    std::uint8_t m_last = 0;
};
} // namespace

Operations GENERATE(std::uint64_t seed) { return Generator(seed).generate(); }
} // namespace Simulation
