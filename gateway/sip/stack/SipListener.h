#pragma once

#include "sip/SipConfiguration.h"
#include "sip/stack/SipHandles.h"

class SipGuard;
class SipStack;
class SipTls;

/// How an interface takes its address.
namespace SipListener
{
/// What it does that with.
struct Means
{
    SipGuard& guard;
    SipTls* tls;          ///< null where it has none
    char const* resolver; ///< the file that says where names are asked for; null: that of the system
    bool isShown;         ///< what comes in is kept as it came, for SipCapture
};

/// A transaction engine that listens on the interface's address, on the transports that it has, with the interface's
/// timers and limits, and lets in what the guard does. `onMessage` is told of every
/// message that belongs to no transaction and no dialog. Throws std::runtime_error with the reason when a port is taken
/// or the system refuses.
SipAgent MAKE_AGENT(SipStack& stack, SipConfiguration const& configuration, Means const& means,
                    nta_message_f* onMessage, SipInterface* interface);
} // namespace SipListener
