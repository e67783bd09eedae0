#pragma once

#include "media/quality/MediaQuality.h"
#include "platform/media/MG_Tones.h"
#include "platform/signalling/QInformationTransferCapability.h"

#include <new>
#include <optional>
#include <string>

class CC_PropertyContainer;
struct MediaReport;

/// What a session asks of its dialog.
class SipSessionWire
{
public:
    virtual ~SipSessionWire() = default;
    /// The peer is to be offered this; empty: the peer is to offer. Comes back as `takeAnswer`, as `takeOffer` when the
    /// peer was to offer, or as `takeRefusal`, at once or later. `isQuick`: an UPDATE will do, nobody is to be asked.
    virtual void sendOffer(std::string const& description, bool isQuick) = 0;
    /// What the peer waits for: the answer to its offer, or the offer that it wanted.
    virtual void sendAnswer(std::string const& description) = 0;
    /// The peer's offer is refused; its session stays as it was.
    virtual void sendRefusal(unsigned int status) = 0;
    /// Nothing can be agreed on: the call is to end.
    virtual void giveUp() = 0;

    // --- what media of ours tell

    virtual void onSilence(unsigned int seconds) = 0;
    /// Our peer has keyed it in: '0' to '9', '*', '#', 'A' to 'D', '!' for a flash of the hook. `milliseconds`: 0: not
    /// known.
    virtual void onDigit(char digit, unsigned int milliseconds) = 0;
    /// Every five seconds.
    virtual void onQuality() = 0;
    /// An RTCP packet came or went.
    virtual void onReport(MediaReport const& report) = 0;
};

/// Who makes and answers the offers of a dialog: the other side of the call, when the peers exchange media themselves
/// (SipDirectSession), or a termination of the gateway (SipAnchoredSession).
///
/// While the dialog comes up, what is said goes into properties that the endpoint writes itself.
class SipSession
{
public:
    /// No pair of ports is free. What lacks memory is cleared in the same way: cause 47.
    class NoPort : public std::bad_alloc
    {
    };

    virtual ~SipSession() = default;

    // --- while the dialog comes up

    /// Whether an INVITE's offer can be served at all; 0, or the status with which it is refused.
    virtual unsigned int check(std::string const& offer) = 0;
    /// What the call has to carry by that offer.
    virtual QInformationTransferCapability getCapability() const { return QInformationTransferCapability::SPEECH; }
    /// Takes what it needs in the call; whether there was any.
    virtual bool open() = 0;
    /// Our peer's offer in its INVITE, or in the answer to ours.
    virtual void addOffer(CC_PropertyContainer& own, std::string const& description) = 0;
    /// Our peer's answer to the first offer; it may say another thing later unless it is binding.
    virtual void addAnswer(CC_PropertyContainer& own, std::string const& description, bool isBinding) = 0;
    /// The offer for our INVITE. Empty without one.
    virtual std::string readFirstOffer() = 0;
    /// Whether what `readForInvite` reads for an offer of our peer's is binding.
    virtual bool isAnswerBinding() const = 0;
    /// What answers our peer's INVITE, or the offer for it because it had none; as it is now.
    virtual std::string readForInvite(bool hadOffer) = 0;
    /// It was passed on.
    virtual void noteSettled() = 0;
    /// The INVITE's answers are another party's from now on.
    virtual void meetFork() = 0;
    /// Whether the call may go on without another description.
    virtual bool isAgreed() const = 0;

    // --- once it is up

    /// The peer offers; empty: it wants us to offer. `SipSessionWire::sendAnswer` or `sendRefusal` follows, from
    /// `proceed()` on. 0, or the status with which it is refused instead.
    virtual unsigned int takeOffer(std::string const& description, bool isQuick) = 0;
    /// The dialog is ready for the answer.
    virtual void proceed() = 0;
    /// The peer has answered what `SipSessionWire::sendOffer` offered.
    virtual void takeAnswer(std::string const& description) = 0;
    /// The peer did not take it; its session is as it was.
    virtual void takeRefusal(unsigned int status) = 0;
    /// The peer no longer waits for what it asked for last.
    virtual void withdraw() = 0;
    /// The peer of the adapter may have said something, or be another.
    virtual void follow(bool isUp) = 0;
    /// The next new other side will offer by itself: nothing is asked.
    virtual void expectOffer() = 0;

    // --- media of ours

    /// The leg may be in another call.
    virtual void followCall() = 0;
    /// Whether our peer takes digits in INFO.
    virtual void noteInfo(bool isTaken) = 0;
    /// From now on our peer hears that tone of ours and nothing else; whether it can.
    virtual bool playTone(MG_Tones::ECallProgressTone::Type) { return false; }
    /// The other side's digit, for our peer: whether it goes there with the media; else the dialog is to tell it.
    virtual bool sendDigit(char digit, unsigned int milliseconds) = 0;
    /// Of the media until now; nothing without any.
    virtual std::optional<MediaQuality> getQuality() const = 0;
    /// Gives up what `open()` has taken.
    virtual void end() = 0;
};
