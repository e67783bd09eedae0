#include "services/CC_ServiceBlindTransfer.h"

CC_ServiceBlindTransfer::CC_ServiceBlindTransfer(String const& code, String const& number)
    : m_code(code), m_number(number)
{
}

String CC_ServiceBlindTransfer::getInfo() const
{
    return BUILD([this]
                 { return String().format("Blind transfer (Code: %s Number: %s)", m_code.c_str(), m_number.c_str()); });
}

InfoContainer& CC_ServiceBlindTransfer::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                                unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Blind transfer", String::s_empty);
    info.addWithin(maxLevel, level + 1, maxDetail, detail, String::s_empty, "Code", m_code);
    info.addWithin(maxLevel, level + 1, maxDetail, detail, String::s_empty, "Number", m_number);
    return info;
}

unsigned int CC_ServiceBlindTransfer::TYPE()
{
    static unsigned int s_type = INVALID_TYPE();
    return KEEP_TYPE(s_type);
}
