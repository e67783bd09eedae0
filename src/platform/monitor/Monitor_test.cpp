#include "platform/monitor/Monitor.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace
{
class Recorder : public RTD::Writer
{
public:
    struct Line
    {
        unsigned int monitorId;
        unsigned int level;
        std::string text;
    };
    void write(unsigned int monitorId, unsigned int level, char const* text) override
    {
        m_lines.push_back({monitorId, level, text});
    }
    std::vector<Line> m_lines;
};

class MonitorTest : public testing::Test
{
protected:
    static constexpr unsigned int ID = 41;
    MonitorTest() { RTD::REPOSITORY::SET_WRITER(&m_writer); }
    ~MonitorTest() override
    {
        RTD::REPOSITORY::ENABLE(ID, RTD::LEVEL_OFF);
        RTD::REPOSITORY::SET_WRITER(nullptr);
    }
    static RTD::Monitor const* MONITOR(unsigned int level)
    {
        return RTD::REPOSITORY::GET_MONITOR_IF_ENABLED_FOR_LOGGING(ID, level);
    }
    Recorder m_writer;
};
} // namespace

TEST_F(MonitorTest, NothingIsEnabledAtFirst)
{
    for (unsigned int level = 0; level <= 6; ++level)
        EXPECT_EQ(nullptr, MONITOR(level)) << level;
}

TEST_F(MonitorTest, ALevelEnablesItselfAndTheMoreImportantOnes)
{
    RTD::REPOSITORY::ENABLE(ID, RTD::LEVEL_CHANGE);
    for (unsigned int level = 0; level <= 6; ++level)
        EXPECT_EQ(level >= RTD::LEVEL_FAILURE && level <= RTD::LEVEL_CHANGE, MONITOR(level) != nullptr) << level;
    EXPECT_EQ(nullptr, RTD::REPOSITORY::GET_MONITOR_IF_ENABLED_FOR_LOGGING(ID + 1, RTD::LEVEL_FAILURE));
    RTD::REPOSITORY::ENABLE(ID, RTD::LEVEL_OFF);
    EXPECT_EQ(nullptr, MONITOR(RTD::LEVEL_FAILURE));
}

TEST_F(MonitorTest, ALevelBeyondTheLastEnablesAllAndNoMore)
{
    RTD::REPOSITORY::ENABLE(ID, 1000);
    EXPECT_NE(nullptr, MONITOR(RTD::LEVEL_BULK));
    EXPECT_EQ(nullptr, MONITOR(RTD::LEVEL_BULK + 1));
    EXPECT_EQ(nullptr, MONITOR(1000));
}

TEST_F(MonitorTest, AnIdPastTheLastIsNeverEnabled)
{
    for (unsigned int const id : {RTD::REPOSITORY::NUMBER_OF_MONITORS, 0xffffffffU})
    {
        RTD::REPOSITORY::ENABLE(id, RTD::LEVEL_BULK);
        EXPECT_EQ(nullptr, RTD::REPOSITORY::GET_MONITOR_IF_ENABLED_FOR_LOGGING(id, RTD::LEVEL_FAILURE));
    }
}

TEST_F(MonitorTest, WithoutAWriterNothingIsWanted)
{
    RTD::REPOSITORY::ENABLE(ID, RTD::LEVEL_BULK);
    RTD::Monitor const* const monitor = MONITOR(RTD::LEVEL_FAILURE);
    ASSERT_NE(nullptr, monitor);
    RTD::REPOSITORY::SET_WRITER(nullptr);
    EXPECT_EQ(nullptr, MONITOR(RTD::LEVEL_FAILURE));
    monitor->debug("dropped"); // a monitor that was fetched before
    EXPECT_TRUE(m_writer.m_lines.empty());
}

TEST_F(MonitorTest, ALineReachesTheWriterWithItsIdAndLevel)
{
    RTD::REPOSITORY::ENABLE(ID, RTD::LEVEL_FLOW);
    RTD::Monitor const* const monitor = MONITOR(RTD::LEVEL_FLOW);
    ASSERT_NE(nullptr, monitor);
    monitor->debug("[Call %s] %u legs", "a%sb", 2U);
    ASSERT_EQ(1U, m_writer.m_lines.size());
    EXPECT_EQ(ID, m_writer.m_lines[0].monitorId);
    EXPECT_EQ(RTD::LEVEL_FLOW, m_writer.m_lines[0].level);
    EXPECT_EQ("[Call a%sb] 2 legs", m_writer.m_lines[0].text);
}

TEST_F(MonitorTest, LinesOfEveryLengthAreWrittenWhole)
{
    RTD::REPOSITORY::ENABLE(ID, RTD::LEVEL_BULK);
    RTD::Monitor const* const monitor = MONITOR(RTD::LEVEL_BULK);
    ASSERT_NE(nullptr, monitor);
    for (std::size_t const length : {0U, 1U, 510U, 511U, 512U, 513U, 10000U})
    {
        std::string const text(length, 'x');
        monitor->debug("%s", text.c_str());
        ASSERT_FALSE(m_writer.m_lines.empty());
        EXPECT_EQ(text, m_writer.m_lines.back().text) << length;
    }
}
