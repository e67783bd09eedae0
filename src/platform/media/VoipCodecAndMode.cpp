#include "platform/media/VoipCodecAndMode.h"

#include "platform/base/NameOf.h"

namespace
{
constexpr NamedValue<VoipCodecAndMode::Mode> s_names[] = {
    {VoipCodecAndMode::SEND_RECEIVE, "send-receive"},
    {VoipCodecAndMode::SEND_ONLY, "send-only"},
    {VoipCodecAndMode::RECEIVE_ONLY, "receive-only"},
    {VoipCodecAndMode::INACTIVE, "inactive"},
};
} // namespace

char const* VoipCodecAndMode::MODE_NAME(Mode mode) { return NAME_OF(s_names, mode); }

VoipCodecAndMode const& VoipCodecAndMode::EMPTY()
{
    static VoipCodecAndMode const s_empty;
    return s_empty;
}

String& VoipCodecAndMode::getShortInfo(String& out) const
{
    m_codec.getShortInfo(out);
    return out.isEmpty() || m_mode == SEND_RECEIVE ? out : out.concatf(" %s", MODE_NAME(m_mode));
}
