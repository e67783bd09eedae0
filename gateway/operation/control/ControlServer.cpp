#include "operation/control/ControlServer.h"

#include "operation/ProcessCopy.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <new>
#include <pwd.h>
#include <stdexcept>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

namespace
{
constexpr unsigned int MILLISECONDS = 1000;

/// Who is at the other end, for the log.
std::string USER_OF(int client)
{
    ucred credentials = {};
    socklen_t length = sizeof credentials;
    if (getsockopt(client, SOL_SOCKET, SO_PEERCRED, &credentials, &length) != 0)
        return "unknown";
    return "uid " + std::to_string(credentials.uid) + ", pid " + std::to_string(credentials.pid);
}
/// Nothing that would steer the terminal of who reads the log.
bool IS_TEXT(std::string_view line)
{
    return std::all_of(line.begin(), line.end(),
                       [](char c)
                       { return (static_cast<unsigned char>(c) >= 0x20 && c != 0x7f) || c == '\t' || c == '\r'; });
}
} // namespace

ControlServer::Client::Client(int client, TYEventLoop& timers, ControlServer& owner)
    : descriptor(client), server(owner), idle(timers, EventPrio::LOW, ON_IDLE, this)
{
}

/// What nobody will read any more is not told to the end.
ControlServer::Client::~Client()
{
    ::close(descriptor);
    if (copy <= 0)
        return;
    kill(copy, SIGKILL);
    waitpid(copy, nullptr, 0);
}

ControlServer::ControlServer(ControlOptions const& options, SignallingLoop& loop, TYEventLoop& timers,
                             ControlHandler& handler)
    : m_options(options), m_loop(loop), m_timers(timers), m_handler(handler), m_socket(options)
{
    m_loop.watch(m_socket.get(), [this] { onConnection(); });
}

ControlServer::~ControlServer()
{
    m_loop.forget(m_socket.get());
    for (Client const& client : m_clients)
        m_loop.forget(client.descriptor);
}

void ControlServer::onConnection()
{
    int const descriptor = m_socket.accept();
    if (descriptor < 0)
        return;
    try
    {
        makeRoom();
        m_clients.emplace_back(descriptor, m_timers, *this);
    }
    catch (std::bad_alloc const&)
    {
        ::close(descriptor);
        return;
    }
    listenTo(m_clients.back());
}

void ControlServer::makeRoom()
{
    if (m_clients.size() < m_options.maxClients)
        return;
    auto const silent =
        std::find_if(m_clients.begin(), m_clients.end(), [](Client const& client) { return client.copy == 0; });
    close(silent != m_clients.end() ? *silent : m_clients.front());
}

/// As long as an answer is being told, nobody looks at what else the client wants.
void ControlServer::listenTo(Client& client)
{
    client.idle.start(m_options.idle * MILLISECONDS);
    try
    {
        m_loop.watch(client.descriptor, [this, &client] { onReadable(client); });
    }
    catch (std::exception const&) // neither memory nor room in the loop
    {
        close(client);
    }
}

void ControlServer::close(Client& client)
{
    m_loop.forget(client.descriptor);
    m_clients.remove_if([&](Client const& candidate) { return &candidate == &client; });
}

void ControlServer::ON_IDLE(void* client)
{
    auto& self = *static_cast<Client*>(client);
    self.server.close(self);
}

void ControlServer::onReadable(Client& client)
{
    std::array<char, LONGEST_LINE> piece{};
    ssize_t const size = read(client.descriptor, piece.data(), piece.size());
    if (size < 0 && (errno == EAGAIN || errno == EINTR))
        return;
    serve(client, {piece.data(), size > 0 ? static_cast<std::size_t>(size) : 0});
    if (size <= 0 || client.isOver)
        close(client);
}

void ControlServer::serve(Client& client, std::string_view more)
{
    try
    {
        client.input.append(more);
        serveLines(client);
    }
    catch (std::bad_alloc const&)
    {
        client.isOver = true;
    }
}

void ControlServer::serveLines(Client& client)
{
    while (client.copy == 0 && !client.isOver)
    {
        std::size_t const end = client.input.find('\n');
        if (end == std::string::npos && client.input.size() <= LONGEST_LINE)
            return;
        std::string const line = client.input.substr(0, end);
        client.input.erase(0, line.size() + 1);
        client.isOver = line.size() > LONGEST_LINE || !IS_TEXT(line);
        if (client.isOver)
            send(client, ControlAnswer{{}, "this is no line of text"}.getText(false));
        else
            serveLine(client, line);
    }
}

void ControlServer::serveLine(Client& client, std::string const& line)
{
    auto const place =
        std::find_if(m_clients.begin(), m_clients.end(), [&](Client const& other) { return &other == &client; });
    m_clients.splice(m_clients.end(), m_clients, place);
    client.idle.start(m_options.idle * MILLISECONDS);
    ControlRequest const request = ControlRequest::PARSE(line);
    std::string const user = USER_OF(client.descriptor);
    if (m_handler.isLong(request))
        answerLater(client, request, user);
    else
        send(client, m_handler.answer(request, user).getText(request.isJson));
}

void ControlServer::answerLater(Client& client, ControlRequest const& request, std::string const& user)
{
    pid_t const copy = countCopies() < MOST_COPIES
                           ? ProcessCopy::START(client.descriptor,
                                                [&] { return m_handler.answer(request, user).getText(request.isJson); })
                           : -1;
    if (copy < 0)
    {
        send(client, ControlAnswer{{}, "too much is being told already"}.getText(request.isJson));
        return;
    }
    client.copy = copy;
    client.idle.stop(); // the copy has a patience of its own
    m_loop.forget(client.descriptor);
}

unsigned int ControlServer::countCopies() const
{
    return static_cast<unsigned int>(
        std::count_if(m_clients.begin(), m_clients.end(), [](Client const& client) { return client.copy != 0; }));
}

void ControlServer::send(Client& client, std::string const& text)
{
    ssize_t const sent = ::send(client.descriptor, text.data(), text.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
    if (sent != static_cast<ssize_t>(text.size())) // it has not read what it was told before
        client.isOver = true;
}

void ControlServer::onChild()
{
    for (auto next = m_clients.begin(); next != m_clients.end();)
    {
        Client& client = *next++;
        if (client.copy == 0 || !ProcessCopy::HAS_ENDED(client.copy))
            continue;
        client.copy = 0;
        serve(client, {});
        if (client.isOver)
            close(client);
        else if (client.copy == 0)
            listenTo(client);
    }
}
