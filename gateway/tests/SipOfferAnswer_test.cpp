#include "sip/dialog/SipOfferAnswer.h"

#include <gtest/gtest.h>

#include <ostream>
#include <vector>

namespace
{
using Negotiation = SipOfferAnswer;
constexpr Negotiation::Direction SENT = Negotiation::SENT;
constexpr Negotiation::Direction RECEIVED = Negotiation::RECEIVED;
constexpr Negotiation::Carrier INVITE = Negotiation::INVITE, PROVISIONAL = Negotiation::PROVISIONAL,
                               RELIABLE = Negotiation::RELIABLE, FINAL = Negotiation::FINAL, ACK = Negotiation::ACK,
                               PRACK = Negotiation::PRACK, PRACK_OK = Negotiation::PRACK_OK,
                               UPDATE = Negotiation::UPDATE, UPDATE_OK = Negotiation::UPDATE_OK;
constexpr Negotiation::Carrier CARRIERS[] = {INVITE, PROVISIONAL, RELIABLE, FINAL,    ACK,
                                             PRACK,  PRACK_OK,    UPDATE,   UPDATE_OK};
constexpr Negotiation::Meaning O = Negotiation::OFFER, A = Negotiation::ANSWER, P = Negotiation::PREVIEW,
                               R = Negotiation::REPEATED, V = Negotiation::VIOLATION;

/// How a dialog has come to where it is.
struct Stage
{
    char const* name;
    void (*come)(Negotiation&, Negotiation::Direction ours);
    Negotiation::Meaning fromOfferer[9]; ///< by the carriers above
    Negotiation::Meaning fromOther[9];
};

void PrintTo(Stage const& stage, std::ostream* stream) { *stream << stage.name; }

Negotiation::Direction OPPOSITE(Negotiation::Direction direction) { return direction == SENT ? RECEIVED : SENT; }

void AGREE(Negotiation& negotiation, Negotiation::Direction first)
{
    negotiation.note(first, INVITE);
    negotiation.note(OPPOSITE(first), FINAL);
}

class SipOfferAnswerTable : public testing::TestWithParam<Stage>
{
};
} // namespace

/// Both ways: what one side may do the other may as well.
TEST_P(SipOfferAnswerTable, EachCellIsWhatItSays)
{
    for (Negotiation::Direction const ours : {SENT, RECEIVED})
        for (unsigned int i = 0; i < 9; ++i)
        {
            Negotiation negotiation;
            GetParam().come(negotiation, ours);
            EXPECT_EQ(negotiation.classify(ours, CARRIERS[i]), GetParam().fromOfferer[i]) << ours << " carrier " << i;
            EXPECT_EQ(negotiation.classify(OPPOSITE(ours), CARRIERS[i]), GetParam().fromOther[i])
                << ours << " answering carrier " << i;
        }
}

//                                        INVITE 1xx rel 2xx ACK PRACK ok UPDATE ok
INSTANTIATE_TEST_SUITE_P(
    SipOfferAnswer, SipOfferAnswerTable,
    testing::Values(Stage{"new",
                          [](Negotiation&, Negotiation::Direction) {},
                          {O, R, O, O, V, V, V, V, V},
                          {O, R, O, O, V, V, V, V, V}},
                    Stage{"offer in INVITE",
                          [](Negotiation& negotiation, Negotiation::Direction ours) { negotiation.note(ours, INVITE); },
                          {V, V, V, V, V, V, V, V, V},
                          {V, P, A, A, V, V, V, V, V}},
                    Stage{"offer in 2xx",
                          [](Negotiation& negotiation, Negotiation::Direction ours)
                          {
                              negotiation.noteOfferlessInvite();
                              negotiation.note(ours, FINAL);
                          },
                          {V, V, V, V, V, V, V, V, V},
                          {V, V, V, V, A, V, V, V, V}},
                    Stage{"offer in a reliable 1xx",
                          [](Negotiation& negotiation, Negotiation::Direction ours)
                          {
                              negotiation.noteOfferlessInvite();
                              negotiation.note(ours, RELIABLE);
                          },
                          {V, V, V, V, V, V, V, V, V},
                          {V, V, V, V, V, A, V, V, V}},
                    Stage{"offer in PRACK",
                          [](Negotiation& negotiation, Negotiation::Direction ours)
                          {
                              negotiation.note(ours, INVITE);
                              negotiation.note(OPPOSITE(ours), RELIABLE);
                              negotiation.note(ours, PRACK);
                          },
                          {V, V, V, V, V, V, V, V, V},
                          {V, V, V, V, V, V, A, V, V}},
                    Stage{"offer in UPDATE",
                          [](Negotiation& negotiation, Negotiation::Direction ours)
                          {
                              AGREE(negotiation, ours);
                              negotiation.note(ours, UPDATE);
                          },
                          {V, V, V, V, V, V, V, V, V},
                          {V, V, V, V, V, V, V, V, A}},
                    Stage{"agreed",
                          [](Negotiation& negotiation, Negotiation::Direction ours) { AGREE(negotiation, ours); },
                          {O, R, R, R, R, O, V, O, V},
                          {O, R, R, R, R, O, V, O, V}},
                    Stage{"agreed, and INVITE without an offer",
                          [](Negotiation& negotiation, Negotiation::Direction ours)
                          {
                              AGREE(negotiation, ours);
                              negotiation.noteOfferlessInvite();
                          },
                          {O, R, O, O, R, O, V, O, V},
                          {O, R, O, O, R, O, V, O, V}}));

TEST(SipOfferAnswer, AnOfferThatFailsLeavesWhatWasAgreedOn)
{
    Negotiation negotiation;
    AGREE(negotiation, SENT);
    negotiation.note(SENT, INVITE);
    negotiation.fail();
    EXPECT_EQ(negotiation.getState(), Negotiation::AGREED);
    negotiation.noteOfferlessInvite();
    negotiation.fail();
    EXPECT_EQ(negotiation.classify(RECEIVED, FINAL), R);
}

TEST(SipOfferAnswer, AFirstOfferThatFailsLeavesNothing)
{
    Negotiation negotiation;
    negotiation.note(RECEIVED, INVITE);
    negotiation.fail();
    EXPECT_EQ(negotiation.getState(), Negotiation::NEW);
}

TEST(SipOfferAnswer, APreviewAgreesOnNothing)
{
    Negotiation negotiation;
    negotiation.note(SENT, INVITE);
    EXPECT_EQ(negotiation.note(RECEIVED, PROVISIONAL), P);
    EXPECT_EQ(negotiation.getState(), Negotiation::OURS);
}

TEST(SipOfferAnswer, AnotherOfferIsRefusedByWhoseIsOutstanding)
{
    Negotiation negotiation;
    EXPECT_EQ(negotiation.getRefusal(), 0u);
    negotiation.note(SENT, INVITE);
    EXPECT_EQ(negotiation.getRefusal(), 491u);
    negotiation.note(RECEIVED, FINAL);
    EXPECT_EQ(negotiation.getRefusal(), 0u);
    negotiation.note(RECEIVED, UPDATE);
    EXPECT_EQ(negotiation.getRefusal(), 500u);
    negotiation.note(SENT, UPDATE_OK);
    negotiation.noteOfferlessInvite();
    EXPECT_EQ(negotiation.getRefusal(), 500u);
}
