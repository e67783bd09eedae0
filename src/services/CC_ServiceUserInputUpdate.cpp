#include "services/CC_ServiceUserInputUpdate.h"

#include "services/CC_ServiceUserInput.h"

CC_ServiceUserInputUpdate::CC_ServiceUserInputUpdate(unsigned int duration) : m_duration(duration) {}

unsigned int CC_ServiceUserInputUpdate::type() const { return CC_ServiceUserInput::TYPE(); }

String CC_ServiceUserInputUpdate::getInfo() const
{
    return BUILD(
        [this]
        {
            String const duration = m_duration != 0 ? String::stringOf(m_duration) : "Unknown";
            return String().format("User Input Update (Duration: %s)", duration.c_str());
        });
}

InfoContainer& CC_ServiceUserInputUpdate::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                                  unsigned int maxDetail, unsigned int detail,
                                                  String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "User Input Update", String::s_empty);
    info.addWithin(maxLevel, level + 1, maxDetail, detail, String::s_empty, "Duration",
                   BUILD([this] { return String().format("%ums", m_duration); }, NO_MEMORY));
    return info;
}

unsigned int CC_ServiceUserInputUpdate::TYPE()
{
    static unsigned int s_type = INVALID_TYPE();
    return KEEP_TYPE(s_type);
}
