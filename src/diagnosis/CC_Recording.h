#pragma once

#include "platform/base/Export.h"
#include "recorder/CC_RecordFormat.h"

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <vector>

/// A recording of call control's recorder (CC_Recorder), read as far as it goes.
///
/// Whatever the octets are, reading ends, and what is whole is there: the file of a process that was killed, one that a
/// process is still writing, one that was cut off, or no recording at all. `getComplaint` says in one line what was not
/// as it should be. Any thread; throws std::bad_alloc when memory is out.
///
///     CC_Recording const recording = CC_Recording::READ_FILE("/var/lib/gateway/calls.ring.previous");
///     for (CC_Recording::Event const& event : recording.getEvents())
///         ...
class CC_EXPORT CC_Recording
{
public:
    /// What an event tells of.
    using Kind = CC_RecordFormat::Kind;

    /// A record with what follows it, taken apart. What its kind does not have is empty.
    struct Event
    {
        CC_RecordFormat::Record record{}; ///< kind, turn, time, serial numbers
        std::uint64_t number = 0;         ///< the other call or leg, the SIP code
        std::string text;                 ///< a name, a class, a reason
        CC_RecordFormat::Brief before;    ///< of a change: the old value
        CC_RecordFormat::Brief after;     ///< the new one
        std::uint64_t by = 0;             ///< the leg whose adapter wrote
        unsigned int filterPlace = 0;     ///< of the filter that made the value different, from 0
        std::string filter;               ///< the name of its class; empty: none did
        std::vector<std::uint32_t> ids;   ///< of the properties that the module was told of
    };

    /// Of a running process: CC_Recorder::GET_IMAGE().
    static CC_Recording READ(std::span<std::byte const> image);
    /// Of a file, also while a process writes it.
    static CC_Recording READ_FILE(char const* path);

    /// From the oldest to the latest.
    std::vector<Event> const& getEvents() const { return m_events; }
    /// Of the whole recording: its beginning in both clocks, the process.
    CC_RecordFormat::Header const& getHeader() const { return m_header; }
    /// Empty when all was as it should be.
    std::string const& getComplaint() const { return m_complaint; }
    /// Nanoseconds since 1970 of an event.
    long long getRealtime(Event const& event) const;

private:
    class Reader;

    std::vector<Event> m_events;
    CC_RecordFormat::Header m_header{};
    std::string m_complaint;
};
