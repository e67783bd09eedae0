#pragma once

#include "media/quality/MediaQuality.h"
#include "platform/media/MG_Rtp.h"
#include "properties/CC_QoS.h"

#include <optional>
#include <string_view>

/// The quality record of one side of a call.
///
/// Of the session descriptions it takes the codec, its packet period and how often the codec changed; of the media, if
/// they go through the gateway, the statistics and the mean opinion score. What was not measured is absent; voice
/// quality and mean opinion score, which the record cannot leave out, are then 0, below either scale.
///
///     m_quality.noteAnswer(sessionDescription);
///     if (std::optional<CC_QoS> const record = m_quality.getRecord(nullptr))
///         std::ignore = adapter.setOwnQoS(*record);
class SipQuality
{
public:
    /// An answer crossed: what the two sides agreed on. One without voice over RTP counts for nothing.
    void noteAnswer(std::string_view sessionDescription);
    /// Nothing when no answer ever crossed. `measured`: null when the media do not go through us.
    std::optional<CC_QoS> getRecord(MediaQuality const* measured) const;

    /// The first voice codec of the first stream of voice that is not refused; nothing without one, and codec NONE for
    /// one that has no number. Packet period 0: the description does not say.
    static std::optional<MG_Rtp::MediaType> MEDIA_OF(std::string_view sessionDescription);

private:
    std::optional<MG_Rtp::MediaType> m_media;
    unsigned int m_codecChanges = 0;
};
