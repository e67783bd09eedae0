// Reading what may be torn, cut off or anything at all. Nothing in the octets is trusted: sizes are checked before they
// are used, and every step goes forward. A record is taken for one only where it bears the stamp of its position; where
// there is none, the reader goes on octet group by octet group until there is, which finds the ring's beginning at the
// latest.
#include "diagnosis/CC_Recording.h"

#include "diagnosis/CC_BriefText.h"
#include "diagnosis/Demangled.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <memory>
#include <string_view>
#include <utility>

using namespace CC_RecordFormat;

namespace
{
constexpr std::size_t SIZE_OF_PADDING = 8; // at least; the first octets of a record

/// Takes what follows a record apart, from its front.
class Payload
{
public:
    explicit Payload(std::string_view octets) : m_octets(octets) {}

    /// Zeros where there are not that many octets.
    template <class Value>
    Value take()
    {
        Value value{};
        if (m_octets.size() >= sizeof value)
        {
            std::memcpy(&value, m_octets.data(), sizeof value);
            m_octets.remove_prefix(sizeof value);
        }
        return value;
    }
    Brief takeBrief() { return CC_BriefText::TAKE(m_octets); }
    std::string takeText(std::size_t size)
    {
        std::string_view const text = m_octets.substr(0, size);
        m_octets.remove_prefix(std::min(WORDS_OF(size), m_octets.size()));
        return std::string(text);
    }
    /// All that is left, without the zeros that fill the last group.
    std::string takeRest() { return std::string(m_octets.substr(0, m_octets.find('\0'))); }

private:
    std::string_view m_octets;
};

/// Whether the file could be read.
bool READ_ALL(char const* path, std::string& octets)
{
    std::unique_ptr<std::FILE, decltype(&std::fclose)> const file(std::fopen(path, "rb"), std::fclose);
    if (file == nullptr)
        return false;
    std::array<char, 65536> chunk;
    while (std::size_t const size = std::fread(chunk.data(), 1, chunk.size(), file.get()))
        octets.append(chunk.data(), size);
    return std::ferror(file.get()) == 0;
}

void TAKE_CHANGE(CC_Recording::Event& event, Payload& payload)
{
    auto const change = payload.take<Change>();
    event.by = change.by;
    event.filterPlace = change.filterPlace;
    event.filter = DEMANGLED(payload.takeText(change.filterNameSize));
    event.before = payload.takeBrief();
    event.after = payload.takeBrief();
}

void TAKE_IDS(CC_Recording::Event& event, Payload& payload)
{
    for (unsigned int left = std::min(event.record.detail, MOST_TOLD); left > 0; --left)
    {
        auto const told = payload.take<ToldIds>();
        for (std::uint32_t bits = told.bits; bits != 0; bits &= bits - 1)
            event.ids.push_back(told.wordIndex * 32 + static_cast<std::uint32_t>(std::countr_zero(bits)));
    }
}

void TAKE(CC_Recording::Event& event, Payload payload)
{
    switch (event.record.kind)
    {
    case Kind::CALL_CHANGED:
    case Kind::LEG_CHANGED:
        return TAKE_CHANGE(event, payload);
    case Kind::TOLD:
        return TAKE_IDS(event, payload);
    case Kind::LEG_MOVED:
    case Kind::TRANSFERRED:
    case Kind::DROPPED:
        event.number = payload.take<std::uint64_t>();
        event.text = payload.takeRest();
        return;
    case Kind::SERVICE_TOLD:
        event.number = payload.take<std::uint64_t>();
        event.text = DEMANGLED(payload.takeRest());
        return;
    case Kind::OFFERED:
    case Kind::OFFER_TAKEN:
    case Kind::SERVICE:
        event.text = DEMANGLED(payload.takeRest());
        return;
    default:
        event.text = payload.takeRest();
    }
}
} // namespace

/// Walks through the ring of one image.
class CC_Recording::Reader
{
public:
    Reader(CC_Recording& recording, std::string_view image) : m_recording(recording), m_image(image) {}

