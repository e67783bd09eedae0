#include "media/srtp/SrtpSession.h"

#include <new>

namespace
{
constexpr unsigned long WINDOW = 1024; // packets that may come late and are not yet replays

bool IS_LIBRARY_READY()
{
    static bool const s_isReady = srtp_init() == srtp_err_status_ok;
    return s_isReady;
}
} // namespace

SrtpSession::Context SrtpSession::MAKE_CONTEXT(MediaKeys const& keys, MediaKeys::Key const& key,
                                               srtp_ssrc_type_t direction)
{
    srtp_policy_t policy{};
    if (keys.suite == MediaKeys::AES_CM_128_HMAC_SHA1_32)
        srtp_crypto_policy_set_aes_cm_128_hmac_sha1_32(&policy.rtp);
    else
        srtp_crypto_policy_set_aes_cm_128_hmac_sha1_80(&policy.rtp);
    srtp_crypto_policy_set_aes_cm_128_hmac_sha1_80(&policy.rtcp); // RFC 4568, 6.2: also beside the short tag
    policy.ssrc.type = direction;
    policy.key = const_cast<unsigned char*>(key.data());
    policy.window_size = WINDOW;
    policy.allow_repeat_tx = 1; // a relayed duplicate stays one
    srtp_t context = nullptr;
    if (srtp_create(&context, &policy) != srtp_err_status_ok)
        context = nullptr;
    return {context, srtp_dealloc};
}

SrtpSession::SrtpSession(MediaKeys const& keys)
    : m_keys(keys)
    , m_send(MAKE_CONTEXT(keys, keys.send, ssrc_any_outbound))
    , m_receive(MAKE_CONTEXT(keys, keys.receive, ssrc_any_inbound))
{
}

std::unique_ptr<SrtpSession> SrtpSession::MAKE(MediaKeys const& keys)
{
    if (keys.suite == MediaKeys::NONE || !IS_LIBRARY_READY())
        return nullptr;
    std::unique_ptr<SrtpSession> made(new (std::nothrow) SrtpSession(keys));
    return made != nullptr && made->m_send != nullptr && made->m_receive != nullptr ? std::move(made) : nullptr;
}

void SrtpSession::takeOver(SrtpSession& before)
{
    if (m_keys.suite != before.m_keys.suite)
        return;
    if (m_keys.send == before.m_keys.send)
        m_send.swap(before.m_send);
    if (m_keys.receive == before.m_keys.receive)
        m_receive.swap(before.m_receive);
}

namespace
{
using Work = srtp_err_status_t (*)(srtp_t, void*, int*);

std::size_t DO(Work work, srtp_t context, unsigned char* octets, std::size_t length)
{
    auto changed = static_cast<int>(length);
    return work(context, octets, &changed) == srtp_err_status_ok ? static_cast<std::size_t>(changed) : 0;
}
} // namespace

std::size_t SrtpSession::protectRtp(unsigned char* octets, std::size_t length)
{
    return DO(srtp_protect, m_send.get(), octets, length);
}

std::size_t SrtpSession::protectRtcp(unsigned char* octets, std::size_t length)
{
    return DO(srtp_protect_rtcp, m_send.get(), octets, length);
}

std::size_t SrtpSession::openRtp(unsigned char* octets, std::size_t length)
{
    return DO(srtp_unprotect, m_receive.get(), octets, length);
}

std::size_t SrtpSession::openRtcp(unsigned char* octets, std::size_t length)
{
    return DO(srtp_unprotect_rtcp, m_receive.get(), octets, length);
}
