#pragma once

#include <memory>
#include <span>
#include <spandsp.h>

/// Fills gaps in decoded sound by repeating its pitch and fading it out, for codecs that have no way of their own.
class Concealment
{
public:
    Concealment() : m_state(plc_init(nullptr), plc_free) {}
    /// Sound that came; behind a gap it is blended with what filled that.
    void note(std::span<short> samples) { plc_rx(m_state.get(), samples.data(), static_cast<int>(samples.size())); }
    void fill(std::span<short> samples) { plc_fillin(m_state.get(), samples.data(), static_cast<int>(samples.size())); }

private:
    std::unique_ptr<plc_state_t, int (*)(plc_state_t*)> m_state;
};
