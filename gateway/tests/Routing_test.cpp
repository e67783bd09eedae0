#include "host/RouteHunt.h"

#include <gtest/gtest.h>

#include <map>

namespace
{
Route MAKE_ROUTE(std::string const& prefix, std::string const& to) { return {"a", prefix, to}; }

std::string FIRST(Routing const& routing, Routing::Question const& question)
{
    Routing::Choices const routes = routing.find(question);
    return routes.empty() ? "none" : routes.front()->to;
}
std::string FIRST(Routing const& routing, std::string_view from, std::string_view number)
{
    return FIRST(routing, {from, number});
}

std::string EXPLAIN(Routing const& routing, Routing::Question const& question)
{
    std::string text;
    for (std::string const& line : routing.explain(question))
        text += line + "\n";
    return text;
}
} // namespace

TEST(Routing, TheLongestPrefixOfTheCallsOwnInterfaceWins)
{
    Routing const routing({{"a", "", "default"},
                           {"a", "49", "germany"},
                           {"a", "4989", "munich"},
                           {"a", "4989", "second"},
                           {"b", "1", "x"}});
    EXPECT_EQ(FIRST(routing, "a", "4989123"), "munich");
    EXPECT_EQ(FIRST(routing, "a", "4930123"), "germany");
    EXPECT_EQ(FIRST(routing, "a", "49"), "germany");
    EXPECT_EQ(FIRST(routing, "a", "4"), "default");
    EXPECT_EQ(FIRST(routing, "a", ""), "default");
}

TEST(Routing, AWholeNumberGoesBeforeEveryPrefix)
{
    Route emergency = MAKE_ROUTE("112", "emergency");
    emergency.isWhole = true;
    Routing const routing({MAKE_ROUTE("112", "prefix"), MAKE_ROUTE("1123", "longer"), emergency});
    EXPECT_EQ(FIRST(routing, "a", "112"), "emergency");
    EXPECT_EQ(FIRST(routing, "a", "1124"), "prefix");
    EXPECT_EQ(FIRST(routing, "a", "1123"), "longer");
}

TEST(Routing, ARouteForSomeCallersIsOnlyForThem)
{
    Route ofHouse = MAKE_ROUTE("49", "cheap");
    ofHouse.calling = "4420";
    Routing const routing({ofHouse, MAKE_ROUTE("49", "usual")});
    EXPECT_EQ(FIRST(routing, {"a", "4989", "44201"}), "cheap");
    EXPECT_EQ(FIRST(routing, {"a", "4989", "33"}), "usual");
    EXPECT_EQ(FIRST(routing, {"a", "4989"}), "usual");
}

TEST(Routing, ARouteForSomeHoursIsOnlyForThese)
{
    Route atWork = MAKE_ROUTE("", "office");
    atWork.hours = WeekHours::PARSE({"mon"}, "08:00-18:00");
    Routing const routing({atWork, MAKE_ROUTE("", "night")});
    EXPECT_EQ(FIRST(routing, {"a", "1", {}, 8 * 60}), "office");
    EXPECT_EQ(FIRST(routing, {"a", "1", {}, 18 * 60}), "night");
    EXPECT_EQ(FIRST(routing, {"a", "1", {}, WeekHours::MINUTES_OF_DAY + 9 * 60}), "night");
}

TEST(Routing, RoutesForTheSameShareTheCallsByTheirWeights)
{
    Route big = MAKE_ROUTE("49", "big");
    big.weight = 3;
    Route small = MAKE_ROUTE("49", "small");
    small.weight = 1;
    Routing const routing({MAKE_ROUTE("49", "spare"), small, big});
    for (unsigned int const step : {1u, 2u, 4u}) // calls of other interfaces may be in between
    {
        std::map<std::string, unsigned int> calls;
        for (unsigned int i = 0; i < 4000; ++i)
            ++calls[FIRST(routing, {"a", "4989", {}, 0, i * step})];
        EXPECT_NEAR(calls["big"], 3000, 150) << step;
        EXPECT_NEAR(calls["small"], 1000, 150) << step;
        EXPECT_EQ(calls["spare"], 0u);
    }
    Routing::Choices const routes = routing.find({"a", "4989"});
    ASSERT_EQ(routes.size(), 3u); // the others come after it
    EXPECT_EQ(routes.back()->to == "spare" || routes[1]->to == "spare", true);
}

