#include "services/CC_ServicePushBack.h"

CC_ServicePushBack::CC_ServicePushBack(unsigned long long callLegId) : m_callLegId(callLegId) {}

String CC_ServicePushBack::getInfo() const
{
    return BUILD([this] { return String().format("Push Back: %llu", m_callLegId); });
}

InfoContainer& CC_ServicePushBack::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                           unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Push Back",
                   BUILD([this] { return String().format("%llu", m_callLegId); }, NO_MEMORY));
    return info;
}

unsigned int CC_ServicePushBack::TYPE()
{
    static unsigned int s_type = INVALID_TYPE();
    return KEEP_TYPE(s_type);
}
