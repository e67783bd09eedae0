#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/media/MG_Rtp.h"

/// A codec as one side of a call offers it: what to speak and how much of it goes into a packet. A plain value.
///
///     VoipCodec const codec(MG_Rtp::ECodec::PCMA, 20);
///     String text;
///     codec.getShortInfo(text); // "PCMA 20ms"
class CC_EXPORT VoipCodec
{
public:
    VoipCodec() = default; ///< no codec
    /// `packetPeriod`: milliseconds of sound in a packet; 0 leaves it to the other side.
    explicit VoipCodec(MG_Rtp::ECodec::Type codec, unsigned int packetPeriod = 0) : m_mediaType{codec, packetPeriod} {}

    /// MG_Rtp::ECodec::NONE, and the period 0, when there is no codec. Periods are in milliseconds. @{
    MG_Rtp::ECodec::Type getCodec() const { return m_mediaType.codec; }
    unsigned int getPacketPeriod() const { return m_mediaType.packetPeriod; }
    MG_Rtp::MediaType const& getMediaType() const { return m_mediaType; }
    /// @}

    /// Replaces `out` by the codec's name and its packet period, which is left out when it is 0: "PCMA 20ms", "PCMA".
    /// The empty text when there is no codec. Returns `out`. Throws std::bad_alloc when memory is out.
    String& getShortInfo(String& out) const;

    /// The same codec and packet period.
    friend bool operator==(VoipCodec const&, VoipCodec const&) = default;

private:
    MG_Rtp::MediaType m_mediaType;
};
