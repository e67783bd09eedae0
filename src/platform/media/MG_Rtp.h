#pragma once

#include "platform/base/Export.h"

/// What an RTP stream carries: the codecs of voice and how they are cut into packets.
///
/// Comfort noise and telephone events accompany a codec in its stream; they are none themselves.
struct CC_EXPORT MG_Rtp
{
    /// The codecs of RTP streams.
    struct CC_EXPORT ECodec
    {
        /// Where a codec has a fixed RTP payload type, its number is that; the others are numbered from 128 on, past
        /// the last payload type. The numbers travel in quality records, so they never change.
        enum Type : int
        {
            NONE = -1,
            PCMU = 0, ///< G.711 mu-law
            GSM = 3,  ///< GSM full rate
            G723 = 4,
            DVI4_8000 = 5,
            DVI4_16000 = 6,
            LPC = 7,
            PCMA = 8, ///< G.711 A-law
            G722 = 9,
            L16_STEREO = 10,
            L16_MONO = 11,
            QCELP = 12,
            G728 = 15,
            G729 = 18, ///< also annex A
            G726_16 = 128,
            G726_24 = 129,
            G726_32 = 130,
            G726_40 = 131,
            ILBC = 132,
            OPUS = 133,
            CLEARMODE = 134 ///< 64 kbit/s of bits that are no speech (RFC 4040)
        };

        /// The name by which RTP knows the codec ("PCMA", "G726-32"), with clock rate and channels where the name alone
        /// stands for several ("DVI4/8000", "L16/44100/2"). "None" for NONE, ERROR::INVALID for any other number.
        static char const* NAME(Type codec);
    };

    /// A codec and its packet period.
    struct MediaType
    {
        /// NONE: no codec.
        ECodec::Type codec = ECodec::NONE;
        unsigned int packetPeriod = 0; ///< milliseconds of sound in a packet; 0: not known

        /// The same codec and packet period.
        friend bool operator==(MediaType const&, MediaType const&) = default;
    };
};
