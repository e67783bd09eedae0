#include "sip/dialog/SipDirectSession.h"

#include "adapters/CC_CallAdapterE164.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCodecNegotiating.h"
#include "properties/CC_PropertyId.h"
#include "sip/message/SipProperty.h"
#include "sip/message/SipPropertyId.h"

#include <tuple>
#include <utility>

using namespace SipProperty;
using Negotiating = CC_PropertyCodecNegotiating;

namespace
{
constexpr unsigned int REQUEST_PENDING = 491;
} // namespace

SipSessionWord::Content const* SipDirectSession::getPeerWord(unsigned int id) const
{
    auto const* const word = SipSessionWord::FROM(m_adapter.getPeerProperty(id));
    return word != nullptr ? &word->get() : nullptr;
}

bool SipDirectSession::isForUs(SipSessionWord::Content const& word) const
{
    return word.to == m_adapter.getOwnCallLegId();
}

/// With it goes whether a codec is being agreed on, for sides that know no descriptions. Without memory the other side
/// does not hear it, and whoever waits does so until its wire's time is over.
void SipDirectSession::write(unsigned int id, SipSessionWord::Content content)
{
    CC_PropertyContainer own;
    bool const isOffer = id == SipPropertyId::SESSION_OFFER;
    ADD(own, Negotiating(CC_PropertyId::CODEC_NEGOTIATING, isOffer ? Negotiating::REQUEST : Negotiating::IDLE));
    ADD(own, SipSessionWord(id, std::move(content)));
    std::ignore = m_adapter.setOwnProperties(own);
}

SipSessionWord::Content SipDirectSession::makeOffer(std::string const& description, bool isQuick)
{
    m_ours = description.empty() ? Wish::TO_BE_OFFERED : Wish::OFFER;
    m_isWithdrawn = false;
    m_offer = description;
    return {m_peer, ++m_offers, 0, isQuick, STRING(description)};
}

// --- while the dialog comes up ---------------------------------------------------------------------------------------

void SipDirectSession::addOffer(CC_PropertyContainer& own, std::string const& description)
{
    m_peer = m_adapter.getPeerCallLegId();
    ADD(own, SipSessionWord(SipPropertyId::SESSION_OFFER, makeOffer(description, false)));
}

void SipDirectSession::addAnswer(CC_PropertyContainer& own, std::string const& description, bool isBinding)
{
    ADD(own, SipSessionWord(SipPropertyId::SESSION_ANSWER, {m_peer, m_taken, 0, isBinding, STRING(description)}));
}

bool SipDirectSession::isAnswerBinding() const
{
    SipSessionWord::Content const* const word = getPeerWord(SipPropertyId::SESSION_ANSWER);
    return word != nullptr && word->isQuick;
}

std::string SipDirectSession::readFirstOffer()
{
    m_peer = m_adapter.getPeerCallLegId();
    SipSessionWord::Content const* const word = getPeerWord(SipPropertyId::SESSION_OFFER);
    if (word == nullptr || word->to != 0)
        return {};
    m_taken = word->number;
    return TEXT_OF(word->description);
}

std::string SipDirectSession::readForInvite(bool hadOffer)
{
    m_peer = m_adapter.getPeerCallLegId();
    SipSessionWord::Content const* const word =
        getPeerWord(hadOffer ? SipPropertyId::SESSION_ANSWER : SipPropertyId::SESSION_OFFER);
    if (word == nullptr || !isForUs(*word) || (hadOffer && word->number != m_offers))
        return {};
    if (!hadOffer)
    {
        m_taken = word->number;
        m_theirs = Wish::OFFER; // the ACK answers it
    }
    return TEXT_OF(word->description);
}

// --- once it is up ---------------------------------------------------------------------------------------------------

unsigned int SipDirectSession::takeOffer(std::string const& description, bool isQuick)
{
    if (m_theirs == Wish::TO_BE_OFFERED) // as the other side wished
        m_theirs = Wish::NONE;
    else if (m_theirs != Wish::NONE || m_ours != Wish::NONE)
        return REQUEST_PENDING;
    write(SipPropertyId::SESSION_OFFER, makeOffer(description, isQuick));
    return 0;
}

