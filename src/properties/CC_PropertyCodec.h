#pragma once

#include "platform/media/VoipCodecAndMode.h"
#include "properties/CC_PropertyValue.h"

/// The codec in use, and in which direction sound flows. Not settable by text.
///
///     VoipCodecAndMode const codec(VoipCodec(MG_Rtp::ECodec::PCMA, 20));
///     leg.setProperty(CC_PropertyCodec(CC_PropertyId::CURRENT_CODEC, codec));
class CC_EXPORT CC_PropertyCodec : public CC_PropertyValue<CC_PropertyCodec, VoipCodecAndMode>
{
public:
    static constexpr char const* TYPE_NAME = "Codec";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue; ///< no codec, unless one is given

    String& getValueString(String& out) const override;
};
