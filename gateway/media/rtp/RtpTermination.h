#pragma once

#include "media/context/MediaDescription.h"
#include "media/context/MediaOptions.h"
#include "media/context/MediaReport.h"
#include "media/file/RecordedSound.h"
#include "media/quality/QualityCell.h"
#include "media/rtp/DatagramBatch.h"
#include "media/rtp/RtcpReports.h"
#include "media/rtp/RtpLatch.h"
#include "media/rtp/RtpPorts.h"
#include "media/rtp/RtpRoutes.h"
#include "media/rtp/TelephoneEventReceiver.h"
#include "media/rtp/TelephoneEventSender.h"
#include "media/srtp/SrtpSession.h"
#include "media/tone/Tone.h"

class DtmfDetector;
class RtpTermination;
class SoundPlayer;
class VoiceReceiver;
class VoiceSender;

/// Whoever passes on what a termination has to tell. On the datapath's thread.
class RtpTerminationObserver
{
public:
    virtual void onDigit(RtpTermination const& leg, HeardDigit const& heard) = 0;
    virtual void onSilence(RtpTermination const& leg, unsigned int seconds) = 0;
    virtual void onSpeech(RtpTermination const& leg) = 0;
    virtual void onQuality(RtpTermination& leg) = 0;
    virtual void onReport(RtpTermination const& leg, MediaReport const& report) = 0;

protected:
    ~RtpTerminationObserver() = default;
};

/// A leg's end of its RTP stream, in the datapath: the sockets, what was described, and what goes in and out. Made on
/// the signalling thread, from then on a datapath loop's. All times are nanoseconds of the monotonic clock.
///
/// Where the other leg of the call takes a payload as it is, it is relayed: the octets behind the header go out as they
/// came in, the header is our own. What is asked for of extensions, contributing sources and padding ends here.
class RtpTermination
{
public:
    /// What random numbers a stream begins with: source, sequence number and timestamp. @{
    struct Seed
    {
        std::uint32_t source;
        std::uint16_t sequence;
        std::uint32_t timestamp;
        unsigned long long name;
    };
    /// @}
    RtpTermination(unsigned long long number, RtpPorts&& ports, MediaOptions const& options, Seed const& seed);
    virtual ~RtpTermination();
    RtpTermination(RtpTermination const&) = delete;
    RtpTermination& operator=(RtpTermination const&) = delete;

    unsigned long long getNumber() const { return m_number; }
    /// For the loop to wait for. @{
    int getRtp() const { return m_ports.rtp.get(); }
    int getRtcp() const { return m_ports.rtcp.get(); }
    /// @}
    /// Null: nobody is told.
    void setObserver(RtpTerminationObserver* observer) { m_observer = observer; }

    void describe(MediaDescription const& description, long long now);
    MediaDescription const& getDescription() const { return m_description; }
    /// The other leg of a call of two, to which is relayed; null: none, or more.
    void setPartner(RtpTermination* partner);
    /// Whether a partner so described understands everything that may come from here as it is.
    bool isRelayable() const { return m_isRelayable; }

    /// Takes what has come to a socket, and sends on what is relayed.
    virtual void receiveRtp(DatagramBatch& batch, long long now);
    void receiveRtcp(DatagramBatch& batch, long long now);
    /// Whether nothing can come any more: a loop that went on waiting for it would be woken for ever.
    bool isCutOff() const { return m_isCutOff; }

    bool sendDigit(char digit, unsigned int milliseconds) { return m_digits.add(digit, milliseconds); }
    /// Digits that the partner's far side tells do not become digits or sounds of ours; its packets are relayed yet.
    void setDigitsAside(bool isAside) { m_areDigitsAside = isAside; }
    /// Plays it instead of what the others say; null: ends it. It must outlive this.
    void playTone(Tone const* tone);
    /// The same with a sound.
    void playSound(SharedSound const& sound, bool isEndless);
    /// Whether digits are heard in what is spoken, too.
    void detectDigits(bool isWanted);
    /// Whether it wants its ticks.
    bool isClocked() const { return m_digits.isBusy() || m_tone.has_value() || m_player != nullptr; }
    /// Every 20 ms of its clocked time.
    void tick(long long now);

