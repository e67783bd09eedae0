#pragma once

#include "media/mixer/Mixer.h"

#include <vector>

class RtpTermination;

/// What the legs of a call say, decoded, and for each what it hears of it: of two that have no codec in common, and of
/// more than two. Each 20 ms one frame.
class Conference
{
public:
    /// `rate`: of the sound in between, in Hz. Throws std::bad_alloc.
    explicit Conference(unsigned int rate) : m_rate(rate), m_heard(rate / 50) {}

    unsigned int getRate() const { return m_rate; }
    void tick(std::vector<RtpTermination*> const& legs, long long now);

    /// The rate that suits these legs: the highest that one of them can use.
    static unsigned int RATE(std::vector<RtpTermination*> const& legs);

private:
    unsigned int m_rate;
    Mixer m_mixer;
    std::vector<std::vector<short>> m_said; // by each leg
    std::vector<short> m_heard;
};
