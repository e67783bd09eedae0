#include "tests/simulation/Attempts.h"

#include "tests/simulation/Run.h"

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <new>
#include <sys/mman.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

namespace Simulation
{
namespace
{
constexpr unsigned int LONGEST_RUN = 20; // seconds of the processor; an honest one takes milliseconds
constexpr unsigned int LONGEST_WAIT = 60;

void BE_SILENT()
{
    int const nowhere = open("/dev/null", O_WRONLY);
    dup2(nowhere, STDOUT_FILENO);
    dup2(nowhere, STDERR_FILENO);
}
} // namespace

void Report::setFailure(std::string const& text)
{
    std::size_t const length = std::min(text.size(), sizeof failure - 1);
    std::memcpy(failure, text.data(), length);
    failure[length] = '\0';
}

Report& SHARED_REPORT()
{
    static Report* const report = []
    {
        void* const memory = mmap(nullptr, sizeof(Report), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
        if (memory == MAP_FAILED)
            std::abort();
        return new (memory) Report{};
    }();
    return *report;
}

void LIMIT_TIME()
{
    itimerval const ofTheProcessor{{}, {LONGEST_RUN, 0}};
    setitimer(ITIMER_PROF, &ofTheProcessor, nullptr);
    alarm(LONGEST_WAIT);
}

Ended ENDED(int status)
{
    if (WIFSIGNALED(status) && (WTERMSIG(status) == SIGPROF || WTERMSIG(status) == SIGALRM))
        return {true, "it hangs"};
    if (WIFSIGNALED(status))
        return {true, std::string("it crashes: ") + strsignal(WTERMSIG(status))};
    if (WEXITSTATUS(status) == 0)
        return {};
    char const* const failure = SHARED_REPORT().failure;
    bool const isTold = *failure != '\0';
    return {true, isTold ? failure : "a sanitizer ends it", !isTold};
}

Ended ATTEMPT(Operations const& operations, bool isSilent)
{
    Report& report = SHARED_REPORT();
    report.setFailure({});
    report.progress = 0;
    std::fflush(nullptr);
    pid_t const child = fork();
    if (child == 0)
    {
        if (isSilent)
            BE_SILENT();
        LIMIT_TIME();
        Outcome const outcome = RUN(operations, &report.progress);
        report.setFailure(outcome.failure);
        _exit(outcome.hasFailed() ? 1 : 0);
    }
    int status = 0;
    if (child < 0 || waitpid(child, &status, 0) != child)
        std::abort();
    return ENDED(status);
}
} // namespace Simulation
