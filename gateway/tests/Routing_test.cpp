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

TEST(Routing, WithoutAFittingRouteThereIsNone)
{
    Routing const routing({{"b", "49", "a"}});
    EXPECT_EQ(routing.find("b", "4420"), nullptr);
    EXPECT_EQ(routing.find("b", ""), nullptr);
    EXPECT_EQ(routing.find("a", "49"), nullptr);
    EXPECT_EQ(Routing({}).find("a", ""), nullptr);
}