    void read()
    {
        if (!readHeader())
            return;
        m_ring = m_image.substr(sizeof(Header));
        Header const& header = m_recording.m_header;
        if (m_ring.size() < header.capacity)
            complain("it is cut off: " + std::to_string(m_ring.size()) + " of " + std::to_string(header.capacity) +
                     " octets of the ring are there");
        std::uint64_t lost = 0;
        for (std::uint64_t position = header.tail; position < header.head;)
        {
            std::uint64_t const size = readRecord(position);
            std::uint64_t const step = size != 0 ? size : getStepWithoutRecord(position);
            lost += size != 0 ? 0 : step;
            position += step;
        }
        if (lost != 0)
            complain(std::to_string(lost) + " octets hold no record that could be read");
    }

private:
    bool readHeader()
    {
        Header& header = m_recording.m_header;
        if (m_image.size() < sizeof header)
            return complain("it is too short for a recording");
        std::memcpy(&header, m_image.data(), sizeof header);
        if (!std::equal(std::begin(MAGIC), std::end(MAGIC), header.magic))
            return complain("it is no recording");
        if (header.byteOrder != BYTE_ORDER_MARK)
            return complain("it was written by a machine of another byte order");
        if (header.version != VERSION)
            return complain("it has version " + std::to_string(header.version) + ", this reads version " +
                            std::to_string(VERSION));
        bool const isWhole = header.capacity != 0 && header.capacity % ALIGNMENT == 0 && header.tail % ALIGNMENT == 0 &&
                             header.head % ALIGNMENT == 0 && header.tail <= header.head &&
                             header.head - header.tail <= header.capacity;
        return isWhole || complain("its header is damaged");
    }

    /// To where the next record may stand: what is cut off is passed over at once, however much it claims to be.
    std::uint64_t getStepWithoutRecord(std::uint64_t position) const
    {
        Header const& header = m_recording.m_header;
        std::uint64_t const offset = position % header.capacity;
        bool const isCutOff = offset + SIZE_OF_PADDING > m_ring.size();
        return std::min<std::uint64_t>(isCutOff ? header.capacity - offset : ALIGNMENT, header.head - position);
    }

    /// The size of the record at the position; 0 when there is none.
    std::uint64_t readRecord(std::uint64_t position)
    {
        Header const& header = m_recording.m_header;
        std::uint64_t const offset = position % header.capacity;
        Event event;
        if (offset + SIZE_OF_PADDING > m_ring.size())
            return 0;
        std::memcpy(&event.record, m_ring.data() + offset, SIZE_OF_PADDING);
        std::uint64_t const size = event.record.size;
        std::uint64_t const most = std::min<std::uint64_t>(header.capacity - offset, header.head - position);
        if (event.record.stamp != static_cast<std::uint32_t>(position) || size % ALIGNMENT != 0 || size == 0 ||
            size > most || offset + size > m_ring.size())
            return 0;
        bool const followsAChange = std::exchange(m_isBehindAChange, false);
        if (event.record.kind == Kind::PADDING)
            return size;
        // both lie inside the ring that is there
        std::string_view const octets = m_ring.substr(static_cast<std::size_t>(offset), static_cast<std::size_t>(size));
        if (event.record.kind == Kind::ALSO_CHANGED)
            return followsAChange ? readAlsoChanged(octets) : 0;
        if (size < sizeof(Record) || event.record.kind >= Kind::NUMBER_OF_KINDS)
            return 0;
        std::memcpy(&event.record, octets.data(), sizeof(Record));
        TAKE(event, Payload(octets.substr(sizeof(Record))));
        m_isBehindAChange = event.record.kind == Kind::LEG_CHANGED || event.record.kind == Kind::CALL_CHANGED;
        m_recording.m_events.push_back(std::move(event));
        return size;
    }

    /// One more property of the event before.
    std::uint64_t readAlsoChanged(std::string_view octets)
    {
        if (octets.size() < sizeof(AlsoChanged))
            return 0;
        Event event = m_recording.m_events.back();
        Payload payload(octets);
        event.record.detail = payload.take<AlsoChanged>().propertyId;
        event.before = payload.takeBrief();
        event.after = payload.takeBrief();
        event.filterPlace = 0;
        event.filter.clear();
        m_isBehindAChange = true;
        m_recording.m_events.push_back(std::move(event));
        return octets.size();
    }

    /// False.
    bool complain(std::string const& what)
    {
        std::string& complaint = m_recording.m_complaint;
        complaint += complaint.empty() ? what : "; " + what;
        return false;
    }

    CC_Recording& m_recording;
    std::string_view m_image;
    std::string_view m_ring;
    bool m_isBehindAChange = false; // the last record that was read is one, or belongs to one
};

CC_Recording CC_Recording::READ(std::span<std::byte const> image)
{
    CC_Recording recording;
    Reader(recording, {reinterpret_cast<char const*>(image.data()), image.size()}).read();
    return recording;
}

CC_Recording CC_Recording::READ_FILE(char const* path)
{
    CC_Recording recording;
    std::string octets;
    if (!READ_ALL(path, octets))
        recording.m_complaint = "it cannot be read";
    else
        Reader(recording, octets).read();
    return recording;
}

long long CC_Recording::getRealtime(Event const& event) const
{
    // unsigned, since the times of a damaged recording may be any
    return static_cast<long long>(static_cast<unsigned long long>(m_header.realtime) +
                                  static_cast<unsigned long long>(event.record.nanoseconds) -
                                  static_cast<unsigned long long>(m_header.monotonic));
}
