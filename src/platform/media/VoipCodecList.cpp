#include "platform/media/VoipCodecList.h"

#include <algorithm>

XCode VoipCodecList::append(VoipCodec const& codec)
{
    if (codec.getCodec() == MG_Rtp::ECodec::NONE || contains(codec))
        return XCode::REFUSED;
    return m_codecs.append(codec);
}

bool VoipCodecList::contains(VoipCodec const& codec) const { return std::find(begin(), end(), codec) != end(); }

String& VoipCodecList::getShortInfo(String& out) const
{
    out.clear();
    String one;
    for (VoipCodec const& codec : m_codecs)
        out.concatf("%s%s", out.isEmpty() ? "" : ", ", codec.getShortInfo(one).c_str());
    return out;
}
