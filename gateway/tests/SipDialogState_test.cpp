#include "sip/dialog/SipDialogState.h"

#include <gtest/gtest.h>

#include <ostream>

namespace
{
using namespace SipDialogState;

constexpr State STATES[] = {NONE, INVITE_RECEIVED, ANSWERED, INVITE_SENT, CANCELLED, UP, BYE_SENT, OVER};

struct Row
{
    char const* name;
    Event event;
    Step steps[8]; ///< in the states above
};

void PrintTo(Row const& row, std::ostream* stream) { *stream << row.name; }

class SipDialogStateTable : public testing::TestWithParam<Row>
{
};

Row ONLY(char const* name, Event event, State state, Step step)
{
    Row row{name, event, {}};
    for (State const other : STATES)
        row.steps[other] = other == state ? step : Step{other, IGNORE};
    return row;
}
} // namespace

TEST_P(SipDialogStateTable, EachCellIsWhatItSays)
{
    for (State const state : STATES)
    {
        Step const step = STEP(state, GetParam().event);
        EXPECT_EQ(step.next, GetParam().steps[state].next) << NAME(state);
        EXPECT_EQ(step.action, GetParam().steps[state].action) << NAME(state);
    }
}

INSTANTIATE_TEST_SUITE_P(SipDialogState, SipDialogStateTable,
                         testing::Values(ONLY("INVITE received", INVITE_IN, NONE, {INVITE_RECEIVED, PROCEED}),
                                         ONLY("INVITE sent", INVITE_OUT, NONE, {INVITE_SENT, PROCEED}),
                                         ONLY("2xx sent", ANSWER_OUT, INVITE_RECEIVED, {ANSWERED, PROCEED}),
                                         Row{"2xx received",
                                             ANSWER_IN,
                                             {{NONE, IGNORE},
                                              {INVITE_RECEIVED, IGNORE},
                                              {ANSWERED, IGNORE},
                                              {UP, PROCEED},
                                              {BYE_SENT, ACK_AND_BYE},
                                              {UP, ACKNOWLEDGE},
                                              {BYE_SENT, ACKNOWLEDGE},
                                              {OVER, IGNORE}}},
                                         Row{"rejected",
                                             REJECTED,
                                             {{NONE, IGNORE},
                                              {INVITE_RECEIVED, IGNORE},
                                              {ANSWERED, IGNORE},
                                              {OVER, PROCEED},
                                              {OVER, PROCEED},
                                              {UP, IGNORE},
                                              {BYE_SENT, IGNORE},
                                              {OVER, IGNORE}}},
                                         ONLY("ACK received", ACK_IN, ANSWERED, {UP, PROCEED}),
                                         ONLY("no ACK came", ACK_MISSING, ANSWERED, {BYE_SENT, SEND_BYE}),
                                         ONLY("CANCEL received", CANCEL_IN, INVITE_RECEIVED, {OVER, TERMINATE}),
                                         Row{"BYE received",
                                             BYE_IN,
                                             {{NONE, REFUSE},
                                              {OVER, TERMINATE},
                                              {OVER, PROCEED},
                                              {INVITE_SENT, REFUSE},
                                              {CANCELLED, REFUSE},
                                              {OVER, PROCEED},
                                              {BYE_SENT, PROCEED},
                                              {OVER, PROCEED}}},
                                         Row{"the call ends",
                                             END,
                                             {{OVER, PROCEED},
                                              {OVER, REJECT},
                                              {ANSWERED, BYE_AFTER_ACK},
                                              {CANCELLED, SEND_CANCEL},
                                              {CANCELLED, IGNORE},
                                              {BYE_SENT, SEND_BYE},
                                              {BYE_SENT, IGNORE},
                                              {OVER, IGNORE}}},
                                         ONLY("the BYE is done", BYE_DONE, BYE_SENT, {OVER, PROCEED}),
                                         Row{"no answer in time",
                                             TIMEOUT,
                                             {{NONE, IGNORE},
                                              {INVITE_RECEIVED, IGNORE},
                                              {ANSWERED, IGNORE},
                                              {INVITE_SENT, GIVE_UP},
                                              {OVER, GIVE_UP},
                                              {UP, IGNORE},
                                              {BYE_SENT, IGNORE},
                                              {OVER, IGNORE}}}));

TEST(SipDialogState, EveryStateHasAName)
{
    EXPECT_STREQ(NAME(INVITE_RECEIVED), "INVITE received");
    EXPECT_STREQ(NAME(OVER), "over");
    EXPECT_STREQ(NAME(static_cast<State>(8)), "(unknown)");
    EXPECT_STREQ(NAME(static_cast<State>(-1)), "(unknown)");
}
