#pragma once

#include "environment/CC_Moment.h"
#include "recorder/CC_RecordFormat.h"

#include <atomic>
#include <cstdint>
#include <cstring>
#include <span>
#include <string_view>

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
        if (s_on == nullptr) [[likely]]
            return nullptr;
        return s_on;
    }

    void add(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail = 0)
    {
        begin(kind, call, leg, detail);
        end();
    }
    /// What is longer than LARGEST_TEXT is cut short.
    void addText(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                 std::string_view text);
    /// `number` stands before the text.
    void addNumber(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                   unsigned long long number, std::string_view text = {});

    // A record in pieces: `begin`, then `append` up to MOST_PAYLOAD octets in all, then `end`. Nothing else is recorded
    // in between.

    void begin(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail)
    {
        if (m_at > m_lastPlace) [[unlikely]]
            makeRoom();
        CC_Moment const now = CC_Moment::NOW();
        m_record = reinterpret_cast<CC_RecordFormat::Record*>(m_at);
        m_record->stamp = static_cast<std::uint32_t>(m_head / CC_RecordFormat::ALIGNMENT);
        m_record->kind = kind;
        m_record->writer = getWriter();
        m_record->nanoseconds = now.nanoseconds;
        m_record->call = call;
        m_record->leg = leg;
        m_record->turn = static_cast<std::uint32_t>(now.turn);
        m_record->detail = detail;
        m_at += sizeof *m_record;
        m_changedLeg = 0;
    }
    /// A change with who writes just now; the old and the new value follow. Of several of a Batch the later ones take
    /// less room.
    void beginChange(Kind kind, unsigned long long call, unsigned long long leg, unsigned int propertyId);
    void append(void const* octets, std::size_t size)
    {
        std::memcpy(m_at, octets, size);
        m_at += size;
    }
    void appendText(std::string_view text)
    {
        if (!text.empty()) // one without characters may point nowhere
            append(text.data(), text.size());
    }
    /// Where the next octets come, for who writes so many there; a place for whole words as long as only such went
    /// before.
    char* getPlace() const { return m_at; }
    void goOnAt(char* place) { m_at = place; }
    void setDetail(unsigned int detail) { m_record->detail = detail; }
    void end()
    {
        std::memset(m_at, 0, CC_RecordFormat::ALIGNMENT); // of which the last group keeps what it does not need
        auto const written = static_cast<std::size_t>(m_at - reinterpret_cast<char*>(m_record));
        std::size_t const size =
            (written + CC_RecordFormat::ALIGNMENT - 1) / CC_RecordFormat::ALIGNMENT * CC_RecordFormat::ALIGNMENT;
        m_record->size = static_cast<std::uint16_t>(size);
        m_at = reinterpret_cast<char*>(m_record) + size;
        m_head += size;
        PUBLISH(m_header->head, m_head);
    }
    /// In place of `end`: there is no such record.
    void cancel() { m_at = reinterpret_cast<char*>(m_record); }

    // CC_Recorder's business
    void start(void* image, std::size_t size);
    void* stop();
    std::span<std::byte const> getImage() const;
    static CC_RecordWriter& INSTANCE();

    /// While it lives, properties are written together.
    class Batch
    {
    public:
        Batch() : m_recorder(ON())
        {
            if (m_recorder != nullptr)
                m_recorder->m_isInBatch = true;
        }
        ~Batch()
        {
            if (m_recorder != nullptr)
                m_recorder->m_isInBatch = false;
        }
        Batch(Batch const&) = delete;
        Batch& operator=(Batch const&) = delete;

    private:
        CC_RecordWriter* m_recorder;
    };

    static constexpr std::size_t MOST_PAYLOAD =
        sizeof(CC_RecordFormat::Change) + 2 * sizeof(CC_RecordFormat::Brief) + CC_RecordFormat::LARGEST_TEXT;

private:
    friend class CC_Writing;

    static constexpr std::size_t LARGEST_RECORD = sizeof(CC_RecordFormat::Record) + MOST_PAYLOAD + 8;

    static void PUBLISH(std::uint64_t& position, std::uint64_t value)
    {
        std::atomic_ref(position).store(value, std::memory_order_release);
    }
    inline CC_RecordFormat::Writer getWriter() const;
    void startAt(std::uint64_t head, std::size_t left);
    void beginAlsoChanged(unsigned int propertyId);
    void appendFilter(CC_FilterNotes const& notes, unsigned int propertyId);
    void makeRoom();
    void pad(std::size_t size);
    CC_RecordFormat::Record& at(std::uint64_t position) const;

    static CC_RecordWriter* s_on;

    CC_RecordFormat::Header* m_header = nullptr;
    CC_RecordFormat::Record* m_record = nullptr; // that is being written; of an AlsoChanged only the first octets
    char* m_at = nullptr;                        // the next octet
    char* m_lastPlace = nullptr;                 // up to here a record of any size may begin
    std::uint64_t m_head = 0;
    CC_Writing const* m_writing = nullptr; // null: code outside any adapter
    // of a change that another may follow: nothing has been recorded since
    unsigned long long m_changedLeg = 0; // 0: there is none
    CC_Writing const* m_changedBy = nullptr;
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
    explicit CC_Writing(CC_RecordFormat::Writer writer) : m_recorder(CC_RecordWriter::ON())
    {
        if (m_recorder != nullptr)
            begin(writer, 0, nullptr);
    }
    /// The adapter of that leg writes.
    template <class CallLeg>
    CC_Writing(CC_RecordFormat::Writer writer, CallLeg const& leg) : m_recorder(CC_RecordWriter::ON())
    {
        if (m_recorder != nullptr)
            begin(writer, leg.getSerial(), nullptr);
    }
    /// The same writer as before, through filters, of which `notes` must live longer.
    explicit CC_Writing(CC_FilterNotes& notes) : m_recorder(CC_RecordWriter::ON())
    {
        if (m_recorder == nullptr)
            return;
        CC_Writing const* const before = m_recorder->m_writing;
        begin(before != nullptr ? before->m_writer : CC_RecordFormat::Writer::OUTSIDE,
              before != nullptr ? before->m_by : 0, &notes);
    }
    ~CC_Writing()
    {
        if (m_recorder != nullptr)
            m_recorder->m_writing = m_outer; // also when recording has ended meanwhile
    }
    CC_Writing(CC_Writing const&) = delete;
    CC_Writing& operator=(CC_Writing const&) = delete;

    /// Where filters are to note what they do; null when nobody writes through them.
    static CC_FilterNotes* NOTES(CC_RecordWriter const& recorder)
    {
        return recorder.m_writing != nullptr ? recorder.m_writing->m_notes : nullptr;
    }

private:
    friend class CC_RecordWriter;

    void begin(CC_RecordFormat::Writer writer, unsigned long long by, CC_FilterNotes* notes)
    {
        m_outer = m_recorder->m_writing;
        m_by = by;
        m_notes = notes;
        m_writer = writer;
        m_recorder->m_writing = this;
    }

    CC_RecordWriter* m_recorder; // null: nothing was recorded, and the rest is not set
    CC_Writing const* m_outer;
    unsigned long long m_by;
    CC_FilterNotes* m_notes;
    CC_RecordFormat::Writer m_writer;
};

inline CC_RecordFormat::Writer CC_RecordWriter::getWriter() const
{
    return m_writing != nullptr ? m_writing->m_writer : CC_RecordFormat::Writer::OUTSIDE;
}
