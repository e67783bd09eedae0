#pragma once

#include "platform/asn1/ASN_CHOICE.h"
#include "platform/asn1/AsnPrimitive.h"
#include "platform/asn1/AsnSequence.h"
#include "platform/media/MG_Rtp.h"

/// The quality-of-service record of a media stream: how it sounded, and what the stream was.
///
/// Numbers travel as 32 bits signed; a counter past 31 bits travels as its bit pattern and reads back the same when
/// taken as unsigned. Optional parts are absent and no kind of media is selected until the program says otherwise.
///
///     CC_QoS qos;
///     qos.m_meanOpinionScore = 412; // 4.12
///     auto& rtp = qos.m_mediaInfo.select(qos.m_mediaInfo.m_rtp);
///     rtp.setPresent(rtp.m_config).m_mediaType.set({MG_Rtp::ECodec::PCMA, 20});
///     leg.setProperty(CC_PropertyQoS(CC_PropertyId::QUALITY_OF_SERVICE, qos));
class CC_EXPORT CC_QoS : public AsnClass<CC_QoS, AsnSequence>
{
public:
    /// The stream: over RTP, or one channel of a trunk.
    class CC_EXPORT MediaInfo : public AsnClass<MediaInfo, ASN_CHOICE>
    {
    public:
        /// What was set for the stream and what was measured.
        class CC_EXPORT RTP : public AsnClass<RTP, AsnSequence>
        {
        public:
            /// How the stream was set up.
            class CC_EXPORT RtpCfg : public AsnClass<RtpCfg, AsnSequence>
            {
            public:
                /// MG_Rtp::MediaType as the record carries it.
                class CC_EXPORT MediaType : public AsnClass<MediaType, AsnSequence>
                {
                public:
                    static constexpr char const* TYPE_NAME = "MediaType";
                    MediaType() { declareMediaType(); }
                    /// From and to the program's own structure, as it is. @{
                    MG_Rtp::MediaType get() const { return {m_codec, m_packetPeriod}; }
                    void set(MG_Rtp::MediaType const& mediaType)
                    {
                        m_codec = mediaType.codec;
                        m_packetPeriod = mediaType.packetPeriod;
                    }
                    /// @}

                    /// Numbered as in MG_Rtp.
                    AsnPrimitiveNativeWithTag<MG_Rtp::ECodec::Type, AsnTag::UNIVERSAL, AsnTag::INTEGER> m_codec;
                    /// milliseconds
                    AsnPrimitiveNativeWithTag<unsigned int, AsnTag::UNIVERSAL, AsnTag::INTEGER> m_packetPeriod;

                private:
                    void declareMediaType();
                };

                static constexpr char const* TYPE_NAME = "RtpCfg";
                RtpCfg() { declareRtpCfg(); }

                /// The codec and its packet period.
                MediaType m_mediaType;

            private:
                void declareRtpCfg();
            };

            /// What the two ends counted.
            class CC_EXPORT RtpStat : public AsnClass<RtpStat, AsnSequence>
            {
            public:
                /// What one end counted.
                class CC_EXPORT Stat : public AsnClass<Stat, AsnSequence>
                {
                public:
                    static constexpr char const* TYPE_NAME = "Stat";
                    Stat() { declareStat(); }

                    /// As whoever owns the stream has counted; each travels in 32 bits. @{
                    AsnInteger m_rxPackets;
                    AsnInteger m_rxOctets; ///< of payload
                    AsnInteger m_rxPacketsLost;
                    AsnInteger m_rxJitter; ///< milliseconds
                    AsnInteger m_txPackets;
                    AsnInteger m_txOctets;      ///< of payload
                    AsnInteger m_roundTripTime; ///< milliseconds
                    /// @}

                private:
                    void declareStat();
                };

                static constexpr char const* TYPE_NAME = "RtpStat";
                RtpStat() { declareRtpStat(); }

                Stat m_local;  ///< optional
                Stat m_remote; ///< optional: what the far end reported

            private:
                void declareRtpStat();
            };

            static constexpr char const* TYPE_NAME = "RTP";
            RTP() { declareRTP(); }

            /// How often the stream went over to another codec.
            AsnInteger m_codecChanges;
            RtpCfg m_config;      ///< optional
            RtpStat m_statistics; ///< optional

        private:
            void declareRTP();
        };

        static constexpr char const* TYPE_NAME = "MediaInfo";
        MediaInfo() { declareMediaInfo(); }

        /// Over RTP, or a channel of a trunk, of which no more is told. @{
        RTP m_rtp;
        AsnNull m_ds0;
        /// @}

    private:
        void declareMediaInfo();
    };

    static constexpr char const* TYPE_NAME = "CC-QoS";
    CC_QoS() { declareCC_QoS(); }

    /// A measure of whoever owns the stream; the library only carries it.
    AsnInteger m_voiceQuality;
    AsnInteger m_meanOpinionScore; ///< in hundredths: 412 means 4.12
    /// Without a selection the record has no encoding.
    MediaInfo m_mediaInfo;

private:
    void declareCC_QoS();
};
