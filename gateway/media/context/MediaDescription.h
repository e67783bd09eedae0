#pragma once

#include "media/context/MediaAddress.h"
#include "platform/media/VoipCodecAndMode.h"

#include <array>
#include <cstddef>

/// The payload types by which a format travels: each side numbers what it wants to receive, so the two may differ.
struct MediaPayloadTypes
{
    static constexpr unsigned char NONE = 255;

    unsigned char receive = NONE; ///< as our own session description said: 0 to 127
    unsigned char send = NONE;    ///< as the far side's said

    bool isAgreed() const { return receive < 128 && send < 128; }
    friend bool operator==(MediaPayloadTypes const&, MediaPayloadTypes const&) = default;
};

/// A codec on which both sides of a stream agreed.
struct MediaFormat
{
    VoipCodec codec; ///< period 0: 20 ms
    MediaPayloadTypes types;

    friend bool operator==(MediaFormat const&, MediaFormat const&) = default;
};

/// The formats of a stream, the best liked first: that one is spoken, all are understood. At most MOST of them.
class MediaFormats
{
public:
    static constexpr std::size_t MOST = 8;

    /// Whether there was room, and the format is a codec with agreed numbers.
    bool add(MediaFormat const& format);
    std::size_t getSize() const { return m_size; }
    MediaFormat const* begin() const { return m_formats.data(); }
    MediaFormat const* end() const { return m_formats.data() + m_size; }
    /// The first that has the codec; null when none has.
    MediaFormat const* find(MG_Rtp::ECodec::Type codec) const;

    friend bool operator==(MediaFormats const&, MediaFormats const&) = default;

private:
    std::array<MediaFormat, MOST> m_formats{};
    std::size_t m_size = 0;
};

/// The keys of a stream under SRTP, as session descriptions carry them (RFC 4568).
struct MediaKeys
{
    /// The suites that are spoken: AES in counter mode with 128 bits, the tag 80 or 32 bits long.
    enum Suite : unsigned char
    {
        NONE, ///< plain RTP
        AES_CM_128_HMAC_SHA1_80,
        AES_CM_128_HMAC_SHA1_32
    };
    static constexpr std::size_t LENGTH = 30; ///< octets: the key and the salt
    using Key = std::array<unsigned char, LENGTH>;

    Suite suite = NONE;
    Key send{};    ///< the one in our own description
    Key receive{}; ///< the one in the far side's

    friend bool operator==(MediaKeys const&, MediaKeys const&) = default;
};

/// What offer and answer made of one stream of voice. A plain value; telling the same again changes nothing.
///
///     MediaDescription description;
///     description.rtp = MediaAddress::OF("192.0.2.10", 4000);
///     description.formats.add({VoipCodec(MG_Rtp::ECodec::PCMA, 20), {8, 8}});
///     description.telephoneEvent = {101, 96};
///     leg.describe(description);
struct MediaDescription
{
    MediaAddress rtp;               ///< where the far side listens; nowhere: nothing is sent until it is learned
    MediaAddress rtcp;              ///< nowhere: at rtp's port plus one
    bool isRtcpMultiplexed = false; ///< both sides take RTCP on rtp's port (RFC 5761)
    MediaFormats formats;
    MediaPayloadTypes telephoneEvent; ///< RFC 4733
    MediaPayloadTypes comfortNoise;   ///< RFC 3389
    MediaKeys keys;
    /// Seen from us: SEND_ONLY sends to the far side and takes nothing from it.
    VoipCodecAndMode::Mode mode = VoipCodecAndMode::SEND_RECEIVE;

    friend bool operator==(MediaDescription const&, MediaDescription const&) = default;
};
