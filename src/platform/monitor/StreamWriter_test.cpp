#include "platform/monitor/StreamWriter.h"

#include "platform/base/TYTime.h"

#include <cstdio>
#include <gtest/gtest.h>
#include <string>
#include <thread>
#include <vector>

namespace
{
TY::Time CLOCK(unsigned int source) { return {source == TY::Time::MONOTONIC ? 12 : 99, 7999999}; }

class StreamWriterTest : public testing::Test
{
protected:
    StreamWriterTest() { TY::Time::SET_CLOCK(CLOCK); }
    ~StreamWriterTest() override
    {
        TY::Time::SET_CLOCK(nullptr);
        if (m_stream != nullptr)
            std::fclose(m_stream);
    }
    std::string written()
    {
        std::string text;
        std::rewind(m_stream);
        for (int letter = std::fgetc(m_stream); letter != EOF; letter = std::fgetc(m_stream))
            text += static_cast<char>(letter);
        return text;
    }
    std::FILE* m_stream = std::tmpfile();
};
} // namespace

TEST_F(StreamWriterTest, ALineBearsTimeIdAndLevel)
{
    ASSERT_NE(nullptr, m_stream);
    RTD::StreamWriter writer(m_stream);
    writer.write(41, RTD::LEVEL_FLOW, "[Call 1] over");
    writer.write(3, RTD::LEVEL_FAILURE, "100 %s");
    EXPECT_EQ("12.007 [41/2] [Call 1] over\n12.007 [3/1] 100 %s\n", written());
}

TEST_F(StreamWriterTest, LinesOfSeveralThreadsDoNotMix)
{
    ASSERT_NE(nullptr, m_stream);
    RTD::StreamWriter writer(m_stream);
    std::vector<std::thread> threads;
    for (unsigned int i = 0; i < 4; ++i)
        threads.emplace_back(
            [&]
            {
                for (unsigned int j = 0; j < 100; ++j)
                    writer.write(41, RTD::LEVEL_FLOW, "text");
            });
    for (std::thread& thread : threads)
        thread.join();
    std::string expected;
    for (unsigned int i = 0; i < 400; ++i)
        expected += "12.007 [41/2] text\n";
    EXPECT_EQ(expected, written());
}

TEST_F(StreamWriterTest, ItServesTheRepository)
{
    ASSERT_NE(nullptr, m_stream);
    RTD::StreamWriter writer(m_stream);
    RTD::REPOSITORY::SET_WRITER(&writer);
    RTD::REPOSITORY::ENABLE(41, RTD::LEVEL_CHANGE);
    RTD::Monitor const* const monitor = RTD::REPOSITORY::GET_MONITOR_IF_ENABLED_FOR_LOGGING(41, RTD::LEVEL_CHANGE);
    ASSERT_NE(nullptr, monitor);
    monitor->debug("State %s", "ALERTING");
    RTD::REPOSITORY::ENABLE(41, RTD::LEVEL_OFF);
    RTD::REPOSITORY::SET_WRITER(nullptr);
    EXPECT_EQ("12.007 [41/3] State ALERTING\n", written());
}
