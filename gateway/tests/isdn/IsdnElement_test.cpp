#include "configuration/DialPlan.h"
#include "isdn/element/IsdnBearer.h"
#include "isdn/element/IsdnCause.h"
#include "isdn/element/IsdnCharge.h"
#include "isdn/element/IsdnParty.h"
#include "isdn/element/IsdnProgress.h"
#include "isdn/element/IsdnRedirection.h"
#include "isdn/element/IsdnSubaddress.h"
#include "isdn/element/IsdnText.h"
#include "isdn/element/IsdnUserUser.h"
#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyKeys.h"

#include <gtest/gtest.h>

#include <cstring>

namespace
{
std::string TEXT_OF(CC_Property const& property)
{
    String text;
    property.getValueString(text);
    return std::string(text.view());
}
std::string TEXT_OF(pri_aoc_amount const& amount)
{
    return std::to_string(amount.cost) + " at " + std::to_string(amount.multiplier);
}
std::string TEXT_OF(pri_aoc_time const& time)
{
    return std::to_string(time.length) + " of " + std::to_string(time.scale);
}
std::string TEXT_OF(pri_aoc_s_element const& element)
{
    auto const& rate = element.rate;
    switch (element.rate_type)
    {
    case PRI_AOC_RATE_TYPE_DURATION:
        return TEXT_OF(rate.duration.amount) + rate.duration.currency + TEXT_OF(rate.duration.time) +
               TEXT_OF(rate.duration.granularity) + std::to_string(rate.duration.charging_type);
    case PRI_AOC_RATE_TYPE_FLAT:
        return TEXT_OF(rate.flat.amount) + rate.flat.currency;
    case PRI_AOC_RATE_TYPE_VOLUME:
        return TEXT_OF(rate.volume.amount) + rate.volume.currency + std::to_string(rate.volume.unit);
    case PRI_AOC_RATE_TYPE_SPECIAL_CODE:
        return std::to_string(rate.special);
    default:
        return {};
    }
}
std::string TEXT_OF(IsdnCharge::Charge const& charge)
{
    return TEXT_OF(CC_PropertyCharge(CC_PropertyId::CHARGE, charge));
}
std::string TEXT_OF(IsdnCharge::Tariff const& tariff)
{
    return TEXT_OF(CC_PropertyTariff(CC_PropertyId::TARIFF, tariff));
}
} // namespace

TEST(IsdnPartyTest, ANumberBecomesAnInternationalOneByItsTypeOrByHowItIsDialled)
{
    DialPlan const plan{"00", "0", "49"};
    struct Row
    {
        char const* number;
        QTypeOfNumber type;
        QNumberingPlan plan;
        char const* whole;
    };
    using enum QTypeOfNumber;
    constexpr QNumberingPlan ISDN = QNumberingPlan::ISDN;
    for (Row const& row : {
             Row{"89123", NATIONAL, ISDN, "+4989123"},
             Row{"89123", NATIONAL, QNumberingPlan::UNKNOWN, "+4989123"},
             Row{"4420123", INTERNATIONAL, ISDN, "+4420123"},
             Row{"089123", UNKNOWN, ISDN, "+4989123"},
             Row{"004420123", UNKNOWN, ISDN, "+4420123"},
             Row{"123", UNKNOWN, ISDN, "123"},
             Row{"0123", SUBSCRIBER, ISDN, "0123"},
             Row{"0123", NETWORK_SPECIFIC, ISDN, "0123"},
             Row{"89123", NATIONAL, QNumberingPlan::PRIVATE, "89123"},
             Row{"", NATIONAL, ISDN, ""},
         })
    {
        IsdnParty party;
        party.number = row.number;
        party.type = row.type;
        party.plan = row.plan;
        EXPECT_EQ(party.normalised(plan).getText(), row.whole) << row.number;
        EXPECT_EQ(party.normalised({}), party) << "nothing is known of how numbers are dialled";
        EXPECT_EQ(party.normalised({"00", "", ""}).getText(),
                  std::string(row.number) == "004420123" ? "+4420123" : party.getText());
    }
}

