// The ring. What could go wrong: the process ends inside a record, or the oldest record is overwritten while its place
// still counts as a record. So `tail` moves off what is going to be overwritten before the first octet is, and `head`
// behind a record after its last; both are stores that the compiler may not move, and whoever reads the file after the
// process's end sees all that it stored.
#include "recorder/CC_RecordWriter.h"

#include "platform/base/TYTime.h"
#include "recorder/CC_FilterNotes.h"

#include <algorithm>
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
    m_tail = 0;
    m_header = new (image) Header{};
    m_header->version = VERSION;
    m_header->byteOrder = BYTE_ORDER_MARK;
    m_header->capacity = m_capacity;
    m_header->monotonic = NANOSECONDS(TY::Time::MONOTONIC);
    m_header->realtime = NANOSECONDS(TY::Time::REALTIME);
    m_header->process = static_cast<std::uint64_t>(getpid());
    std::copy(std::begin(MAGIC), std::end(MAGIC), m_header->magic);
    m_ring = static_cast<char*>(image) + sizeof(Header);
    startAt(0, m_capacity);
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

void CC_RecordWriter::beginChange(Kind kind, unsigned long long call, unsigned long long leg, unsigned int propertyId)
{
    CC_FilterNotes const* const notes = m_writing != nullptr ? m_writing->m_notes : nullptr;
    if (m_isInBatch && notes == nullptr && m_changedLeg == leg && m_changedBy == m_writing && m_at <= m_lastPlace)
        return beginAlsoChanged(propertyId);
    begin(kind, call, leg, propertyId);
    auto& change = *new (m_at) Change{};
    m_at += sizeof change;
    if (m_writing != nullptr)
        change.by = m_writing->m_by;
    if (notes != nullptr)
        appendFilter(*notes, propertyId);
    m_changedLeg = leg;
    m_changedBy = m_writing;
}

inline void CC_RecordWriter::beginAlsoChanged(unsigned int propertyId)
{
    m_record = reinterpret_cast<Record*>(m_at);
    new (m_at) AlsoChanged{static_cast<std::uint32_t>(m_head / ALIGNMENT), 0, Kind::ALSO_CHANGED, 0, propertyId};
    m_at += sizeof(AlsoChanged);
}

/// The filter that made the value different, if one did.
void CC_RecordWriter::appendFilter(CC_FilterNotes const& notes, unsigned int propertyId)
{
    CC_FilterNotes::Note const* const note = notes.find(propertyId);
    if (note == nullptr)
        return;
    auto& change = reinterpret_cast<Change*>(m_at)[-1];
    std::string_view const name = std::string_view(note->name).substr(0, LARGEST_TEXT);
    change.filterPlace = static_cast<std::uint8_t>(std::min(note->place, 255U));
    change.filterNameSize = static_cast<std::uint8_t>(name.size());
    std::memset(m_at + WORDS_OF(name.size()) - WORDS_OF(1), 0, WORDS_OF(1)); // a name is never empty
    std::memcpy(m_at, name.data(), name.size());
    m_at += WORDS_OF(name.size());
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
    startAt(m_head, static_cast<std::size_t>(std::min(m_capacity - m_head % m_capacity, m_tail + m_capacity - m_head)));
}

/// `left`: octets at the head that belong to no record.
void CC_RecordWriter::startAt(std::uint64_t head, std::size_t left)
{
    m_head = head;
    m_at = m_ring + head % m_capacity;
    m_lastPlace = m_at + left - LARGEST_RECORD;
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
