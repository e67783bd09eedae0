#include "tests/simulation/CallOut.h"

#include <cstddef>
#include <iterator>

char const* Simulation::NAME_OF(CallOut kind)
{
    static constexpr char const* NAMES[] = {
        "call ended",         "leg added",          "leg removed",      "call changed",        "leg ended",
        "leg relinked",       "leg changed",        "leg service",      "context destroyed",   "provider added",
        "provider removed",   "call created",       "call released",    "registry: added",     "registry: destroyed",
        "provider destroyed", "endpoint destroyed", "provider's dial",  "endpoint's offer",    "endpoint's name",
        "endpoint's dump",    "peer changed",       "peer service",     "input filter",        "output filter",
        "filter's clone",     "filter's end",       "property's clone", "property's assign",   "property's compare",
        "property's text",    "property's end",     "media request",    "media context's end", "reboot: add",
        "reboot: release",    "log line",           "adapter's dial",   "adapter's accept",    "adapter's drop",
        "adapter's setup",    "adapter's cleanup"};
    static_assert(std::size(NAMES) == static_cast<std::size_t>(CallOut::NUMBER_OF_CALL_OUTS));
    return NAMES[static_cast<std::size_t>(kind)];
}
