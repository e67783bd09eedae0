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

bool CC_RecordWriter::s_isOn = false;
constinit CC_RecordWriter CC_RecordWriter::s_instance;
constinit CC_RecordWriter::Writing const CC_RecordWriter::OUTSIDE = {0, nullptr, Writer::OUTSIDE};

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
    m_writing = &OUTSIDE;
    m_isInBatch = false;
    s_isOn = true;
}

void* CC_RecordWriter::stop()
{
    s_isOn = false;
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

/// Moment and end of what was begun. Static, and the clock comes as late as can be: so nothing outlives the call.
void CC_RecordWriter::FINISH()
{
    TYEventLoop* const loop = CC_Environment::CC_EVENT_LOOP();
    s_instance.getRecord().turn = loop != nullptr ? static_cast<std::uint32_t>(loop->getNumberOfTurns()) : 0;
    long long const now = loop != nullptr ? loop->getTime() : 0;
    s_instance.getRecord().nanoseconds = now;
    s_instance.goOn();
}

void CC_RecordWriter::finishInBatch()
{
    Record const& record = getRecord();
    m_behindChange = m_at + record.size;
    if (record.kind == Kind::ALSO_CHANGED)
        return goOn();
    m_changedLeg = record.leg;
    m_changedBy = m_writing;
    FINISH();
}

/// The filter that made the value different, if one did.
char* CC_RecordWriter::appendFilter(CC_FilterNotes const& notes, unsigned int propertyId, char* place)
{
    CC_FilterNotes::Note const* const note = notes.find(propertyId);
    if (note == nullptr)
        return place;
    auto& change = reinterpret_cast<Change*>(place)[-1];
    std::string_view const name = std::string_view(note->name).substr(0, LARGEST_TEXT);
    change.filterPlace = static_cast<std::uint8_t>(std::min(note->place, 255U));
    change.filterNameSize = static_cast<std::uint8_t>(name.size());
    char* const behind = place + WORDS_OF(name.size());
    std::memset(behind - WORDS_OF(1), 0, WORDS_OF(1)); // a name is never empty
    APPEND(place, name);
    return behind;
}

/// Gives up the oldest records, so that there is room for a record of any size at the head. When the ring's end is too
/// near, the head moves to its beginning. More than one record's room is made at once, or every record would come here.
void CC_RecordWriter::makeRoom()
{
    std::uint64_t const head = getHead();
    auto const offset = static_cast<std::size_t>(head % m_capacity);
    std::size_t const rest = m_capacity - offset;
    std::size_t const padding = rest < LARGEST_RECORD ? rest : 0;
    std::size_t const wanted = std::min(ROOM_AT_ONCE, padding != 0 ? ROOM_AT_ONCE : rest);
    while (m_tail < head && m_tail + m_capacity < head + padding + wanted)
        m_tail += at(m_tail).size;
    while (m_tail < head && at(m_tail).kind == Kind::ALSO_CHANGED)
        m_tail += at(m_tail).size; // what it belongs to has gone
    m_behindChange = nullptr;
    PUBLISH(m_header->tail, m_tail);
    if (padding != 0)
        pad(padding);
    std::uint64_t const next = head + padding;
    startAt(next, static_cast<std::size_t>(std::min(m_capacity - next % m_capacity, m_tail + m_capacity - next)));
}

/// `left`: octets at the head that belong to no record.
void CC_RecordWriter::startAt(std::uint64_t head, std::size_t left)
{
    m_at = m_ring + head % m_capacity;
    m_toPosition = head - reinterpret_cast<std::uintptr_t>(m_at);
    m_lastPlace = m_at + left - LARGEST_RECORD;
}

/// Fills the end of the ring.
void CC_RecordWriter::pad(std::size_t size)
{
    auto& record = *reinterpret_cast<Record*>(m_at); // of which maybe only the first octets are there
    record.stamp = getStamp();
    record.size = static_cast<std::uint16_t>(size);
    record.kind = Kind::PADDING;
    PUBLISH(m_header->head, getHead() + size);
}

void CC_RecordWriter::add(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail)
{
    end(begin(kind, call, leg, detail));
}

void CC_RecordWriter::addText(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                              std::string_view text)
{
    end(APPEND(begin(kind, call, leg, detail), text.substr(0, LARGEST_TEXT)));
}

void CC_RecordWriter::addNumber(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                                unsigned long long number, std::string_view text)
{
    char* const place = begin(kind, call, leg, detail);
    std::memcpy(place, &number, sizeof number);
    end(APPEND(place + sizeof number, text.substr(0, LARGEST_TEXT)));
}
