#include "SipUserAgent.h"

#include <arpa/inet.h>
#include <cstdlib>
#include <netinet/in.h>
#include <stdexcept>
#include <strings.h>
#include <sys/socket.h>
#include <unistd.h>

namespace
{
constexpr std::size_t LARGEST = 65536; // bytes of a message

sockaddr_in ADDRESS_OF(SocketAddress const& address)
{
    sockaddr_in raw = {};
    raw.sin_family = AF_INET;
    raw.sin_port = htons(address.port);
    inet_pton(AF_INET, address.host.c_str(), &raw.sin_addr);
    return raw;
}

bool IS_NAMED(std::string_view line, std::string_view name)
{
    return line.size() > name.size() && line[name.size()] == ':' &&
           strncasecmp(line.data(), name.data(), name.size()) == 0;
}

std::string_view LINE_AT(std::string_view message, std::size_t position)
{
    return message.substr(position, message.find("\r\n", position) - position);
}

/// All headers of that name as they stand, a line each; empty without one.
std::string LINES_OF(std::string_view message, std::string_view name)
{
    std::string lines;
    for (std::size_t at = message.find("\r\n"); at != std::string_view::npos; at = message.find("\r\n", at + 2))
        if (std::string_view const line = LINE_AT(message, at + 2); IS_NAMED(line, name))
            lines += std::string(line) + "\r\n";
    return lines;
}

/// The value of the first header of that name.
std::string VALUE_OF(std::string_view message, std::string_view name)
{
    std::string const lines = LINES_OF(message, name);
    if (lines.empty())
        return {};
    std::size_t const begin = lines.find_first_not_of(' ', name.size() + 1);
    return lines.substr(begin, lines.find("\r\n") - begin);
}

std::string BETWEEN(std::string const& text, char const* before, char const* after)
{
    std::size_t const begin = text.find(before);
    if (begin == std::string::npos)
        return {};
    std::size_t const start = begin + std::string_view(before).size();
    std::size_t const stop = text.find_first_of(after, start);
    return text.substr(start, stop == std::string::npos ? stop : stop - start);
}

unsigned int CAUSE_OF(std::string_view message)
{
    std::string const reasons = LINES_OF(message, "Reason");
    std::size_t const at = reasons.find("Q.850");
    if (at == std::string::npos)
        return 0;
    return static_cast<unsigned int>(std::strtoul(BETWEEN(reasons.substr(at), "cause=", ";,\r").c_str(), nullptr, 10));
}

std::string REASON_OF(unsigned int cause) { return "Reason: Q.850;cause=" + std::to_string(cause) + "\r\n"; }

/// What an answer repeats of its request.
std::string ANSWER_TO(std::string_view request, char const* status, std::string const& to)
{
    return std::string("SIP/2.0 ") + status + "\r\n" + LINES_OF(request, "Via") + LINES_OF(request, "From") +
           "To: " + to + "\r\n" + LINES_OF(request, "Call-ID") + LINES_OF(request, "CSeq");
}
} // namespace

SipUserAgent::SipUserAgent() : m_socket(socket(AF_INET, SOCK_DGRAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0))
{
    sockaddr_in raw = ADDRESS_OF({"127.0.0.1", 0});
    socklen_t length = sizeof raw;
    if (m_socket < 0 || bind(m_socket, reinterpret_cast<sockaddr*>(&raw), length) != 0 ||
        getsockname(m_socket, reinterpret_cast<sockaddr*>(&raw), &length) != 0)
        throw std::runtime_error("no socket for the user agent");
    m_address = {"127.0.0.1", ntohs(raw.sin_port)};
}

SipUserAgent::~SipUserAgent() { close(m_socket); }

void SipUserAgent::send(std::string const& text, std::string const& body)
{
    std::string const whole = text + "Content-Length: " + std::to_string(body.size()) + "\r\n\r\n" + body;
    sockaddr_in const raw = ADDRESS_OF(m_peer);
    if (sendto(m_socket, whole.data(), whole.size(), 0, reinterpret_cast<sockaddr const*>(&raw), sizeof raw) < 0)
        throw std::runtime_error("the user agent cannot send");
}

