#pragma once

#include "environment/CC_Moment.h"
#include "recorder/CC_RecordFormat.h"

#include <cstring>
#include <span>
#include <string_view>

class CC_FilterNotes;

/// Writes records into the ring: what the library does where something happens.
///
///     if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
///         recorder->add(CC_RecordFormat::Kind::LEG_JOINED, to->m_serial, leg.m_serial);
class CC_RecordWriter
{
public:
    using Kind = CC_RecordFormat::Kind;
    using Brief = CC_RecordFormat::Brief;

    /// Who is writing properties just now.
    struct Writing
    {
        CC_RecordFormat::Writer writer;
        unsigned long long by;   // the adapter's leg
        CC_FilterNotes* filters; // what filters did to what is written; null: nothing
    };

    /// Null while nothing is recorded.
    static CC_RecordWriter* ON() { return s_on; }

    void add(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail = 0)
    {
        begin(kind, call, leg, detail, 0);
        end();
    }
    void addText(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                 std::string_view text);
    /// `number` stands before the text.
    void addNumber(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail,
                   unsigned long long number, std::string_view text = {});
    void addChange(Kind kind, unsigned long long call, unsigned long long leg, unsigned int id, Brief const& before,
                   Brief const& after);
    /// For a list of ids, of which there are `count`: `next()` gives one after the other.
    template <class Next>
    void addIds(unsigned long long call, unsigned long long leg, unsigned int count, Next&& next)
    {
        unsigned int const listed = count < CC_RecordFormat::MOST_LISTED_IDS ? count : CC_RecordFormat::MOST_LISTED_IDS;
        begin(Kind::TOLD, call, leg, count, listed * sizeof(std::uint32_t));
        for (unsigned int i = 0; i < listed; ++i)
        {
            std::uint32_t const id = next();
            append(&id, sizeof id);
        }
        end();
    }

    Writing& getWriting() { return m_writing; }

    // CC_Recorder's business
    void start(void* image, std::size_t size);
    void* stop();
    std::span<std::byte const> getImage() const;
    static CC_RecordWriter& INSTANCE();

private:
    void begin(Kind kind, unsigned long long call, unsigned long long leg, unsigned int detail, std::size_t payload);
    void append(void const* octets, std::size_t size)
    {
        std::memcpy(m_at, octets, size);
        m_at += size;
    }
    void end();
    void makeRoom(std::size_t size);
    CC_RecordFormat::Record& at(std::uint64_t position) const;

    static CC_RecordWriter* s_on;

    CC_RecordFormat::Header* m_header = nullptr;
    char* m_ring = nullptr;
    std::uint64_t m_capacity = 0;
    std::uint64_t m_head = 0; // of the header: nobody else writes these
    std::uint64_t m_tail = 0;
    std::uint64_t m_offset = 0; // of the head in the ring
    char* m_at = nullptr;       // of the record that is being written
    std::size_t m_size = 0;     // the whole recording's
    Writing m_writing{};
};

/// Says who writes, for as long as it lives; the one before comes back then.
///
///     CC_Writing const writing(CC_RecordFormat::Writer::OWN, *m_ownCallLeg);
class CC_Writing
{
public:
    explicit CC_Writing(CC_RecordFormat::Writer writer) : m_recorder(CC_RecordWriter::ON())
    {
        if (m_recorder != nullptr)
            begin({writer, 0, nullptr});
    }
    /// The adapter of that leg writes.
    template <class CallLeg>
    CC_Writing(CC_RecordFormat::Writer writer, CallLeg const& leg) : m_recorder(CC_RecordWriter::ON())
    {
        if (m_recorder != nullptr)
            begin({writer, leg.getSerial(), nullptr});
    }
    /// The same writer as before, through filters, of which `notes` must live longer.
    explicit CC_Writing(CC_FilterNotes& notes) : m_recorder(CC_RecordWriter::ON())
    {
        if (m_recorder != nullptr)
            begin({m_recorder->getWriting().writer, m_recorder->getWriting().by, &notes});
    }
    ~CC_Writing()
    {
        if (m_recorder != nullptr)
            m_recorder->getWriting() = m_before; // also when recording has ended meanwhile
    }
    CC_Writing(CC_Writing const&) = delete;
    CC_Writing& operator=(CC_Writing const&) = delete;

private:
    void begin(CC_RecordWriter::Writing const& writing)
    {
        m_before = m_recorder->getWriting();
        m_recorder->getWriting() = writing;
    }

    CC_RecordWriter* m_recorder;
    CC_RecordWriter::Writing m_before; // of a recorder that is on
};
