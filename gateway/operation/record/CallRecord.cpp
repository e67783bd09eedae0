#include "operation/record/CallRecord.h"

#include <algorithm>

namespace
{
template <class Is>
CallRecord::Leg const* FIND(std::vector<CallRecord::Leg> const& legs, Is&& is)
{
    auto const found = std::find_if(legs.begin(), legs.end(), is);
    return found != legs.end() ? &*found : nullptr;
}
} // namespace

CallRecord::Leg const* CallRecord::getCaller() const
{
    return FIND(legs, [](Leg const& leg) { return leg.isCalling; });
}

CallRecord::Leg const* CallRecord::getCalled() const
{
    return FIND(legs, [](Leg const& leg) { return !leg.isCalling; });
}

CallRecord::Leg const* CallRecord::getClearing() const
{
    return FIND(legs, [this](Leg const& leg) { return leg.serial == clearedBy; });
}
