#include "testing/RecordingMonitor.h"

#include "testing/FailingAllocator.h"

#include <algorithm>

RecordingMonitor::RecordingMonitor(unsigned int level, unsigned int monitorId, Journal* journal)
    : m_monitorId(monitorId), m_journal(journal)
{
    RTD::REPOSITORY::SET_WRITER(this);
    RTD::REPOSITORY::ENABLE(monitorId, level);
}

RecordingMonitor::~RecordingMonitor()
{
    RTD::REPOSITORY::ENABLE(m_monitorId, RTD::LEVEL_OFF);
    RTD::REPOSITORY::SET_WRITER(nullptr);
}

void RecordingMonitor::write(unsigned int monitorId, unsigned int level, char const* text)
{
    FailingAllocator::Pause const unseen;
    if (monitorId != m_monitorId)
        return;
    m_lines.push_back({level, text});
    if (m_journal != nullptr)
        m_journal->add(std::string("log: ") + text);
}

Lines RecordingMonitor::linesOfLevel(unsigned int level) const
{
    Lines lines;
    for (Line const& line : m_lines)
        if (line.level == level)
            lines.push_back(line.text);
    return lines;
}

bool RecordingMonitor::contains(std::string const& text) const
{
    return std::any_of(m_lines.begin(), m_lines.end(),
                       [&](Line const& line) { return line.text.find(text) != std::string::npos; });
}
