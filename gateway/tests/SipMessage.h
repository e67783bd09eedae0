#pragma once

#include "sip/stack/Sofia.h"

#include <sofia-sip/sip_util.h>

#include <string>

/// A message as the stack reads it from the wire.
///
///     SipMessage const invite = SipMessage::INVITE("From: <sip:4420@host>;tag=a\r\n");
///     SipIdentity::READ_CALLER(invite.get());
class SipMessage
{
public:
    explicit SipMessage(std::string const& text)
        : m_message(msg_make(sip_default_mclass(), 0, text.data(), static_cast<ssize_t>(text.size())))
    {
    }
    ~SipMessage() { msg_destroy(m_message); }
    SipMessage(SipMessage const&) = delete;
    SipMessage& operator=(SipMessage const&) = delete;

    /// `headers`: whole lines, From among them.
    static SipMessage INVITE(std::string const& headers, std::string const& uri = "sip:4989@host",
                             std::string const& to = "<sip:4989@host>")
    {
        return SipMessage("INVITE " + uri + " SIP/2.0\r\n" + COMMON + "To: " + to + "\r\n" + headers + "\r\n");
    }
    static SipMessage ANSWER(std::string const& headers, std::string const& to = "<sip:4989@host>")
    {
        return SipMessage("SIP/2.0 200 OK\r\n" + std::string(COMMON) + "To: " + to +
                          ";tag=b\r\nFrom: <sip:4420@host>;tag=a\r\n" + headers + "\r\n");
    }

    sip_t const* get() const { return sip_object(m_message); }

private:
    static constexpr char const* COMMON = "Via: SIP/2.0/UDP host;branch=z9hG4bK1\r\nCall-ID: 1\r\nCSeq: 1 INVITE\r\n";

    msg_t* m_message;
};
