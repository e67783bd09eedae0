#include "media/codec/VoiceReceiver.h"

#include <algorithm>
#include <utility>

namespace
{
constexpr unsigned int MOST_CONCEALED = 3; // packets in a row; what lasts longer is silence
}

VoiceReceiver::VoiceReceiver(unsigned int rate)
    : m_rate(rate), m_decoded(VoiceDecoder::MOST_SAMPLES), m_ready(2 * VoiceDecoder::MOST_SAMPLES)
{
}

bool VoiceReceiver::take(std::span<short> frame)
{
    while (m_size < frame.size() && step())
    {
    }
    std::size_t const count = std::min(m_size, frame.size());
    std::copy_n(m_ready.begin(), count, frame.begin());
    std::fill(frame.begin() + static_cast<std::ptrdiff_t>(count), frame.end(), short{0});
    m_size -= count;
    std::copy_n(m_ready.begin() + static_cast<std::ptrdiff_t>(count), m_size, m_ready.begin());
    return count != 0;
}

bool VoiceReceiver::step()
{
    JitterBuffer::Slot const* slot = nullptr;
    JitterBuffer::Result const result = m_buffer.next(slot);
    if (result == JitterBuffer::PACKET)
    {
        decode(*slot);
        return true;
    }
    if (m_decoder == nullptr || m_period == 0 || m_concealed == MOST_CONCEALED)
        return result == JitterBuffer::LOST; // there is more behind it
    conceal();
    return true;
}

bool VoiceReceiver::prepare(MG_Rtp::ECodec::Type codec)
{
    if (m_codec == codec)
        return m_decoder != nullptr;
    m_codec = codec;
    m_period = 0;
    unsigned int const rate = VoiceCodec::RATE_OF(codec, m_rate);
    m_decoder = VoiceCodec::MAKE_DECODER(codec, rate);
    m_resampler = std::make_unique<Resampler>(rate, m_rate);
    return m_decoder != nullptr;
}

void VoiceReceiver::decode(JitterBuffer::Slot const& slot)
{
    if (slot.codec == MG_Rtp::ECodec::NONE || !prepare(slot.codec))
        return;
    std::size_t const count = m_decoder->decode({slot.payload.data(), slot.length}, m_decoded);
    if (count == 0)
        return;
    m_period = count;
    m_concealed = 0;
    append(count);
}

void VoiceReceiver::conceal()
{
    ++m_concealed;
    m_decoder->conceal(std::span(m_decoded).first(m_period));
    append(m_period);
}

void VoiceReceiver::append(std::size_t samples)
{
    m_size += m_resampler->convert(std::span(m_decoded).first(samples), std::span(m_ready).subspan(m_size));
}
