#include "media/tone/DtmfDetector.h"

#include "media/codec/Resampler.h"

#include <new>

namespace
{
constexpr unsigned int RATE = 8000; // Hz, at which digits are heard
} // namespace

DtmfDetector::DtmfDetector() : m_state(dtmf_rx_init(nullptr, nullptr, nullptr), dtmf_rx_free)
{
    if (m_state == nullptr)
        throw std::bad_alloc();
}

void DtmfDetector::hear(MG_Rtp::ECodec::Type codec, std::span<unsigned char const> payload)
{
    if (codec != m_codec)
    {
        m_codec = codec;
        m_rate = VoiceCodec::RATE_OF(codec, RATE);
        m_decoder = VoiceCodec::MAKE_DECODER(codec, m_rate);
        m_resampler = std::make_unique<Resampler>(m_rate, RATE);
    }
    if (m_decoder == nullptr)
        return;
    std::size_t const count = m_decoder->decode(payload, m_samples);
    std::size_t const heard = m_resampler->convert(std::span(m_samples).first(count), m_heard);
    dtmf_rx(m_state.get(), m_heard.data(), static_cast<int>(heard));
}

std::optional<char> DtmfDetector::take()
{
    char digit = '\0';
    return dtmf_rx_get(m_state.get(), &digit, 1) == 1 ? std::optional(digit) : std::nullopt;
}

Tone const& DtmfDetector::SOUND_OF(unsigned char event)
{
    static constexpr unsigned short LOW[] = {697, 770, 852, 941};
    static constexpr unsigned short HIGH[] = {1209, 1336, 1477, 1633};
    static constexpr std::string_view KEYS = "123A456B789C*0#D";   // rows of a keypad
    static constexpr std::string_view EVENTS = "0123456789*#ABCD"; // RFC 4733, table 3
    static std::array<Tone, 16> const s_sounds = []
    {
        std::array<Tone, 16> sounds;
        for (std::size_t i = 0; i < sounds.size(); ++i)
        {
            std::size_t const key = KEYS.find(EVENTS[i]);
            sounds[i].pieces.push_back({{LOW[key / 4], HIGH[key % 4]}, 0});
        }
        return sounds;
    }();
    return s_sounds[event % 16];
}
