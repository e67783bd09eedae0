#include "diagnosis/CC_ExplanationEnd.h"

#include "properties/CC_PropertyCallLegState.h"

#include <algorithm>
#include <array>
#include <cstdio>

namespace
{
using Age = CC_Explanation::Age;
using Call = CC_Explanation::Call;
using Holder = CC_Explanation::Holder;
using Leg = CC_Explanation::Leg;
using State = CC_PropertyCallLegState;

Holder const* FIND(Leg const& leg, Holder::Kind kind)
{
    auto const found = std::find_if(leg.holders.begin(), leg.holders.end(),
                                    [kind](Holder const& holder) { return holder.kind == kind; });
    return found != leg.holders.end() ? &*found : nullptr;
}

bool IS_LIVE(Leg const& leg) { return leg.state != State::RELEASED; }

std::string NUMBER(long long number, char const* one, char const* more)
{
    return std::to_string(number) + " " + (number == 1 ? one : more);
}

/// What a leg's module does not know or cannot do.
std::string OBSTACLES(Leg const& leg, Holder const& own)
{
    std::string text;
    if (!leg.viewedState.empty())
        text += "; its module's view says " + leg.viewedState + ", so a filter stands between the two";
    if (own.untold != 0)
        text += "; its module is still to be told of " + NUMBER(own.untold, "change", "changes") +
                CC_ExplanationEnd::STALL_OF(leg);
    return text;
}

std::string END_OF(Leg const& leg)
{
    std::string const who =
        "leg " + leg.name + " is " + State::STATE_NAME(static_cast<State::State>(leg.state)) + " and ";
    if (Holder const* const own = FIND(leg, Holder::OWN_ADAPTER))
        return who + "held by " + CC_ExplanationEnd::NAME_OF(own->adapter) + ": it ends when that adapter drops" +
               OBSTACLES(leg, *own);
    if (leg.isMoving)
        return who + "on its way between calls: it goes on when that move has ended";
    if (Holder const* const unknown = FIND(leg, Holder::NOBODY_KNOWN))
        return who + "driven by no adapter: it ends when whoever holds the " +
               NUMBER(unknown->references, "reference", "references") + " that nobody is known for " +
               (IS_LIVE(leg) ? "stores RELEASED and gives up" : "gives up");
    if (Holder const* const peer = FIND(leg, Holder::PEER_ADAPTER))
        return who + "held by " + CC_ExplanationEnd::NAME_OF(peer->adapter) +
               " as its peer: it ends when that adapter drops or chooses another";
    return who + "held by its call alone: it ends when somebody takes it out (CC_Call::removeCallLeg)";
}

void KEEP_LONGEST(long long& longest, Age const& age)
{
    if (age.isKnown && age.turns == 0)
        longest = std::max(longest, age.nanoseconds);
}

std::string STALL(long long nanoseconds)
{
    return nanoseconds == 0 ? std::string()
                            : ", and the loop has begun no turn for " + CC_ExplanationEnd::DURATION(nanoseconds);
}

/// Of a call without a live leg.
std::string END_OF_DEAD(Call const& call)
{
    if (!call.hasCleanUp)
        return "no leg is live, but memory was out when the call was made: it ends when who made it destroys it";
    if (call.isCleanUpPending)
        return "no leg is live and the clean-up is pending: it ends in the loop's next turn" +
               CC_ExplanationEnd::STALL_OF(call);
    if (call.legs.empty())
        return "no leg has joined: it ends when who made it asks for the clean-up (CC_Call::defer) or releases it";
    return "no leg is live, but nobody has asked for the clean-up: it ends when somebody does (CC_Call::defer)";
}
} // namespace

std::string CC_ExplanationEnd::NAME_OF(CC_Explanation::Adapter const& adapter)
{
    std::string const text = "adapter `" + adapter.name + "`";
    return adapter.endpoint.empty() ? text : text + " of endpoint `" + adapter.endpoint + "`";
}

std::string CC_ExplanationEnd::DURATION(long long nanoseconds)
{
    std::array<char, 32> text;
    std::snprintf(text.data(), text.size(), "%.3f s", static_cast<double>(nanoseconds) / 1e9);
    return text.data();
}

std::string CC_ExplanationEnd::STALL_OF(Leg const& leg)
{
    long long longest = 0;
    KEEP_LONGEST(longest, leg.age);
    KEEP_LONGEST(longest, leg.inState);
    return STALL(longest);
}

std::string CC_ExplanationEnd::STALL_OF(Call const& call)
{
    long long longest = 0;
    KEEP_LONGEST(longest, call.age);
    KEEP_LONGEST(longest, call.inState);
    for (Leg const& leg : call.legs)
    {
        KEEP_LONGEST(longest, leg.age);
        KEEP_LONGEST(longest, leg.inState);
    }
    return STALL(longest);
}

void CC_ExplanationEnd::TELL(Leg& leg) { leg.end = END_OF(leg); }

void CC_ExplanationEnd::TELL(Call& call)
{
    for (Leg& leg : call.legs)
        TELL(leg);
    if (call.isReleased)
    {
        call.end = "the call was released: it ends when the " + NUMBER(call.holds, "hold", "holds") +
                   " on it (an operation under way, or somebody's CC_Call::Hold) let go";
        return;
    }
    for (Leg const& leg : call.legs)
        if (IS_LIVE(leg))
            call.end += (call.end.empty() ? "" : "; ") + leg.end;
    if (call.end.empty())
        call.end = END_OF_DEAD(call);
}
