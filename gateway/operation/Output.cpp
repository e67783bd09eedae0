#include "operation/Output.h"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <fcntl.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

namespace
{
constexpr int MOMENT = 50; // milliseconds between looks at whether it is time to end

bool IS_WRITABLE(int descriptor, int milliseconds)
{
    pollfd asked = {descriptor, POLLOUT, 0};
    return poll(&asked, 1, milliseconds) > 0;
}

ssize_t WRITE(void* output, char const* text, std::size_t size)
{
    static_cast<Output*>(output)->write({text, size});
    return static_cast<ssize_t>(size);
}
} // namespace

Output::Output(int descriptor, std::size_t bound) : m_bound(bound) { setDescriptor(descriptor); }

Output::~Output()
{
    flush();
    {
        std::lock_guard const lock(m_mutex);
        m_isEnding = true;
    }
    m_changed.notify_all();
    if (m_thread.joinable())
        m_thread.join();
    if (m_isOwn)
        close(m_descriptor);
}

/// Pipes and terminals are opened once more, so as not to block: whoever else has them would be surprised by a change
/// of the descriptor that we share.
void Output::setDescriptor(int descriptor)
{
    struct stat status = {};
    m_descriptor = descriptor;
    m_isSocket = fstat(descriptor, &status) == 0 && S_ISSOCK(status.st_mode);
    m_isFile = S_ISREG(status.st_mode);
    if (!S_ISFIFO(status.st_mode) && !S_ISCHR(status.st_mode))
        return;
    std::string const name = "/proc/self/fd/" + std::to_string(descriptor);
    int const own = ::open(name.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY);
    if (own < 0)
        return;
    m_descriptor = own;
    m_isOwn = true;
}

bool Output::open(char const* file)
{
    int const descriptor = ::open(file, O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC | O_NONBLOCK | O_NOCTTY, 0640);
    if (descriptor < 0)
        return false;
    std::lock_guard const lock(m_mutex);
    if (m_isOwn)
        close(m_descriptor);
    m_descriptor = descriptor;
    m_isOwn = true;
    m_isSocket = false;
    return true;
}

/// What was taken of it; 0 for what cannot be taken now, and all for what never can.
long Output::tryToWrite(std::string_view text)
{
    std::size_t taken = 0;
    while (taken < text.size())
    {
        std::string_view const rest = text.substr(taken);
        ssize_t result = 0;
        if (m_isSocket)
            result = send(m_descriptor, rest.data(), rest.size(), MSG_DONTWAIT | MSG_NOSIGNAL);
        else if (m_isOwn || m_isFile)
            result = ::write(m_descriptor, rest.data(), rest.size());
        else if (IS_WRITABLE(m_descriptor, 0)) // a pipe that has any room has it for so much
            result = ::write(m_descriptor, rest.data(), std::min<std::size_t>(rest.size(), PIPE_BUF));
        else
            break;
        if (result < 0 && errno == EINTR)
            continue;
        if (result < 0 && (errno == EAGAIN || errno == EWOULDBLOCK))
            break;
        if (result < 0)
            return static_cast<long>(text.size());
        taken += static_cast<std::size_t>(result);
    }
    return static_cast<long>(taken);
}

void Output::write(std::string_view text)
{
    std::lock_guard const lock(m_mutex);
    std::size_t const taken = m_waiting.empty() ? static_cast<std::size_t>(tryToWrite(text)) : 0;
    if (taken < text.size())
        enqueue(text.substr(taken));
}

/// With the lock.
void Output::enqueue(std::string_view text)
{
    try
    {
        if (m_octets + text.size() > m_bound)
            throw std::bad_alloc();
        m_waiting.emplace_back(text);
        m_octets += text.size();
        if (!m_thread.joinable())
            m_thread = std::thread([this] { drain(); });
        m_changed.notify_all();
    }
    catch (std::bad_alloc const&)
    {
        ++m_dropped;
    }
    catch (std::system_error const&) // no thread: the next text that has to wait tries again
    {
    }
}

void Output::drain()
{
    std::unique_lock lock(m_mutex);
    while (!m_isEnding)
    {
        if (m_waiting.empty())
        {
            tellDropped();
            m_changed.notify_all();
            m_changed.wait(lock, [this] { return m_isEnding || !m_waiting.empty(); });
            continue;
        }
        std::string& front = m_waiting.front();
        auto const taken = static_cast<std::size_t>(tryToWrite(front));
        m_octets -= taken;
        front.erase(0, taken);
        if (front.empty())
        {
            m_waiting.pop_front();
            continue;
        }
        int const descriptor = m_descriptor;
        lock.unlock();
        IS_WRITABLE(descriptor, MOMENT);
        lock.lock();
    }
}

/// With the lock, once nothing waits.
void Output::tellDropped()
{
    if (m_dropped == m_told)
        return;
    std::string const line = "(" + std::to_string(m_dropped - m_told) + " texts were dropped: nobody read them)\n";
    if (static_cast<std::size_t>(tryToWrite(line)) == line.size())
        m_told = m_dropped;
}

unsigned long long Output::getDropped() const
{
    std::lock_guard const lock(m_mutex);
    return m_dropped;
}

void Output::flush(std::chrono::milliseconds patience)
{
    std::unique_lock lock(m_mutex);
    m_changed.wait_for(lock, patience, [this] { return m_waiting.empty(); });
}

std::FILE* Output::makeStream()
{
    cookie_io_functions_t functions = {};
    functions.write = WRITE;
    return fopencookie(this, "w", functions);
}
