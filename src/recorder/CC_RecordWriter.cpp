// The ring. What could go wrong: the process ends inside a record, or the oldest record is overwritten while its place
// still counts as a record. So `tail` moves off what is going to be overwritten before the first octet is, and `head`
// behind a record after its last; both are stores that the compiler may not move, and whoever reads the file after the
// process's end sees all that it stored.
#include "recorder/CC_RecordWriter.h"

#include "platform/base/TYTime.h"
#include "recorder/CC_FilterNotes.h"

#include <algorithm>
#include <atomic>
#include <new>
#include <unistd.h>
#include <utility>

using namespace CC_RecordFormat;

CC_RecordWriter* CC_RecordWriter::s_on = nullptr;

namespace
{
constexpr long long NANOSECONDS_IN_SECOND = 1000000000;

long long NANOSECONDS(TY::Time::Source source)
{
    TY::Time const now = TY::Time::NOW(source);
    return now.seconds * NANOSECONDS_IN_SECOND + now.nanoseconds;
}

void PUBLISH(std::uint64_t& position, std::uint64_t value)
{
    std::atomic_ref(position).store(value, std::memory_order_release);
}

std::size_t ALIGNED(std::size_t size) { return (size + ALIGNMENT - 1) / ALIGNMENT * ALIGNMENT; }
} // namespace

CC_RecordWriter& CC_RecordWriter::INSTANCE()
{
    static constinit CC_RecordWriter s_instance;
    return s_instance;
}

void CC_RecordWriter::start(void* image, std::size_t size)
{
    m_size = size;
    m_capacity = (size - sizeof(Header)) / ALIGNMENT * ALIGNMENT;
    m_head = m_tail = m_offset = 0;
    m_header = new (image) Header{};
    m_header->version = VERSION;
    m_header->byteOrder = BYTE_ORDER_MARK;
    m_header->capacity = m_capacity;
    m_header->monotonic = NANOSECONDS(TY::Time::MONOTONIC);
    m_header->realtime = NANOSECONDS(TY::Time::REALTIME);
    m_header->process = static_cast<std::uint64_t>(getpid());
    std::copy(std::begin(MAGIC), std::end(MAGIC), m_header->magic);
    m_ring = static_cast<char*>(image) + sizeof(Header);
    s_on = this;
}

void* CC_RecordWriter::stop()
{
    s_on = nullptr;
    return std::exchange(m_header, nullptr);
}

std::span<std::byte const> CC_RecordWriter::getImage() const
{
    return {reinterpret_cast<std::byte const*>(m_header), m_header != nullptr ? m_size : 0};
}

Record& CC_RecordWriter::at(std::uint64_t position) const
{
    return *reinterpret_cast<Record*>(m_ring + position % m_capacity);
}

/// Begins a record at the head, with room behind it for so many octets.
void CC_RecordWriter::begin(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                            std::size_t payload)
{
    std::size_t const size = ALIGNED(sizeof(Record) + payload);
    makeRoom(size);
    CC_Moment const now = CC_Moment::NOW();
    auto* const record = new (m_ring + m_offset) Record;
    record->stamp = static_cast<std::uint32_t>(m_head / ALIGNMENT);
    record->size = static_cast<std::uint16_t>(size);
    record->kind = kind;
    record->writer = m_writing.writer;
    record->nanoseconds = now.nanoseconds;
    record->call = call;
    record->leg = leg;
    record->turn = static_cast<std::uint32_t>(now.turn);
    record->detail = detail;
    m_at = m_ring + m_offset + sizeof(Record);
    std::memset(m_ring + m_offset + size - ALIGNMENT, 0, payload == 0 ? 0 : ALIGNMENT); // behind what follows
}

void CC_RecordWriter::end()
{
    std::uint16_t const size = at(m_head).size;
    m_head += size;
    m_offset += size;
    if (m_offset == m_capacity)
        m_offset = 0;
    PUBLISH(m_header->head, m_head);
}

/// Gives up the oldest records for so many octets at the head, which do not wrap.
void CC_RecordWriter::makeRoom(std::size_t size)
{
    std::size_t const rest = m_capacity - m_offset;
    std::size_t const padding = rest < size ? rest : 0;
    if (m_head + padding + size > m_tail + m_capacity)
    {
        do
            m_tail += at(m_tail).size;
        while (m_head + padding + size > m_tail + m_capacity);
        PUBLISH(m_header->tail, m_tail);
    }
    if (padding == 0)
        return;
    Record& record = at(m_head); // of which only the first octets are there
    record.stamp = static_cast<std::uint32_t>(m_head / ALIGNMENT);
    record.size = static_cast<std::uint16_t>(padding);
    record.kind = Kind::PADDING;
    m_head += padding;
    m_offset = 0;
    PUBLISH(m_header->head, m_head);
}

void CC_RecordWriter::addText(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                              std::string_view text)
{
    std::string_view const kept = text.substr(0, LARGEST_TEXT);
    begin(kind, call, leg, detail, kept.size());
    append(kept.data(), kept.size());
    end();
}

void CC_RecordWriter::addNumber(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                                unsigned long long number, std::string_view text)
{
    std::string_view const kept = text.substr(0, LARGEST_TEXT);
    begin(kind, call, leg, detail, sizeof number + kept.size());
    append(&number, sizeof number);
    append(kept.data(), kept.size());
    end();
}

void CC_RecordWriter::addChange(Kind kind, unsigned long long call, unsigned long long leg, unsigned int id,
                                Brief const& before, Brief const& after)
{
    Change change{};
    change.by = m_writing.by;
    std::string_view name;
    if (m_writing.filters != nullptr)
        if (CC_FilterNotes::Note const* const note = m_writing.filters->find(id))
        {
            name = std::string_view(note->name).substr(0, MOST_FILTER_NAME);
            change.filterPlace = static_cast<std::uint8_t>(std::min(note->place, 255U));
            change.filterNameSize = static_cast<std::uint8_t>(name.size());
        }
    begin(kind, call, leg, id, sizeof change + before.getSize() + after.getSize() + name.size());
    append(&change, sizeof change);
    append(&before, before.getSize());
    append(&after, after.getSize());
    append(name.data(), name.size());
    end();
}
