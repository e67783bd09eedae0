#include "operation/page/ControlRelay.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstring>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace
{
constexpr std::string_view PREFIX = "/control/";
constexpr std::array<std::string_view, 10> GIVEN_OUT = {"call",     "calls", "history", "interfaces", "peers",
                                                        "recorded", "stats", "status",  "top",        "registrations"};
constexpr std::array<std::string_view, 3> CHANGING = {"block", "drop", "unblock"};
constexpr std::string_view OK = R"({"status":"ok"})";
constexpr std::string_view END = "\n\n"; // of an answer, after one line at least

/// With what "%20" and the like stand for.
std::string DECODED(std::string_view text)
{
    std::string decoded;
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        unsigned char octet = 0;
        if (text[i] == '%' && i + 2 < text.size() &&
            std::from_chars(&text[i + 1], &text[i + 1] + 2, octet, 16).ptr == &text[i + 1] + 2)
        {
            decoded += static_cast<char>(octet);
            i += 2;
        }
        else
            decoded += text[i];
    }
    return decoded;
}

/// One word for the socket, which nothing in it turns into another line, two words or an option.
bool IS_WORD(std::string_view word)
{
    return !word.empty() && !word.starts_with("--") &&
           std::all_of(word.begin(), word.end(), [](unsigned char c) { return c > ' ' && c != 0x7f; });
}

template <std::size_t SIZE>
bool HAS(std::array<std::string_view, SIZE> const& verbs, std::string_view verb)
{
    return std::find(verbs.begin(), verbs.end(), verb) != verbs.end();
}

/// The time that it takes tells nobody how much of it was right.
bool IS_SAME_SECRET(std::string_view one, std::string_view other)
{
    unsigned char difference = 0;
    for (std::size_t i = 0; i < std::min(one.size(), other.size()); ++i)
        difference = static_cast<unsigned char>(difference | (one[i] ^ other[i]));
    return one.size() == other.size() && difference == 0;
}

std::string_view TAKE_UP_TO(std::string_view& text, char separator)
{
    std::string_view const piece = text.substr(0, text.find(separator));
    text.remove_prefix(std::min(piece.size() + 1, text.size()));
    return piece;
}
} // namespace

std::string ControlRelay::LINE_OF(HttpRequest const& request)
{
    std::string_view path = request.path;
    if (!path.starts_with(PREFIX))
        return {};
    path.remove_prefix(PREFIX.size());
    std::string line(TAKE_UP_TO(path, '/'));
    if (!(request.isPost ? HAS(CHANGING, line) : HAS(GIVEN_OUT, line)))
        return {};
    while (!path.empty())
    {
        std::string const argument = DECODED(TAKE_UP_TO(path, '/'));
        if (!IS_WORD(argument))
            return {};
        (line += ' ') += argument;
    }
    for (std::string_view query = request.query; !query.empty();)
    {
        std::string_view option = TAKE_UP_TO(query, '&');
        std::string const name = DECODED(TAKE_UP_TO(option, '='));
        std::string const value = DECODED(option);
        if (!IS_WORD(name) || !IS_WORD(value))
            return {};
        (((line += " --") += name) += ' ') += value;
    }
    return line += " --json\n";
}

/// The socket is of this host, so what is asked has gone when this returns, or never goes.
int ControlRelay::open(HttpRequest const& request, unsigned int& refusal)
{
    if (request.isPost && !IS_SAME_SECRET(request.token, m_token))
        refusal = 401;
    if (request.isPost && m_token.empty())
        refusal = 405;
    std::string const line = refusal == 401 || refusal == 405 ? std::string() : LINE_OF(request);
    if (line.empty())
        return -1;
    refusal = 503;
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    if (m_socket.size() >= sizeof address.sun_path)
        return -1;
    std::memcpy(address.sun_path, m_socket.data(), m_socket.size());
    int const descriptor = socket(AF_UNIX, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0);
    if (descriptor >= 0 && connect(descriptor, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0 &&
        send(descriptor, line.data(), line.size(), MSG_NOSIGNAL) == static_cast<ssize_t>(line.size()))
        return descriptor;
    if (descriptor >= 0)
        close(descriptor);
    return -1;
}

std::optional<HttpAnswer> ControlRelay::read(std::string_view come, bool isEnd)
{
    if (!come.ends_with(END))
        return isEnd ? std::optional(HttpAnswer::REFUSING(503)) : std::nullopt;
    std::string_view const status = come.substr(0, come.find('\n'));
    if (status != OK)
        return HttpAnswer{404, std::string(status) + '\n', CONTENT_TYPE};
    come.remove_prefix(std::min(status.size() + 1, come.size()));
    come.remove_suffix(1);
    return HttpAnswer{200, std::string(come), CONTENT_TYPE};
}
