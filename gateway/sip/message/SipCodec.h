#pragma once

#include "platform/media/MG_Rtp.h"

#include <string>
#include <string_view>

/// The formats of session descriptions (RFC 8866, 6.6; RFC 3551) and the codecs that the library knows. A format is its
/// payload type and what "a=rtpmap" says of it ("opus/48000/2"), which is empty for one of the fixed payload types.
namespace SipCodec
{
/// NONE for a format that is no codec with a number.
MG_Rtp::ECodec::Type OF(std::string_view payloadType, std::string_view name);
/// Whether it is comfort noise or telephone events, which accompany a codec.
bool IS_COMPANION(std::string_view payloadType, std::string_view name);
/// What "a=rtpmap" says of a codec: "PCMA/8000".
std::string ENCODING(MG_Rtp::ECodec::Type codec);
/// The codec that a person means by that name, whatever the case of its letters: "PCMA", "opus"; "L16" in one channel.
/// NONE for a name that none has.
MG_Rtp::ECodec::Type NAMED(std::string_view name);
} // namespace SipCodec
