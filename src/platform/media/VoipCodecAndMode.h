#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/media/VoipCodec.h"

/// The codec in use and its mode: in which direction sound flows. A plain value.
///
///     VoipCodecAndMode const held(VoipCodec(MG_Rtp::ECodec::PCMA, 20), VoipCodecAndMode::SEND_ONLY);
///     String text;
///     held.getShortInfo(text); // "PCMA 20ms send-only"
class CC_EXPORT VoipCodecAndMode
{
public:
    /// Seen from the side that states it.
    enum Mode : int
    {
        SEND_RECEIVE = 0,
        SEND_ONLY = 1,
        RECEIVE_ONLY = 2,
        INACTIVE = 3
    };

    VoipCodecAndMode() = default; ///< no codec, in both directions
    /// `mode`: seen from the side that states it.
    explicit VoipCodecAndMode(VoipCodec const& codec, Mode mode = SEND_RECEIVE) : m_codec(codec), m_mode(mode) {}

    /// The codec, which may be none, and its directions. @{
    VoipCodec const& getCodec() const { return m_codec; }
    Mode getMode() const { return m_mode; }
    /// @}

    /// "send-receive", "send-only", "receive-only", "inactive"; ERROR::INVALID for any other number.
    static char const* MODE_NAME(Mode mode);
    /// A shared instance without a codec, for getters that return a reference.
    static VoipCodecAndMode const& EMPTY();

    /// Replaces `out` by the codec's short info and, unless it flows both ways, the mode's name: "PCMA 20ms",
    /// "PCMA 20ms send-only". The empty text when there is no codec. Returns `out`. Throws std::bad_alloc when memory
    /// is out.
    String& getShortInfo(String& out) const;

    /// The same codec, packet period and mode.
    friend bool operator==(VoipCodecAndMode const&, VoipCodecAndMode const&) = default;

private:
    VoipCodec m_codec;
    Mode m_mode = SEND_RECEIVE;
};
