// What an explanation reads as, for operators and for programs.
#include "calls/CC_Call.h"
#include "diagnosis/CC_Explanation.h"
#include "diagnosis/CC_ExplanationEnd.h"
#include "diagnosis/CC_JsonLine.h"
#include "diagnosis/SafeText.h"
#include "properties/CC_PropertyCallLegState.h"

#include <array>
#include <cstdio>
#include <new>

namespace
{
using Age = CC_Explanation::Age;
using Call = CC_Explanation::Call;
using Holder = CC_Explanation::Holder;
using Leg = CC_Explanation::Leg;
using Observer = CC_Explanation::Observer;

char const* STATE_OF(Leg const& leg)
{
    return CC_PropertyCallLegState::STATE_NAME(static_cast<CC_PropertyCallLegState::State>(leg.state));
}
char const* STATE_OF(Call const& call) { return CC_Call::STATE_NAME(static_cast<CC_Call::State>(call.state)); }

std::string ADDRESS(void const* address)
{
    std::array<char, 32> text;
    std::snprintf(text.data(), text.size(), "%p", address);
    return text.data();
}

std::string SPAN(Age const& age)
{
    return age.isKnown ? CC_ExplanationEnd::DURATION(age.nanoseconds) : "an unknown time";
}

template <class Object>
std::string SUMMARY_OF(Object const& object)
{
    return std::to_string(object.serial) + " (" + object.name + "): " + STATE_OF(object) + " for " +
           SPAN(object.inState) + ", made " + SPAN(object.age) + " ago";
}

/// Adds the lines of one dump; what memory refuses makes the dump incomplete.
class Dump
{
public:
    Dump(InfoContainer& info, unsigned int maxLevel, unsigned int maxDetail)
        : m_info(info), m_maxLevel(maxLevel), m_maxDetail(maxDetail)
    {
    }
    void add(unsigned int level, unsigned int detail, std::string const& key, std::string const& text)
    {
        if (level <= m_maxLevel && detail <= m_maxDetail)
            m_info.add(level, detail, String(std::string_view(key)), String(std::string_view(SAFE_TEXT(text))));
    }
    void add(unsigned int level, unsigned int detail, char const* key, std::vector<Observer> const& observers)
    {
        for (Observer const& observer : observers)
            add(level, detail, key, CC_Explanation::TEXT_OF(observer));
    }
    void add(unsigned int level, unsigned int detail, std::string const& key, Leg const& leg)
    {
        add(level, detail, key, SUMMARY_OF(leg));
        if (!leg.viewedState.empty())
            add(level + 1, detail, "State in its module's view", leg.viewedState);
        for (Holder const& holder : leg.holders)
        {
            bool const isVague = holder.kind == Holder::NOBODY_KNOWN && leg.isBusy;
            add(level + 1, detail, "Held by",
                CC_Explanation::TEXT_OF(holder) + (isVague ? ", operations under way among them" : ""));
        }
        add(level + 1, detail + 1, "Observed by", leg.observers);
    }
    void add(unsigned int level, unsigned int detail, std::string const& key, Call const& call)
    {
        add(level, detail, key, SUMMARY_OF(call));
        add(level + 1, detail, "End", call.end);
        if (call.isCleanUpPending)
            add(level + 1, detail, "Pending", "clean-up, in the loop's next turn" + CC_ExplanationEnd::STALL_OF(call));
        if (!call.hasPool)
            add(level + 1, detail, "Pool", "none: it has never had one, or its context has ended");
        if (call.holds != 0)
            add(level + 1, detail, "Operations under way, or a CC_Call::Hold", std::to_string(call.holds));
        for (Leg const& leg : call.legs)
            add(level + 1, detail, "Call Leg", leg);
        add(level + 1, detail + 1, "Observed by", call.observers);
        add(level + 1, detail + 1, "Legs observed by", call.legObservers);
    }

private:
    InfoContainer& m_info;
    unsigned int m_maxLevel;
    unsigned int m_maxDetail;
};

// --- JSON ------------------------------------------------------------------------------------------------------------

std::string JSON(bool value) { return value ? "true" : "false"; }
std::string JSON(Age const& age) { return age.isKnown ? std::to_string(age.nanoseconds) : "null"; }

std::string JSON(Holder const& holder);
std::string JSON(Observer const& observer);
std::string JSON(Leg const& leg);

template <class Element>
std::string JSON(std::vector<Element> const& elements)
{
    std::string text = "[";
    for (Element const& element : elements)
        (text += text.size() > 1 ? "," : "") += JSON(element);
    return text + "]";
}

void ADD_ADAPTER(CC_JsonLine& line, CC_Explanation::Adapter const& adapter)
{
    line.add("adapter", adapter.name);
    if (!adapter.endpoint.empty())
        line.add("endpoint", adapter.endpoint);
}

std::string JSON(Holder const& holder)
{
    static constexpr std::string_view KINDS[] = {"call", "own adapter", "peer adapter", "move", "nobody known"};
    CC_JsonLine line;
    line.add("kind", KINDS[holder.kind]).addJson("references", std::to_string(holder.references));
    if (holder.kind == Holder::CALL)
        line.add("call", holder.call);
    if (holder.kind == Holder::OWN_ADAPTER || holder.kind == Holder::PEER_ADAPTER)
    {
        ADD_ADAPTER(line, holder.adapter);
        line.add("untold", holder.untold);
    }
    return line.get();
}

std::string JSON(Observer const& observer)
{
    static constexpr std::string_view KINDS[] = {"call", "adapter", "foreign"};
    CC_JsonLine line;
    line.add("kind", KINDS[observer.kind]).addJson("registrations", std::to_string(observer.registrations));
    line.addJson("surplus", std::to_string(observer.surplus));
    if (observer.kind == Observer::CALL)
        line.add("call", observer.call);
    if (observer.kind == Observer::ADAPTER)
        ADD_ADAPTER(line, observer.adapter);
    return line.add("address", ADDRESS(observer.address)).get();
}

std::string JSON(Leg const& leg)
{
    CC_JsonLine line;
    line.add("leg", leg.serial).add("name", leg.name).add("state", STATE_OF(leg));
    line.addJson("age", JSON(leg.age)).addJson("inState", JSON(leg.inState));
    line.addJson("references", std::to_string(leg.references)).addJson("holders", JSON(leg.holders));
    line.addJson("observers", JSON(leg.observers));
    line.addJson("isMoving", JSON(leg.isMoving)).addJson("isBusy", JSON(leg.isBusy));
    if (!leg.viewedState.empty())
        line.add("viewedState", leg.viewedState);
    return line.add("end", leg.end).get();
}

std::string JSON(Call const& call)
{
    CC_JsonLine line;
    line.add("call", call.serial).add("name", call.name).add("state", STATE_OF(call));
    line.addJson("age", JSON(call.age)).addJson("inState", JSON(call.inState));
    line.addJson("hasPool", JSON(call.hasPool)).addJson("isReleased", JSON(call.isReleased));
    line.addJson("isCleanUpPending", JSON(call.isCleanUpPending)).add("holds", call.holds);
    line.addJson("legs", JSON(call.legs)).addJson("observers", JSON(call.observers));
    return line.addJson("legObservers", JSON(call.legObservers)).add("end", call.end).get();
}
} // namespace

