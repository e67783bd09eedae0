#include "platform/media/VoipCodec.h"

String& VoipCodec::getShortInfo(String& out) const
{
    out.clear();
    if (getCodec() == MG_Rtp::ECodec::NONE)
        return out;
    out += MG_Rtp::ECodec::NAME(getCodec());
    return getPacketPeriod() == 0 ? out : out.concatf(" %ums", getPacketPeriod());
}
