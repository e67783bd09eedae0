#include "media/rtp/RtpTermination.h"

#include "media/codec/VoiceReceiver.h"
#include "media/codec/VoiceSender.h"
#include "media/file/SoundPlayer.h"
#include "media/quality/EModel.h"
#include "media/tone/DtmfDetector.h"

#include <algorithm>
#include <utility>

namespace
{
constexpr long long MILLISECOND = 1000000; // ns
constexpr long long SECOND = 1000 * MILLISECOND;
constexpr long long PUBLISHING = 100 * MILLISECOND;
constexpr long long TELLING = 5 * SECOND; // between two records of quality
} // namespace

RtpTermination::RtpTermination(unsigned long long number, RtpPorts&& ports, MediaOptions const& options,
                               Seed const& seed)
    : m_number(number)
    , m_ports(std::move(ports))
    , m_silence(options.silence * SECOND)
    , m_tellsReports(options.tellsReports)
    , m_latch(options.learningTime * MILLISECOND)
    , m_rtcpLatch(options.learningTime * MILLISECOND)
    , m_numbering(seed.source, seed.sequence, seed.timestamp)
    , m_reports(options.reportInterval * MILLISECOND, seed.name)
{
}

RtpTermination::~RtpTermination() = default;

bool RtpTermination::receives() const
{
    return m_mode == VoipCodecAndMode::SEND_RECEIVE || m_mode == VoipCodecAndMode::RECEIVE_ONLY;
}

bool RtpTermination::sends() const
{
    return m_mode == VoipCodecAndMode::SEND_RECEIVE || m_mode == VoipCodecAndMode::SEND_ONLY;
}

void RtpTermination::describe(MediaDescription const& description, long long now)
{
    if (!std::exchange(m_isDescribed, true) || description.mode != m_mode)
        m_lastArrival = now;
    m_mode = description.mode;
    m_isMultiplexed = description.isRtcpMultiplexed;
    m_latch.expect(DatagramAddress(description.rtp));
    MediaAddress rtcp = description.rtcp.isSomewhere() ? description.rtcp : description.rtp;
    if (!description.rtcp.isSomewhere() && rtcp.port != 0)
        ++rtcp.port;
    m_rtcpLatch.expect(DatagramAddress(rtcp));
    setKeys(description.keys);
    m_description = description;
    setPartner(m_partner);
}

void RtpTermination::setPartner(RtpTermination* partner)
{
    m_partner = partner;
    m_routes = RtpRoutes(m_description, partner == nullptr ? nullptr : &partner->m_description);
    bool const isKnown = partner != nullptr && partner->m_description.formats.getSize() != 0;
    m_isRelayable = !isKnown || m_routes.areAllRelayed(m_description);
}

void RtpTermination::receiveRtp(DatagramBatch& batch, long long now)
{
    unsigned int const count = batch.receive(getRtp());
    for (unsigned int i = 0; i < count; ++i)
    {
        DatagramAddress const& from = batch.getSource(i);
        if (batch.isCut(i))
            ++m_quality.malformedPackets;
        else if (RtpPacket::IS_RTCP(batch.getOctets(i))) // also under SRTP: that byte is in the clear
            takeRtcp(batch.getOctets(i), from, now);
        else
            takeRtp(batch.getOctets(i), from, batch, now);
    }
    sendRelayed(batch, now);
}

void RtpTermination::sendRelayed(DatagramBatch& batch, long long now)
{
    publish(now);
    if (m_partner == nullptr)
        return;
    batch.send(m_partner->getRtp());
    m_partner->publish(now);
}

void RtpTermination::publish(long long now)
{
    if (now - m_lastPublished < PUBLISHING && m_lastPublished != 0)
        return;
    m_lastPublished = now;
    getQuality();
}

void RtpTermination::sendDatagram(std::span<unsigned char const> octets, DatagramBatch* batch)
{
    DatagramAddress const& to = m_latch.getTarget();
    if (batch != nullptr)
        batch->queue({const_cast<unsigned char*>(octets.data()), octets.size()}, to);
    else
        sendto(getRtp(), octets.data(), octets.size(), 0, &to.any, to.length);
}

void RtpTermination::receiveRtcp(DatagramBatch& batch, long long now)
{
    unsigned int const count = batch.receive(getRtcp());
    for (unsigned int i = 0; i < count; ++i)
        takeRtcp(batch.getOctets(i), batch.getSource(i), now);
}

