#pragma once

#include "media/context/LegMedia.h"
#include "media/context/MediaObserver.h"
#include "sip/SipConfiguration.h"
#include "sip/dialog/SipCodecChoice.h"
#include "sip/dialog/SipSession.h"
#include "sip/dialog/SipStream.h"

#include <memory>
#include <optional>

class CC_CallAdapterE164;

/// The session of a dialog whose media end at the gateway: offers and answers are its own (RFC 3264), and what they
/// agree on goes to the media layer, which relays to the call's other side, or transcodes.
///
/// No description leaves it. What the other side needs to know stands on the leg, in the library's own properties, and
/// the other side's leg tells the same, whatever its protocol is:
///
///     Supported-Codecs: which codecs our peer takes that the interface allows     Codec: which one it speaks, seen
///     from it     Codec-Negotiating: idle, or a request is under way
///
/// A change on one side is answered to its peer at once, and the other side's is not asked: only if the two sides have
/// come to speak codecs of which one cannot be made of the other, one of them is offered others; that one whose
/// Call-Leg-ID is greater, or who alone can.
///
/// A member of its endpoint, on the signalling thread.
class SipAnchoredSession : public SipSession, private MediaObserver
{
public:
    /// `local`: where our ports are.
    SipAnchoredSession(CC_CallAdapterE164& adapter, SipSessionWire& wire, SipConfiguration const& interface,
                       IpAddress const& local)
        : m_adapter(adapter), m_wire(wire), m_interface(interface), m_local(local)
    {
    }

    // --- SipSession
    unsigned int check(std::string const& offer) override;
    QInformationTransferCapability getCapability() const override;
    bool open() override;
    void addOffer(CC_PropertyContainer& own, std::string const& description) override;
    void addAnswer(CC_PropertyContainer& own, std::string const& description, bool isBinding) override;
    std::string readFirstOffer() override { return makeOffer(); }
    bool isAnswerBinding() const override { return true; } // it is our own, and stays
    std::string readForInvite(bool hadOffer) override;
    void noteSettled() override {}
    void meetFork() override { m_forInvite.clear(); }
    bool isAgreed() const override { return m_isAgreed; }
    unsigned int takeOffer(std::string const& description, bool isQuick) override;
    void proceed() override;
    void takeAnswer(std::string const& description) override;
    void takeRefusal(unsigned int status) override;
    void withdraw() override {}
    void follow(bool isUp) override;
    void expectOffer() override {}
    void followCall() override;
    void noteInfo(bool isTaken) override;
    bool playTone(MG_Tones::ECallProgressTone::Type tone) override;
    bool sendDigit(char digit, unsigned int milliseconds) override;
    std::optional<MediaQuality> getQuality() const override
    {
        return m_leg != nullptr ? std::optional<MediaQuality>(m_leg->getQuality()) : std::nullopt;
    }
    void end() override { m_leg.reset(); }

private:
    using Codecs = SipCodecChoice::Codecs;

    // --- MediaObserver
    void onSilence(unsigned int seconds) override;
    void onDigit(char digit, unsigned int milliseconds) override;
    void onQuality(MediaQuality const&) override { m_wire.onQuality(); }
    void onReport(MediaReport const& report) override { m_wire.onReport(report); }

    SipCodecChoice::Across getAcross() const;
    std::optional<SipStream> read(std::string const& description) const;
    SipCrypto getKey(unsigned int tag, MediaKeys::Suite suite);
    bool isSecuredEnough(MediaDescription const& agreed, SipStream const& far) const;
    Codecs getOffered(SipStream const& far) const;
    std::string makeOffer();
    std::string makeAnswer(SipStream const& far);
    std::string write(SipStream&& ours);
    bool settle(SipStream const& far);
    void tell(SipStream const& far);
    void addTo(CC_PropertyContainer& own, SipStream const& far);
    bool takesEvents() const;
    void settleDigits();
    void followTone();
    bool isInUnison() const;
    bool isOurTurn() const;
    bool canChange() const;
    bool canOtherSideChange() const;

    CC_CallAdapterE164& m_adapter;
    SipSessionWire& m_wire;
    SipConfiguration const& m_interface;
    IpAddress m_local;
    std::unique_ptr<LegMedia> m_leg;
    std::optional<SipStream> m_offerOfInvite;
    std::string m_forInvite;       // what was made of it
    SipStream m_frame;             // the streams of the session and all payload types that were ever in it
    SipStream m_ours;              // our last description
    std::string m_written;         // the same as text
    std::vector<SipCrypto> m_keys; // of ours, one of each suite for as long as the dialog
    unsigned int m_version = 0;
    std::string m_pending; // what our peer is to be answered once the dialog is ready
    Codecs m_supported;    // as our peer has told last
    bool m_isAgreed = false;
    bool m_isOffering = false;
    bool m_isInfoTaken = false;
    bool m_isToneOurs = false; // that our peer hears, whatever the other side asks for
    MG_Tones::ECallProgressTone::Type m_tone = MG_Tones::ECallProgressTone::NONE; // that our peer hears
    VoipCodecAndMode m_codec;
};