TEST(IsdnSubaddressTest, EachComesBackAndWhatIsNoneIsNone)
{
    for (std::string const text : {"00504142", "2812", "20fe00"})
    {
        EXPECT_NE(IsdnSubaddress::TO_WIRE(text).valid, 0) << text;
        EXPECT_EQ(IsdnSubaddress::OF(IsdnSubaddress::TO_WIRE(text)), text);
    }
    EXPECT_EQ(IsdnSubaddress::TO_WIRE("28fe").odd_even_indicator, 1);
    std::string const longest = "00" + std::string(40, '1');
    EXPECT_EQ(IsdnSubaddress::OF(IsdnSubaddress::TO_WIRE(longest)), longest);
    for (std::string const& text : {std::string(), std::string("00"), std::string("005"), std::string("00xy"),
                                    std::string("-012"), std::string("1011"), longest + "11"})
        EXPECT_EQ(IsdnSubaddress::TO_WIRE(text).valid, 0) << text;
    pri_party_subaddress wrong = {};
    EXPECT_EQ(IsdnSubaddress::OF(wrong), "");
    wrong.valid = 1;
    wrong.length = -5;
    EXPECT_EQ(IsdnSubaddress::OF(wrong), "00");
    wrong.length = 1000;
    EXPECT_EQ(IsdnSubaddress::OF(wrong).size(), 42u);
}

TEST(IsdnPartyTest, EachOctetOfANumberComesBack)
{
    for (int type = 0; type < 8; ++type)
        for (int plan = 0; plan < 16; ++plan)
            for (int presentation = 0; presentation < 3; ++presentation)
                for (int screening = 0; screening < 4; ++screening)
                {
                    IsdnParty party;
                    party.number = "4989123*#";
                    party.type = static_cast<QTypeOfNumber>(type);
                    party.plan = static_cast<QNumberingPlan>(plan);
                    party.presentation = static_cast<QPresentationIndicator>(presentation);
                    party.screening = static_cast<QScreeningIndicator>(screening);
                    party.name = "Ada";
                    pri_party_id const id = party.getId();
                    EXPECT_EQ(id.number.plan, type << 4 | plan);
                    EXPECT_EQ(id.number.presentation, presentation << 5 | screening);
                    EXPECT_EQ(IsdnParty::OF(id), party);
                }
}

TEST(IsdnPartyTest, WhatIsNoNumberIsNotSentAsOne)
{
    struct Row
    {
        char const* number;
        char const* digits;
    };
    Row const rows[] = {
        {"4989123", "4989123"},
        {"+4989123", "4989123"},
        {"alice", ""},
        {"49 89", ""},
        {"+", ""},
        {"0123456789012345678901234567890123456789", "0123456789012345678901234567890123456789"},
        {"01234567890123456789012345678901234567890", ""},
    };
    for (Row const& row : rows)
    {
        IsdnParty party;
        party.number = row.number;
        EXPECT_EQ(party.getDigits(), row.digits) << row.number;
        EXPECT_EQ(party.getId().number.valid, *row.digits != '\0') << row.number;
    }
}

TEST(IsdnPartyTest, ARestrictedNumberIsToldWithoutDigitsToo)
{
    IsdnParty party;
    party.presentation = QPresentationIndicator::RESTRICTED;
    EXPECT_NE(party.getId().number.valid, 0);
    EXPECT_EQ(party.getId().number.presentation, PRI_PRES_RESTRICTED);
}

