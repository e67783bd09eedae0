#include "RecordsFixture.h"
#include "operation/record/CallJson.h"
#include "operation/record/CallRecords.h"
#include "operation/record/LineFile.h"

namespace
{
class CallRecordsTest : public RecordsFixture
{
protected:
    CallRecordsTest() { options.file = folder + "/calls.jsonl"; }
    /// What the process would leave if it was killed now.
    void leaveAs(std::string const& name) const
    {
        std::filesystem::copy(options.spool + "/calls.journal", folder + '/' + name);
    }
    /// From here on the next process: with what was left under that name.
    void goOnWith(std::string const& name) const
    {
        std::filesystem::rename(folder + '/' + name, options.spool + "/calls.journal");
    }

    RecordOptions options;
};

TEST_F(CallRecordsTest, WriteALineForEachCallBeforeTheyEnd)
{
    {
        CallRecords records(options);
        records.write(RECORD(1));
        records.write(RECORD(2));
    }
    EXPECT_EQ(CALLS_OF(options.file), (Calls{"1", "2"}));
}

TEST_F(CallRecordsTest, GoOnInANewFileWhenTheOldOneWasMovedAway)
{
    CallRecords records(options);
    records.write(RECORD(1));
    ASSERT_TRUE(WAIT_UNTIL([&] { return records.getCounters().written == 1; }));
    std::filesystem::rename(options.file, folder + "/old");
    records.reopen();
    ASSERT_TRUE(WAIT_UNTIL([&] { return std::filesystem::exists(options.file); }));
    records.write(RECORD(2));
    ASSERT_TRUE(WAIT_UNTIL([&] { return records.getCounters().written == 2; }));
    EXPECT_EQ(CALLS_OF(folder + "/old"), Calls{"1"});
    EXPECT_EQ(CALLS_OF(options.file), Calls{"2"});
}

TEST_F(CallRecordsTest, KeepWhatADiskThatIsFullDoesNotTakeAndCountWhatTheyCannotKeep)
{
    std::filesystem::create_symlink("/dev/full", options.file);
    options.kept = 3;
    CallRecords records(options);
    for (unsigned int i = 1; i <= 5; ++i)
        records.write(RECORD(i));
    EXPECT_FALSE(records.hasRoom());
    EXPECT_EQ(records.getCounters().waiting, 3u);
    EXPECT_EQ(records.getCounters().lost, 2u);
    std::filesystem::remove(options.file);
    records.reopen(); // on another disk
    ASSERT_TRUE(WAIT_UNTIL([&] { return records.getCounters().written == 3; }));
    EXPECT_TRUE(records.hasRoom());
    EXPECT_EQ(CALLS_OF(options.file), (Calls{"1", "2", "3"}));
}

TEST_F(CallRecordsTest, SayWhichKeyCannotBeServed)
{
    auto const keyOf = [this]
    {
        try
        {
            CallRecords const records(options);
        }
        catch (CallRecords::Failure const& failure)
        {
            return failure.key;
        }
        return std::string();
    };
    options.file = folder + "/none/calls";
    EXPECT_EQ(keyOf(), "file");
    options.file.clear();
    options.spool = folder + "/none/spool";
    EXPECT_EQ(keyOf(), "spool");
    options.spool = folder + "/spool";
    options.sqlite = folder + "/none/calls";
    EXPECT_EQ(keyOf(), "sqlite");
    std::filesystem::remove_all(options.spool);
    std::filesystem::create_directory(options.spool);
    std::ofstream(options.spool + "/calls.journal") << "text";
    EXPECT_EQ(keyOf(), "spool") << "no journal";
}

TEST_F(CallRecordsTest, OfCallsThatWereUpWhenTheProcessWasKilledAreWrittenByTheNextOne)
{
    options.spool = folder + "/spool";
    {
        CallRecords records(options);
        for (unsigned int i = 1; i <= 3; ++i)
            records.note(RECORD(i));
        records.write(RECORD(2));
        ASSERT_TRUE(WAIT_UNTIL([&] { return records.getCounters().written == 1; }));
        leaveAs("killed");
    }
    goOnWith("killed");
    {
        CallRecords const next(options);
        ASSERT_TRUE(WAIT_UNTIL([&] { return next.getCounters().written == 2; }));
    }
    CallRecords const afterNext(options);
    EXPECT_EQ(afterNext.getCounters().waiting, 0u);
    EXPECT_EQ(CALLS_OF(options.file), (Calls{"2", "1 (interrupted)", "3 (interrupted)"}));
}

TEST_F(CallRecordsTest, OfAProcessThatWasKilledBeforeItCouldNoteThatTheyAreWrittenAreNotDoubled)
{
    options.spool = folder + "/spool";
    {
        CallRecords records(options);
        records.note(RECORD(1));
        records.note(RECORD(2));
        leaveAs("killed");
        records.write(RECORD(1));
    }
    goOnWith("killed");
    {
        CallRecords const next(options);
    }
    EXPECT_EQ(CALLS_OF(options.file), (Calls{"1", "2 (interrupted)"}));
}

TEST_F(CallRecordsTest, ThatADiskDidNotTakeBeforeTheProcessEndedAreWrittenByTheNextOneAsTheyAre)
{
    options.spool = folder + "/spool";
    std::filesystem::create_symlink("/dev/full", options.file);
    {
        CallRecords records(options);
        records.note(RECORD(1));
        records.write(RECORD(1));
    }
    std::filesystem::remove(options.file);
    {
        CallRecords const next(options);
    }
    EXPECT_EQ(CALLS_OF(options.file), Calls{"1"});
}

TEST_F(CallRecordsTest, AreNotedForMoreCallsThanTheJournalBeganWith)
{
    options.spool = folder + "/spool";
    constexpr unsigned int CALLS = 1500;
    CallRecords records(options);
    for (unsigned int i = 1; i <= CALLS; ++i)
        records.note(RECORD(i));
    EXPECT_EQ(CallJournal(options.spool + "/calls.journal").getLeft().size(), CALLS);
    for (unsigned int i = 1; i <= CALLS; ++i)
        records.write(RECORD(i));
    ASSERT_TRUE(WAIT_UNTIL([&] { return records.getCounters().written == CALLS; }));
    EXPECT_TRUE(WAIT_UNTIL([&] { return CallJournal(options.spool + "/calls.journal").getLeft().empty(); }));
}

TEST_F(CallRecordsTest, ThatAreTooLongForTheJournalStayThereAsTheyWereBefore)
{
    CallJournal journal(folder + "/journal");
    CallJournal::Ticket const ticket = journal.open(1, "short");
    journal.note(ticket, std::string(5000, 'x'));
    ASSERT_EQ(journal.getLeft().size(), 1u);
    EXPECT_EQ(journal.getLeft().front().line, "short");
    EXPECT_EQ(journal.open(1, std::string(5000, 'x')), CallJournal::NONE);
    journal.close(CallJournal::NONE, 1);
}

TEST_F(CallRecordsTest, AreWholeLinesAlsoBehindAPieceOfOne)
{
    std::ofstream(options.file) << "whole\npiece";
    LineFile file(options.file);
    EXPECT_TRUE(file.append("next"));
    EXPECT_EQ(LINES_OF(options.file), (Calls{"whole", "next"}));
    std::ofstream(folder + "/piece") << "piece";
    EXPECT_EQ(LineFile(folder + "/piece").getSize(), 0);
}

TEST(CallJson, WithholdsWhatMayNotBePresentedUnlessItIsAskedFor)
{
    CallRecord record;
    record.serial = 7;
    record.start = 1795345935204000000;
    record.legs.resize(2);
    record.legs[0].isCalling = true;
    record.legs[0].presentation = CallRecord::Presentation::RESTRICTED;
    record.legs[0].number = "4420";
    record.legs[0].name = "Ada";
    record.legs[0].redirecting = "4930";
    record.legs[0].isRedirectingRestricted = true;
    record.legs[1].number = "4989\n123";
    std::string const process = CallJson::PROCESS_OF(1795345935000000042);
    EXPECT_EQ(process, "2026-11-22T11:12:15.000000042Z");
    std::string const withheld = CallJson::LINE_OF(record, {process});
    for (char const* const secret : {"4420", "Ada", "4930"})
    {
        EXPECT_EQ(withheld.find(secret), std::string::npos) << withheld;
        EXPECT_NE(CallJson::LINE_OF(record, {process, true}).find(secret), std::string::npos);
    }
    EXPECT_NE(withheld.find("\"4989\\u000a123\""), std::string::npos) << withheld;
    EXPECT_NE(withheld.find("\"start\":\"2026-11-22T11:12:15.204Z\""), std::string::npos) << withheld;
    EXPECT_EQ(CallJson::KEY_OF(withheld), "{\"version\":2,\"call\":7,\"process\":\"2026-11-22T11:12:15.000000042Z\"");
}
} // namespace
