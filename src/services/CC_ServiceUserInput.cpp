#include "services/CC_ServiceUserInput.h"

CC_ServiceUserInput::CC_ServiceUserInput(String const& input, unsigned int duration)
    : m_input(input), m_duration(duration)
{
}

String CC_ServiceUserInput::getInfo() const
{
    return BUILD(
        [this]
        {
            String const duration = m_duration != 0 ? String::stringOf(m_duration) : "Unknown";
            return String().format("User Input: %s (Duration: %s)", m_input.c_str(), duration.c_str());
        });
}

InfoContainer& CC_ServiceUserInput::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                            unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "User Input", m_input);
    info.addWithin(maxLevel, level + 1, maxDetail, detail, String::s_empty, "Duration",
                   BUILD([this] { return String().format("%ums", m_duration); }, NO_MEMORY));
    return info;
}

unsigned int CC_ServiceUserInput::TYPE()
{
    static unsigned int s_type = INVALID_TYPE();
    return KEEP_TYPE(s_type);
}