void SipDirectSession::takeAnswer(std::string const& description) { answerPeer(description, 0); }

void SipDirectSession::takeRefusal(unsigned int status) { answerPeer({}, status); }

void SipDirectSession::answerPeer(std::string const& description, unsigned int refusal)
{
    if (std::exchange(m_theirs, Wish::NONE) != Wish::NONE)
        write(SipPropertyId::SESSION_ANSWER, {m_peer, m_taken, refusal, false, STRING(description)});
}

void SipDirectSession::withdraw() { m_isWithdrawn = m_ours != Wish::NONE; }

void SipDirectSession::follow(bool isUp)
{
    unsigned long long const peer = m_adapter.getPeerCallLegId();
    if (peer == 0)
        return;
    if (peer != m_peer)
        meetPeer(peer);
    followAnswer(); // first: an offer of the other side's may come behind its answer in one turn
    followOffer();
    renegotiate(isUp);
}

/// What our peer has offered is still to be answered, and is told to whoever is there now.
void SipDirectSession::meetPeer(unsigned long long peer)
{
    bool const isFirst = std::exchange(m_peer, peer) == 0;
    m_taken = 0;
    m_theirs = m_theirs == Wish::TO_BE_OFFERED ? Wish::TO_BE_OFFERED : Wish::NONE;
    if (isFirst)
        return;
    if (m_ours != Wish::NONE)
        write(SipPropertyId::SESSION_OFFER, {m_peer, m_offers, 0, false, STRING(m_offer)});
    else
        m_isToRenegotiate = !std::exchange(m_expectsOffer, false) && m_adapter.getOwnCallLegId() > peer;
}

void SipDirectSession::followOffer()
{
    SipSessionWord::Content const* const word = getPeerWord(SipPropertyId::SESSION_OFFER);
    if (word == nullptr || !isForUs(*word) || word->number == m_taken)
        return;
    m_taken = word->number;
    bool const isWanted = m_ours == Wish::TO_BE_OFFERED && !word->description.isEmpty();
    if (m_theirs != Wish::NONE || (m_ours != Wish::NONE && !isWanted))
    {
        write(SipPropertyId::SESSION_ANSWER, {m_peer, m_taken, REQUEST_PENDING, false, {}});
        return;
    }
    m_theirs = word->description.isEmpty() ? Wish::TO_BE_OFFERED : Wish::OFFER;
    m_isToRenegotiate = false;
    bool const isQuick = word->isQuick;
    std::string const description = TEXT_OF(word->description); // the view may change in what follows
    if (!isWanted)
        m_wire.sendOffer(description, isQuick);
    else if (m_ours = Wish::NONE; m_isWithdrawn)
        takeRefusal(REQUEST_PENDING);
    else
        m_wire.sendAnswer(description);
}

void SipDirectSession::followAnswer()
{
    SipSessionWord::Content const* const word = getPeerWord(SipPropertyId::SESSION_ANSWER);
    if (m_ours == Wish::NONE || word == nullptr || !isForUs(*word) || word->number != m_offers)
        return;
    m_ours = Wish::NONE;
    m_offer.clear();
    if (std::exchange(m_isWithdrawn, false))
        m_isToRenegotiate = word->refusal == 0; // the other side goes by what ours has taken back
    else if (word->refusal != 0)
        m_wire.sendRefusal(word->refusal);
    else
        m_wire.sendAnswer(TEXT_OF(word->description));
}

void SipDirectSession::renegotiate(bool isUp)
{
    auto const* const state = CC_PropertyCallLegState::FROM(m_adapter.getPeerProperty(CC_PropertyId::STATE));
    bool const isPeerUp = state != nullptr && state->getState() >= CC_PropertyCallLegState::HELD;
    if (!m_isToRenegotiate || !isUp || !isPeerUp || m_ours != Wish::NONE || m_theirs != Wish::NONE)
        return;
    m_isToRenegotiate = false;
    m_theirs = Wish::TO_BE_OFFERED;
    m_wire.sendOffer({}, false);
}
