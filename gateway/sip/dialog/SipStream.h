#pragma once

#include "media/context/MediaDescription.h"

#include "sip/dialog/SipCrypto.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// The one stream that the gateway's own media carry, as one side's session description tells it: the first that is
/// voice over RTP and not refused. A plain value.
///
///     std::optional<SipStream> const far = SipStream::READ(offer);
///     SipStream ours = far->getReply(); // its other streams are refused
///     ours.rtp = leg.getLocalRtp();
///     ours.formats = {far->formats.front()};
///     std::string const answer = ours.write({7, 1});
///     leg.describe(SipStream::AGREED(ours, *far));
struct SipStream
{
    using Codec = MG_Rtp::ECodec::Type;

    /// A codec and its payload type.
    struct Format
    {
        Codec codec;
        unsigned char type;

        friend bool operator==(Format const&, Format const&) = default;
    };
    /// Telephone events (RFC 4733), with the clock by which they are told: that of the voice beside them, in Hz.
    struct Events
    {
        unsigned int rate;
        unsigned char type;

        friend bool operator==(Events const&, Events const&) = default;
    };
    /// Who a description is said to come from (RFC 8866, 5.2): numbers of ours.
    struct Origin
    {
        unsigned long long session = 0;
        unsigned long long version = 0;
    };

    /// Whether SRTP is spoken (RFC 3711).
    enum Security
    {
        PLAIN,
        OPTIONAL, ///< if the far side has keys, under whatever profile
        SECURED
    };

    MediaAddress rtp;            ///< where its side listens; nowhere: it does not
    std::vector<Format> formats; ///< that the media layer relays at least, the best liked first, each once
    std::vector<Events> events;  ///< each rate once
    unsigned int period = 0;     ///< milliseconds of sound that its side wants in a packet; 0: it is not told
    VoipCodecAndMode::Mode mode = VoipCodecAndMode::SEND_RECEIVE; ///< seen from its side
    std::vector<std::string> streams; ///< all of the description, each as it is refused ("video 0 RTP/AVP 31")
    std::size_t place = 0;            ///< of this one among them
    bool isSecuredProfile = false;    ///< RTP/SAVP; else RTP/AVP, which may have keys all the same
    std::vector<SipCrypto> keys;      ///< the best liked first

    /// Nothing for a description that cannot be read, or has no such stream, or none so secured.
    static std::optional<SipStream> READ(std::string_view description, Security security = PLAIN);
    /// What answers it, or offers anew what is there: the same streams and payload types, but nothing agreed on yet.
    SipStream getReply() const;
    /// The session description: every other stream is refused.
    std::string write(Origin const& origin) const;
    /// Which payload type the codec has, or may get if it has none; the same with events.
    unsigned char getType(Codec codec) const;
    unsigned char getEventsType(unsigned int rate) const;

    /// What a description of ours and the far side's agree on: the formats of both in the far side's order, none where
    /// they have none in common. Of keys that of ours under the tag that the answer has.
    static MediaDescription AGREED(SipStream const& ours, SipStream const& far);
};