TEST(IsdnPartyTest, APlusIsInternational)
{
    IsdnParty party;
    party.number = "+4989";
    EXPECT_EQ(party.getPlan(), PRI_INTERNATIONAL_ISDN);
    EXPECT_EQ(IsdnParty::OF_TEXT("+4989").getText(), "+4989");
    EXPECT_EQ(IsdnParty::OF_TEXT("089").getText(), "089");
    EXPECT_EQ(IsdnParty::OF_CALLED("4989", PRI_INTERNATIONAL_ISDN).getText(), "+4989");
    EXPECT_EQ(IsdnParty::OF_CALLED("89", PRI_NATIONAL_ISDN).getText(), "89");
}

TEST(IsdnTextTest, CharactersOfBothSides)
{
    EXPECT_EQ(IsdnText::TO_WIRE("J\xc3\xb6rg", 34), "J\xf6rg");
    EXPECT_EQ(IsdnText::FROM_WIRE("J\xf6rg"), "J\xc3\xb6rg");
    EXPECT_EQ(IsdnText::FROM_WIRE("J\xc3\xb6rg"), "J\xc3\xb6rg") << "some send UTF-8";
    EXPECT_EQ(IsdnText::TO_WIRE("\xe2\x82\xac 5", 34), "? 5") << "no euro in ISO 8859-1";
    EXPECT_EQ(IsdnText::TO_WIRE("a\r\nb\x7f", 34), "a  b ");
    EXPECT_EQ(IsdnText::TO_WIRE("\xc3\xc3\xb6\xff", 34), "?\xf6?");
    EXPECT_EQ(IsdnText::TO_WIRE("abcdef", 3), "abc");
    EXPECT_EQ(IsdnText::TO_WIRE("\xc3\xb6\xc3\xb6", 1), "\xf6") << "octets of the wire count";
    EXPECT_EQ(IsdnText::FROM_WIRE("\x01x"), " x");
}

TEST(IsdnRedirectionTest, EachReasonComesBack)
{
    using Reason = QReasonForRedirection;
    for (Reason const reason :
         {Reason::UNKNOWN, Reason::FORWARDING_BUSY, Reason::FORWARDING_NO_REPLY, Reason::CALL_DEFLECTION,
          Reason::OUT_OF_ORDER, Reason::FORWARDING_BY_CALLED, Reason::FORWARDING_UNCONDITIONAL})
    {
        IsdnRedirection redirection;
        redirection.last.number = "200";
        redirection.first = redirection.last;
        redirection.reason = redirection.firstReason = reason;
        redirection.count = 1;
        EXPECT_EQ(IsdnRedirection::OF(redirection.getRedirecting()), redirection) << static_cast<int>(reason);
    }
    EXPECT_EQ(IsdnRedirection::REASON_OF(4), Reason::CALL_DEFLECTION) << "as Q.931 has it";
    EXPECT_EQ(IsdnRedirection::REASON_OF(77), Reason::UNKNOWN);
}

TEST(IsdnRedirectionTest, WhoRedirectedFirstAndLast)
{
    IsdnRedirection redirection;
    redirection.last = IsdnParty::OF_TEXT("+4989200");
    redirection.first = IsdnParty::OF_TEXT("300");
    redirection.reason = QReasonForRedirection::FORWARDING_BUSY;
    redirection.firstReason = QReasonForRedirection::FORWARDING_UNCONDITIONAL;
    redirection.count = 2;
    EXPECT_EQ(IsdnRedirection::OF(redirection.getRedirecting()), redirection);
    CC_PropertyContainer properties;
    redirection.addTo(properties);
    EXPECT_EQ(properties.get(Key::REDIRECTING_E164_NUMBER).getValueOr(""), "+4989200");
    EXPECT_EQ(properties.get(Key::REDIRECTING_FIRST_E164_NUMBER).getValueOr(""), "300");
    EXPECT_EQ(properties.get(Key::REDIRECTING_COUNTER).getValueOr(0u), 2u);
}

