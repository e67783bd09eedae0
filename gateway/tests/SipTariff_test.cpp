#include "sip/message/SipTariff.h"

#include "sip/message/SipAdvice.h"
#include "sip/message/SipBody.h"
#include "sip/message/SipContent.h"

#include <gtest/gtest.h>

namespace
{
std::string ITEMS(std::string const& items)
{
    return SipAdvice::WRITE("<aoc-s><charged-items>" + items + "</charged-items></aoc-s>");
}
std::string PRICE(std::string const& amount)
{
    return "<currency-id>EUR</currency-id><currency-amount>" + amount + "</currency-amount>";
}
std::string PER(std::string const& units, std::string const& scale)
{
    return "<time-unit>" + units + "</time-unit><scale>" + scale + "</scale>";
}
std::string BY_TIME(std::string const& rest)
{
    return ITEMS("<basic><price-time>" + PRICE("0.05") + rest + "</price-time></basic>");
}
/// As the property shows it; "none" for what is no tariff.
std::string TARIFF_TEXT(std::string const& body)
{
    std::optional<SipTariff::Tariff> const tariff = SipTariff::READ(body);
    String text;
    return tariff ? CC_PropertyTariff(1, *tariff).getValueString(text).c_str() : "none";
}
/// Written and read again.
std::string TARIFF_AGAIN(std::string const& body)
{
    return TARIFF_TEXT(SipTariff::WRITE(SipTariff::READ(body).value()));
}
} // namespace

TEST(SipTariff, EachItemHasARate)
{
    std::string const minute = "<length-time-unit>" + PER("1", "one-minute") + "</length-time-unit>";
    std::string const bodies[] = {
        BY_TIME(minute + "<charging-type>step-function</charging-type>"),
        BY_TIME(minute + "<charging-type>continuous</charging-type><granularity>" + PER("10", "one-second") +
                "</granularity>"),
        ITEMS("<basic><free-charge/></basic><communication-setup><flat-rate>" + PRICE("0.1") +
              "</flat-rate></communication-setup>"),
        ITEMS("<communication-attempt><not-available/></communication-attempt><services><special-code>3"
              "</special-code></services>"),
        SipAdvice::WRITE("<aoc-s><special-arrangement>7</special-arrangement></aoc-s>"),
    };
    for (std::string const& body : bodies)
    {
        EXPECT_NE(TARIFF_TEXT(body), "none") << body;
        EXPECT_EQ(TARIFF_AGAIN(body), TARIFF_TEXT(body));
    }
    EXPECT_EQ(TARIFF_TEXT(bodies[2]), "basicCommunication: Free, callSetup: Flat Rate: EUR 1 * oneTenth");
    EXPECT_EQ(TARIFF_TEXT(bodies[4]), "Special Arrangement 7");
    EXPECT_NE(TARIFF_TEXT(bodies[0]), TARIFF_TEXT(bodies[1]));
}

TEST(SipTariff, WhatHasNoPlaceInTheBody)
{
    SipTariff::Tariff tariff;
    tariff.select(tariff.m_chargeNotAvailable);
    EXPECT_EQ(TARIFF_TEXT(SipTariff::WRITE(tariff)), "basicCommunication: N/A");
    Q956::AOCSCurrencyInfo& entry = *tariff.select(tariff.m_currencyInfoList).append();
    entry.m_chargedItem = Q956::EChargedItem::USER_TO_USER_INFO;
    entry.m_aOCSCurrencyInfo.select(entry.m_aOCSCurrencyInfo.m_freeOfCharge);
    EXPECT_EQ(TARIFF_TEXT(SipTariff::WRITE(tariff)), "basicCommunication: N/A");
}

TEST(SipTariff, WhatIsNoTariffIsNone)
{
    std::string const hour = "<length-time-unit>" + PER("1", "one-hour") + "</length-time-unit>";
    EXPECT_NE(TARIFF_TEXT(BY_TIME(hour)), "none");
    for (std::string const& body :
         {std::string(), std::string("hello"), SipAdvice::WRITE(""), SipAdvice::WRITE("<aoc-s/>"),
          SipAdvice::WRITE("<aoc-d><charged-items/></aoc-d>"), BY_TIME(""),
          BY_TIME("<length-time-unit>" + PER("1", "one-year") + "</length-time-unit>"),
          BY_TIME("<length-time-unit>" + PER("1.5", "one-hour") + "</length-time-unit>"),
          BY_TIME(hour + "<granularity/>"),
          ITEMS("<basic><flat-rate><currency-id>EUR</currency-id></flat-rate></basic>"),
          ITEMS("<basic><flat-rate>" + PRICE("-1") + "</flat-rate></basic>"),
          ITEMS("<basic><special-code>11</special-code></basic>"),
          SipAdvice::WRITE("<aoc-s><special-arrangement>x</special-arrangement></aoc-s>")})
        EXPECT_EQ(TARIFF_TEXT(body), "none") << body;
}

TEST(SipAdvice, TheTypeOfItsBody)
{
    EXPECT_TRUE(SipAdvice::IS_TYPE("application/vnd.etsi.AOC+xml;charset=utf-8"));
    EXPECT_FALSE(SipAdvice::IS_TYPE("application/vnd.etsi.aoc"));
}

TEST(SipAdvice, AThousandElementsAreEnough)
{
    std::string many;
    for (int i = 0; i < 2000; ++i)
        many += "<a/>";
    EXPECT_TRUE(SipAdvice::READ(SipAdvice::WRITE(many)).empty());
}

TEST(SipContent, ASessionAndAnAdviceAreReadAgainByWhoeverTheyAreFor)
{
    EXPECT_TRUE(SipContent::OF("", "").isEmpty());
    EXPECT_EQ(SipContent::OF("v=0", "").type, "application/sdp");
    EXPECT_EQ(SipContent::OF("", "<aoc/>").type, SipAdvice::TYPE);
    for (std::string const session : {"v=0\r\n", "v=0\r\n--part\r\n\r\n--part--\r\n", "v=0\r\n--part+\r\n"})
    {
        SipContent const content = SipContent::OF(session, "<aoc/>");
        SipBody const body = SipBody::READ(content.body, content.type, "", "");
        EXPECT_TRUE(body.isUnderstood());
        EXPECT_EQ(body.session, session);
        EXPECT_EQ(body.advice, "<aoc/>");
    }
}
