#include "media/codec/VoiceReceiver.h"
#include "media/codec/VoiceSender.h"
#include "media/file/CallRecording.h"
#include "media/file/SoundPlayer.h"
#include "media/rtp/RtpTermination.h"
#include "media/tone/DtmfDetector.h"

#include <array>

namespace
{
constexpr unsigned int TONE_RATE = 8000; // Hz
constexpr unsigned int WIDE_RATE = 16000;
constexpr std::size_t TONE_FRAME = TONE_RATE / 50;
} // namespace

void RtpTermination::openVoice(unsigned int rate, bool isAll)
{
    m_isAllDecoded = isAll;
    if (m_receiver == nullptr || m_receiver->getRate() != rate)
        m_receiver = std::make_unique<VoiceReceiver>(rate);
    prepareSender(rate);
}

void RtpTermination::closeVoice()
{
    m_isAllDecoded = false;
    m_receiver.reset();
    if (!isClocked())
        m_sender.reset();
}

/// Makes the sender anew when what is spoken, or the rate, has changed.
void RtpTermination::prepareSender(unsigned int rate)
{
    if (m_description.formats.getSize() == 0)
        return m_sender.reset();
    MG_Rtp::MediaType const& media = m_description.formats.begin()->codec.getMediaType();
    if (m_sender == nullptr || m_sender->getRate() != rate || m_sender->getMedia() != media)
        m_sender = std::make_unique<VoiceSender>(rate, media);
}

void RtpTermination::hearVoice(RtpPacket const& packet, RtpRoutes::Route const& route)
{
    MG_Rtp::ECodec::Type const codec = m_description.formats.begin()[route.format].codec.getCodec();
    if (m_receiver != nullptr && (m_isAllDecoded || route.relayType == MediaPayloadTypes::NONE))
        m_receiver->put(packet.header, codec, packet.payload);
    if (m_ear != nullptr)
        m_ear->put(packet.header, codec, packet.payload);
    if (m_detector == nullptr)
        return;
    m_detector->hear(codec, packet.payload);
    while (std::optional<char> const digit = m_detector->take())
        tell(HeardDigit{*digit, 0, true});
}

bool RtpTermination::listen(std::span<short> frame) { return m_receiver != nullptr && m_receiver->take(frame); }

void RtpTermination::openEar(bool isWanted)
{
    m_ear = isWanted ? std::make_unique<VoiceReceiver>(CallRecording::RATE) : nullptr;
}

bool RtpTermination::overhear(std::span<short> frame) { return m_ear != nullptr && m_ear->take(frame); }

void RtpTermination::speak(std::span<short const> frame, unsigned int rate, long long now)
{
    if (!isClocked())
        sendFrame(frame, rate, now);
}

void RtpTermination::sendFrame(std::span<short const> frame, unsigned int rate, long long now)
{
    prepareSender(rate); // as it was, unless something changed
    if (m_sender == nullptr || !isOpen())
        return;
    m_sender->add(frame);
    std::uint32_t const ticks = m_sender->getPeriod() * getClockRate() / 1000;
    for (std::span<unsigned char const> payload = m_sender->take(); !payload.empty(); payload = m_sender->take())
        transmit(m_numbering.next(m_description.formats.begin()->types.send, ticks, getClockRate(), now), payload);
}

void RtpTermination::playTone(Tone const* tone)
{
    m_tone.reset();
    m_player.reset();
    if (tone != nullptr)
        m_tone.emplace(*tone);
}

void RtpTermination::sendTone(long long now)
{
    std::array<short, TONE_FRAME> frame;
    if (m_tone->make(frame, TONE_RATE))
        sendFrame(frame, TONE_RATE, now);
    else
        m_tone.reset();
}

void RtpTermination::playSound(SharedSound const& sound, bool isEndless)
{
    m_tone.reset();
    m_player.reset();
    if (sound == nullptr || m_description.formats.getSize() == 0)
        return;
    MG_Rtp::ECodec::Type const codec = m_description.formats.begin()->codec.getCodec();
    bool const isWide = VoiceCodec::RATE_OF(codec, WIDE_RATE) > TONE_RATE;
    m_player = std::make_unique<SoundPlayer>(sound, isEndless, isWide ? WIDE_RATE : TONE_RATE);
}

void RtpTermination::sendSound(long long now)
{
    std::array<short, WIDE_RATE / 50> samples;
    std::span<short> const frame = std::span(samples).first(m_player->getRate() / 50);
    if (m_player->take(frame))
        sendFrame(frame, m_player->getRate(), now);
    else
        m_player.reset();
}

/// Without telephone events a digit is a sound (ITU-T Q.23), if the codec is one that we speak.
void RtpTermination::sendAudibleEvent(TelephoneEventSender::Packet const& packet, long long now)
{
    if (packet.isFirst)
        m_digitSound.emplace(DtmfDetector::SOUND_OF(packet.event.event));
    std::array<short, TONE_FRAME> frame;
    if (m_digitSound && m_digitSound->make(frame, TONE_RATE))
        sendFrame(frame, TONE_RATE, now);
}

void RtpTermination::detectDigits(bool isWanted) { m_detector = isWanted ? std::make_unique<DtmfDetector>() : nullptr; }
