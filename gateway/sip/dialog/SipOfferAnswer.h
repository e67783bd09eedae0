#pragma once

/// Where a dialog stands in offering and answering session descriptions (RFC 3264), and what a description is that a
/// message carries. Which messages may carry which is RFC 6337, table 1:
///
/// | offer | answer | |
/// |---|---|---|
/// | INVITE | 2xx | RFC 3261 |
/// | 2xx | ACK | RFC 3261 |
/// | INVITE | reliable 1xx | RFC 3262 |
/// | reliable 1xx | PRACK | RFC 3262 |
/// | PRACK | 2xx to it | RFC 3262 |
/// | UPDATE | 2xx to it | RFC 3311 |
///
/// What a description means that a message bears:
///
/// | message | nothing agreed yet | an offer is outstanding | agreed |
/// |---|---|---|---|
/// | INVITE, UPDATE, PRACK | INVITE: offer; else a violation | a violation | offer |
/// | 1xx | repeated | to an INVITE's offer: preview | repeated |
/// | reliable 1xx, 2xx to INVITE | offer | to an INVITE's offer: answer | offer if the INVITE had none; else repeated |
/// | ACK, PRACK, 2xx to PRACK or UPDATE | a violation | to the offer that it belongs to: answer | ACK: repeated; else a
/// violation |
///
/// An unreliable provisional answer binds nobody: a preview. A description in a 2xx behind a reliable answer repeats it
/// and is not looked at (RFC 6337, 3.1.1).
///
///     SipOfferAnswer negotiation;
///     negotiation.note(SipOfferAnswer::RECEIVED, SipOfferAnswer::INVITE); // OFFER
///     negotiation.note(SipOfferAnswer::SENT, SipOfferAnswer::FINAL);      // ANSWER
class SipOfferAnswer
{
public:
    enum Direction
    {
        SENT,
        RECEIVED
    };
    enum Carrier
    {
        INVITE,
        PROVISIONAL, ///< 101 to 199, unreliable
        RELIABLE,    ///< the same, with 100rel
        FINAL,       ///< 2xx to an INVITE
        ACK,
        PRACK,
        PRACK_OK,
        UPDATE,
        UPDATE_OK
    };
    enum State
    {
        NEW,    ///< nothing was ever agreed on
        OURS,   ///< our offer is outstanding
        THEIRS, ///< theirs is
        AGREED
    };
    enum Meaning
    {
        OFFER,
        ANSWER,
        PREVIEW,
        REPEATED,
        VIOLATION
    };

    State getState() const { return m_state; }
    /// Whether anything was ever agreed on.
    bool hasAgreed() const { return m_wasAgreed; }
    bool isOpen() const { return m_state == OURS || m_state == THEIRS; }
    /// An INVITE without a description: the next 1xx or 2xx brings the offer.
    void noteOfferlessInvite() { m_isOfferWanted = true; }
    /// What a description in that message is; nothing changes.
    Meaning classify(Direction direction, Carrier carrier) const;
    /// The same, and the state goes on.
    Meaning note(Direction direction, Carrier carrier);
    /// The transaction with the offer failed: all is as it was before (RFC 3261, 14.1).
    void fail();

    /// How a request of the peer's with an offer is to be refused now: 491 while ours is outstanding, 500 while theirs
    /// is (RFC 3261, 14.2; RFC 3311, 5.2); 0: it is not.
    unsigned int getRefusal() const;

private:
    Meaning classifyInReply(Carrier carrier) const;
    Meaning classifyUnasked(Carrier carrier) const;

    State m_state = NEW;
    Carrier m_offer = INVITE; // what bore the offer that is outstanding
    bool m_wasAgreed = false;
    bool m_isOfferWanted = false; // the INVITE had none
};
