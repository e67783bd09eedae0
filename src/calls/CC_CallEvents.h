#pragma once

#include "calls/CC_Event.h"
#include "properties/CC_Flags.h"

#include <utility>

/// The call ends: nothing more is told about it. Sent by the call's destructor.
class CC_EXPORT CC_EvCallObservationEnded : public CC_EventClass<CC_EvCallObservationEnded, CC_Call>
{
public:
    static constexpr char const* CLASS_NAME = "CC_EvCallObservationEnded";
    /// Made by the call's destructor.
    explicit CC_EvCallObservationEnded(CC_Call& call) : CC_EventClass(call) {}
    ~CC_EvCallObservationEnded() override;
};

/// A leg joined the call (`onCallCallLegAdded`) or left it (`onCallCallLegRemoved`).
class CC_EXPORT CC_EvCallCallLegModified : public CC_EventClass<CC_EvCallCallLegModified, CC_Call>
{
public:
    static constexpr char const* CLASS_NAME = "CC_EvCallCallLegModified";
    /// The leg that joined or left.
    CC_EvCallCallLegModified(CC_Call& call, CC_CallLeg& leg) : CC_EventClass(call), m_callLeg(&leg) {}
    ~CC_EvCallCallLegModified() override;

    /// Lent for the delivery.
    CC_CallLeg* getCallLeg() const { return m_callLeg; }

private:
    CC_CallLeg* m_callLeg;
};

/// Properties of the call changed. The flags hold their ids and may be empty: setting several properties always tells.
class CC_EXPORT CC_EvCallPropertyChanged : public CC_EventClass<CC_EvCallPropertyChanged, CC_Call>
{
public:
    static constexpr char const* CLASS_NAME = "CC_EvCallPropertyChanged";
    /// `flags`: the ids, copied, which may need memory.
    CC_EvCallPropertyChanged(CC_Call& call, CC_Flags const& flags) : CC_EventClass(call), m_flags(flags) {}
    /// Takes the flags over, which needs no memory.
    CC_EvCallPropertyChanged(CC_Call& call, CC_Flags&& flags) : CC_EventClass(call), m_flags(std::move(flags)) {}
    ~CC_EvCallPropertyChanged() override;

    /// The ids of the properties that changed.
    CC_Flags const& getFlags() const { return m_flags; }

private:
    CC_Flags m_flags;
};
