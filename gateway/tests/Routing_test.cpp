#include "host/Routing.h"

#include <gtest/gtest.h>

TEST(Routing, TheLongestPrefixOfTheCallsOwnInterfaceWins)
{
    Routing const routing({{"a", "", "default"},
                           {"a", "49", "germany"},
                           {"a", "4989", "munich"},
                           {"a", "4989", "second"},
                           {"b", "1", "x"}});
    EXPECT_EQ(*routing.find("a", "4989123"), "munich");
    EXPECT_EQ(*routing.find("a", "4930123"), "germany");
    EXPECT_EQ(*routing.find("a", "49"), "germany");
    EXPECT_EQ(*routing.find("a", "4"), "default");
    EXPECT_EQ(*routing.find("a", ""), "default");
}

TEST(Routing, AllThatFitAreToldInTheOrderInWhichTheyWouldBeTaken)
{
    Routing const routing(
        {{"a", "", "default"}, {"a", "49", "germany"}, {"a", "4930", "berlin"}, {"a", "4989", "munich"}});
    std::string text;
    for (Routing::Match const& match : routing.findAll("a", "4989123"))
        text += std::string(match.prefix) + "->" + match.to + " ";
    EXPECT_EQ(text, "4989->munich 49->germany ->default ");
}

TEST(Routing, NoInterfaceGetsTheRoutesOfAnotherWhoseNameBeginsAlike)
{
    Routing const routing({{"a", "49", "x"}, {"a4", "9", "y"}});
    EXPECT_EQ(*routing.find("a", "499"), "x");
    EXPECT_EQ(*routing.find("a4", "99"), "y");
    EXPECT_EQ(routing.find("a4", "499"), nullptr);
}

TEST(Routing, ANumberThatMoreDigitsCouldLeadSomewhereIsABeginning)
{
    Routing const routing({{"a", "4989", "munich"}, {"b", "7", "x"}});
    EXPECT_TRUE(routing.isBeginning("a", "49"));
    EXPECT_TRUE(routing.isBeginning("a", ""));
    EXPECT_FALSE(routing.isBeginning("a", "48"));
    EXPECT_FALSE(routing.isBeginning("a", "7")) << "of another interface";
}

TEST(Routing, AHundredThousandPrefixesAreATable)
{
    std::vector<Configuration::Route> routes;
    for (unsigned int i = 100000; i < 200000; ++i)
        routes.push_back({"a", std::to_string(i), "to" + std::to_string(i)});
    Routing const routing(routes);
    EXPECT_EQ(*routing.find("a", "1234567890"), "to123456");
    EXPECT_EQ(routing.find("a", "2234567890"), nullptr);
}

TEST(Routing, WithoutAFittingRouteThereIsNone)
{
    Routing const routing({{"b", "49", "a"}});
    EXPECT_EQ(routing.find("b", "4420"), nullptr);
    EXPECT_EQ(routing.find("b", ""), nullptr);
    EXPECT_EQ(routing.find("a", "49"), nullptr);
    EXPECT_EQ(Routing({}).find("a", ""), nullptr);
}
