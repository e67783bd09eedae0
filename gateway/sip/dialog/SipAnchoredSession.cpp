#include "sip/dialog/SipAnchoredSession.h"

#include "adapters/CC_CallAdapterE164.h"
#include "media/context/CallMedia.h"
#include "media/rtp/RtpRoutes.h"
#include "properties/CC_PropertyCallProgressTone.h"
#include "properties/CC_PropertyCodec.h"
#include "properties/CC_PropertyCodecNegotiating.h"
#include "properties/CC_PropertyCodecs.h"
#include "properties/CC_PropertyId.h"
#include "sip/message/SipProperty.h"

#include <algorithm>
#include <tuple>
#include <utility>

using namespace SipProperty;
using Negotiating = CC_PropertyCodecNegotiating;

namespace
{
constexpr unsigned int NOT_ACCEPTABLE = 488;
constexpr unsigned int USUAL_DIGIT = 100;     // milliseconds
constexpr unsigned int TELEPHONE_RATE = 8000; // Hz: the clock of events that every phone knows

/// As whoever is at the other end sees it.
VoipCodecAndMode::Mode ACROSS(VoipCodecAndMode::Mode mode)
{
    if (mode == VoipCodecAndMode::SEND_ONLY)
        return VoipCodecAndMode::RECEIVE_ONLY;
    return mode == VoipCodecAndMode::RECEIVE_ONLY ? VoipCodecAndMode::SEND_ONLY : mode;
}

SipCodecChoice::Codecs CODECS_OF(SipStream const& stream)
{
    SipCodecChoice::Codecs codecs;
    for (SipStream::Format const& format : stream.formats)
        codecs.push_back(format.codec);
    return codecs;
}

/// The clock of the voice beside them wins; many phones know but one.
std::vector<SipStream::Events> EVENTS_FOR(SipStream const& far, SipStream::Codec codec)
{
    for (unsigned int const rate : {RtpRoutes::CLOCK_RATE(codec), TELEPHONE_RATE})
        for (SipStream::Events const& events : far.events)
            if (events.rate == rate)
                return {events};
    return {};
}
} // namespace

bool SipAnchoredSession::open()
{
    if (m_leg != nullptr)
        return true;
    CallMedia* const call = CallMedia::OF(m_adapter.getDatapathContext());
    m_leg = call != nullptr ? call->addLeg(m_local, *this, CallMedia::PART_OF(m_adapter)) : nullptr;
    if (m_leg != nullptr && m_interface.detectsDigits)
        m_leg->detectDigits(true);
    return m_leg != nullptr;
}

SipCodecChoice::Across SipAnchoredSession::getAcross() const
{
    SipCodecChoice::Across across;
    across.codec = m_adapter.getPeerCodec().getCodec().getCodec();
    for (VoipCodec const& codec : m_adapter.getPeerSupportedCodecs().getList(VoipCodecListSet::SEND_RECEIVE))
        across.supported.push_back(codec.getCodec());
    return across;
}

SipCodecChoice::Codecs SipAnchoredSession::getOffered(SipStream const& far) const
{
    return SipCodecChoice::COMMON(CODECS_OF(far), m_interface.codecs);
}

std::optional<SipStream> SipAnchoredSession::read(std::string const& description) const
{
    return SipStream::READ(description, m_interface.security);
}

// --- what the other side is told -------------------------------------------------------------------------------------

void SipAnchoredSession::addTo(CC_PropertyContainer& own, SipStream const& far)
{
    m_supported = SipCodecChoice::COMMON(m_interface.codecs, CODECS_OF(far));
    VoipCodecListSet supported;
    unsigned int const period = far.period;
    for (SipStream::Codec const codec : m_supported)
        std::ignore = supported.getList(VoipCodecListSet::SEND_RECEIVE).append(VoipCodec(codec, period));
    ADD(own, CC_PropertyCodecs(CC_PropertyId::SUPPORTED_CODECS, supported));
    ADD(own, Negotiating(CC_PropertyId::CODEC_NEGOTIATING, m_isOffering ? Negotiating::REQUEST : Negotiating::IDLE));
    if (m_isAgreed)
        ADD(own, CC_PropertyCodec(CC_PropertyId::CURRENT_CODEC, m_codec));
}