TEST(IsdnRedirectionTest, ACallThatWasNotRedirectedHasNone)
{
    CC_PropertyContainer properties;
    IsdnRedirection::OF(pri_party_redirecting{}).addTo(properties);
    EXPECT_TRUE(properties.isEmpty());
}

TEST(IsdnBearerTest, EachCapabilityComesBack)
{
    using Capability = QInformationTransferCapability;
    struct Row
    {
        Capability capability;
        int layer1;
    };
    Row const rows[] = {{Capability::SPEECH, 0x23},
                        {Capability::AUDIO_3_1_KHZ, 0x23},
                        {Capability::UNRESTRICTED_DIGITAL, -1},
                        {Capability::RESTRICTED_DIGITAL, -1},
                        {Capability::UNRESTRICTED_DIGITAL_WITH_TONES, -1},
                        {Capability::VIDEO, -1}};
    for (Row const& row : rows)
    {
        EXPECT_EQ(IsdnBearer::OF(IsdnBearer{row.capability}.getCapability()).capability, row.capability);
        EXPECT_EQ(IsdnBearer{row.capability}.getLayer1(), row.layer1);
    }
    EXPECT_EQ(IsdnBearer::OF(7).capability, Capability::SPEECH);
}

TEST(IsdnCauseTest, EachValueIsTheSame)
{
    for (int value = 1; value <= 127; ++value)
    {
        EXPECT_EQ(static_cast<int>(IsdnCause::FROM_WIRE(value)), value);
        EXPECT_EQ(IsdnCause::TO_WIRE(static_cast<QCause>(value)), value);
    }
    for (int const none : {-1, 0, 128, 1000})
    {
        EXPECT_EQ(IsdnCause::FROM_WIRE(none), QCause::NORMAL_UNSPECIFIED);
        EXPECT_EQ(IsdnCause::TO_WIRE(static_cast<QCause>(none)), 16);
    }
}

TEST(IsdnProgressTest, WhatEachDescriptionSays)
{
    EXPECT_TRUE(IsdnProgress::OF(0).isIsdn);
    EXPECT_FALSE(IsdnProgress::OF(0).isInBand);
    EXPECT_TRUE(IsdnProgress::OF(PRI_PROG_INBAND_AVAILABLE).isInBand);
    EXPECT_TRUE(IsdnProgress::OF(PRI_PROG_INBAND_AVAILABLE).isIsdn);
    for (int const end : {PRI_PROG_CALL_NOT_E2E_ISDN, PRI_PROG_CALLED_NOT_ISDN, PRI_PROG_CALLER_NOT_ISDN})
        EXPECT_FALSE(IsdnProgress::OF(end).isIsdn) << end;
}

TEST(IsdnUserUserTest, ATextComesBack)
{
    auto const content = IsdnUserUser::FROM_WIRE("Hi!\n");
    EXPECT_EQ(content.content, "044869210a");
    EXPECT_EQ(content.getParameter("encoding"), "hex");
    EXPECT_EQ(IsdnUserUser::TO_WIRE(content), "Hi!\n");
}

TEST(IsdnUserUserTest, WhatTheStackCannotSendIsNotSent)
{
    using Content = CC_PropertyParametrizedString::ParametrizedString;
    EXPECT_EQ(IsdnUserUser::TO_WIRE(Content("04414A")), "AJ");
    for (char const* const none : {"", "04", "00414a", "044", "04zz", "0400", "04ff", "041g"})
        EXPECT_EQ(IsdnUserUser::TO_WIRE(Content(none)), "") << none;
    std::string longest = "04";
    for (int i = 0; i < 128; ++i)
        longest += "41";
    EXPECT_EQ(IsdnUserUser::TO_WIRE(Content(String(std::string_view(longest)))).size(), 128u);
    longest += "41";
    EXPECT_EQ(IsdnUserUser::TO_WIRE(Content(String(std::string_view(longest)))), "");
}

