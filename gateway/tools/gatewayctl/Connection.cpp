#include "Connection.h"

#include <array>
#include <cerrno>
#include <cstring>
#include <stdexcept>
#include <sys/socket.h>
#include <sys/time.h>
#include <sys/un.h>
#include <unistd.h>

namespace
{
constexpr timeval PATIENCE = {15, 0}; // longer than the gateway's own
} // namespace

Connection::Connection(std::string const& path) : m_descriptor(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0))
{
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    bool const isShort = path.size() < sizeof address.sun_path;
    path.copy(address.sun_path, isShort ? path.size() : 0);
    setsockopt(m_descriptor, SOL_SOCKET, SO_RCVTIMEO, &PATIENCE, sizeof PATIENCE);
    setsockopt(m_descriptor, SOL_SOCKET, SO_SNDTIMEO, &PATIENCE, sizeof PATIENCE);
    if (isShort && connect(m_descriptor, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0)
        return;
    std::string const reason = isShort ? std::strerror(errno) : "the name is too long for a socket";
    close(m_descriptor);
    throw std::runtime_error(path + ": " + reason);
}

Connection::~Connection() { close(m_descriptor); }

void Connection::send(std::string_view line)
{
    std::string const text = std::string(line) + '\n';
    if (::send(m_descriptor, text.data(), text.size(), MSG_NOSIGNAL) != static_cast<ssize_t>(text.size()))
        throw std::runtime_error("the gateway takes nothing");
}

std::optional<std::string> Connection::receive()
{
    std::size_t end = m_waiting.find('\n');
    while (end == std::string::npos)
    {
        std::array<char, 16384> piece{};
        ssize_t const size = read(m_descriptor, piece.data(), piece.size());
        if (size < 0 && errno == EINTR)
            continue;
        if (size <= 0)
            return std::nullopt;
        std::size_t const before = m_waiting.size();
        m_waiting.append(piece.data(), static_cast<std::size_t>(size));
        end = m_waiting.find('\n', before);
    }
    std::string line = m_waiting.substr(0, end);
    m_waiting.erase(0, end + 1);
    return line;
}

bool Connection::IS_OK(std::string_view status) { return status == "ok" || status == R"({"status":"ok"})"; }

Connection::Answer Connection::ask(std::string_view line)
{
    send(line);
    std::optional<std::string> next = receive();
    if (!next)
        throw std::runtime_error("no answer");
    Answer answer{IS_OK(*next), *next, {}};
    for (next = receive(); next && !next->empty(); next = receive())
        answer.lines.push_back(*next);
    if (!next)
        throw std::runtime_error("the answer is cut off");
    return answer;
}
