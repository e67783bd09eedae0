#pragma once

#include "platform/base/Export.h"

#include <atomic>
#include <cstdarg>

namespace RTD
{
/// How much a log line matters; a monitor enabled at a level shows the levels up to it.
enum Level : unsigned int
{
    LEVEL_OFF = 0,
    LEVEL_FAILURE = 1, ///< failures
    LEVEL_FLOW = 2,    ///< the normal flow of calls
    LEVEL_CHANGE = 3,  ///< property changes
    LEVEL_NAMING = 4,  ///< renaming
    LEVEL_BULK = 5     ///< bulky values
};

/// Where log lines go. Written by the application (`StreamWriter` is one); must outlive its use by the repository.
class CC_EXPORT Writer
{
public:
    virtual ~Writer() = default;
    /// One line, which may contain line breaks of its own. On the thread that logs; it must not log itself.
    virtual void write(unsigned int monitorId, unsigned int level, char const* text) = 0;
};

/// The log channel of one monitor id and one level, handed out by the repository when both are enabled.
class CC_EXPORT Monitor
{
public:
    /// Writes one line. A line that memory refuses is written as its format alone.
    void debug(char const* format, ...) const __attribute__((format(printf, 2, 3)));

private:
    friend class REPOSITORY;
    unsigned int m_id = 0;
    unsigned int m_level = 0;
};

/// All monitors of the process. Nothing is enabled until the application says so.
///
///     RTD::StreamWriter writer(stderr);
///     RTD::REPOSITORY::SET_WRITER(&writer);
///     RTD::REPOSITORY::ENABLE(41, RTD::LEVEL_FLOW);
///     ...
///     if (auto const* monitor = RTD::REPOSITORY::GET_MONITOR_IF_ENABLED_FOR_LOGGING(41, RTD::LEVEL_FLOW))
///         monitor->debug("[Call %s] over", name.c_str());
class CC_EXPORT REPOSITORY
{
public:
    /// Monitor ids and levels count from 0; those below these numbers exist. @{
    static constexpr unsigned int NUMBER_OF_MONITORS = 64;
    static constexpr unsigned int NUMBER_OF_LEVELS = 6;
    /// @}

    /// The channel when lines of this id and level are wanted, else null; then nothing is to be formatted.
    static Monitor const* GET_MONITOR_IF_ENABLED_FOR_LOGGING(unsigned int id, unsigned int level)
    {
        if (id >= NUMBER_OF_MONITORS || level > s_enabled[id].load(std::memory_order_relaxed)) [[likely]]
            return nullptr;
        return CHANNEL(id, level);
    }

    /// Shows the levels 1 to `level` of the monitor; LEVEL_OFF shows none. An id past the last is ignored.
    static void ENABLE(unsigned int id, unsigned int level);
    /// Null: lines are dropped.
    static void SET_WRITER(Writer* writer);

private:
    friend class Monitor;
    static Monitor const* CHANNEL(unsigned int id, unsigned int level);
    static std::atomic<unsigned char> s_enabled[NUMBER_OF_MONITORS];
    static std::atomic<Writer*> s_writer;
};
} // namespace RTD
