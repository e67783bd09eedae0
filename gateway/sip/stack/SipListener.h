#pragma once

#include "configuration/Configuration.h"
#include "sip/stack/SipHandles.h"

class SipStack;

/// How an interface takes its address.
namespace SipListener
{
/// A transaction engine that listens on the interface's address, on UDP and TCP, with the interface's timers. Throws
/// std::runtime_error with the reason when one of the two ports is taken or the system refuses.
SipAgent MAKE_AGENT(SipStack& stack, Configuration::Interface const& configuration);
} // namespace SipListener