void SipUserAgent::receive()
{
    std::string buffer(LARGEST, '\0');
    for (;;)
    {
        ssize_t const length = recv(m_socket, buffer.data(), buffer.size(), 0);
        if (length < 0)
            return;
        take(std::string_view(buffer).substr(0, static_cast<std::size_t>(length)));
    }
}

void SipUserAgent::take(std::string_view message)
{
    bool const isResponse = message.starts_with("SIP/2.0");
    if (isResponse && VALUE_OF(message, "CSeq").find("OPTIONS") != std::string::npos)
    {
        ++m_pongs;
        return;
    }
    ++m_messages;
    if (!m_isSilent)
        isResponse ? takeResponse(message) : takeRequest(message);
}

// --- requests --------------------------------------------------------------------------------------------------------

void SipUserAgent::takeRequest(std::string_view message)
{
    Call* const call = find(VALUE_OF(message, "Call-ID"));
    if (message.starts_with("INVITE ") && call == nullptr)
        takeInvite(message);
    else if (call == nullptr)
        return;
    else if (message.starts_with("INVITE "))
        send(call->lastAnswer);
    else if (message.starts_with("CANCEL "))
        takeCancel(message, *call);
    else if (message.starts_with("BYE "))
        takeBye(message, *call);
    else if (message.starts_with("INFO "))
    {
        send(ANSWER_TO(message, "200 OK", call->local));
        tell({.kind = Event::DIGITS, .call = call->number, .number = BETWEEN(std::string(message), "Signal=", "\r")});
    }
}

void SipUserAgent::takeInvite(std::string_view message)
{
    auto const number = static_cast<unsigned int>(m_calls.size() + 1);
    m_calls.push_back({.number = number,
                       .id = VALUE_OF(message, "Call-ID"),
                       .local = VALUE_OF(message, "To") + ";tag=ua" + std::to_string(number),
                       .remote = VALUE_OF(message, "From"),
                       .target = BETWEEN(VALUE_OF(message, "Contact"), "<", ">"),
                       .invite = std::string(message),
                       .uri = {}});
    answerInvite(m_calls.back(), "100 Trying");
    tell({.kind = Event::CALLED, .call = number, .number = BETWEEN(std::string(message), "sip:", "@")});
}

void SipUserAgent::takeCancel(std::string_view message, Call& call)
{
    send(ANSWER_TO(message, "200 OK", call.local));
    if (call.isOver || call.isAnswered)
        return;
    answerInvite(call, "487 Request Terminated");
    end(call, CAUSE_OF(message));
}

void SipUserAgent::takeBye(std::string_view message, Call& call)
{
    send(ANSWER_TO(message, "200 OK", call.local));
    end(call, CAUSE_OF(message));
}

void SipUserAgent::answerInvite(Call& call, char const* status, std::string const& more)
{
    std::string const contact = "Contact: <sip:" + m_address.text() + ">\r\n";
    call.lastAnswer = ANSWER_TO(call.invite, status, call.local) + contact + more;
    send(call.lastAnswer);
}

void SipUserAgent::end(Call& call, unsigned int cause)
{
    if (call.isOver)
        return;
    call.isOver = true;
    tell({.kind = Event::CLEARED, .call = call.number, .cause = cause});
}

// --- responses -------------------------------------------------------------------------------------------------------

void SipUserAgent::takeResponse(std::string_view message)
{
    Call* const call = find(VALUE_OF(message, "Call-ID"));
    bool const isToInvite = VALUE_OF(message, "CSeq").find("INVITE") != std::string::npos;
    auto const status = static_cast<unsigned int>(std::strtoul(std::string(message.substr(8, 3)).c_str(), nullptr, 10));
    if (call != nullptr && isToInvite && status > 100)
        takeInviteResponse(message, status, *call);
}

