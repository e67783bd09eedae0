#include "services/CC_ServiceConferenceRefer.h"

CC_ServiceConferenceRefer::CC_ServiceConferenceRefer(String const& referTo) : m_referTo(referTo) {}

String CC_ServiceConferenceRefer::getInfo() const
{
    return BUILD([this] { return String().format("Conference refer: %s", m_referTo.c_str()); });
}

InfoContainer& CC_ServiceConferenceRefer::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                                  unsigned int maxDetail, unsigned int detail,
                                                  String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Conference refer", String::s_empty);
    info.addWithin(maxLevel, level + 1, maxDetail, detail, String::s_empty, "Refer-to", m_referTo);
    return info;
}

unsigned int CC_ServiceConferenceRefer::TYPE()
{
    static unsigned int s_type = INVALID_TYPE();
    return KEEP_TYPE(s_type);
}
