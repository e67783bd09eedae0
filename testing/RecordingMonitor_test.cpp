#include "testing/RecordingMonitor.h"

#include <gtest/gtest.h>

namespace
{
void LOG(unsigned int id, RTD::Level level, char const* text)
{
    if (RTD::Monitor const* const monitor = RTD::REPOSITORY::GET_MONITOR_IF_ENABLED_FOR_LOGGING(id, level))
        monitor->debug("%s", text);
}
} // namespace

TEST(RecordingMonitor, CollectsTheLevelsUpToItsOwn)
{
    RecordingMonitor const monitor(RTD::LEVEL_FLOW);
    LOG(CC_Monitor::ID, RTD::LEVEL_FAILURE, "failed");
    LOG(CC_Monitor::ID, RTD::LEVEL_FLOW, "flowed");
    LOG(CC_Monitor::ID, RTD::LEVEL_CHANGE, "changed");
    using Line = RecordingMonitor::Line;
    EXPECT_EQ(monitor.getLines(),
              (std::vector<Line>{Line{RTD::LEVEL_FAILURE, "failed"}, Line{RTD::LEVEL_FLOW, "flowed"}}));
    EXPECT_EQ(monitor.linesOfLevel(RTD::LEVEL_FLOW), Lines{"flowed"});
    EXPECT_EQ(monitor.linesOfLevel(RTD::LEVEL_CHANGE), Lines());
    EXPECT_TRUE(monitor.contains("low"));
    EXPECT_FALSE(monitor.contains("change"));
}

TEST(RecordingMonitor, HearsOfItsOwnMonitorAlone)
{
    RecordingMonitor monitor(RTD::LEVEL_BULK, 7);
    LOG(CC_Monitor::ID, RTD::LEVEL_FAILURE, "not ours");
    monitor.write(CC_Monitor::ID, RTD::LEVEL_FAILURE, "not ours either");
    LOG(7, RTD::LEVEL_BULK, "ours");
    EXPECT_EQ(monitor.getLines().size(), 1u);
    monitor.clear();
    EXPECT_TRUE(monitor.getLines().empty());
}

TEST(RecordingMonitor, WritesAmongTheRecordersOfAJournal)
{
    Journal journal;
    journal.add("a: before");
    {
        RecordingMonitor const monitor(RTD::LEVEL_FLOW, journal);
        LOG(CC_Monitor::ID, RTD::LEVEL_FLOW, "flowed");
        LOG(CC_Monitor::ID, RTD::LEVEL_BULK, "bulky");
        LOG(7, RTD::LEVEL_FLOW, "not ours");
        EXPECT_EQ(monitor.linesOfLevel(RTD::LEVEL_FLOW), Lines{"flowed"});
    }
    journal.add("a: after");
    EXPECT_EQ(journal.take(), (Lines{"a: before", "log: flowed", "a: after"}));
}

TEST(RecordingMonitor, SwitchesTheMonitorOffAgain)
{
    {
        RecordingMonitor const monitor;
        EXPECT_NE(CC_Monitor::FOR(RTD::LEVEL_BULK), nullptr);
    }
    EXPECT_EQ(CC_Monitor::FOR(RTD::LEVEL_FAILURE), nullptr);
}