void SipUserAgent::takeInviteResponse(std::string_view message, unsigned int status, Call& call)
{
    call.remote = VALUE_OF(message, "To");
    if (status == 180)
        tell({.kind = Event::RINGING, .call = call.number});
    if (status < 200)
        return;
    bool const isFirst = !call.isAnswered;
    if (status >= 300) // its ACK belongs to the INVITE's transaction
    {
        call.target = call.uri;
        request(call, "ACK", call.invite, 1, {});
        end(call, CAUSE_OF(message));
        return;
    }
    call.target = BETWEEN(VALUE_OF(message, "Contact"), "<", ">");
    request(call, "ACK", makeVia(), 1, {});
    call.isAnswered = true;
    if (isFirst)
        tell({.kind = Event::ANSWERED, .call = call.number});
}

// --- what the user does ----------------------------------------------------------------------------------------------

void SipUserAgent::call(std::string const& number)
{
    auto const index = static_cast<unsigned int>(m_calls.size() + 1);
    std::string const uri = "sip:" + number + "@" + m_peer.text();
    m_calls.push_back({.number = index,
                       .id = "call" + std::to_string(index) + "@" + m_address.text(),
                       .local = "<sip:4940444@" + m_address.text() + ">;tag=ua" + std::to_string(index),
                       .remote = "<" + uri + ">",
                       .target = uri,
                       .invite = makeVia(),
                       .uri = uri,
                       .isOurs = true});
    request(m_calls.back(), "INVITE", m_calls.back().invite, 1, "Contact: <sip:" + m_address.text() + ">\r\n");
}

void SipUserAgent::ring()
{
    if (Call* const call = findFirst())
        answerInvite(*call, "180 Ringing");
}

void SipUserAgent::answer()
{
    Call* const call = findFirst();
    if (call == nullptr)
        return;
    call->isAnswered = true;
    answerInvite(*call, "200 OK");
}

void SipUserAgent::clear(unsigned int cause)
{
    Call* const call = findFirst();
    if (call == nullptr)
        return;
    call->isOver = true;
    if (call->isAnswered)
        request(*call, "BYE", makeVia(), ++call->sequence, REASON_OF(cause));
    else if (call->isOurs)
        request(*call, "CANCEL", call->invite, 1, REASON_OF(cause));
    else
        answerInvite(*call, "480 Temporarily Unavailable", REASON_OF(cause));
}

void SipUserAgent::sendDigit(char digit)
{
    if (Call* const call = findFirst())
        request(*call, "INFO", makeVia(), ++call->sequence, "Content-Type: application/dtmf-relay\r\n",
                std::string("Signal=") + digit + "\r\nDuration=100\r\n");
}

void SipUserAgent::ping()
{
    std::string const peer = "sip:" + m_peer.text();
    request({.number = 0,
             .id = "ping" + std::to_string(++m_branches),
             .local = "<sip:" + m_address.text() + ">;tag=ping",
             .remote = "<" + peer + ">",
             .target = peer,
             .invite = {},
             .uri = {}},
            "OPTIONS", makeVia(), 1, {});
}

void SipUserAgent::request(Call const& call, char const* method, std::string const& via, unsigned int sequence,
                           std::string const& more, std::string const& body)
{
    send(std::string(method) + " " + call.target + " SIP/2.0\r\n" + via + "Max-Forwards: 70\r\nFrom: " + call.local +
             "\r\nTo: " + call.remote + "\r\nCall-ID: " + call.id + "\r\nCSeq: " + std::to_string(sequence) + " " +
             method + "\r\n" + more,
         body);
}

std::string SipUserAgent::makeVia()
{
    return "Via: SIP/2.0/UDP " + m_address.text() + ";branch=z9hG4bK" + std::to_string(++m_branches) + ";rport\r\n";
}

SipUserAgent::Call* SipUserAgent::find(std::string_view id)
{
    for (Call& call : m_calls)
        if (call.id == id)
            return &call;
    return nullptr;
}

SipUserAgent::Call* SipUserAgent::findFirst()
{
    for (Call& call : m_calls)
        if (!call.isOver)
            return &call;
    return nullptr;
}

void SipUserAgent::tell(Event const& event) const
{
    if (onEvent)
        onEvent(event);
}
