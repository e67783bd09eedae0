#include "host/RouteHunt.h"
#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

#include <optional>

namespace
{
Route LIMITED(std::string const& prefix, std::string const& to, unsigned int calls, unsigned int perSecond = 0)
{
    Route route{"a", prefix, to};
    route.maxCalls = calls;
    route.maxCallsPerSecond = perSecond;
    return route;
}

Route EMERGENCY(std::string const& prefix, bool isWhole)
{
    Route route{"a", prefix, "emergency"};
    route.isWhole = isWhole;
    route.isEmergency = true;
    return route;
}

RouteHunt HUNT(Routing const& routing, std::string_view number = "49") { return {routing.find({"a", number}), number}; }

std::string PROVIDER_OF(RouteHunt const& hunt) { return hunt.isEmpty() ? "none" : hunt.getProvider(); }

std::string EXPLAINED(Routing const& routing, Routing::Question const& question)
{
    std::string text;
    for (std::string const& line : routing.explain(question))
        text += line + "\n";
    return text;
}
} // namespace

TEST(RouteLimits, WhenARouteIsFullTheNextOneGetsTheCall)
{
    Routing const routing({LIMITED("49", "small", 1), LIMITED("4", "big", 2)});
    RouteHunt const first = HUNT(routing);
    EXPECT_EQ(PROVIDER_OF(first), "small");
    RouteHunt const second = HUNT(routing);
    EXPECT_EQ(PROVIDER_OF(second), "big");
    RouteHunt const third = HUNT(routing);
    EXPECT_EQ(PROVIDER_OF(third), "big");
    RouteHunt const fourth = HUNT(routing);
    EXPECT_EQ(PROVIDER_OF(fourth), "none");
    EXPECT_EQ(fourth.getRefusal(), QCause::NO_CIRCUIT_CHANNEL_AVAILABLE);
    EXPECT_EQ(HUNT(routing, "7").getRefusal(), QCause::NO_ROUTE_TO_DESTINATION);
}

TEST(RouteLimits, ACallThatIsOverMakesRoom)
{
    Routing const routing({LIMITED("49", "small", 1)});
    {
        RouteHunt hunt = HUNT(routing);
        RouteHunt copy = hunt;
        EXPECT_TRUE(HUNT(routing).isEmpty());
        hunt.leave();
        EXPECT_TRUE(HUNT(routing).isEmpty()) << "the copy is of the same call";
        copy.leave();
        EXPECT_FALSE(HUNT(routing).isEmpty());
        EXPECT_EQ(PROVIDER_OF(hunt), "small") << "it is still told of";
    }
    EXPECT_FALSE(HUNT(routing).isEmpty());
}

TEST(RouteLimits, ACallThatGoesOnLeavesItsRouteAndSkipsWhatIsFull)
{
    Route first = LIMITED("49", "first", 1);
    first.nextOn = {38};
    Routing const routing({first, LIMITED("4", "full", 1), LIMITED("", "last", 1)});
    RouteHunt const other = RouteHunt({routing.find({"a", "4"}).front()}, "4");
    EXPECT_EQ(PROVIDER_OF(other), "full");
    RouteHunt hunt = HUNT(routing);
    EXPECT_TRUE(hunt.goOn(38));
    EXPECT_EQ(PROVIDER_OF(hunt), "last");
    EXPECT_EQ(PROVIDER_OF(HUNT(routing)), "first") << "there is room again";
    RouteHunt again = HUNT(routing);
    EXPECT_FALSE(again.goOn(38)) << "the others are full";
    EXPECT_EQ(PROVIDER_OF(again), "first");
}

TEST(RouteLimits, CallsThatBeginTooFastAreRefused)
{
    DrivenClock clock;
    Routing const routing({LIMITED("49", "slow", 0, 2)});
    EXPECT_FALSE(HUNT(routing).isEmpty());
    EXPECT_FALSE(HUNT(routing).isEmpty());
    EXPECT_EQ(HUNT(routing).getRefusal(), QCause::SWITCHING_EQUIPMENT_CONGESTION);
    clock.advance(500);
    EXPECT_FALSE(HUNT(routing).isEmpty());
    EXPECT_TRUE(HUNT(routing).isEmpty());
}

TEST(RouteLimits, CallsOfBeforeAReloadCountOn)
{
    Routing const before({LIMITED("49", "x", 1), LIMITED("49", "y", 1)});
    RouteHunt const hunt = HUNT(before);
    Routing const after({LIMITED("49", "y", 1), LIMITED("49", "x", 2)}, &before);
    EXPECT_EQ(PROVIDER_OF(HUNT(after)), "y");
    RouteHunt const ofY = HUNT(after);
    RouteHunt const ofX = HUNT(after);
    EXPECT_EQ(PROVIDER_OF(ofX), "x");
    EXPECT_TRUE(HUNT(after).isEmpty()) << "one of the two that x takes began before";
}

TEST(RouteLimits, ARouteForAUserIsOnlyForHim)
{
    Route ofAlice{"a", "49", "cheap"};
    ofAlice.user = "alice";
    Routing const routing({ofAlice, {"a", "49", "usual"}});
    EXPECT_EQ(routing.find({"a", "49", {}, 0, 0, "alice"}).front()->to, "cheap");
    EXPECT_EQ(routing.find({"a", "49", {}, 0, 0, "bob"}).front()->to, "usual");
    EXPECT_EQ(routing.find({"a", "49"}).front()->to, "usual");
}

TEST(RouteLimits, AnEmergencyNumberIsThatOfTheWholeNumberOrTheLongestPrefix)
{
    Routing const routing({EMERGENCY("112", true),
                           EMERGENCY("urn:service:sos", false),
                           {"a", "11", "x"},
                           {"a", "urn:service:sos.test", "y"}});
    EXPECT_TRUE(routing.isEmergency("a", "112"));
    EXPECT_FALSE(routing.isEmergency("a", "1123"));
    EXPECT_FALSE(routing.isEmergency("a", "110"));
    EXPECT_FALSE(routing.isEmergency("b", "112"));
    EXPECT_TRUE(routing.isEmergency("a", "urn:service:sos.fire"));
    EXPECT_FALSE(routing.isEmergency("a", "urn:service:sos.test"));
    EXPECT_FALSE(Routing({{"a", "112", "x"}}).isEmergency("a", "112"));
    EXPECT_TRUE(HUNT(routing, "112").isEmergency());
    EXPECT_FALSE(RouteHunt().isEmergency());
}

TEST(RouteLimits, ADryRunTellsOfThem)
{
    Route ofAlice{"a", "49", "cheap"};
    ofAlice.user = "alice";
    Route both = LIMITED("49", "both", 3, 4);
    both.nextOn = {38};
    Routing const routing({LIMITED("498", "small", 1), both, ofAlice, {"a", "4", "usual"}, EMERGENCY("112", true)});
    EXPECT_EQ(EXPLAINED(routing, {"a", "498"}),
              "498 from a: prefix \"498\" to small, 1 calls at most\n"
              "498 from a: prefix \"49\" to both, 3 calls at most, 4 a second at most (tried when that is full)\n"
              "498 from a: prefix \"4\" to usual (tried when that is full, or ends with cause 38)\n"
              "498 from a: prefix \"49\" to cheap (not taken: it is for another user)\n");
    EXPECT_EQ(EXPLAINED(routing, {"a", "112"}), "112 from a: number \"112\" to emergency, an emergency number\n");
}
