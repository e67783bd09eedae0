#include "operation/http/HttpServer.h"

#include "host/SignallingLoop.h"

#include <algorithm>
#include <arpa/inet.h>
#include <array>
#include <cerrno>
#include <cstring>
#include <new>
#include <poll.h>
#include <stdexcept>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <tuple>
#include <unistd.h>
#include <vector>

namespace
{
constexpr std::chrono::milliseconds REST(100); // when there is no descriptor left
constexpr std::string_view END_OF_HEAD = "\r\n\r\n";

void WAKE(int descriptor)
{
    std::uint64_t const one = 1;
    std::ignore = write(descriptor, &one, sizeof one);
}

void FALL_ASLEEP(int descriptor)
{
    std::uint64_t count = 0;
    std::ignore = read(descriptor, &count, sizeof count);
}

bool BIND_TO(int descriptor, SocketAddress const& address)
{
    int const yes = 1;
    setsockopt(descriptor, SOL_SOCKET, SO_REUSEADDR, &yes, sizeof yes);
    sockaddr_in6 version6 = {};
    sockaddr_in version4 = {};
    version6.sin6_family = AF_INET6;
    version4.sin_family = AF_INET;
    version6.sin6_port = version4.sin_port = htons(address.port);
    if (address.isVersion6())
        return inet_pton(AF_INET6, address.host.c_str(), &version6.sin6_addr) == 1 &&
               bind(descriptor, reinterpret_cast<sockaddr*>(&version6), sizeof version6) == 0;
    return inet_pton(AF_INET, address.host.c_str(), &version4.sin_addr) == 1 &&
           bind(descriptor, reinterpret_cast<sockaddr*>(&version4), sizeof version4) == 0;
}

int LISTEN_ON(SocketAddress const& address)
{
    int const family = address.isVersion6() ? AF_INET6 : AF_INET;
    int const descriptor = socket(family, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    if (descriptor >= 0 && BIND_TO(descriptor, address) && listen(descriptor, SOMAXCONN) == 0)
        return descriptor;
    std::string const reason = std::strerror(errno);
    close(descriptor);
    throw std::runtime_error("cannot be listened on: " + reason);
}

/// 503 without memory.
HttpAnswer MAKE(std::function<HttpAnswer()> const& page)
{
    try
    {
        return page();
    }
    catch (std::bad_alloc const&)
    {
        HttpAnswer none;
        none.status = 503;
        return none;
    }
}
} // namespace

HttpServer::Descriptor::Descriptor(int descriptor) : m_descriptor(descriptor)
{
    if (descriptor < 0)
        throw std::runtime_error(std::string("no descriptor: ") + std::strerror(errno));
}

HttpServer::Descriptor::~Descriptor() { close(m_descriptor); }

HttpServer::HttpServer(SocketAddress const& listen, SignallingLoop& loop, HttpContents contents, Milliseconds patience)
    : m_contents(std::move(contents))
    , m_loop(loop)
    , m_patience(patience)
    , m_listening(LISTEN_ON(listen))
    , m_asked(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK))
    , m_wake(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK))
{
    for (auto const& page : m_contents.pages)
        m_made[page.first] = {HttpAnswer::REFUSING(503), {}};
    m_loop.watch(m_asked.get(), [this] { onAsked(); });
    m_thread = std::thread([this] { run(); });
}

HttpServer::~HttpServer()
{
    m_isEnding = true;
    WAKE(m_wake.get());
    m_thread.join();
    m_loop.forget(m_asked.get());
}

// --- on the loop's thread

void HttpServer::onAsked()
{
    FALL_ASLEEP(m_asked.get());
    std::set<std::string> wanted;
    {
        std::lock_guard const lock(m_mutex);
        wanted.swap(m_wanted);
    }
    for (std::string const& path : wanted)
    {
        HttpAnswer made = MAKE(m_contents.pages.find(path)->second);
        std::lock_guard const lock(m_mutex);
        m_made.find(path)->second = {std::move(made), Clock::now()};
    }
    WAKE(m_wake.get());
}

// --- on the other one

void HttpServer::run()
{
    while (!m_isEnding)
        try
        {
            runTurn();
        }
        catch (std::exception const&) // no memory
        {
            m_clients.clear();
        }
}

void HttpServer::runTurn()
{
    bool const isResting = Clock::now() < m_restingUntil;
    std::vector<pollfd> polled{{m_wake.get(), POLLIN, 0}, {isResting ? -1 : m_listening.get(), POLLIN, 0}};
    for (Client const& client : m_clients)
    {
        polled.push_back({client.source ? client.source->get() : -1, POLLIN, 0});
        polled.push_back({client.descriptor.get(), 0, 0});
        if (client.state == State::READING || client.state == State::CLOSING)
            polled.back().events = POLLIN;
        else if (client.state == State::WRITING)
            polled.back().events = POLLOUT;
    }
    poll(polled.data(), polled.size(), getTimeout());
    if (polled[0].revents != 0)
        FALL_ASLEEP(m_wake.get());
    std::size_t place = 2;
    for (Client& client : m_clients)
    {
        if (polled[place++].revents != 0)
            collect(client);
        if (polled[place++].revents != 0)
            onEvent(client);
        if (client.state == State::WAITING)
            ask(client);
        expire(client);
    }
    m_clients.remove_if([](Client const& client) { return client.state == State::OVER; });
    if (polled[1].revents != 0)
        accept();
}

