#include "recorder/CC_Recorder.h"

#include "calls/CC_CallLeg.h"
#include "diagnosis/CC_Recording.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/CallControlFixture.h"
#include "testing/DrivenClock.h"
#include "testing/FailingAllocator.h"

#include <csignal>
#include <cstdlib>
#include <fstream>
#include <gtest/gtest.h>
#include <limits>
#include <string>
#include <sys/stat.h>
#include <sys/wait.h>
#include <tuple>
#include <unistd.h>

namespace
{
using Kind = CC_RecordFormat::Kind;

/// Octets that neither a disk nor a machine has.
constexpr std::size_t TOO_MUCH = std::numeric_limits<std::size_t>::max() / 8 * (sizeof(std::size_t) == 8 ? 1 : 7);

class CC_Recorder_Test : public testing::Test
{
protected:
    CC_Recorder_Test()
    {
        char pattern[] = "/tmp/recorder-test-XXXXXX";
        folder = mkdtemp(pattern);
        path = folder + "/ring";
    }
    ~CC_Recorder_Test() override
    {
        CC_Recorder::CLOSE();
        for (char const* const file : {"/ring", "/ring.previous"})
            unlink((folder + file).c_str());
        rmdir(folder.c_str());
    }

    XCode open(std::size_t octets = CC_Recorder::DEFAULT_SIZE) const
    {
        return CC_Recorder::OPEN(String(std::string_view(path)), octets);
    }
    static void changeNames(CC_CallLeg& leg, unsigned int count)
    {
        for (unsigned int i = 0; i < count; ++i)
            ASSERT_EQ(leg.setProperty(CC_PropertyString(CC_PropertyId::NAME, std::to_string(i).c_str())), XCode::OK);
    }
    static std::string lastName(CC_Recording const& recording)
    {
        CC_RecordFormat::Brief const& value = recording.getEvents().back().after;
        return {value.text, value.textSize};
    }

    CallControlFixture fixture;
    std::string folder;
    std::string path;
};
} // namespace

TEST_F(CC_Recorder_Test, IsOffUntilItIsStarted)
{
    EXPECT_FALSE(CC_Recorder::IS_ON());
    EXPECT_TRUE(CC_Recorder::GET_IMAGE().empty());
    auto* const leg = new CC_CallLeg;
    leg->removeReference();
    ASSERT_EQ(CC_Recorder::START(), XCode::OK);
    EXPECT_TRUE(CC_Recorder::IS_ON());
    EXPECT_TRUE(CC_Recording::READ(CC_Recorder::GET_IMAGE()).getEvents().empty());
    CC_Recorder::CLOSE();
    EXPECT_FALSE(CC_Recorder::IS_ON());
    CC_Recorder::CLOSE();
}

TEST_F(CC_Recorder_Test, IsStartedOnceAndNotTooSmall)
{
    EXPECT_EQ(CC_Recorder::START(CC_Recorder::LEAST_SIZE - 1), XCode::REFUSED);
    EXPECT_EQ(open(CC_Recorder::LEAST_SIZE - 1), XCode::REFUSED);
    ASSERT_EQ(CC_Recorder::START(CC_Recorder::LEAST_SIZE), XCode::OK);
    EXPECT_EQ(CC_Recorder::START(), XCode::REFUSED);
    EXPECT_EQ(open(), XCode::REFUSED);
    EXPECT_NE(access(path.c_str(), F_OK), 0) << "what is refused makes no file";
}

TEST_F(CC_Recorder_Test, AFileThatCannotBeMadeIsAFailure)
{
    EXPECT_EQ(CC_Recorder::OPEN("/no/such/folder/ring"), XCode::FAILURE);
    EXPECT_EQ(CC_Recorder::OPEN("/proc/ring"), XCode::FAILURE);
    EXPECT_FALSE(CC_Recorder::IS_ON());
}

TEST_F(CC_Recorder_Test, AFullDiskIsFoundAtTheStartAndNotLater)
{
    EXPECT_EQ(open(TOO_MUCH), XCode::NO_ELEMENT);
    EXPECT_FALSE(CC_Recorder::IS_ON());
    EXPECT_NE(access(path.c_str(), F_OK), 0);
    EXPECT_EQ(CC_Recorder::START(TOO_MUCH), XCode::NO_ELEMENT) << "nor is there that much memory";
}

