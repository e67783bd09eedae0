// isdn-exchange: the network side of primary-rate lines, for tests and demonstrations. README.md tells how it is used.
#include "Exchange.h"
#include "isdn/line/IsdnSocketListener.h"

#include <cstdio>
#include <exception>
#include <poll.h>
#include <signal.h>
#include <sys/signalfd.h>
#include <time.h>
#include <vector>

namespace
{
long long NOW()
{
    timespec now = {};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return now.tv_sec * 1000LL + now.tv_nsec / 1000000;
}

int MAKE_SIGNALS()
{
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGINT);
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    return signalfd(-1, &signals, SFD_CLOEXEC | SFD_NONBLOCK);
}

void BE_QUIET(pri*, char*) {}

void PRINT(Report const& report)
{
    std::printf("exchange: %u calls received, %u answered; %u placed, %u answered, %u over; %u units charged\n",
                report.received, report.answered, report.placed, report.placedAnswered, report.over, report.units);
    std::printf("exchange: %lu blocks heard\n", report.blocks);
    for (auto const& [cause, count] : report.causes)
        std::printf("exchange: cause %d: %u\n", cause, count);
    for (auto const& [digits, count] : report.keyed)
        std::printf("exchange: keyed %s: %u\n", digits.c_str(), count);
    std::fflush(stdout);
}

bool IS_OVER(Plan const& plan, Report const& report)
{
    unsigned int expected = 0;
    for (Plan::Call const& call : plan.calls)
        expected += call.count;
    return plan.endsAfterCalls && expected != 0 && report.over >= expected;
}

void SERVE(Plan const& plan)
{
    IsdnDescriptor const signals(MAKE_SIGNALS());
    IsdnSocketListener listener;
    Capture capture;
    Report report;
    if (!listener.open(plan.line))
        throw std::runtime_error("nobody can connect to '" + plan.line + "'");
    if (!plan.capture.empty() && !capture.open(plan.capture))
        throw std::runtime_error("'" + plan.capture + "' cannot be written");
    std::printf("exchange: listens at %s\n", plan.line.c_str());
    std::fflush(stdout);
    std::vector<std::unique_ptr<Exchange>> lines;
    long long const end = plan.seconds != 0 ? NOW() + plan.seconds * 1000LL : -1;
    for (long long now = NOW(); (end < 0 || now < end) && !IS_OVER(plan, report); now = NOW())
    {
        std::vector<pollfd> waiting{{signals.get(), POLLIN, 0}, {listener.getDescriptor(), POLLIN, 0}};
        for (auto const& line : lines)
            waiting.push_back({line->getDescriptor(), POLLIN, 0});
        poll(waiting.data(), waiting.size(), lines.empty() ? 1000 : 5);
        if (waiting[0].revents != 0)
            break;
        while (std::optional<IsdnWires> wires = listener.accept())
            lines.push_back(std::make_unique<Exchange>(std::move(*wires), plan, capture, report));
        for (auto const& line : lines)
            line->run(NOW());
        std::erase_if(lines, [](auto const& line) { return line->isGone(); });
    }
    PRINT(report);
}
} // namespace

int main(int argc, char** argv)
try
{
    if (argc != 2)
    {
        std::fprintf(stderr, "usage: isdn-exchange PLAN.toml\n");
        return 2;
    }
    pri_set_message(BE_QUIET);
    pri_set_error(BE_QUIET);
    SERVE(Plan::READ(argv[1]));
    return 0;
}
catch (std::exception const& error)
{
    std::fprintf(stderr, "isdn-exchange: %s\n", error.what());
    return 2;
}
