#pragma once

#include "sip/stack/Sofia.h"

class Capture;

/// Shows a capture every SIP message that the stack lets in, and every one that it sends, repeated ones too. In the
/// clear, also what goes over TLS.
///
///     SipCapture capture(*host.capture); // as long as the interfaces are there
///
/// The stack tells nobody, so this module defines the function that sends, as SipGuard does with others. One at most;
/// belongs to the thread of the stack's loop.
class SipCapture
{
public:
    explicit SipCapture(Capture& capture);
    ~SipCapture();
    SipCapture(SipCapture const&) = delete;
    SipCapture& operator=(SipCapture const&) = delete;

    // --- what the stack calls. Nothing without a capture. @{
    static void ON_RECEIVED(tport_t const* port, msg_t* message);
    static void ON_SENT(tport_t const* port, msg_t* message);
    /// @}
};
