#pragma once

#include <atomic>
#include <cstddef>
#include <string_view>
#include <vector>

/// Lines of records that somebody else keeps.
using RecordLines = std::vector<std::string_view>;

/// Where records of calls go. All but the counters is for the thread of its RecordWriter.
class RecordTarget
{
public:
    struct Counters
    {
        unsigned long long written = 0;
        unsigned long long spooled = 0; ///< that wait on the disk
    };

    RecordTarget() = default;
    RecordTarget(RecordTarget const&) = delete;
    RecordTarget& operator=(RecordTarget const&) = delete;
    virtual ~RecordTarget() = default;

    /// Takes the first ones of the lines, and tells how many: it takes no more for now. Throws std::bad_alloc.
    virtual std::size_t take(RecordLines const& lines) = 0;
    /// Goes on with what it has taken and not delivered yet; false: that is to be tried again. Throws std::bad_alloc.
    virtual bool deliver() { return true; }
    /// Somebody has moved its file away.
    virtual void reopen() {}

    Counters getCounters() const { return {m_written, m_spooled}; } ///< any thread

protected:
    std::atomic<unsigned long long> m_written = 0;
    std::atomic<unsigned long long> m_spooled = 0;
};
