#include "operation/StateDump.h"

#include <spdlog/spdlog.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <string_view>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <tuple>
#include <unistd.h>
#include <utility>

namespace
{
constexpr unsigned int PATIENCE = 10; // seconds that somebody may take to read it

void WRITE_ALL(std::string_view text)
{
    while (!text.empty())
    {
        ssize_t const written = write(STDOUT_FILENO, text.data(), text.size());
        if (written < 0 && errno != EINTR)
            return;
        text.remove_prefix(written > 0 ? static_cast<std::size_t>(written) : 0);
    }
}

[[noreturn]] void TELL(std::function<std::string()> const& collect)
{
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    std::signal(SIGALRM, SIG_DFL);
    alarm(PATIENCE);
    std::ignore = nice(10);                 // the calls go first
    close_range(STDERR_FILENO + 1, ~0u, 0); // else the ports would be open for as long, and connections
    try
    {
        WRITE_ALL(collect());
    }
    catch (std::exception const&) // without memory there is nothing to tell
    {
    }
    _exit(0);
}
} // namespace

StateDump::~StateDump()
{
    if (m_child > 0)
        waitpid(m_child, nullptr, 0); // within its patience: what was asked for is told
}

void StateDump::begin(std::function<std::string()> collect)
{
    if (m_child > 0)
    {
        m_next = std::move(collect);
        return;
    }
    std::fflush(stdout); // else both would write what is in the buffer
    m_child = fork();
    if (m_child == 0)
        TELL(collect);
    if (m_child < 0)
        spdlog::warn("the state cannot be told: no process");
}

void StateDump::onChild()
{
    if (m_child <= 0 || waitpid(m_child, nullptr, WNOHANG) == 0)
        return;
    m_child = 0;
    if (auto const next = std::exchange(m_next, nullptr))
        begin(next);
}
