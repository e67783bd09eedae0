#include "sip/endpoint/SipServiceDialog.h"

InfoContainer& SipServiceDialog::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                         unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Dialog", String());
    return info;
}

unsigned int SipServiceDialog::TYPE()
{
    static unsigned int s_type = INVALID_TYPE();
    return KEEP_TYPE(s_type);
}