TEST(IsdnChargeTest, AChargeInMoneyComesBack)
{
    pri_subcmd_aoc_d advice = {};
    advice.charge = PRI_AOC_DE_CHARGE_CURRENCY;
    std::strcpy(advice.recorded.money.currency, "EUR");
    advice.recorded.money.amount = {1234, PRI_AOC_MULTIPLIER_HUNDREDTH};
    advice.billing_id = PRI_AOC_D_BILLING_ID_REVERSE;
    IsdnCharge::Charge const charge = IsdnCharge::OF_D(advice);
    EXPECT_EQ(TEXT_OF(charge), "EUR 12.34 (reverseCharging) (subTotal)");
    EXPECT_FALSE(IsdnCharge::IS_TOTAL(charge));
    pri_subcmd_aoc_d const back = IsdnCharge::TO_D(charge);
    EXPECT_EQ(back.charge, advice.charge);
    EXPECT_STREQ(back.recorded.money.currency, "EUR");
    EXPECT_EQ(back.recorded.money.amount.cost, 1234);
    EXPECT_EQ(back.recorded.money.amount.multiplier, PRI_AOC_MULTIPLIER_HUNDREDTH);
    EXPECT_EQ(back.billing_id, PRI_AOC_D_BILLING_ID_REVERSE);
    EXPECT_EQ(back.billing_accumulation, 0);
}

TEST(IsdnChargeTest, AChargeInUnitsAtTheEnd)
{
    pri_subcmd_aoc_e advice = {};
    advice.charge = PRI_AOC_DE_CHARGE_UNITS;
    advice.recorded.unit.num_items = 3;
    advice.recorded.unit.item[0] = {7, -1};
    advice.recorded.unit.item[1] = {-1, 2};
    advice.recorded.unit.item[2] = {0, 16};
    advice.billing_id = PRI_AOC_E_BILLING_ID_CALL_TRANSFER;
    IsdnCharge::Charge const charge = IsdnCharge::OF_E(advice);
    EXPECT_TRUE(IsdnCharge::IS_TOTAL(charge));
    pri_subcmd_aoc_e const back = IsdnCharge::TO_E(charge);
    ASSERT_EQ(back.recorded.unit.num_items, 3);
    for (int i = 0; i < 3; ++i)
    {
        EXPECT_EQ(back.recorded.unit.item[i].number, advice.recorded.unit.item[i].number) << i;
        EXPECT_EQ(back.recorded.unit.item[i].type, advice.recorded.unit.item[i].type) << i;
    }
    EXPECT_EQ(back.billing_id, PRI_AOC_E_BILLING_ID_CALL_TRANSFER);
    EXPECT_EQ(IsdnCharge::TO_D(charge).billing_id, 0) << "AOC-D has no such identification";
}

TEST(IsdnChargeTest, FreeAndUnknown)
{
    for (int const kind : {PRI_AOC_DE_CHARGE_FREE, PRI_AOC_DE_CHARGE_NOT_AVAILABLE})
    {
        pri_subcmd_aoc_e advice = {};
        advice.charge = kind;
        EXPECT_EQ(IsdnCharge::TO_E(IsdnCharge::OF_E(advice)).charge, kind);
        EXPECT_FALSE(IsdnCharge::IS_TOTAL(IsdnCharge::OF_E(advice))) << "it does not say";
    }
    EXPECT_EQ(IsdnCharge::TO_D(IsdnCharge::Charge()).charge, PRI_AOC_DE_CHARGE_NOT_AVAILABLE);
}

TEST(IsdnChargeTest, MoreUnitsThanThereAreIsNotBelieved)
{
    pri_subcmd_aoc_d advice = {};
    advice.charge = PRI_AOC_DE_CHARGE_UNITS;
    advice.recorded.unit.num_items = 1000;
    EXPECT_EQ(IsdnCharge::TO_D(IsdnCharge::OF_D(advice)).recorded.unit.num_items, 32);
    advice.recorded.unit.num_items = -5;
    EXPECT_EQ(IsdnCharge::TO_D(IsdnCharge::OF_D(advice)).recorded.unit.num_items, 0);
}

