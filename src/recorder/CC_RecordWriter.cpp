// The ring. What could go wrong: the process ends inside a record, or the oldest record is overwritten while its place
// still counts as a record. So `tail` moves off what is going to be overwritten before the first octet is, and `head`
// behind a record after its last; both are stores that the compiler may not move, and whoever reads the file after the
// process's end sees all that it stored.
#include "recorder/CC_RecordWriter.h"

#include "platform/base/TYTime.h"
#include "recorder/CC_FilterNotes.h"

#include <algorithm>
#include <atomic>
#include <iterator>
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

/// So many octets are given up at once, where the ring has them before its end.
constexpr std::size_t ROOM_AT_ONCE = 2048;

void PUBLISH(std::uint64_t& position, std::uint64_t value)
{
    std::atomic_ref(position).store(value, std::memory_order_release);
}

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
    m_head = m_tail = 0;
    m_left = m_capacity;
    m_header = new (image) Header{};
    m_header->version = VERSION;
    m_header->byteOrder = BYTE_ORDER_MARK;
    m_header->capacity = m_capacity;
    m_header->monotonic = NANOSECONDS(TY::Time::MONOTONIC);
    m_header->realtime = NANOSECONDS(TY::Time::REALTIME);
    m_header->process = static_cast<std::uint64_t>(getpid());
    std::copy(std::begin(MAGIC), std::end(MAGIC), m_header->magic);
    m_ring = m_at = static_cast<char*>(image) + sizeof(Header);
    m_writing = nullptr;
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

void CC_RecordWriter::begin(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail)
{
    if (m_left < LARGEST_RECORD) [[unlikely]]
        makeRoom();
    CC_Moment const now = CC_Moment::NOW();
    m_record = reinterpret_cast<Record*>(m_at);
    m_record->stamp = static_cast<std::uint32_t>(m_head / ALIGNMENT);
    m_record->kind = kind;
    m_record->writer = m_writing != nullptr ? m_writing->m_writer : Writer::OUTSIDE;
    m_record->nanoseconds = now.nanoseconds;
    m_record->call = call;
    m_record->leg = leg;
    m_record->turn = static_cast<std::uint32_t>(now.turn);
    m_record->detail = detail;
    m_at += sizeof(Record);
    m_changedLeg = 0;
}

void CC_RecordWriter::beginChange(Kind kind, unsigned long long call, unsigned long long leg, unsigned int propertyId)
{
    bool const mayNote = m_writing != nullptr && m_writing->m_notes != nullptr;
    if (m_isInBatch && !mayNote && m_changedLeg == leg && m_changedBy == m_writing && m_left >= LARGEST_RECORD)
        return beginAlsoChanged(propertyId);
    begin(kind, call, leg, propertyId);
    auto& change = *new (m_at) Change{};
    m_at += sizeof change;
    if (m_writing != nullptr)
        change.by = m_writing->m_by;
    if (mayNote)
        appendFilter(propertyId);
    m_changedLeg = leg;
    m_changedBy = m_writing;
}

inline void CC_RecordWriter::beginAlsoChanged(unsigned int propertyId)
{
    m_record = reinterpret_cast<Record*>(m_at);
    auto& also = reinterpret_cast<AlsoChanged&>(*m_at);
    also.stamp = static_cast<std::uint32_t>(m_head / ALIGNMENT);
    also.kind = Kind::ALSO_CHANGED;
    also.propertyId = propertyId;
    m_at += sizeof also;
}

/// The filter that made the value different, if one did.
void CC_RecordWriter::appendFilter(unsigned int propertyId)
{
    CC_FilterNotes::Note const* const note = m_writing->m_notes->find(propertyId);
    if (note == nullptr)
        return;
    auto& change = reinterpret_cast<Change*>(m_at)[-1];
    std::string_view const name = std::string_view(note->name).substr(0, LARGEST_TEXT);
    change.filterPlace = static_cast<std::uint8_t>(std::min(note->place, 255U));
    change.filterNameSize = static_cast<std::uint8_t>(name.size());
    std::memcpy(m_at, name.data(), name.size());
    m_at += WORDS_OF(name.size());
}

void CC_RecordWriter::end()
{
    std::memset(m_at, 0, ALIGNMENT); // of which the last group keeps what it does not need
    auto const written = static_cast<std::size_t>(m_at - reinterpret_cast<char*>(m_record));
    std::size_t const size = (written + ALIGNMENT - 1) / ALIGNMENT * ALIGNMENT;
    m_record->size = static_cast<std::uint16_t>(size);
    m_at = reinterpret_cast<char*>(m_record) + size;
    m_head += size;
    m_left -= size;
    PUBLISH(m_header->head, m_head);
}

/// Gives up the oldest records, so that there is room for a record of any size at the head. When the ring's end is too
/// near, the head moves to its beginning. More than one record's room is made at once, or every record would come here.
void CC_RecordWriter::makeRoom()
{
    auto const offset = static_cast<std::size_t>(m_head % m_capacity);
    std::size_t const rest = m_capacity - offset;
    std::size_t const padding = rest < LARGEST_RECORD ? rest : 0;
    std::size_t const wanted = std::min(ROOM_AT_ONCE, padding != 0 ? ROOM_AT_ONCE : rest);
    while (m_tail < m_head && m_tail + m_capacity < m_head + padding + wanted)
        m_tail += at(m_tail).size;
    while (m_tail < m_head && at(m_tail).kind == Kind::ALSO_CHANGED)
        m_tail += at(m_tail).size; // what it belongs to has gone
    m_changedLeg = 0;
    PUBLISH(m_header->tail, m_tail);
    if (padding != 0)
        pad(padding);
    m_at = m_ring + m_head % m_capacity;
    m_left = static_cast<std::size_t>(std::min(m_capacity - m_head % m_capacity, m_tail + m_capacity - m_head));
}

/// Fills the end of the ring.
void CC_RecordWriter::pad(std::size_t size)
{
    Record& record = at(m_head); // of which maybe only the first octets are there
    record.stamp = static_cast<std::uint32_t>(m_head / ALIGNMENT);
    record.size = static_cast<std::uint16_t>(size);
    record.kind = Kind::PADDING;
    m_head += size;
    PUBLISH(m_header->head, m_head);
}

void CC_RecordWriter::addText(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                              std::string_view text)
{
    begin(kind, call, leg, detail);
    appendText(text.substr(0, LARGEST_TEXT));
    end();
}

void CC_RecordWriter::addNumber(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                                unsigned long long number, std::string_view text)
{
    begin(kind, call, leg, detail);
    append(&number, sizeof number);
    appendText(text.substr(0, LARGEST_TEXT));
    end();
}
