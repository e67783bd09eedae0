#pragma once

#include <cstddef>
#include <cstdint>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

/// What is known of each call whose record is not where it belongs, in a file that is mapped into memory: it is there
/// for the next process when this one is killed, without a system call for each note.
///
///     CallJournal journal("/var/lib/gateway/records/calls.journal");
///     for (CallJournal::Left const& left : journal.getLeft()) // by a process before
///         ...
///     CallJournal::Ticket const ticket = journal.open(1, line);
///     journal.note(ticket, line); // any number
///     journal.close(ticket, 1); // once the record is where it belongs
class CallJournal
{
public:
    using Ticket = std::uint32_t;
    using Owed = std::uint32_t; ///< a bit for each target that is to get the record
    static constexpr Ticket NONE = ~Ticket();

    struct Left
    {
        Ticket ticket;
        Owed owed;
        std::string line;
    };

    /// Throws std::runtime_error when the file cannot be had, is another process's or none of this kind.
    explicit CallJournal(std::string const& file);
    ~CallJournal();
    CallJournal(CallJournal const&) = delete;
    CallJournal& operator=(CallJournal const&) = delete;

    /// In the order in which they were opened, as far as their tickets tell. Before any is opened.
    std::vector<Left> getLeft() const;
    /// NONE: the line is too long, or the disk has no room. On the thread of call control, as `note`.
    Ticket open(Owed owed, std::string_view line);
    /// What is too long leaves it as it was.
    void note(Ticket ticket, std::string_view line);
    /// Those targets have it, or never will; nothing for NONE. Any thread.
    void close(Ticket ticket, Owed owed);

private:
    struct Slot;

    void addChunk(bool isThere);
    Slot& getSlot(Ticket ticket) const;

    int m_descriptor;
    std::vector<Slot*> m_chunks; // mapped; only the thread of call control adds to them
    mutable std::mutex m_mutex;  // of the next, and of the one above as it grows
    std::vector<Ticket> m_free;  // the last is taken first
};