InfoContainer& CC_Explanation::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                       unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    try
    {
        std::string const heading(prefix.view());
        Dump dump(info, maxLevel, maxDetail);
        for (Call const& call : m_calls)
            dump.add(level, detail, heading + "Call", call);
        for (Leg const& leg : m_legs)
        {
            dump.add(level, detail, heading + "Call Leg", leg);
            dump.add(level + 1, detail, "End", leg.end);
        }
    }
    catch (std::bad_alloc const&)
    {
        info.markIncomplete();
    }
    return info;
}

CC_Explanation::Lines CC_Explanation::getJson() const
{
    Lines lines;
    for (Call const& call : m_calls)
        lines.push_back(JSON(call));
    for (Leg const& leg : m_legs)
        lines.push_back(JSON(leg));
    return lines;
}

std::string CC_Explanation::TEXT_OF(Holder const& holder)
{
    std::string const untold =
        holder.untold != 0 ? ", its module still to be told of " + std::to_string(holder.untold) : std::string();
    switch (holder.kind)
    {
    case Holder::CALL:
        return "call " + std::to_string(holder.call);
    case Holder::OWN_ADAPTER:
        return CC_ExplanationEnd::NAME_OF(holder.adapter) + " (own)" + untold;
    case Holder::PEER_ADAPTER:
        return CC_ExplanationEnd::NAME_OF(holder.adapter) + " (peer)" + untold;
    case Holder::MOVE:
        return "the move between calls that is under way";
    case Holder::NOBODY_KNOWN:
        break;
    }
    return "nobody known: " + std::to_string(holder.references);
}

std::string CC_Explanation::TEXT_OF(Observer const& observer)
{
    std::string text = observer.kind == Observer::CALL ? "call " + std::to_string(observer.call)
                       : observer.kind == Observer::ADAPTER
                           ? CC_ExplanationEnd::NAME_OF(observer.adapter)
                           : "an observer at " + ADDRESS(observer.address) + ", not one of call control's";
    if (observer.registrations < 0)
        return text + ", removed more often than added (" + std::to_string(observer.registrations) +
               ") and so still told";
    if (observer.kind == Observer::FOREIGN)
        return observer.registrations == 1 ? text : text + ", " + std::to_string(observer.registrations) + " times";
    if (observer.surplus > 0)
        text += ", " + std::to_string(observer.surplus) + " registered by somebody else";
    return text;
}
