#include "operation/ProcessCopy.h"

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <exception>
#include <poll.h>
#include <string_view>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <tuple>
#include <unistd.h>

namespace
{
constexpr unsigned int PATIENCE = 10; // seconds that somebody may take to read it

void WRITE_ALL(std::string_view text)
{
    pollfd output = {STDOUT_FILENO, POLLOUT, 0};
    while (!text.empty())
    {
        ssize_t const written = write(STDOUT_FILENO, text.data(), text.size());
        if (written < 0 && errno == EAGAIN)
            poll(&output, 1, -1);
        else if (written < 0 && errno != EINTR)
            return;
        text.remove_prefix(written > 0 ? static_cast<std::size_t>(written) : 0);
    }
}

[[noreturn]] void TELL(int descriptor, std::function<std::string()> const& collect)
{
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    std::signal(SIGALRM, SIG_DFL);
    alarm(PATIENCE);
    std::ignore = nice(10); // the calls go first
    dup2(descriptor, STDOUT_FILENO);
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

pid_t ProcessCopy::START(int descriptor, std::function<std::string()> const& collect)
{
    std::fflush(stdout); // else both would write what is in the buffer
    pid_t const copy = fork();
    if (copy == 0)
        TELL(descriptor, collect);
    return copy;
}

bool ProcessCopy::HAS_ENDED(pid_t copy) { return waitpid(copy, nullptr, WNOHANG) != 0; }
