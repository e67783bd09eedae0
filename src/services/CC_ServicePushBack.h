#pragma once

#include "services/CC_ServiceClass.h"

/// Asks one leg of an internal loop, whose both ends are on the same network, to step back and let that network connect
/// the parties itself.
///
///     CC_ServicePushBack pushBack(callLegId);
///     leg.invokeSynchronousService(pushBack);
class CC_EXPORT CC_ServicePushBack : public CC_ServiceClass<CC_ServicePushBack>
{
public:
    /// `callLegId`: the Call-Leg-ID property of the leg that is asked.
    explicit CC_ServicePushBack(unsigned long long callLegId);

    String getInfo() const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// The Call-Leg-ID property of the leg that is asked.
    unsigned long long getCallLegId() const { return m_callLegId; }

    static unsigned int TYPE();

private:
    unsigned long long m_callLegId;
};
