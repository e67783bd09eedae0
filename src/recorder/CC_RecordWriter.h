#pragma once

#include "environment/CC_Environment.h"
#include "platform/eventloop/TYEventLoop.h"
#include "recorder/CC_RecordFormat.h"

#include <atomic>
#include <cstdint>
#include <cstring>
#include <new>
#include <span>
#include <string_view>
#include <utility>

class CC_FilterNotes;
class CC_Writing;

/// Writes records into the ring: what the library does where something happens.
///
///     if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
///         recorder->add(CC_RecordFormat::Kind::LEG_JOINED, to->m_serial, leg.m_serial);
class CC_RecordWriter
{
public:
    using Kind = CC_RecordFormat::Kind;

    /// Null while nothing is recorded.
    static CC_RecordWriter* ON()
    {
        if (!s_isOn) [[likely]]
            return nullptr;
        return &s_instance;
    }

    void add(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail = 0);
    /// What is longer than LARGEST_TEXT is cut short.
    void addText(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                 std::string_view text);
    /// `number` stands before the text.
    void addNumber(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                   unsigned long long number, std::string_view text = {});

    // A record in pieces: `begin` tells the place of what follows, MOST_PAYLOAD octets at most, and `end` is told the
    // place behind it. A record that is not ended is none. Nothing else is recorded in between.

    char* begin(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail)
    {
        auto& record = getRecord();
        record.stamp = getStamp();
        record.kind = kind;
        record.writer = m_writing->writer;
        record.call = call;
        record.leg = leg;
        record.detail = detail;
        return m_at + sizeof record;
    }
    /// A change with who writes just now; the old and the new value follow. Of several of a Batch the later ones take
    /// less room.
    [[gnu::always_inline]] char* beginChange(Kind kind, unsigned long long call, unsigned long long leg,
                                             unsigned int propertyId)
    {
        if (m_isInBatch && belongsToTheLast(leg))
            return beginAlsoChanged(propertyId);
        char* const place = begin(kind, call, leg, propertyId);
        Writing const& writing = *m_writing;
        auto& change = *reinterpret_cast<CC_RecordFormat::Change*>(place);
        change.by = writing.by;
        std::memset(&change.filterPlace, 0, sizeof change - offsetof(CC_RecordFormat::Change, filterPlace));
        char* const values = place + sizeof change;
        return writing.notes == nullptr ? values : appendFilter(*writing.notes, propertyId, values);
    }
    void end(char* behind)
    {
        fill(behind);
        FINISH();
    }
    /// What beginChange began. @{
    void fill(char* behind)
    {
        std::memset(behind, 0, CC_RecordFormat::ALIGNMENT); // of which the last group keeps what it does not need
        std::size_t const size = (static_cast<std::size_t>(behind - m_at) + CC_RecordFormat::ALIGNMENT - 1) /
                                 CC_RecordFormat::ALIGNMENT * CC_RecordFormat::ALIGNMENT;
        getRecord().size = static_cast<std::uint16_t>(size);
    }
    void endChange()
    {
        if (m_isInBatch)
            finishInBatch();
        else
            FINISH();
    }
    /// @}

    /// Where the next octets come. Short texts without the detour through the C library, which costs more than these.
    static char* APPEND(char* place, std::string_view text)
    {
        if (text.size() <= 32)
            COPY(place, text);
        else
            std::memcpy(place, text.data(), text.size());
        return place + text.size();
    }

    // CC_Recorder's business
    void start(void* image, std::size_t size);
    void* stop();
    std::span<std::byte const> getImage() const;
    static CC_RecordWriter& INSTANCE() { return s_instance; }

    /// While it lives, properties are written together.
    class Batch
    {
    public:
        Batch()
        {
            if (CC_RecordWriter* const recorder = ON())
                recorder->beginBatch();
        }
        ~Batch()
        {
            if (CC_RecordWriter* const recorder = ON())
                recorder->m_isInBatch = false;
        }
        Batch(Batch const&) = delete;
        Batch& operator=(Batch const&) = delete;
    };