    /// Decodes from now on what cannot be relayed, or all, at that rate in Hz. Throws std::bad_alloc.
    void openVoice(unsigned int rate, bool isAll);
    void closeVoice();
    /// The next 20 ms of what the far side says, at the rate it was opened with; false: nothing.
    bool listen(std::span<short> frame);
    /// Whether its side made the call. @{
    bool isCaller() const { return m_isCaller; }
    void setCaller(bool isCaller) { m_isCaller = isCaller; }
    /// @}
    /// Whether all that the far side says is decoded for a recording as well. Throws std::bad_alloc.
    void openEar(bool isWanted);
    /// The next 20 ms of that, at CallRecording::RATE; false: nothing.
    bool overhear(std::span<short> frame);
    /// 20 ms for the far side, at that rate in Hz; passed over while a tone or a digit goes out.
    void speak(std::span<short const> frame, unsigned int rate, long long now);
    /// About once a second: reports, silence, quality.
    void attend(long long now);
    /// Tells the far side that the stream ends.
    void end(long long now);
    /// As of now.
    MediaQuality const& getQuality();
    /// Where it can be read from elsewhere, a tenth of a second old at most as long as something comes or goes.
    std::shared_ptr<QualityCell const> getCell() const { return m_cell; }

protected:
    void takeRtp(std::span<unsigned char> octets, DatagramAddress const& from, DatagramBatch& batch, long long now);
    void cutOff() { m_isCutOff = true; }
    /// What was queued for the partner goes out.
    void sendRelayed(DatagramBatch& batch, long long now);

private:
    /// An RTP packet on its way out; `batch`: where it is queued, null: it goes at once.
    virtual void sendDatagram(std::span<unsigned char const> octets, DatagramBatch* batch);
    virtual void sendReport(bool isBye, long long now);
    bool receives() const;
    bool sends() const;
    bool isOpen() const { return sends() && !m_isUnusable && m_latch.getTarget().isSomewhere(); }
    bool isOpenForRelay() const { return isOpen() && !isClocked(); }
    void setKeys(MediaKeys const& keys);
    bool open(std::span<unsigned char>& octets, std::size_t (SrtpSession::*work)(unsigned char*, std::size_t));
    void transmit(RtpHeader const& header, std::span<unsigned char const> payload);
    void hearVoice(RtpPacket const& packet, RtpRoutes::Route const& route);
    void sendFrame(std::span<short const> frame, unsigned int rate, long long now);
    void prepareSender(unsigned int rate);
    unsigned int getClockRate() const { return m_routes.getClockRate(); }
    void takeRtcp(std::span<unsigned char> octets, DatagramAddress const& from, long long now);
    void tellReport(RtcpPacket const& packet, DatagramAddress const& far, bool isOurs);
    void takeEvent(RtpPacket const& packet, RtpRoutes::Route const& route, long long now);
    void noteArrival(RtpPacket const& packet, RtpRoutes::Route const& route, long long now);
    void relay(RtpPacket const& packet, RtpRoutes::Route const& route, DatagramBatch& batch, long long now);
    void tell(std::optional<HeardDigit> const& heard);
    void tellEvent(std::optional<HeardDigit> const& heard);
    void sendEvent(TelephoneEventSender::Packet const& packet, long long now);
    void sendAudibleEvent(TelephoneEventSender::Packet const& packet, long long now);
    void sendTone(long long now);
    void sendSound(long long now);
    void publish(long long now);
    void checkSilence(long long now);

    unsigned long long m_number;
    RtpPorts m_ports;
    RtpTerminationObserver* m_observer = nullptr;
    RtpTermination* m_partner = nullptr;
    bool m_isMultiplexed = false;
    bool m_isCaller = false;
    bool m_isCutOff = false;
    bool m_isSilent = false;
    bool m_isDescribed = false;
    VoipCodecAndMode::Mode m_mode = VoipCodecAndMode::INACTIVE;
    long long m_lastArrival = 0; // or when it began to be waited for
    long long m_lastPublished = 0;
    std::shared_ptr<QualityCell> const m_cell = std::make_shared<QualityCell>();
    long long m_lastTold = 0; // of the quality
    long long m_silence;
    bool m_tellsReports;
    RtpLatch m_latch;
    RtpLatch m_rtcpLatch;
    RtpNumbering m_numbering;
    RtpReception m_reception;
    MediaQuality m_quality;
    RtpRoutes m_routes;
    RtcpReports m_reports;
    TelephoneEventReceiver m_heard;
    TelephoneEventSender m_digits;
    bool m_isRelayable = true;
    bool m_isAllDecoded = false;
    bool m_passesDigitsOn = false;
    bool m_areDigitsAside = false;
    bool m_isUnusable = false; // its keys cannot be used: nothing goes in or out in the clear
    std::unique_ptr<SrtpSession> m_srtp;
    std::unique_ptr<VoiceReceiver> m_receiver;
    std::unique_ptr<VoiceReceiver> m_ear; // of a recording; null: there is none
    std::unique_ptr<VoiceSender> m_sender;
    std::unique_ptr<DtmfDetector> m_detector;
    std::optional<ToneGenerator> m_tone;
    std::unique_ptr<SoundPlayer> m_player;
    std::optional<ToneGenerator> m_digitSound;
    std::uint32_t m_eventTimestamp = 0;
    MediaDescription m_description;
};
