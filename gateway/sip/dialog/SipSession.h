#pragma once

#include <string>

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
};

/// Who answers the offers of a dialog that is up, and makes offers of its own: the other side of the call, when the
/// peers exchange media themselves (SipDirectSession), or a termination of the gateway.
class SipSession
{
public:
    virtual ~SipSession() = default;
    /// The peer offers; empty: it wants us to offer. `SipSessionWire::sendAnswer` or `sendRefusal` follows, at once or
    /// later. 0, or the status with which it is refused instead.
    virtual unsigned int takeOffer(std::string const& description, bool isQuick) = 0;
    /// The peer has answered what `SipSessionWire::sendOffer` offered.
    virtual void takeAnswer(std::string const& description) = 0;
    /// The peer did not take it; its session is as it was.
    virtual void takeRefusal(unsigned int status) = 0;
    /// The peer no longer waits for what it asked for last.
    virtual void withdraw() = 0;
};