    static constexpr std::size_t MOST_PAYLOAD =
        sizeof(CC_RecordFormat::Change) + 2 * CC_RecordFormat::LARGEST_BRIEF + CC_RecordFormat::LARGEST_TEXT;

private:
    friend class CC_Writing;

    struct Writing
    {
        unsigned long long by; // the leg's serial number
        CC_FilterNotes* notes;
        CC_RecordFormat::Writer writer;
    };
    static Writing const OUTSIDE; // code outside any adapter

    static constexpr std::size_t LARGEST_RECORD = sizeof(CC_RecordFormat::Record) + MOST_PAYLOAD + 8;

    /// Not before everything that was stored until now. Not as an atomic: who reads it is another process, or this
    /// one's successor, and a 32-bit processor would need a loop.
    static void PUBLISH(std::uint64_t& position, std::uint64_t value)
    {
#ifndef __SANITIZE_THREAD__ // which knows no fences; no other thread of this process reads it
        std::atomic_thread_fence(std::memory_order_release);
#endif
        const_cast<std::uint64_t volatile&>(position) = value;
    }
    /// Both ends of so many octets, which together are all when these are no more than twice as many.
    template <std::size_t SIZE>
    static void COPY_ENDS(char* to, std::string_view text)
    {
        std::memcpy(to, text.data(), SIZE);
        std::memcpy(to + text.size() - SIZE, text.data() + text.size() - SIZE, SIZE);
    }
    /// REQUIRES: no more than 32 octets.
    static void COPY(char* to, std::string_view text)
    {
        if (text.size() >= 16)
            COPY_ENDS<16>(to, text);
        else if (text.size() >= 8)
            COPY_ENDS<8>(to, text);
        else if (text.size() >= 4)
            COPY_ENDS<4>(to, text);
        else if (text.size() >= 2)
            COPY_ENDS<2>(to, text);
        else if (text.size() == 1)
            *to = text[0];
    }

    CC_RecordFormat::Record& getRecord() const { return *reinterpret_cast<CC_RecordFormat::Record*>(m_at); }
    std::uint64_t getHead() const { return reinterpret_cast<std::uintptr_t>(m_at) + m_toPosition; }
    std::uint32_t getStamp() const { return static_cast<std::uint32_t>(getHead()); }
    static void FINISH();
    void finishInBatch();
    void goOn()
    {
        char* const next = m_at + getRecord().size;
        m_at = next;
        PUBLISH(m_header->head, reinterpret_cast<std::uintptr_t>(next) + m_toPosition);
        if (next > m_lastPlace) [[unlikely]]
            makeRoom(); // for the next one, now that nothing of this one is needed any more
    }
    void startAt(std::uint64_t head, std::size_t left);
    void beginBatch()
    {
        m_isInBatch = true;
        m_behindChange = nullptr;
    }
    /// Whether a change of that leg would be of the same writer as the one before, and that is the last record.
    bool belongsToTheLast(unsigned long long leg) const
    {
        return m_at == m_behindChange && m_changedLeg == leg && m_changedBy == m_writing && m_writing->notes == nullptr;
    }
    char* beginAlsoChanged(unsigned int propertyId)
    {
        new (m_at) CC_RecordFormat::AlsoChanged{getStamp(), 0, Kind::ALSO_CHANGED, 0, propertyId};
        return m_at + sizeof(CC_RecordFormat::AlsoChanged);
    }
    static char* appendFilter(CC_FilterNotes const& notes, unsigned int propertyId, char* place);
    void makeRoom();
    void pad(std::size_t size);
    CC_RecordFormat::Record& at(std::uint64_t position) const;

    static bool s_isOn;
    static CC_RecordWriter s_instance;