void RtpTermination::takeRtp(std::span<unsigned char> octets, DatagramAddress const& from, DatagramBatch& batch,
                             long long now)
{
    RtpPacket packet;
    if (m_isUnusable)
    {
        ++m_quality.unkeyedPackets;
        return;
    }
    if (!packet.read(octets)) // first, so that nothing malformed comes to the keys
    {
        ++m_quality.malformedPackets;
        return;
    }
    if (m_srtp != nullptr && (!open(octets, &SrtpSession::openRtp) || !packet.read(octets)))
        return;
    RtpRoutes::Route const& route = m_routes.get(packet.header.type);
    if (route.kind == RtpRoutes::UNKNOWN)
    {
        ++m_quality.unknownPackets;
        return;
    }
    if (!m_latch.accept(from, now))
    {
        ++m_quality.strayPackets;
        return;
    }
    noteArrival(packet, route, now);
    if (!receives())
        return;
    if (route.kind == RtpRoutes::EVENT)
        takeEvent(packet, route, now);
    else if (route.kind == RtpRoutes::VOICE)
        hearVoice(packet, route);
    if (m_partner != nullptr && !m_isAllDecoded)
        relay(packet, route, batch, now);
}

void RtpTermination::noteArrival(RtpPacket const& packet, RtpRoutes::Route const& route, long long now)
{
    m_lastArrival = now;
    ++m_quality.receivedPackets;
    m_quality.receivedOctets += packet.payload.size();
    m_reception.count(packet.header, route.kind == RtpRoutes::VOICE ? route.clockRate : 0, now);
    if (std::exchange(m_isSilent, false) && m_observer != nullptr)
        m_observer->onSpeech(*this);
}

void RtpTermination::takeEvent(RtpPacket const& packet, RtpRoutes::Route const& route, long long now)
{
    if (m_receiver != nullptr) // it has its number among those of speech
        m_receiver->put(packet.header, MG_Rtp::ECodec::NONE, {});
    m_passesDigitsOn = route.relayType == MediaPayloadTypes::NONE || m_receiver != nullptr;
    TelephoneEvent event;
    if (event.read(packet.payload))
        tellEvent(m_heard.receive(packet.header, event, getClockRate(), now));
    else
        ++m_quality.malformedPackets;
}

/// Where the packets cannot be relayed, because the partner takes none, or they would get among packets of our own, the
/// digit is made anew.
void RtpTermination::tellEvent(std::optional<HeardDigit> const& heard)
{
    if (heard && m_passesDigitsOn && m_partner != nullptr && !m_partner->m_areDigitsAside)
        m_partner->sendDigit(heard->digit, heard->milliseconds);
    tell(heard);
}

void RtpTermination::tell(std::optional<HeardDigit> const& heard)
{
    if (heard && m_observer != nullptr)
        m_observer->onDigit(*this, *heard);
}

void RtpTermination::relay(RtpPacket const& packet, RtpRoutes::Route const& route, DatagramBatch& batch, long long now)
{
    RtpTermination& to = *m_partner;
    bool const isDecoded = route.kind != RtpRoutes::VOICE && m_receiver != nullptr;
    if (route.relayType == MediaPayloadTypes::NONE || isDecoded)
        return;
    if (!to.isOpenForRelay())
    {
        to.m_numbering.interrupt();
        return;
    }
    RtpHeader const header = to.m_numbering.relay(packet.header, route.relayType, route.clockRate, m_number, now);
    unsigned char* const start = packet.payload.data() - RtpHeader::LENGTH; // there was a header at least as long
    header.write(start);
    ++to.m_quality.sentPackets;
    to.m_quality.sentOctets += packet.payload.size();
    std::size_t length = RtpHeader::LENGTH + packet.payload.size();
    if (to.m_srtp != nullptr)
        length = to.m_srtp->protectRtp(start, length); // a received datagram has room behind it
    if (length != 0)
        to.sendDatagram({start, length}, &batch);
}

void RtpTermination::takeRtcp(std::span<unsigned char> octets, DatagramAddress const& from, long long now)
{
    RtpLatch& latch = m_isMultiplexed ? m_latch : m_rtcpLatch;
    RtcpPacket packet;
    if (m_srtp != nullptr && !open(octets, &SrtpSession::openRtcp))
        return;
    if (!packet.read(octets, m_numbering.getSource()))
        ++m_quality.malformedPackets;
    else if (!latch.accept(from, now))
        ++m_quality.strayPackets;
    else
    {
        m_reports.take(packet, m_reception, getClockRate(), m_quality, now);
        tellReport(packet, from, false);
    }
}

void RtpTermination::tellReport(RtcpPacket const& packet, DatagramAddress const& far, bool isOurs)
{
    if (!m_tellsReports || m_observer == nullptr)
        return;
    MediaAddress const own = m_isMultiplexed ? m_ports.address : m_ports.getRtcp();
    m_observer->onReport(*this, isOurs ? MediaReport{packet, own, far.get()} : MediaReport{packet, far.get(), own});
}

void RtpTermination::tick(long long now)
{
    if (m_digits.isBusy())
    {
        if (std::optional<TelephoneEventSender::Packet> const packet = m_digits.tick(getClockRate()))
            sendEvent(*packet, now);
        return;
    }
    if (m_tone)
        sendTone(now);
    else
        sendSound(now);
}

