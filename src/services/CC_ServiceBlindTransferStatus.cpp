#include "services/CC_ServiceBlindTransferStatus.h"

CC_ServiceBlindTransferStatus::CC_ServiceBlindTransferStatus(QCause cause) : m_cause(cause) {}

String CC_ServiceBlindTransferStatus::getInfo() const
{
    return BUILD([this] { return String().format("Blind transfer status (Cause: %s)", QCAUSE_NAME(m_cause)); });
}

InfoContainer& CC_ServiceBlindTransferStatus::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                                      unsigned int maxDetail, unsigned int detail,
                                                      String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Blind transfer status", String::s_empty);
    info.addWithin(maxLevel, level + 1, maxDetail, detail, String::s_empty, "Cause",
                   BUILD([this] { return String(QCAUSE_NAME(m_cause)); }, NO_MEMORY));
    return info;
}

unsigned int CC_ServiceBlindTransferStatus::TYPE()
{
    static unsigned int s_type = INVALID_TYPE();
    return KEEP_TYPE(s_type);
}
