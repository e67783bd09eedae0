#pragma once

#include "properties/CC_PropertyContainer.h"
#include "sip/dialog/SipSession.h"
#include "sip/dialog/SipSessionWord.h"

class CC_CallAdapterE164;

/// The session of a dialog whose peer exchanges media with the peer of the call's other side: what the one offers is
/// offered to the other, and the other's answer is its answer.
///
/// The two sides talk through words on their legs (SipSessionWord). One exchange at a time: when both offer at once,
/// each refuses the other with 491, and both peers try again in their own time (RFC 3261, 14.1). When another leg takes
/// the place of the call's other side, the two settle anew what they do: the one with the greater Call-Leg-ID asks its
/// peer for an offer (RFC 3725, flow I).
///
/// A member of its endpoint, on whose thread it lives.
class SipDirectSession : public SipSession
{
public:
    SipDirectSession(CC_CallAdapterE164& adapter, SipSessionWire& wire) : m_adapter(adapter), m_wire(wire) {}

    // --- SipSession
    unsigned int check(std::string const&) override { return 0; } // the other side's peer says what it takes
    bool open() override { return true; }
    void addOffer(CC_PropertyContainer& own, std::string const& description) override;
    void addAnswer(CC_PropertyContainer& own, std::string const& description, bool isBinding) override;
    std::string readFirstOffer() override; ///< it counts as taken
    bool isAnswerBinding() const override;
    std::string readForInvite(bool hadOffer) override;
    void noteSettled() override { m_ours = Wish::NONE; }
    void meetFork() override {}
    bool isAgreed() const override { return true; }
    unsigned int takeOffer(std::string const& description, bool isQuick) override;
    void proceed() override {}
    void takeAnswer(std::string const& description) override;
    void takeRefusal(unsigned int status) override;
    void withdraw() override;
    void follow(bool isUp) override;
    void expectOffer() override { m_expectsOffer = true; }
    void followCall() override {}
    void noteInfo(bool) override {}
    bool sendDigit(char, unsigned int) override { return false; }
    MediaQuality const* getQuality() const override { return nullptr; }
    void end() override {}

private:
    enum class Wish
    {
        NONE,
        OFFER,
        TO_BE_OFFERED
    };

    SipSessionWord::Content const* getPeerWord(unsigned int id) const;
    bool isForUs(SipSessionWord::Content const& word) const;
    void write(unsigned int id, SipSessionWord::Content content);
    SipSessionWord::Content makeOffer(std::string const& description, bool isQuick);
    void answerPeer(std::string const& description, unsigned int refusal);
    void meetPeer(unsigned long long peer);
    void followOffer();
    void followAnswer();
    void renegotiate(bool isUp);

    CC_CallAdapterE164& m_adapter;
    SipSessionWire& m_wire;
    unsigned long long m_peer = 0; // the Call-Leg-ID of the other side
    unsigned int m_offers = 0;     // that we made
    unsigned int m_taken = 0;      // the number of the other side's last offer
    Wish m_ours = Wish::NONE;      // what our peer wants of the other side
    Wish m_theirs = Wish::NONE;    // what the other side wants of our peer
    std::string m_offer;           // our peer's, as long as it is open
    bool m_isWithdrawn = false;    // our peer has taken back what the other side may grant
    bool m_isToRenegotiate = false;
    bool m_expectsOffer = false;
};
