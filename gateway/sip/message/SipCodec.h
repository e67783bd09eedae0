#pragma once

#include "platform/media/MG_Rtp.h"

#include <string_view>

/// The formats of session descriptions (RFC 8866, 6.6; RFC 3551) and the codecs that the library knows. A format is its
/// payload type and what "a=rtpmap" says of it ("opus/48000/2"), which is empty for one of the fixed payload types.
namespace SipCodec
{
/// NONE for a format that is no codec with a number.
MG_Rtp::ECodec::Type OF(std::string_view payloadType, std::string_view name);
/// Whether it is comfort noise or telephone events, which accompany a codec.
bool IS_COMPANION(std::string_view payloadType, std::string_view name);
} // namespace SipCodec
