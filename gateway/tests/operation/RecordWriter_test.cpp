#include "operation/record/RecordWriter.h"

#include "operation/record/CallJson.h"

#include <array>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <spdlog/spdlog.h>
#include <string>
#include <thread>
#include <vector>

namespace
{
CallRecord RECORD(unsigned long long serial)
{
    CallRecord record;
    record.serial = serial;
    record.start = 1795345935204000000;
    record.ended = 1.5;
    return record;
}

class RecordWriterTest : public testing::Test
{
protected:
    RecordWriterTest()
    {
        spdlog::set_level(spdlog::level::off);
        std::array<char, 64> name{"/tmp/record-test.XXXXXX"};
        folder = mkdtemp(name.data());
        options.file = folder + "/calls.jsonl";
    }
    ~RecordWriterTest() override { std::filesystem::remove_all(folder); }
    /// The calls of a file, one each line.
    std::vector<std::string> callsOf(std::string const& file) const
    {
        std::vector<std::string> calls;
        std::ifstream stream(folder + '/' + file);
        for (std::string line; std::getline(stream, line);)
            calls.push_back(line.substr(0, line.find(",\"start\"")));
        return calls;
    }
    template <class Is>
    bool waitUntil(Is const& is) const
    {
        for (int i = 0; i < 1000 && !is(); ++i)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        return is();
    }

    std::string folder;
    RecordOptions options;
};

TEST_F(RecordWriterTest, WritesALineForEachCallBeforeItEnds)
{
    {
        RecordWriter writer(options);
        writer.write(RECORD(1));
        writer.write(RECORD(2));
    }
    EXPECT_EQ(callsOf("calls.jsonl"),
              (std::vector<std::string>{"{\"version\":1,\"call\":1", "{\"version\":1,\"call\":2"}));
}

TEST_F(RecordWriterTest, GoesOnInANewFileWhenTheOldOneWasMovedAway)
{
    RecordWriter writer(options);
    writer.write(RECORD(1));
    ASSERT_TRUE(waitUntil([&] { return writer.getCounters().written == 1; }));
    std::filesystem::rename(options.file, folder + "/old");
    writer.reopen();
    ASSERT_TRUE(waitUntil([&] { return std::filesystem::exists(options.file); }));
    writer.write(RECORD(2));
    ASSERT_TRUE(waitUntil([&] { return writer.getCounters().written == 2; }));
    EXPECT_EQ(callsOf("old").size(), 1u);
    EXPECT_EQ(callsOf("calls.jsonl").size(), 1u);
}

TEST_F(RecordWriterTest, KeepsWhatADiskThatIsFullDoesNotTakeAndCountsWhatItCannotKeep)
{
    std::filesystem::create_symlink("/dev/full", options.file);
    options.kept = 3;
    RecordWriter writer(options);
    for (unsigned int i = 1; i <= 5; ++i)
        writer.write(RECORD(i));
    EXPECT_FALSE(writer.hasRoom());
    EXPECT_EQ(writer.getCounters().waiting, 3u);
    EXPECT_EQ(writer.getCounters().lost, 2u);
    std::filesystem::remove(options.file);
    writer.reopen(); // on another disk
    ASSERT_TRUE(waitUntil([&] { return writer.getCounters().written == 3; }));
    EXPECT_TRUE(writer.hasRoom());
    EXPECT_EQ(callsOf("calls.jsonl").size(), 3u);
}

TEST_F(RecordWriterTest, RefusesAFileThatCannotBeMade)
{
    options.file = folder + "/none/calls";
    EXPECT_THROW(RecordWriter{options}, std::runtime_error);
}

TEST(CallJson, WithholdsWhatMayNotBePresentedUnlessItIsAskedFor)
{
    CallRecord record = RECORD(7);
    record.legs.resize(2);
    record.legs[0].isCalling = true;
    record.legs[0].presentation = CallRecord::Presentation::RESTRICTED;
    record.legs[0].number = "4420";
    record.legs[0].name = "Ada";
    record.legs[0].redirecting = "4930";
    record.legs[0].isRedirectingRestricted = true;
    record.legs[1].number = "4989\n123";
    std::string const withheld = CallJson::LINE_OF(record, false);
    for (char const* const secret : {"4420", "Ada", "4930"})
    {
        EXPECT_EQ(withheld.find(secret), std::string::npos) << withheld;
        EXPECT_NE(CallJson::LINE_OF(record, true).find(secret), std::string::npos);
    }
    EXPECT_NE(withheld.find("\"4989\\u000a123\""), std::string::npos) << withheld;
    EXPECT_NE(withheld.find("\"start\":\"2026-11-22T11:12:15.204Z\""), std::string::npos) << withheld;
}
} // namespace
