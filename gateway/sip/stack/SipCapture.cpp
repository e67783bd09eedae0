#include "sip/stack/SipCapture.h"

#include "host/Capture.h"
#include "sip/stack/StackFunction.h"

#include <array>
#include <netinet/in.h>
#include <new>
#include <string>
#include <utility>

namespace
{
constexpr std::size_t MOST_PIECES = 512; // of a message: about one for each header

Capture* s_capture = nullptr;

/// As it is on the wire; empty when it is in too many pieces.
std::string TEXT_OF(msg_t* message)
{
    std::array<msg_iovec_t, MOST_PIECES> pieces;
    isize_t const count = msg_iovec(message, pieces.data(), pieces.size());
    std::string text;
    if (count > static_cast<isize_t>(pieces.size()))
        return text;
    for (isize_t i = 0; i < count; ++i)
        text.append(static_cast<char const*>(pieces[static_cast<std::size_t>(i)].mv_base),
                    pieces[static_cast<std::size_t>(i)].mv_len);
    return text;
}

void SHOW(tport_t const* port, msg_t* message, sockaddr const& far, bool isOurs)
try
{
    sockaddr const& own = *tport_get_address(tport_parent(port))->ai_addr;
    unsigned char const transport = tport_is_udp(port) ? IPPROTO_UDP : IPPROTO_TCP;
    std::string const text = TEXT_OF(message);
    s_capture->show({CapturedMessage::SIP, transport, isOurs ? own : far, isOurs ? far : own,
                     std::chrono::system_clock::now(), text});
}
catch (std::bad_alloc const&)
{
    s_capture->noteLost();
}
} // namespace

SipCapture::SipCapture(Capture& capture) { s_capture = &capture; }

SipCapture::~SipCapture() { s_capture = nullptr; }

void SipCapture::ON_RECEIVED(tport_t const* port, msg_t* message)
{
    if (s_capture != nullptr)
        SHOW(port, message, msg_addr(message)->su_sa, false);
}

void SipCapture::ON_SENT(tport_t const* port, msg_t* message)
{
    if (s_capture != nullptr)
        SHOW(port, message, *(tport_is_secondary(port) ? tport_get_address(port) : msg_addrinfo(message))->ai_addr,
             true);
}

/// Where every message leaves, and again each time it is repeated.
extern "C" __attribute__((visibility("default"))) int tport_send_msg(tport_t* port, msg_t* message,
                                                                     tp_name_t const* name, void* compressor)
{
    static auto* const s_original = STACK_FUNCTION<int(tport_t*, msg_t*, tp_name_t const*, void*)>("tport_send_msg");
    int const result = s_original(port, message, name, compressor);
    if (result >= 0)
        SipCapture::ON_SENT(port, message);
    return result;
}