/// Without memory the other side goes on as it is, and what it sends is transcoded if it can be.
void SipAnchoredSession::tell(SipStream const& far)
{
    CC_PropertyContainer own;
    addTo(own, far);
    std::ignore = m_adapter.setOwnProperties(own);
}

// --- descriptions of ours --------------------------------------------------------------------------------------------

/// With another version if it says another thing than the last one (RFC 3264, 8).
std::string SipAnchoredSession::write(SipStream&& ours)
{
    m_ours = std::move(ours);
    if (m_ours.write({m_leg->getNumber(), m_version}) != m_written)
        m_written = m_ours.write({m_leg->getNumber(), ++m_version});
    return m_written;
}

/// Empty: our peer could be understood in nothing that the interface allows.
std::string SipAnchoredSession::makeOffer()
{
    if (!open())
        throw NoPort();
    Codecs const codecs = SipCodecChoice::FOR_OFFER(m_interface.codecs, getAcross());
    if (codecs.empty())
        return {};
    SipStream ours = m_frame.getReply();
    ours.rtp = m_leg->getLocalRtp();
    for (SipStream::Codec const codec : codecs)
    {
        ours.formats.push_back({codec, m_frame.getType(codec)});
        if (std::find(m_frame.formats.begin(), m_frame.formats.end(), ours.formats.back()) == m_frame.formats.end())
            m_frame.formats.push_back(ours.formats.back());
    }
    bool const isSpeech = codecs.front() != MG_Rtp::ECodec::CLEARMODE;
    bool const hasOpus = std::find(codecs.begin(), codecs.end(), MG_Rtp::ECodec::OPUS) != codecs.end();
    for (unsigned int const rate : {TELEPHONE_RATE, RtpRoutes::CLOCK_RATE(MG_Rtp::ECodec::OPUS)})
        if (isSpeech && (rate == TELEPHONE_RATE || hasOpus))
        {
            ours.events.push_back({rate, m_frame.getEventsType(rate)});
            if (std::find(m_frame.events.begin(), m_frame.events.end(), ours.events.back()) == m_frame.events.end())
                m_frame.events.push_back(ours.events.back());
        }
    if (m_interface.security != SipStream::PLAIN)
        ours.keys = {getKey(1, MediaKeys::AES_CM_128_HMAC_SHA1_80), getKey(2, MediaKeys::AES_CM_128_HMAC_SHA1_32)};
    if (m_interface.security == SipStream::SECURED)
        ours.isSecuredProfile = true;
    return write(std::move(ours));
}

/// The same each time, so that a stream that goes on keeps its counters.
SipCrypto SipAnchoredSession::getKey(unsigned int tag, MediaKeys::Suite suite)
{
    auto const known =
        std::find_if(m_keys.begin(), m_keys.end(), [suite](SipCrypto const& one) { return one.suite == suite; });
    SipCrypto key = known != m_keys.end() ? *known : m_keys.emplace_back(SipCrypto::MAKE(tag, suite));
    key.tag = tag;
    return key;
}

/// Empty: nothing of it would be understood across. One codec alone is chosen, so that nobody changes it unasked.
std::string SipAnchoredSession::makeAnswer(SipStream const& far)
{
    SipStream::Codec const codec = SipCodecChoice::FOR_ANSWER(getOffered(far), getAcross());
    if (codec == MG_Rtp::ECodec::NONE)
        return {};
    if (!open())
        throw NoPort();
    m_frame = far;
    SipStream ours = far.getReply();
    ours.rtp = m_leg->getLocalRtp();
    ours.formats = {{codec, far.getType(codec)}};
    ours.events = EVENTS_FOR(far, codec);
    ours.mode = ACROSS(far.mode);
    if (!far.keys.empty())
        ours.keys = {getKey(far.keys.front().tag, far.keys.front().suite)};
    std::string answer = write(std::move(ours));
    settle(far);
    return answer;
}

