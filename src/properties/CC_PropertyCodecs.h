#pragma once

#include "platform/media/VoipCodecListSet.h"
#include "properties/CC_PropertyValue.h"

/// Every codec that a side supports. Not settable by text.
///
///     leg.setProperty(CC_PropertyCodecs(CC_PropertyId::SUPPORTED_CODECS, supported));
class CC_EXPORT CC_PropertyCodecs : public CC_PropertyValue<CC_PropertyCodecs, VoipCodecListSet>
{
public:
    static constexpr char const* TYPE_NAME = "Codecs";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue; ///< none, unless some are given

    String& getValueString(String& out) const override;
};
