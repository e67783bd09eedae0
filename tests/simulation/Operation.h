#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace Simulation
{
/// What can be done to call control and by its users. The numbers are what a file of octets holds: append, never
/// insert.
enum class Code : std::uint8_t
{
    WORLD, // only as the first operation; elsewhere it does nothing
    TURN,
    SETTLE,
    ADVANCE_CLOCK,
    DIAL,
    ACCEPT,
    REJECT,
    ANSWER_MODE,
    BECOME,
    SET_OWN,
    SET_PEER,
    SET_CALL,
    SERVICE,
    TRANSFER,
    DROP,
    CLEANUP,
    SETUP,
    DESTROY_ADAPTER,
    MAKE_ADAPTER,
    ACQUIRE,
    RELEASE,
    DROP_CALLS,
    NEW_LEG,
    ADD_LEG,
    MOVE_LEG,
    REMOVE_LEG,
    SET_LEG,
    GIVE_UP_LEG,
    LEG_SERVICE,
    SET_ON_CALL,
    EMPTY_CALL,
    CLEAN_UP_CALL,
    CREATE_CONTEXT,
    DESTROY_CONTEXT,
    ADD_PROVIDER,
    REMOVE_PROVIDER,
    DESTROY_MODULE,
    MAKE_MODULE,
    CHANGE_FILTERS,
    USE_FILTERS,
    OBSERVE,
    STOP_OBSERVING,
    WHEN,
    FAIL_ALLOCATION,
    OTHER_THREAD,
    MEDIA_MODE,
    REBOOT_MODE,
    LOG_LEVEL,
    DUMP,
    READ,
    RESET_STATISTICS,
    SET_NAME,
    SET_DATAPATH,
    OFFER,
    ANSWER_HELD,
    NEW_CALL,
    CHANGE_UNTOLD,
    ACCESSOR,
    KEEP_BLOCKS,
    SET_OPTIONS,
    NUMBER_OF_CODES
};

/// One operation: a code and arguments of which every value is valid (each is taken modulo what there is to choose
/// from), so that any string of octets is a run and stays one when octets are taken out or changed.
struct Operation
{
    static constexpr std::size_t SIZE = 8;
    static constexpr std::size_t NUMBER_OF_ARGUMENTS = SIZE - 1;

    Code code = Code::WORLD;
    std::array<std::uint8_t, NUMBER_OF_ARGUMENTS> arguments{};

    unsigned int operator[](std::size_t index) const { return arguments[index]; }
    friend bool operator==(Operation const&, Operation const&) = default;
};

/// Of `when`: the call-outs that are let pass, and the operations that are carried out inside.
constexpr unsigned int MOST_OTHERS = 64;
constexpr unsigned int MOST_INSIDE = 8;

using Operations = std::vector<Operation>;

Operations FROM_OCTETS(std::uint8_t const* octets, std::size_t size);
std::vector<std::uint8_t> TO_OCTETS(Operations const& operations);

/// One line: the name, the arguments up to the last that is not 0, and what it means as a comment.
std::string TO_LINE(Operation const& operation);
/// The lines of a file that can be reviewed and run again; `remarks` stand above, each line of them behind a "#".
std::string TO_TEXT(Operations const& operations, std::string const& remarks);
/// Reads what TO_TEXT wrote; whether every line was understood, otherwise `error` tells which one was not.
bool FROM_TEXT(std::string const& text, Operations& operations, std::string& error);

char const* NAME_OF(Code code);
} // namespace Simulation
