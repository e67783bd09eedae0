#include "testing/Journal.h"

#include "calls/CC_CallLeg.h"
#include "testing/Recorder.h"

#include <gtest/gtest.h>

namespace
{
struct TalkingRecorder : Recorder
{
    using Recorder::record;
    using Recorder::Recorder;
    using Recorder::textOf;
};
} // namespace

TEST(Journal, KeepsTheOrderOfItsLines)
{
    Journal journal;
    journal.add("one");
    journal.add("two");
    journal.add("one");
    EXPECT_EQ(journal.getLines(), (Lines{"one", "two", "one"}));
    EXPECT_EQ(journal.count("one"), 2u);
    EXPECT_TRUE(journal.contains("two"));
    EXPECT_FALSE(journal.contains("tw"));
}

TEST(Journal, TakingEmptiesIt)
{
    Journal journal;
    journal.add("one");
    EXPECT_EQ(journal.take(), Lines{"one"});
    EXPECT_EQ(journal.take(), Lines());
    journal.add("two");
    journal.clear();
    EXPECT_EQ(journal.getLines(), Lines());
}

TEST(Journal, ObjectsGoByTheNameThatTheyWereGiven)
{
    Journal journal;
    int object = 0;
    EXPECT_EQ(journal.nameOf(&object, "it"), "it");
    journal.name(&object, "X");
    journal.name(&object, "Y");
    EXPECT_EQ(journal.nameOf(&object, "it"), "Y");
    EXPECT_EQ(journal.nameOf(nullptr, "it"), "none");
}

TEST(Recorder, WritesToItsOwnJournalUnlessGivenOne)
{
    Journal shared;
    TalkingRecorder alone("alone");
    TalkingRecorder first("first", &shared);
    TalkingRecorder second("second", &shared);
    first.record("a");
    alone.record("b");
    second.record("c");
    EXPECT_EQ(shared.take(), (Lines{"first: a", "second: c"}));
    EXPECT_EQ(alone.take(), Lines{"alone: b"});
    EXPECT_EQ(&first.getJournal(), &shared);
    EXPECT_EQ(first.getRecorderName(), "first");
}

TEST(Recorder, ALegGoesByTheJournalsNameThenByItsOwn)
{
    TalkingRecorder recorder("r");
    CC_CallLeg* const leg = new CC_CallLeg;
    EXPECT_EQ(recorder.textOf(leg), "leg");
    EXPECT_TRUE(leg->setName("sip/7").isOk());
    EXPECT_EQ(recorder.textOf(leg), "sip/7");
    recorder.getJournal().name(leg, "L");
    EXPECT_EQ(recorder.textOf(leg), "L");
    leg->removeReference();
    EXPECT_EQ(recorder.textOf(static_cast<CC_Call const*>(nullptr)), "none");
}
