#include "media/mixer/Conference.h"

#include "media/codec/VoiceCodec.h"
#include "media/rtp/RtpTermination.h"

#include <algorithm>

unsigned int Conference::RATE(std::vector<RtpTermination*> const& legs)
{
    unsigned int highest = 8000;
    bool areAllOpus = true;
    for (RtpTermination const* const leg : legs)
    {
        for (MediaFormat const& format : leg->getDescription().formats)
        {
            bool const isOpus = format.codec.getCodec() == MG_Rtp::ECodec::OPUS;
            areAllOpus &= isOpus;
            // Opus takes any rate, so the others decide
            highest = std::max(highest, isOpus ? 8000u : VoiceCodec::RATE_OF(format.codec.getCodec(), highest));
        }
    }
    return areAllOpus || highest > 16000 ? 48000 : highest;
}

void Conference::tick(std::vector<RtpTermination*> const& legs, long long now)
{
    std::size_t const samples = m_heard.size();
    while (m_said.size() < std::min(legs.size(), Mixer::MOST))
        m_said.emplace_back(samples);
    m_mixer.begin(samples);
    for (std::size_t i = 0; i < legs.size() && i < Mixer::MOST; ++i)
    {
        bool const isTalking = legs[i]->listen(m_said[i]);
        m_mixer.add(isTalking ? std::span<short const>(m_said[i]) : std::span<short const>());
    }
    m_mixer.choose();
    for (std::size_t i = 0; i < legs.size(); ++i)
    {
        bool const isHeard = m_mixer.get(i, m_heard);
        // two hear each other's pauses as such; of more, who is never sent anything would think the call dead
        if (isHeard || legs.size() > 2)
            legs[i]->speak(m_heard, m_rate, now);
    }
}