TEST(IsdnTariffTest, EachRateComesBack)
{
    pri_subcmd_aoc_s advice = {};
    advice.num_items = 6;
    auto& item = advice.item;
    item[0].chargeable = PRI_AOC_CHARGED_ITEM_BASIC_COMMUNICATION;
    item[0].rate_type = PRI_AOC_RATE_TYPE_DURATION;
    item[0].rate.duration.amount = {5, PRI_AOC_MULTIPLIER_HUNDREDTH};
    item[0].rate.duration.time = {1, PRI_AOC_TIME_SCALE_MINUTE};
    item[0].rate.duration.granularity = {10, PRI_AOC_TIME_SCALE_SECOND};
    item[0].rate.duration.charging_type = 1;
    std::strcpy(item[0].rate.duration.currency, "CHF");
    item[1].chargeable = PRI_AOC_CHARGED_ITEM_CALL_SETUP;
    item[1].rate_type = PRI_AOC_RATE_TYPE_FLAT;
    item[1].rate.flat.amount = {1, PRI_AOC_MULTIPLIER_TENTH};
    std::strcpy(item[1].rate.flat.currency, "CHF");
    item[2].chargeable = PRI_AOC_CHARGED_ITEM_USER_USER_INFO;
    item[2].rate_type = PRI_AOC_RATE_TYPE_VOLUME;
    item[2].rate.volume.amount = {2, PRI_AOC_MULTIPLIER_ONE};
    item[2].rate.volume.unit = PRI_AOC_VOLUME_UNIT_MESSAGE;
    std::strcpy(item[2].rate.volume.currency, "CHF");
    item[3].chargeable = PRI_AOC_CHARGED_ITEM_CALL_ATTEMPT;
    item[3].rate_type = PRI_AOC_RATE_TYPE_FREE;
    item[4].chargeable = PRI_AOC_CHARGED_ITEM_SUPPLEMENTARY_SERVICE;
    item[4].rate_type = PRI_AOC_RATE_TYPE_SPECIAL_CODE;
    item[4].rate.special = 3;
    item[5].chargeable = PRI_AOC_CHARGED_ITEM_CALL_ATTEMPT;
    item[5].rate_type = PRI_AOC_RATE_TYPE_NOT_AVAILABLE;
    pri_subcmd_aoc_s const back = IsdnCharge::TO_S(IsdnCharge::OF_S(advice));
    ASSERT_EQ(back.num_items, 6);
    for (int i = 0; i < 6; ++i)
    {
        EXPECT_EQ(back.item[i].chargeable, item[i].chargeable) << i;
        EXPECT_EQ(back.item[i].rate_type, item[i].rate_type) << i;
        EXPECT_EQ(TEXT_OF(back.item[i]), TEXT_OF(item[i])) << i;
    }
}

TEST(IsdnTariffTest, ASpecialArrangementAndNone)
{
    pri_subcmd_aoc_s advice = {};
    EXPECT_EQ(TEXT_OF(IsdnCharge::OF_S(advice)), "n/a");
    EXPECT_EQ(IsdnCharge::TO_S(IsdnCharge::OF_S(advice)).num_items, 0);
    advice.num_items = 1;
    advice.item[0].chargeable = PRI_AOC_CHARGED_ITEM_SPECIAL_ARRANGEMENT;
    advice.item[0].rate_type = PRI_AOC_RATE_TYPE_SPECIAL_CODE;
    advice.item[0].rate.special = 3;
    EXPECT_EQ(TEXT_OF(IsdnCharge::OF_S(advice)), "Special Arrangement 3");
    EXPECT_EQ(IsdnCharge::TO_S(IsdnCharge::OF_S(advice)).item[0].rate.special, 3);
}
