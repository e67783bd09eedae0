#include "sip/message/SipCharge.h"

#include <gtest/gtest.h>

namespace
{
std::string BODY(std::string const& advice)
{
    return R"(<?xml version="1.0"?><aoc xmlns="http://uri.etsi.org/ngn/params/xml/simservs/aoc">)" + advice + "</aoc>";
}
std::string AMOUNT(std::string const& currency, std::string const& amount)
{
    return BODY(
        "<aoc-d><charging-info>subtotal</charging-info><recorded-charges><recorded-currency-units><currency-id>" +
        currency + "</currency-id><currency-amount>" + amount +
        "</currency-amount></recorded-currency-units></recorded-charges></aoc-d>");
}
/// As the property shows it; "none" for what is no charge.
std::string TEXT_OF(std::string const& body)
{
    std::optional<SipCharge::Charge> const charge = SipCharge::READ(body);
    String text;
    return charge ? CC_PropertyCharge(1, *charge).getValueString(text).c_str() : "none";
}
/// Written and read again.
std::string AGAIN(std::string const& body) { return TEXT_OF(SipCharge::WRITE(SipCharge::READ(body).value())); }
} // namespace

TEST(SipCharge, WhatACallCostsSoFarAndInAll)
{
    std::string const soFar = AMOUNT("EUR", "1.25");
    EXPECT_EQ(TEXT_OF(soFar), "EUR 1.25 (subTotal)");
    std::string const total =
        BODY("<aoc-e><recorded-charges><recorded-currency-units><currency-id> EUR </currency-id>\n<currency-amount>12"
             "</currency-amount></recorded-currency-units></recorded-charges><billing-id>normal-charging</billing-id>"
             "</aoc-e>");
    EXPECT_EQ(TEXT_OF(total), "EUR 12 (normalCharging) (total)");
    EXPECT_TRUE(SipCharge::IS_TOTAL(SipCharge::READ(total).value()));
    for (std::string const& body : {soFar, total, AMOUNT("UNIT", "7"), AMOUNT("X", "0.005"), AMOUNT("X", "70000000")})
        EXPECT_EQ(AGAIN(body), TEXT_OF(body));
}

TEST(SipCharge, AnElementMayHaveAPrefix)
{
    EXPECT_EQ(
        TEXT_OF(R"(<a:aoc xmlns:a="http://uri.etsi.org/ngn/params/xml/simservs/aoc"><a:aoc-e><a:recorded-charges>)"
                R"(<a:free-charge/></a:recorded-charges></a:aoc-e></a:aoc>)"),
        "Free");
}

TEST(SipCharge, UnitsFreeCallsAndChargesThatAreNotKnown)
{
    EXPECT_EQ(TEXT_OF(AMOUNT("UNIT", "7")), "7 units (subTotal)");
    for (auto const& [element, text] : {std::pair{"<free-charge/>", "Free"}, std::pair{"<not-available/>", "N/A"}})
    {
        std::string const body =
            BODY(std::string("<aoc-d><recorded-charges>") + element + "</recorded-charges></aoc-d>");
        EXPECT_EQ(TEXT_OF(body), text);
        EXPECT_EQ(AGAIN(body), text);
    }
}

TEST(SipCharge, AmountsAreRoundedToWhatThePropertyHolds)
{
    EXPECT_EQ(TEXT_OF(AMOUNT("EUR", "0.0125")), TEXT_OF(AMOUNT("EUR", "0.013")));
    EXPECT_EQ(TEXT_OF(AMOUNT("EUR", "123456.789")), TEXT_OF(AMOUNT("EUR", "123456.79")));
    EXPECT_EQ(TEXT_OF(AMOUNT("EUR", ".5")), TEXT_OF(AMOUNT("EUR", "0.5")));
}

TEST(SipCharge, WhatIsNoChargeIsNone)
{
    std::string const bomb = R"(<!DOCTYPE a [<!ENTITY b "c">]>)" + AMOUNT("EUR", "1");
    std::string deep;
    for (int i = 0; i < 1000; ++i)
        deep += "<a>";
    for (std::string const& body :
         {std::string(),
          std::string("hello"),
          std::string("<aoc/>"),
          BODY(""),
          BODY("<aoc-s/>"),
          bomb,
          deep,
          BODY("<aoc-d><recorded-charges>"),
          AMOUNT("EUR", "-1"),
          AMOUNT("EUR", "1,5"),
          AMOUNT("EUR", "1.2.3"),
          AMOUNT("EUR", ""),
          AMOUNT("EUR", "."),
          AMOUNT("", "1"),
          AMOUNT("more than ten", "1"),
          AMOUNT("\xe2\x82\xac", "1"),
          AMOUNT("UNIT", "1.5"),
          AMOUNT("EUR", "99999999999999"),
          AMOUNT("EUR", "99999999999"),
          std::string("<aoc><aoc-d><recorded-charges><free-charge/></recorded-charges></aoc-d></aoc>")})
        EXPECT_EQ(TEXT_OF(body), "none") << body.substr(0, 300);
}
