#include "operation/CallTracer.h"

#include "diagnosis/CC_RecordingReport.h"
#include "operation/ProcessCopy.h"
#include "operation/record/CallRecord.h"
#include "recorder/CC_Recorder.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>

namespace
{
std::string LADDERS_OF(std::set<unsigned long long> const& calls)
{
    CC_RecordingReport const report(CC_Recording::READ(CC_Recorder::GET_IMAGE()));
    std::string text;
    for (unsigned long long const call : calls)
    {
        text += fmt::format("trace: call {}\n", call);
        for (std::string const& line : report.getLadder(call))
            text += line + '\n';
    }
    return text;
}
} // namespace

CallTracer::~CallTracer()
{
    if (m_copy > 0)
        waitpid(m_copy, nullptr, 0); // within its patience
}

bool CallTracer::add(unsigned long long serial) { return !isFull() && (m_serials.insert(serial), true); }

bool CallTracer::add(std::string const& number) { return !isFull() && (m_numbers.insert(number), true); }

bool CallTracer::isTraced(CallRecord const& record)
{
    if (m_serials.erase(record.serial) != 0)
        return true;
    return std::any_of(record.legs.begin(), record.legs.end(),
                       [&](CallRecord::Leg const& leg)
                       { return m_numbers.contains(leg.dialled) || m_numbers.contains(leg.number); });
}

void CallTracer::onCallOver(CallRecord const& record)
{
    if (!isTraced(record))
        return;
    m_waiting.insert(record.serial);
    if (m_copy <= 0)
        tell();
}

void CallTracer::tell()
{
    m_copy = ProcessCopy::START(STDOUT_FILENO, [this] { return LADDERS_OF(m_waiting); });
    if (m_copy < 0)
        spdlog::warn("{} calls cannot be told: no process", m_waiting.size());
    m_waiting.clear();
}

void CallTracer::onChild()
{
    if (m_copy <= 0 || !ProcessCopy::HAS_ENDED(m_copy))
        return;
    m_copy = 0;
    if (!m_waiting.empty())
        tell();
}
