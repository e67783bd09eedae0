#pragma once

#include "calls/CC_Event.h"
#include "properties/CC_Flags.h"

#include <utility>

class CC_Service;

/// The leg ends: nothing more is told about it. Sent by the leg's destructor.
class CC_EXPORT CC_EvCallLegObservationEnded : public CC_EventClass<CC_EvCallLegObservationEnded, CC_CallLeg>
{
public:
    static constexpr char const* CLASS_NAME = "CC_EvCallLegObservationEnded";
    /// Made by the leg's destructor.
    explicit CC_EvCallLegObservationEnded(CC_CallLeg& leg) : CC_EventClass(leg) {}
    ~CC_EvCallLegObservationEnded() override;
};

/// The leg went from one call to another; either may be null.
class CC_EXPORT CC_EvCallLegCallRelinked : public CC_EventClass<CC_EvCallLegCallRelinked, CC_CallLeg>
{
public:
    static constexpr char const* CLASS_NAME = "CC_EvCallLegCallRelinked";
    /// `newCall` null: the leg is in none any more; `oldCall` null: it was in none.
    CC_EvCallLegCallRelinked(CC_CallLeg& leg, CC_Call* newCall, CC_Call* oldCall)
        : CC_EventClass(leg), m_newCall(newCall), m_oldCall(oldCall)
    {
    }
    ~CC_EvCallLegCallRelinked() override;

    /// As given: null for none. @{
    CC_Call* getNewCall() const { return m_newCall; }
    CC_Call* getOldCall() const { return m_oldCall; }
    /// @}

private:
    CC_Call* m_newCall;
    CC_Call* m_oldCall;
};

/// Properties of the leg changed. The flags hold their ids and may be empty: setting several properties always tells.
class CC_EXPORT CC_EvCallLegPropertyChanged : public CC_EventClass<CC_EvCallLegPropertyChanged, CC_CallLeg>
{
public:
    static constexpr char const* CLASS_NAME = "CC_EvCallLegPropertyChanged";
    /// `flags`: the ids, copied, which may need memory.
    CC_EvCallLegPropertyChanged(CC_CallLeg& leg, CC_Flags const& flags) : CC_EventClass(leg), m_flags(flags) {}
    /// Takes the flags over, which needs no memory.
    CC_EvCallLegPropertyChanged(CC_CallLeg& leg, CC_Flags&& flags) : CC_EventClass(leg), m_flags(std::move(flags)) {}
    ~CC_EvCallLegPropertyChanged() override;

    /// The ids of the properties that changed.
    CC_Flags const& getFlags() const { return m_flags; }

private:
    CC_Flags m_flags;
};

/// Somebody asks a service of the leg. Answers go through the service object, which lives for this delivery only.
class CC_EXPORT CC_EvCallLegSynchronousService : public CC_EventClass<CC_EvCallLegSynchronousService, CC_CallLeg>
{
public:
    static constexpr char const* CLASS_NAME = "CC_EvCallLegSynchronousService";
    /// `service` is lent for the delivery.
    CC_EvCallLegSynchronousService(CC_CallLeg& leg, CC_Service& service) : CC_EventClass(leg), m_service(&service) {}
    ~CC_EvCallLegSynchronousService() override;

    /// The request, to be answered through; never null.
    CC_Service* getService() const { return m_service; }

private:
    CC_Service* m_service;
};