TEST(Routing, TheNumberLeavesAsTheRouteShapesIt)
{
    Route route = MAKE_ROUTE("0049", "germany");
    route.strip = 4;
    route.prepend = "0";
    RouteHunt const hunt(Routing({route}).find({"a", "004989123"}), "004989123");
    EXPECT_EQ(hunt.getNumber(), "089123");
    EXPECT_TRUE(hunt.isNumberShaped());
    EXPECT_EQ(RouteHunt(Routing({MAKE_ROUTE("00", "x")}).find({"a", "0049"}), "0049").getNumber(), "0049");
}

TEST(RouteHunt, GoesOnUponTheCausesThatTheRouteNamesAsLongAsThereIsAnotherOne)
{
    Route first = MAKE_ROUTE("49", "first");
    first.nextOn = {34, 38};
    RouteHunt hunt(Routing({first, MAKE_ROUTE("49", "second"), MAKE_ROUTE("", "third")}).find({"a", "49"}), "49");
    EXPECT_EQ(hunt.getProvider(), "first");
    EXPECT_FALSE(hunt.goOn(17));
    EXPECT_TRUE(hunt.goOn(38));
    EXPECT_EQ(hunt.getProvider(), "second");
    EXPECT_FALSE(hunt.goOn(38)); // this one names none
    EXPECT_TRUE(RouteHunt().isEmpty());
    EXPECT_EQ(RouteHunt::TO("a/conference", "77").getProvider(), "a/conference");
    EXPECT_FALSE(RouteHunt::TO("a/conference", "77").goOn(38));
}

TEST(Routing, EveryRouteForTheNumberIsExplained)
{
    Route first = MAKE_ROUTE("4989", "munich");
    first.nextOn = {34, 38};
    first.prepend = "9";
    Route ofHouse = MAKE_ROUTE("49", "cheap");
    ofHouse.calling = "4420";
    Route atNight = MAKE_ROUTE("49", "night");
    atNight.hours = WeekHours::PARSE({"sun"}, {});
    Routing const routing({MAKE_ROUTE("", "default"), MAKE_ROUTE("49", "germany"), ofHouse, atNight, first,
                           MAKE_ROUTE("4989", "second"), MAKE_ROUTE("4930", "berlin")});
    EXPECT_EQ(EXPLAIN(routing, {"a", "4989123"}),
              "4989123 from a: prefix \"4989\" to munich as 94989123\n"
              "4989123 from a: prefix \"4989\" to second (tried when that ends with cause 34, 38)\n"
              "4989123 from a: prefix \"49\" to germany (not taken: a longer one fits)\n"
              "4989123 from a: prefix \"\" to default (not taken: a longer one fits)\n"
              "4989123 from a: prefix \"49\" to cheap (not taken: it is for other callers)\n"
              "4989123 from a: prefix \"49\" to night (not taken: it is for other hours)\n");
    EXPECT_EQ(EXPLAIN(routing, {"b", "4989123"}), "");
}

TEST(Routing, NoInterfaceGetsTheRoutesOfAnotherWhoseNameBeginsAlike)
{
    Routing const routing({{"a", "49", "x"}, {"a4", "9", "y"}});
    EXPECT_EQ(FIRST(routing, "a", "499"), "x");
    EXPECT_EQ(FIRST(routing, "a4", "99"), "y");
    EXPECT_EQ(FIRST(routing, "a4", "499"), "none");
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
    std::vector<Route> routes;
    for (unsigned int i = 100000; i < 200000; ++i)
        routes.push_back({"a", std::to_string(i), "to" + std::to_string(i)});
    Routing const routing(routes);
    EXPECT_EQ(FIRST(routing, "a", "1234567890"), "to123456");
    EXPECT_EQ(FIRST(routing, "a", "2234567890"), "none");
}

TEST(Routing, WithoutAFittingRouteThereIsNone)
{
    Routing const routing({{"b", "49", "a"}});
    EXPECT_EQ(FIRST(routing, "b", "4420"), "none");
    EXPECT_EQ(FIRST(routing, "b", ""), "none");
    EXPECT_EQ(FIRST(routing, "a", "49"), "none");
    EXPECT_EQ(FIRST(Routing({}), "a", ""), "none");
}
