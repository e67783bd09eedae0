#pragma once

#include "media/codec/Resampler.h"
#include "media/file/RecordedSound.h"

#include <span>

/// Plays a sound frame by frame, once or again and again.
class SoundPlayer
{
public:
    /// `rate`: at which it is played, in Hz. Throws std::bad_alloc.
    SoundPlayer(SharedSound const& sound, bool isEndless, unsigned int rate);

    unsigned int getRate() const { return m_rate; }
    /// Fills the frame; false: it is over, and the frame is silence.
    bool take(std::span<short> frame);

private:
    SharedSound m_sound;
    bool m_isEndless;
    unsigned int m_rate;
    std::size_t m_at = 0;
    Resampler m_resampler;
};