/// False: they have nothing in common; what was agreed on before stays.
bool SipAnchoredSession::settle(SipStream const& far)
{
    MediaDescription const agreed = SipStream::AGREED(m_ours, far);
    if (m_leg == nullptr || agreed.formats.getSize() == 0 || !isSecuredEnough(agreed, far))
        return false;
    m_leg->describe(agreed);
    m_codec = VoipCodecAndMode(agreed.formats.begin()->codec, ACROSS(agreed.mode));
    m_isAgreed = true;
    settleDigits();
    return true;
}

/// Nothing goes out in the clear that somebody believes to be secured.
bool SipAnchoredSession::isSecuredEnough(MediaDescription const& agreed, SipStream const& far) const
{
    bool const mustBe = m_interface.security == SipStream::SECURED || m_ours.isSecuredProfile || !far.keys.empty();
    return !mustBe || agreed.keys.suite != MediaKeys::NONE;
}

// --- while the dialog comes up ---------------------------------------------------------------------------------------

unsigned int SipAnchoredSession::check(std::string const& offer)
{
    if (offer.empty())
        return 0; // the INVITE has none: we offer
    m_offerOfInvite = read(offer);
    return m_offerOfInvite && !getOffered(*m_offerOfInvite).empty() ? 0 : NOT_ACCEPTABLE;
}

QInformationTransferCapability SipAnchoredSession::getCapability() const
{
    return m_offerOfInvite ? SipCodecChoice::CAPABILITY_OF(getOffered(*m_offerOfInvite))
                           : QInformationTransferCapability::SPEECH;
}

void SipAnchoredSession::addOffer(CC_PropertyContainer& own, std::string const&)
{
    if (m_offerOfInvite)
        addTo(own, *m_offerOfInvite);
}

void SipAnchoredSession::addAnswer(CC_PropertyContainer& own, std::string const& description, bool)
{
    std::optional<SipStream> const far = read(description);
    if (far && settle(*far))
        addTo(own, *far);
}

/// The first answer stays, whatever the called side says later: what differs is transcoded.
std::string SipAnchoredSession::readForInvite(bool hadOffer)
{
    if (!m_forInvite.empty())
        return m_forInvite;
    if (!hadOffer)
        m_forInvite = makeOffer();
    else if (m_offerOfInvite)
    {
        m_forInvite = makeAnswer(*m_offerOfInvite);
        tell(*m_offerOfInvite);
        followTone();
    }
    return m_forInvite;
}

// --- once it is up ---------------------------------------------------------------------------------------------------

unsigned int SipAnchoredSession::takeOffer(std::string const& description, bool)
{
    if (description.empty())
        m_pending = makeOffer();
    else if (std::optional<SipStream> const far = read(description))
    {
        m_pending = makeAnswer(*far);
        if (!m_pending.empty())
            tell(*far);
    }
    return m_pending.empty() ? NOT_ACCEPTABLE : 0;
}

void SipAnchoredSession::proceed()
{
    if (std::string const description = std::exchange(m_pending, {}); !description.empty())
        m_wire.sendAnswer(description);
}

void SipAnchoredSession::takeAnswer(std::string const& description)
{
    m_isOffering = false;
    std::optional<SipStream> const far = read(description);
    if (far && settle(*far))
        tell(*far);
    else
        takeRefusal(NOT_ACCEPTABLE);
}

/// A refusal that is for now alone ends nothing: the next change has us try again.
void SipAnchoredSession::takeRefusal(unsigned int status)
{
    m_isOffering = false;
    if (!m_isAgreed || (status == NOT_ACCEPTABLE && !isInUnison()))
        m_wire.giveUp();
}

bool SipAnchoredSession::isInUnison() const
{
    return !m_adapter.existsPeerCodec() ||
           SipCodecChoice::ARE_COMPATIBLE(m_codec.getCodec().getCodec(),
                                          m_adapter.getPeerCodec().getCodec().getCodec());
}

/// Of two that could, the one whose Call-Leg-ID is greater.
bool SipAnchoredSession::isOurTurn() const
{
    return !canOtherSideChange() || m_adapter.getOwnCallLegId() > m_adapter.getPeerCallLegId();
}