    char* m_at = nullptr;                // the record that is being written, or the next one
    char* m_lastPlace = nullptr;         // up to here a record of any size may begin
    std::uint64_t m_toPosition = 0;      // from an address, modulo 2^64
    Writing const* m_writing = &OUTSIDE; // never null
    CC_RecordFormat::Header* m_header = nullptr;
    // of the last change of a batch
    char* m_behindChange = nullptr; // null: there is none that another may follow
    unsigned long long m_changedLeg = 0;
    Writing const* m_changedBy = nullptr;
    bool m_isInBatch = false;
    char* m_ring = nullptr;
    std::size_t m_capacity = 0;
    std::uint64_t m_tail = 0;
    std::size_t m_size = 0; // the whole recording's
};

/// Says who writes properties, for as long as it lives; the one before comes back then. On the stack.
///
///     CC_Writing const writing(CC_RecordFormat::Writer::OWN, *m_ownCallLeg);
class CC_Writing
{
public:
    explicit CC_Writing(CC_RecordFormat::Writer writer)
    {
        if (CC_RecordWriter::ON() != nullptr)
            begin(writer, 0, nullptr);
    }
    /// The adapter of that leg writes.
    template <class CallLeg>
    CC_Writing(CC_RecordFormat::Writer writer, CallLeg const& leg)
    {
        if (CC_RecordWriter::ON() != nullptr)
            begin(writer, leg.getSerial(), nullptr);
    }
    /// The same writer as before, through filters, of which `notes` must live longer.
    explicit CC_Writing(CC_FilterNotes& notes)
    {
        if (CC_RecordWriter::ON() == nullptr)
            return;
        CC_RecordWriter::Writing const& before = *CC_RecordWriter::s_instance.m_writing;
        begin(before.writer, before.by, &notes);
    }
    ~CC_Writing()
    {
        if (m_outer != nullptr)
            CC_RecordWriter::s_instance.m_writing = m_outer; // also when recording has ended meanwhile
    }
    CC_Writing(CC_Writing const&) = delete;
    CC_Writing& operator=(CC_Writing const&) = delete;

    /// Where filters are to note what they do; null when nobody writes through them.
    static CC_FilterNotes* NOTES(CC_RecordWriter const& recorder) { return recorder.m_writing->notes; }

    class Recorded;
    class Outside;

private:
    void begin(CC_RecordFormat::Writer writer, unsigned long long by, CC_FilterNotes* notes)
    {
        m_writing = {by, notes, writer};
        m_outer = std::exchange(CC_RecordWriter::s_instance.m_writing, &m_writing);
    }

    CC_RecordWriter::Writing const* m_outer = nullptr; // null: nothing was recorded, and the rest is not set
    CC_RecordWriter::Writing m_writing;
};

/// The same. REQUIRES: something is recorded.
class CC_Writing::Recorded
{
public:
    template <class CallLeg>
    Recorded(CC_RecordFormat::Writer writer, CallLeg const& leg)
        : m_writing{leg.getSerial(), nullptr, writer}
        , m_outer(std::exchange(CC_RecordWriter::s_instance.m_writing, &m_writing))
    {
    }
    ~Recorded() { CC_RecordWriter::s_instance.m_writing = m_outer; }
    Recorded(Recorded const&) = delete;
    Recorded& operator=(Recorded const&) = delete;

private:
    CC_RecordWriter::Writing m_writing;
    CC_RecordWriter::Writing const* m_outer;
};

/// Code outside any adapter writes. REQUIRES: something is recorded.
class CC_Writing::Outside
{
public:
    Outside() : m_outer(std::exchange(CC_RecordWriter::s_instance.m_writing, &CC_RecordWriter::OUTSIDE)) {}
    ~Outside() { CC_RecordWriter::s_instance.m_writing = m_outer; }
    Outside(Outside const&) = delete;
    Outside& operator=(Outside const&) = delete;

private:
    CC_RecordWriter::Writing const* m_outer;
};
