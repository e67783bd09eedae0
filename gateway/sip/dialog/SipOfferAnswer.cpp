#include "sip/dialog/SipOfferAnswer.h"

namespace
{
using Carrier = SipOfferAnswer::Carrier;

/// RFC 6337, table 1.
bool ANSWERS(Carrier offer, Carrier carrier)
{
    switch (offer)
    {
    case Carrier::INVITE:
        return carrier == Carrier::RELIABLE || carrier == Carrier::FINAL;
    case Carrier::FINAL:
        return carrier == Carrier::ACK;
    case Carrier::RELIABLE:
        return carrier == Carrier::PRACK;
    case Carrier::PRACK:
        return carrier == Carrier::PRACK_OK;
    case Carrier::UPDATE:
        return carrier == Carrier::UPDATE_OK;
    default:
        return false;
    }
}
} // namespace

SipOfferAnswer::Meaning SipOfferAnswer::classify(Direction direction, Carrier carrier) const
{
    if (!isOpen())
        return classifyUnasked(carrier);
    bool const isInReply = m_state == (direction == SENT ? THEIRS : OURS);
    return isInReply ? classifyInReply(carrier) : VIOLATION; // who has offered waits for the answer
}

SipOfferAnswer::Meaning SipOfferAnswer::classifyInReply(Carrier carrier) const
{
    if (carrier == PROVISIONAL && m_offer == INVITE)
        return PREVIEW;
    return ANSWERS(m_offer, carrier) ? ANSWER : VIOLATION;
}

SipOfferAnswer::Meaning SipOfferAnswer::classifyUnasked(Carrier carrier) const
{
    switch (carrier)
    {
    case INVITE:
        return OFFER;
    case PROVISIONAL:
        return REPEATED;
    case RELIABLE:
    case FINAL:
        return m_isOfferWanted || m_state == NEW ? OFFER : REPEATED;
    case PRACK:
    case UPDATE:
        return m_state == AGREED ? OFFER : VIOLATION;
    case ACK:
        return m_state == AGREED ? REPEATED : VIOLATION;
    default:
        return VIOLATION;
    }
}

SipOfferAnswer::Meaning SipOfferAnswer::note(Direction direction, Carrier carrier)
{
    Meaning const meaning = classify(direction, carrier);
    if (meaning == OFFER)
    {
        m_isOfferWanted = false;
        m_offer = carrier;
        m_state = direction == SENT ? OURS : THEIRS;
    }
    else if (meaning == ANSWER)
    {
        m_state = AGREED;
        m_wasAgreed = true;
    }
    return meaning;
}

void SipOfferAnswer::fail()
{
    m_isOfferWanted = false;
    m_state = m_wasAgreed ? AGREED : NEW;
}

unsigned int SipOfferAnswer::getRefusal() const
{
    if (m_state == OURS)
        return 491;
    return m_state == THEIRS || m_isOfferWanted ? 500 : 0;
}
