#pragma once

#include "media/context/MediaDescription.h"

#include <memory>
#include <span>
#include <srtp2/srtp.h>

/// One stream's keys at work (RFC 3711): it secures what is sent and opens what is received. The rollover counters and
/// what was received before live in it, so whoever describes the same keys again keeps it.
class SrtpSession
{
public:
    static constexpr std::size_t MOST_GROWTH = SRTP_MAX_TRAILER_LEN + 4; ///< octets that securing adds

    /// Null when the keys are none that can be used, or memory is out.
    static std::unique_ptr<SrtpSession> MAKE(MediaKeys const& keys);

    /// In a direction whose key stays, the counters of that one go on: a key must never secure two packets of one
    /// number.
    void takeOver(SrtpSession& before);
    MediaKeys const& getKeys() const { return m_keys; }
    /// Work in place: the length afterwards; 0: refused. Those that secure need MOST_GROWTH octets of room behind. @{
    std::size_t protectRtp(unsigned char* octets, std::size_t length);
    std::size_t protectRtcp(unsigned char* octets, std::size_t length);
    std::size_t openRtp(unsigned char* octets, std::size_t length);
    std::size_t openRtcp(unsigned char* octets, std::size_t length);
    /// @}

private:
    using Context = std::unique_ptr<srtp_ctx_t, srtp_err_status_t (*)(srtp_ctx_t*)>;

    explicit SrtpSession(MediaKeys const& keys);
    static Context MAKE_CONTEXT(MediaKeys const& keys, MediaKeys::Key const& key, srtp_ssrc_type_t direction);

    MediaKeys m_keys;
    Context m_send;
    Context m_receive;
};
