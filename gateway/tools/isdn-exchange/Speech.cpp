#include "Speech.h"

#include <algorithm>
#include <fstream>
#include <iterator>

namespace
{
/// 1 kHz in A-law at 0 dBm0: the digital milliwatt of G.711, table 5, one period.
constexpr unsigned char MILLIWATT[] = {0x34, 0x21, 0x21, 0x34, 0xb4, 0xa1, 0xa1, 0xb4};
} // namespace

Speech::Speech(IsdnDescriptor&& channel, std::string what, std::string const& file, std::string const& record)
    : m_channel(std::move(channel)), m_what(std::move(what))
{
    if (m_what == "file")
    {
        std::ifstream in(file, std::ios::binary);
        m_sound.assign(std::istreambuf_iterator<char>(in), {});
    }
    if (!record.empty())
        m_record.reset(std::fopen(record.c_str(), "wb"));
}

void Speech::tick()
{
    IsdnBlock block;
    bool hasEcho = false;
    while (block.receive(m_channel.get()))
    {
        hear(block);
        if (m_what != "echo")
            continue;
        hasEcho = true;
        block.timestamp = m_timestamp;
        m_timestamp += IsdnBlock::SAMPLES;
        block.send(m_channel.get());
    }
    if (!hasEcho && m_what != "echo")
        makeBlock().send(m_channel.get());
}

void Speech::hear(IsdnBlock const& block)
{
    ++m_heard;
    if (m_record == nullptr)
        return;
    std::fwrite(block.speech.data(), 1, block.speech.size(), m_record.get());
    std::fflush(m_record.get());
}

IsdnBlock Speech::makeBlock()
{
    IsdnBlock block;
    block.timestamp = m_timestamp;
    m_timestamp += IsdnBlock::SAMPLES;
    block.speech.fill(IsdnBlock::SILENCE);
    if (m_what == "tone")
        for (std::size_t i = 0; i < block.speech.size(); ++i)
            block.speech[i] = MILLIWATT[i % std::size(MILLIWATT)];
    std::size_t const count = std::min(block.speech.size(), m_sound.size() - std::min(m_position, m_sound.size()));
    std::copy_n(m_sound.begin() + static_cast<std::ptrdiff_t>(std::min(m_position, m_sound.size())), count,
                block.speech.begin());
    m_position += count;
    return block;
}