void RtpTermination::sendEvent(TelephoneEventSender::Packet const& packet, long long now)
{
    if (!m_description.telephoneEvent.isAgreed())
    {
        sendAudibleEvent(packet, now);
        return;
    }
    if (packet.isFirst)
        m_eventTimestamp = m_numbering.beginEvent(getClockRate(), now);
    unsigned char payload[TelephoneEvent::LENGTH];
    packet.event.write(payload);
    transmit(m_numbering.event(m_description.telephoneEvent.send, m_eventTimestamp, packet.isFirst), payload);
}

/// For packets of our own; what is relayed goes out in batches.
void RtpTermination::transmit(RtpHeader const& header, std::span<unsigned char const> payload)
{
    std::array<unsigned char, DatagramBatch::ROOM> octets;
    if (!isOpen() || payload.size() > DatagramBatch::LONGEST - RtpHeader::LENGTH)
        return;
    header.write(octets.data());
    std::copy(payload.begin(), payload.end(), octets.begin() + RtpHeader::LENGTH);
    std::size_t length = RtpHeader::LENGTH + payload.size();
    if (m_srtp != nullptr)
        length = m_srtp->protectRtp(octets.data(), length);
    if (length == 0)
        return;
    ++m_quality.sentPackets;
    m_quality.sentOctets += payload.size();
    sendDatagram(std::span(octets).first(length), nullptr);
}

void RtpTermination::setKeys(MediaKeys const& keys)
{
    if (keys == m_description.keys)
        return; // the counters of the stream go on
    std::unique_ptr<SrtpSession> const before = std::exchange(m_srtp, SrtpSession::MAKE(keys));
    if (m_srtp != nullptr && before != nullptr)
        m_srtp->takeOver(*before);
    m_isUnusable = keys.suite != MediaKeys::NONE && m_srtp == nullptr;
}

/// Opens what came under SRTP, in place.
bool RtpTermination::open(std::span<unsigned char>& octets,
                          std::size_t (SrtpSession::*work)(unsigned char*, std::size_t))
{
    std::size_t const length = ((*m_srtp).*work)(octets.data(), octets.size());
    octets = octets.first(length);
    m_quality.unkeyedPackets += length == 0;
    return length != 0;
}

void RtpTermination::attend(long long now)
{
    tellEvent(m_heard.expire(now));
    publish(now);
    checkSilence(now);
    if (m_reports.isDue(now))
        sendReport(false, now);
    if (now - m_lastTold < TELLING || m_observer == nullptr)
        return;
    m_lastTold = now;
    m_observer->onQuality(*this);
}

void RtpTermination::checkSilence(long long now)
{
    if (m_silence == 0 || m_isSilent || !m_isDescribed || !receives() || now - m_lastArrival < m_silence)
        return;
    m_isSilent = true;
    if (m_observer != nullptr)
        m_observer->onSilence(*this, static_cast<unsigned int>((now - m_lastArrival) / SECOND));
}

void RtpTermination::end(long long now)
{
    if (m_isDescribed)
        sendReport(true, now);
}

void RtpTermination::sendReport(bool isBye, long long now)
{
    DatagramAddress const& to = m_isMultiplexed ? m_latch.getTarget() : m_rtcpLatch.getTarget();
    if (!to.isSomewhere() || m_isUnusable)
        return;
    std::array<unsigned char, RtcpPacket::LONGEST + SrtpSession::MOST_GROWTH> octets;
    RtcpPacket const packet = m_reports.make(m_numbering, m_reception, m_quality, isBye, now);
    std::size_t length = packet.write(std::span(octets).first<RtcpPacket::LONGEST>(), m_reports.getName());
    if (m_srtp != nullptr)
        length = m_srtp->protectRtcp(octets.data(), length);
    if (length == 0)
        return;
    sendto(m_isMultiplexed ? getRtp() : getRtcp(), octets.data(), length, 0, &to.any, to.length);
    tellReport(packet, to, true);
}

MediaQuality const& RtpTermination::getQuality()
{
    m_quality.lostPackets = m_reception.getTotalLost();
    m_quality.jitter = m_reception.getJitterMilliseconds();
    if (m_quality.lostPackets && m_description.formats.getSize() != 0)
    {
        double const lost = *m_quality.lostPackets;
        double const expected = lost + static_cast<double>(m_quality.receivedPackets);
        m_quality.meanOpinionScore =
            EModel::SCORE(m_description.formats.begin()->codec.getCodec(), expected == 0 ? 0 : 100 * lost / expected,
                          m_quality.roundTripTime.value_or(0) / 2.0);
    }
    m_cell->write(m_quality);
    return m_quality;
}
