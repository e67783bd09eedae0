#include "operation/metric/ProcessMetrics.h"

#include "host/MetricText.h"

#include <cstdio>
#include <ctime>
#include <memory>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/time.h>
#include <unistd.h>

namespace
{
constexpr double MICROSECONDS = 1e6; // in a second

double const s_start = static_cast<double>(std::time(nullptr)); // when this library was loaded

double SECONDS_OF(timeval const& time)
{
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) / MICROSECONDS;
}

struct Pages
{
    unsigned long long all = 0;
    unsigned long long resident = 0;
};

Pages READ_PAGES()
{
    Pages pages;
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> const file(std::fopen("/proc/self/statm", "re"), std::fclose);
    if (file == nullptr || std::fscanf(file.get(), "%llu %llu", &pages.all, &pages.resident) != 2)
        return {};
    return pages;
}

/// The folder's size is their number since Linux 6.2, and 0 before; to count them would take longer the more there are.
unsigned long long GET_DESCRIPTORS()
{
    struct stat status = {};
    return stat("/proc/self/fd", &status) == 0 ? static_cast<unsigned long long>(status.st_size) : 0;
}

void ADD_DESCRIPTORS(MetricText& text)
{
    rlimit limit = {};
    getrlimit(RLIMIT_NOFILE, &limit);
    text.begin("process_max_fds", MetricText::GAUGE, "Descriptors that the process may have open");
    text.add(limit.rlim_cur);
    if (unsigned long long const open = GET_DESCRIPTORS(); open != 0)
    {
        text.begin("process_open_fds", MetricText::GAUGE, "Descriptors that the process has open");
        text.add(open);
    }
}
} // namespace

void ProcessMetrics::ADD(MetricText& text)
{
    rusage usage = {};
    getrusage(RUSAGE_SELF, &usage);
    auto const size = static_cast<unsigned long long>(sysconf(_SC_PAGESIZE));
    Pages const pages = READ_PAGES();
    text.begin("process_cpu_seconds_total", MetricText::COUNTER, "Processor time, of all threads");
    text.add(SECONDS_OF(usage.ru_utime) + SECONDS_OF(usage.ru_stime));
    text.begin("process_resident_memory_bytes", MetricText::GAUGE, "Memory that the process has now");
    text.add(pages.resident * size);
    text.begin("process_virtual_memory_bytes", MetricText::GAUGE, "Addresses that the process has");
    text.add(pages.all * size);
    text.begin("process_start_time_seconds", MetricText::GAUGE, "When the process was started, after 1970");
    text.add(s_start);
    ADD_DESCRIPTORS(text);
}