TEST_F(CC_Recorder_Test, TheFileIsForItsOwnerAlone)
{
    ASSERT_EQ(open(), XCode::OK);
    struct stat status
    {
    };
    ASSERT_EQ(stat(path.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777U, 0600U) << "it holds numbers";
    EXPECT_EQ(static_cast<std::size_t>(status.st_size), CC_Recorder::DEFAULT_SIZE);
}

TEST_F(CC_Recorder_Test, TheFileOfTheProcessBeforeIsKept)
{
    for (char const* const name : {"first", "second", "third"})
    {
        ASSERT_EQ(open(), XCode::OK);
        auto* const leg = new CC_CallLeg;
        ASSERT_EQ(leg->setName(name), XCode::OK);
        CC_Recorder::CLOSE();
        leg->removeReference();
    }
    EXPECT_EQ(CC_Recording::READ_FILE(path.c_str()).getEvents().back().text, "third");
    EXPECT_EQ(CC_Recording::READ_FILE((path + ".previous").c_str()).getEvents().back().text, "second");
}

TEST_F(CC_Recorder_Test, KeepsTheLastEventsAndForgetsTheOldest)
{
    ASSERT_EQ(CC_Recorder::START(CC_Recorder::LEAST_SIZE), XCode::OK);
    auto* const leg = new CC_CallLeg;
    for (unsigned int round = 0; round < 300; ++round) // over and over, with every remainder at the ring's end
    {
        changeNames(*leg, 7);
        CC_Recording const recording = CC_Recording::READ(CC_Recorder::GET_IMAGE());
        ASSERT_EQ(recording.getComplaint(), "");
        ASSERT_EQ(lastName(recording), "6");
        ASSERT_EQ(leg->setName(std::string(round % 61, 'x').c_str()), XCode::OK);
    }
    CC_Recording const recording = CC_Recording::READ(CC_Recorder::GET_IMAGE());
    EXPECT_GT(recording.getEvents().size(), 20u);
    EXPECT_NE(recording.getEvents().front().record.kind, Kind::LEG_MADE);
    leg->removeReference();
}

TEST_F(CC_Recorder_Test, AllMemoryIsTakenAtTheStart)
{
    ASSERT_EQ(open(CC_Recorder::LEAST_SIZE), XCode::OK);
    auto* const leg = new CC_CallLeg;
    changeNames(*leg, 1);
    CC_PropertyString const first(CC_PropertyId::NAME, "Ada");
    CC_PropertyString const second(CC_PropertyId::NAME, "Bert");
    FailingAllocator::failNth(1);
    for (unsigned int i = 0; i < 100; ++i)
        EXPECT_EQ(leg->setProperty(i % 2 == 0 ? first : second), XCode::OK);
    FailingAllocator::stop();
    EXPECT_FALSE(FailingAllocator::hasFailed()) << "nobody asked for memory";
    EXPECT_EQ(lastName(CC_Recording::READ(CC_Recorder::GET_IMAGE())), "Bert");
    leg->removeReference();
}

TEST_F(CC_Recorder_Test, WhatKillsTheProcessLeavesTheFile)
{
    for (int const signal : {SIGKILL, SIGSEGV})
    {
        pid_t const child = fork();
        ASSERT_GE(child, 0);
        if (child == 0)
        {
            std::signal(SIGSEGV, SIG_DFL);
            std::ignore = open();
            auto* const leg = new CC_CallLeg;
            std::ignore = leg->setProperty(CC_PropertyString(CC_PropertyId::NAME, "Ada"));
            raise(signal);
            _exit(0);
        }
        int status = 0;
        ASSERT_EQ(waitpid(child, &status, 0), child);
        EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == signal);
        CC_Recording const recording = CC_Recording::READ_FILE(path.c_str());
        EXPECT_EQ(recording.getComplaint(), "");
        ASSERT_EQ(recording.getEvents().size(), 2u);
        EXPECT_EQ(lastName(recording), "Ada");
        EXPECT_EQ(recording.getHeader().process, static_cast<std::uint64_t>(child));
    }
}

TEST_F(CC_Recorder_Test, EveryEventBearsTurnTimeCallAndLeg)
{
    DrivenClock clock;
    ASSERT_EQ(CC_Recorder::START(), XCode::OK);
    clock.advance(1500);
    fixture.m_loop.turn();
    fixture.m_loop.turn();
    unsigned long long const turns = fixture.m_loop.getNumberOfTurns();
    auto* const leg = new CC_CallLeg;
    CC_Recording const recording = CC_Recording::READ(CC_Recorder::GET_IMAGE());
    ASSERT_EQ(recording.getEvents().size(), 1u);
    CC_RecordFormat::Record const& made = recording.getEvents().front().record;
    EXPECT_EQ(made.kind, Kind::LEG_MADE);
    EXPECT_EQ(made.leg, leg->getSerial());
    EXPECT_EQ(made.call, 0u);
    EXPECT_EQ(made.turn, turns);
    EXPECT_EQ(recording.getRealtime(recording.getEvents().front()) - recording.getHeader().realtime, 1500000000);
    leg->removeReference();
}
