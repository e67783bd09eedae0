#pragma once

#include "sip/SipConfiguration.h"
#include "sip/stack/SipHandles.h"

class SipGuard;
class SipStack;
class SipTls;

/// How an interface takes its address.
namespace SipListener
{
/// A transaction engine that listens on the interface's address, on the transports that it has, with the interface's
/// timers and limits, and lets in what the guard does. `tls`: null where it has none. `onMessage` is told of every
/// message that belongs to no transaction and no dialog. Throws std::runtime_error with the reason when a port is taken
/// or the system refuses.
SipAgent MAKE_AGENT(SipStack& stack, SipConfiguration const& configuration, SipGuard& guard, SipTls* tls,
                    nta_message_f* onMessage, SipInterface* interface);
} // namespace SipListener
