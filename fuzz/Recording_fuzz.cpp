// Reads any octets as a recording and tells all that there is to tell of it.
#include "diagnosis/CC_RecordingReport.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <span>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* octets, std::size_t size)
{
    CC_Recording recording = CC_Recording::READ(std::as_bytes(std::span(octets, size)));
    for (CC_Recording::Event const& event : recording.getEvents())
        if (event.record.kind >= CC_RecordFormat::Kind::NUMBER_OF_KINDS)
            std::abort();
    if (recording.getEvents().size() > 2000) // the reports of many calls take long
        return 0;
    CC_RecordingReport const report(std::move(recording));
    std::size_t const lines = report.getCalls().size() + report.getLadders().size() + report.getJson().size() +
                              report.getHistory(1, "state").size();
    return lines == 0 ? -1 : 0;
}