/// Not through the guard of connections, which is the signalling thread's.
void HttpServer::accept()
{
    int const descriptor = accept4(m_listening.get(), nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK);
    if (descriptor < 0)
    {
        if (errno != EAGAIN && errno != ECONNABORTED)
            m_restingUntil = Clock::now() + REST;
        return;
    }
    makeRoom();
    try
    {
        m_clients.emplace_back(descriptor, Clock::now() + m_patience);
    }
    catch (std::bad_alloc const&)
    {
        close(descriptor);
    }
}

void HttpServer::makeRoom()
{
    if (m_clients.size() < MOST_CLIENTS)
        return;
    auto const silent = std::find_if(m_clients.begin(), m_clients.end(),
                                     [](Client const& client) { return client.state == State::READING; });
    m_clients.erase(silent != m_clients.end() ? silent : m_clients.begin());
}

void HttpServer::onEvent(Client& client)
{
    switch (client.state)
    {
    case State::READING:
    case State::CLOSING:
        receive(client);
        break;
    case State::WRITING:
        send(client);
        break;
    default: // it has gone while it waited
        client.state = State::OVER;
    }
}

void HttpServer::receive(Client& client)
{
    std::array<char, 4096> piece{};
    ssize_t const size = read(client.descriptor.get(), piece.data(), piece.size());
    if (size < 0 && (errno == EAGAIN || errno == EINTR))
        return;
    if (size <= 0)
        client.state = State::OVER;
    if (client.state != State::READING)
        return;
    client.text.append(piece.data(), static_cast<std::size_t>(size));
    if (std::size_t const end = client.text.find(END_OF_HEAD); end <= LONGEST_REQUEST - END_OF_HEAD.size())
    {
        client.request = HttpRequest::PARSE(std::string_view(client.text).substr(0, end + END_OF_HEAD.size()));
        begin(client);
    }
    else if (client.text.size() > LONGEST_REQUEST)
        answer(client, HttpAnswer::REFUSING(431));
}

void HttpServer::begin(Client& client)
{
    if (client.request.refusal != 0)
        return answer(client, HttpAnswer::REFUSING(client.request.refusal));
    auto const file = m_contents.files.find(client.request.path);
    bool const isMade = m_contents.pages.contains(client.request.path);
    if (client.request.isPost && (isMade || file != m_contents.files.end() || m_contents.relay == nullptr))
        return answer(client, HttpAnswer::REFUSING(405));
    if (file != m_contents.files.end())
        return answer(client, file->second);
    if (!isMade)
    {
        unsigned int refusal = 404;
        int const source = m_contents.relay != nullptr ? m_contents.relay->open(client.request, refusal) : -1;
        if (source < 0)
            return answer(client, HttpAnswer::REFUSING(refusal));
        client.source.emplace(source);
        client.text.clear();
    }
    client.state = isMade ? State::WAITING : State::COLLECTING;
    client.asked = Clock::now();
    client.deadline = client.asked + m_patience;
}

void HttpServer::collect(Client& client)
{
    std::array<char, 65536> piece;
    ssize_t const size = read(client.source->get(), piece.data(), piece.size());
    if (size < 0 && (errno == EAGAIN || errno == EINTR))
        return;
    client.text.append(piece.data(), size > 0 ? static_cast<std::size_t>(size) : 0);
    bool const isTooLong = client.text.size() > LONGEST_RELAYED;
    if (std::optional<HttpAnswer> const whole = m_contents.relay->read(client.text, size <= 0); whole || isTooLong)
    {
        client.source.reset();
        answer(client, isTooLong ? HttpAnswer::REFUSING(503) : *whole);
    }
}

void HttpServer::ask(Client& client)
{
    HttpAnswer made;
    {
        std::lock_guard const lock(m_mutex);
        Made const& latest = m_made.find(client.request.path)->second;
        if (latest.time + FRESHNESS < client.asked)
        {
            if (m_wanted.insert(client.request.path).second)
                WAKE(m_asked.get());
            return;
        }
        made = latest.answer;
    }
    answer(client, made);
}

void HttpServer::answer(Client& client, HttpAnswer const& answer)
{
    client.text = answer.getText(client.request.isHead);
    client.state = State::WRITING;
    client.deadline = Clock::now() + m_patience;
    send(client);
}

void HttpServer::send(Client& client)
{
    ssize_t const sent =
        ::send(client.descriptor.get(), client.text.data(), client.text.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
    if (sent < 0 && errno != EAGAIN && errno != EINTR)
        client.state = State::OVER;
    client.text.erase(0, sent > 0 ? static_cast<std::size_t>(sent) : 0);
    if (!client.text.empty() || client.state == State::OVER)
        return;
    shutdown(client.descriptor.get(), SHUT_WR);
    client.state = State::CLOSING;
}

void HttpServer::expire(Client& client)
{
    if (Clock::now() < client.deadline)
        return;
    client.source.reset();
    if (client.state == State::WAITING || client.state == State::COLLECTING)
        answer(client, {503, "the gateway's loop does not turn\n"});
    else
        client.state = State::OVER;
}

int HttpServer::getTimeout() const
{
    auto const now = Clock::now();
    auto earliest = now < m_restingUntil ? m_restingUntil : Clock::time_point::max();
    for (Client const& client : m_clients)
        earliest = std::min(earliest, client.deadline);
    if (earliest == Clock::time_point::max())
        return -1;
    return static_cast<int>(std::max<long long>(0, std::chrono::ceil<Milliseconds>(earliest - now).count()));
}
