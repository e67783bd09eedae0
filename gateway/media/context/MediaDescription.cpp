#include "media/context/MediaDescription.h"

#include <algorithm>

bool MediaFormats::add(MediaFormat const& format)
{
    if (m_size == MOST || format.codec.getCodec() == MG_Rtp::ECodec::NONE || !format.types.isAgreed())
        return false;
    m_formats[m_size++] = format;
    return true;
}

MediaFormat const* MediaFormats::find(MG_Rtp::ECodec::Type codec) const
{
    MediaFormat const* const found =
        std::find_if(begin(), end(), [codec](MediaFormat const& format) { return format.codec.getCodec() == codec; });
    return found == end() ? nullptr : found;
}
