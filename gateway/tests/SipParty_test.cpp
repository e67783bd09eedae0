#include "sip/message/SipParty.h"

#include "properties/CC_PropertyContainer.h"

#include <gtest/gtest.h>

#include <ostream>

namespace
{
struct Row
{
    char const* user;
    char const* number;
    QTypeOfNumber type;
    char const* written;
};

void PrintTo(Row const& row, std::ostream* stream) { *stream << row.user; }

class SipPartyUser : public testing::TestWithParam<Row>
{
};

SipNameAddr USER(std::string const& user)
{
    SipNameAddr address;
    address.user = user;
    address.host = "host";
    return address;
}
} // namespace

TEST_P(SipPartyUser, BecomesANumberAndAUserAgain)
{
    SipParty const party = SipParty::OF(USER(GetParam().user));
    EXPECT_EQ(party.number, GetParam().number);
    EXPECT_EQ(party.type, GetParam().type);
    EXPECT_EQ(party.plan, party.type == QTypeOfNumber::INTERNATIONAL ? QNumberingPlan::ISDN : QNumberingPlan::UNKNOWN);
    EXPECT_EQ(party.getUser(), GetParam().written);
}

INSTANTIATE_TEST_SUITE_P(
    SipParty, SipPartyUser,
    testing::Values(Row{"+4989123", "4989123", QTypeOfNumber::INTERNATIONAL, "+4989123"},
                    Row{"+49-(89).123", "4989123", QTypeOfNumber::INTERNATIONAL, "+4989123"},
                    Row{"+4989123;phone-context=x", "4989123", QTypeOfNumber::INTERNATIONAL, "+4989123"},
                    Row{"+123456789012345", "123456789012345", QTypeOfNumber::INTERNATIONAL, "+123456789012345"},
                    Row{"+1234567890123456", "+1234567890123456", QTypeOfNumber::UNKNOWN, "+1234567890123456"},
                    Row{"+", "+", QTypeOfNumber::UNKNOWN, "+"}, Row{"+49a", "+49a", QTypeOfNumber::UNKNOWN, "+49a"},
                    Row{"4989123", "4989123", QTypeOfNumber::UNKNOWN, "4989123"},
                    Row{"089123;cpc=payphone", "089123", QTypeOfNumber::UNKNOWN, "089123"},
                    Row{"*31#12", "*31#12", QTypeOfNumber::UNKNOWN, "*31#12"},
                    Row{"alice", "alice", QTypeOfNumber::UNKNOWN, "alice"},
                    Row{"alice;day=tuesday", "alice;day=tuesday", QTypeOfNumber::UNKNOWN, "alice;day=tuesday"},
                    Row{";x", ";x", QTypeOfNumber::UNKNOWN, ";x"}, Row{"Anonymous", "", QTypeOfNumber::UNKNOWN, ""},
                    Row{"Unavailable", "", QTypeOfNumber::UNKNOWN, ""}, Row{"", "", QTypeOfNumber::UNKNOWN, ""}));

TEST(SipParty, WhatWasAddedToAnOfferIsReadBackFromIt)
{
    SipParty party;
    party.number = "4989";
    party.type = QTypeOfNumber::NATIONAL;
    party.plan = QNumberingPlan::PRIVATE;
    party.name = "Bob";
    CC_PropertyContainer offer;
    party.addTo(offer);
    SipParty const read = SipParty::OF_OFFER(offer);
    EXPECT_EQ(read.number, "4989");
    EXPECT_EQ(read.type, QTypeOfNumber::NATIONAL);
    EXPECT_EQ(read.plan, QNumberingPlan::PRIVATE);
    EXPECT_EQ(read.name, "Bob");
    EXPECT_EQ(SipParty::OF_OFFER(CC_PropertyContainer::EMPTY()).getUser(), "");
}
