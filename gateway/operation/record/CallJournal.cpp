#include "operation/record/CallJournal.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <stdexcept>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

namespace
{
constexpr std::size_t SLOT = 4096; // octets
constexpr std::uint32_t IN_CHUNK = 1024;
constexpr off_t CHUNK = static_cast<off_t>(SLOT) * IN_CHUNK;

[[noreturn]] void REFUSE_JOURNAL(int descriptor, std::string const& reason)
{
    if (descriptor >= 0)
        close(descriptor);
    throw std::runtime_error(reason);
}

int OPEN_JOURNAL(std::string const& file)
{
    int const descriptor = open(file.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOCTTY, 0640);
    struct flock whole = {};
    whole.l_type = F_WRLCK; // of the process: a copy of it does not have it
    whole.l_whence = SEEK_SET;
    struct stat status = {};
    if (descriptor < 0 || fstat(descriptor, &status) != 0)
        REFUSE_JOURNAL(descriptor, file + " cannot be opened: " + std::strerror(errno));
    if (fcntl(descriptor, F_SETLK, &whole) != 0)
        REFUSE_JOURNAL(descriptor, "another process has " + file);
    if (status.st_size % CHUNK != 0)
        REFUSE_JOURNAL(descriptor, file + " is no journal of calls");
    return descriptor;
}
} // namespace

/// Two texts, of which the one that is not valid is written: a process may be killed in the midst of it.
struct CallJournal::Slot
{
    struct Text
    {
        std::uint32_t size;
        std::array<char, SLOT / 2 - 8> octets;

        std::string_view get() const { return {octets.data(), std::min<std::size_t>(size, octets.size())}; }
    };
    std::atomic<Owed> owed;
    std::atomic<std::uint32_t> valid; // 0 or 1
    std::array<Text, 2> texts;

    bool write(std::string_view line)
    {
        std::uint32_t const next = (valid + 1) % 2;
        if (line.size() > texts[next].octets.size())
            return false;
        texts[next].size = static_cast<std::uint32_t>(line.size());
        std::copy(line.begin(), line.end(), texts[next].octets.begin());
        valid = next;
        return true;
    }
};

CallJournal::CallJournal(std::string const& file) : m_descriptor(OPEN_JOURNAL(file))
{
    static_assert(sizeof(Slot) == SLOT && std::atomic<Owed>::is_always_lock_free);
    struct stat status = {};
    fstat(m_descriptor, &status);
    for (off_t i = 0; i < status.st_size / CHUNK; ++i)
        addChunk(true);
    if (m_chunks.empty())
        addChunk(false);
    if (m_chunks.empty())
        REFUSE_JOURNAL(m_descriptor, "there is no room for " + file);
}

CallJournal::~CallJournal()
{
    for (Slot* const chunk : m_chunks)
        munmap(chunk, static_cast<std::size_t>(CHUNK));
    ::close(m_descriptor);
}

/// Memory behind which there is no disk would kill the process as it is written: so the disk comes first.
void CallJournal::addChunk(bool isThere)
{
    auto const begin = static_cast<off_t>(m_chunks.size()) * CHUNK;
    if (!isThere && posix_fallocate(m_descriptor, begin, CHUNK) != 0)
        return;
    void* const memory =
        mmap(nullptr, static_cast<std::size_t>(CHUNK), PROT_READ | PROT_WRITE, MAP_SHARED, m_descriptor, begin);
    if (memory == MAP_FAILED)
        return;
    auto* const slots = static_cast<Slot*>(memory);
    auto const first = static_cast<Ticket>(m_chunks.size() * IN_CHUNK);
    m_chunks.push_back(slots);
    for (std::uint32_t i = IN_CHUNK; i-- > 0;)
        if (slots[i].owed == 0)
            m_free.push_back(first + i);
}

CallJournal::Slot& CallJournal::getSlot(Ticket ticket) const { return m_chunks[ticket / IN_CHUNK][ticket % IN_CHUNK]; }

std::vector<CallJournal::Left> CallJournal::getLeft() const
{
    std::vector<Left> left;
    for (Ticket ticket = 0; ticket < m_chunks.size() * IN_CHUNK; ++ticket)
        if (Slot const& slot = getSlot(ticket); slot.owed != 0)
            left.push_back({ticket, slot.owed, std::string(slot.texts[slot.valid % 2].get())});
    return left;
}

CallJournal::Ticket CallJournal::open(Owed owed, std::string_view line)
{
    std::lock_guard const lock(m_mutex);
    if (m_free.empty())
        addChunk(false);
    if (m_free.empty() || !getSlot(m_free.back()).write(line))
        return NONE;
    Ticket const ticket = m_free.back();
    m_free.pop_back();
    getSlot(ticket).owed = owed; // from here on it counts
    return ticket;
}

void CallJournal::note(Ticket ticket, std::string_view line) { getSlot(ticket).write(line); }

void CallJournal::close(Ticket ticket, Owed owed)
{
    if (ticket == NONE)
        return;
    std::lock_guard const lock(m_mutex);
    Slot& slot = getSlot(ticket);
    if (Owed const before = slot.owed.fetch_and(~owed); before != 0 && slot.owed == 0)
        m_free.push_back(ticket);
}
