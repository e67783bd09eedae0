#pragma once

#include "calls/CC_Monitor.h"
#include "platform/monitor/Monitor.h"
#include "testing/Journal.h"

#include <string>
#include <vector>

/// Collects what a monitor logs (call control's, 41, unless told otherwise) up to a level while it lives. It is the
/// process's one writer meanwhile, so one at a time; afterwards the monitor is off.
///
///     RecordingMonitor monitor(RTD::LEVEL_FLOW);
///     adapter.drop(QCause::NORMAL_CALL_CLEARING, 0);
///     EXPECT_TRUE(monitor.contains("[EP line/7] Drop"));
///     EXPECT_EQ(monitor.linesOfLevel(RTD::LEVEL_FAILURE), Lines());
///
/// Given a journal, it also writes each line there, as "log: [EP line/7] Drop", among those of the recorders.
class RecordingMonitor : public RTD::Writer
{
public:
    /// One log line.
    struct Line
    {
        /// As it was written; a text may have line breaks of its own. @{
        unsigned int level;
        std::string text;
        /// @}
        /// The same level and text.
        friend bool operator==(Line const&, Line const&) = default;
    };

    /// `journal` must outlive it; null: none.
    explicit RecordingMonitor(unsigned int level = RTD::LEVEL_BULK, unsigned int monitorId = CC_Monitor::ID,
                              Journal* journal = nullptr);
    /// All lines of the levels up to `level`, and each of them to the journal as well.
    RecordingMonitor(unsigned int level, Journal& journal) : RecordingMonitor(level, CC_Monitor::ID, &journal) {}
    ~RecordingMonitor() override;
    RecordingMonitor(RecordingMonitor const&) = delete;
    RecordingMonitor& operator=(RecordingMonitor const&) = delete;

    void write(unsigned int monitorId, unsigned int level, char const* text) override;

    /// In the order in which they were written.
    std::vector<Line> const& getLines() const { return m_lines; }
    /// The texts of one level, in their order.
    Lines linesOfLevel(unsigned int level) const;
    /// Whether a line contains the text.
    bool contains(std::string const& text) const;
    /// Forgets the lines; the journal keeps its.
    void clear() { m_lines.clear(); }

private:
    unsigned int m_monitorId;
    Journal* m_journal;
    std::vector<Line> m_lines;
};