bool SipAnchoredSession::canChange() const { return SipCodecChoice::HAS_COMPATIBLE(m_supported, getAcross().codec); }

bool SipAnchoredSession::canOtherSideChange() const
{
    return m_adapter.getPeerCodecNegotiatingState() != Negotiating::NOT_CAPABLE &&
           SipCodecChoice::HAS_COMPATIBLE(getAcross().supported, m_codec.getCodec().getCodec());
}

void SipAnchoredSession::follow(bool isUp)
{
    if (!isUp || !m_isAgreed || m_isOffering || isInUnison())
        return;
    if (!canChange())
    {
        if (!canOtherSideChange())
            m_wire.giveUp();
        return;
    }
    if (!isOurTurn())
        return;
    std::string const offer = makeOffer();
    if (offer.empty())
    {
        m_wire.giveUp();
        return;
    }
    m_isOffering = true;
    std::ignore =
        m_adapter.setOwnProperty(Negotiating(CC_PropertyId::CODEC_NEGOTIATING, Negotiating::REQUEST)); // for the trace
    m_wire.sendOffer(offer, true);
}

// --- media of ours ---------------------------------------------------------------------------------------------------

void SipAnchoredSession::followCall()
{
    CallMedia* const call = m_leg != nullptr ? CallMedia::OF(m_adapter.getDatapathContext()) : nullptr;
    if (call != nullptr && call != &m_leg->getCall())
        m_leg->moveTo(*call);
    followTone();
}

/// The other side asks for it as a property, and ends it so; who has not been answered yet cannot hear it.
void SipAnchoredSession::followTone()
{
    auto const* const asked =
        CC_PropertyCallProgressTone::FROM(m_adapter.getPeerProperty(CC_PropertyId::CALL_PROGRESS_TONE));
    auto const tone = asked != nullptr ? asked->getTone() : MG_Tones::ECallProgressTone::NONE;
    if (m_leg == nullptr || !m_isAgreed || tone == m_tone || m_isToneOurs)
        return;
    m_tone = tone;
    m_leg->playTone(tone);
}

bool SipAnchoredSession::playTone(MG_Tones::ECallProgressTone::Type tone)
{
    if (m_leg == nullptr || !m_isAgreed)
        return false;
    m_isToneOurs = true;
    m_leg->playTone(tone);
    return true;
}

/// Who holds may be silent.
void SipAnchoredSession::onSilence(unsigned int seconds)
{
    if (m_leg->getDescription().mode == VoipCodecAndMode::SEND_RECEIVE)
        m_wire.onSilence(seconds);
}

// --- digits ----------------------------------------------------------------------------------------------------------

// Each goes to our peer by one way alone: as an event where these were agreed on, else in INFO if it takes that, else
// as a sound. Events that the other side's peer sends, and sounds, the media layer passes on by itself.

bool SipAnchoredSession::takesEvents() const
{
    return m_leg != nullptr && m_leg->getDescription().telephoneEvent.isAgreed();
}

void SipAnchoredSession::settleDigits()
{
    if (m_leg != nullptr)
        m_leg->setDigitsAside(m_isInfoTaken && !takesEvents());
}

void SipAnchoredSession::noteInfo(bool isTaken)
{
    if (std::exchange(m_isInfoTaken, isTaken) != isTaken)
        settleDigits();
}

void SipAnchoredSession::onDigit(char digit, unsigned int milliseconds)
{
    m_wire.onDigit(digit == 'F' ? '!' : digit, milliseconds);
}

bool SipAnchoredSession::sendDigit(char digit, unsigned int milliseconds)
{
    if (m_leg == nullptr)
        return false;
    CallMedia::DigitWay const way = m_leg->getCall().getDigitTold();
    if (way == CallMedia::SOUND ? !takesEvents() : way == CallMedia::EVENT && (takesEvents() || !m_isInfoTaken))
        return true; // it is there already
    if (!takesEvents() && m_isInfoTaken)
        return false;
    m_leg->sendDigit(digit, milliseconds != 0 ? milliseconds : USUAL_DIGIT);
    return true;
}
