#pragma once

#include "platform/signalling/QPresentationIndicator.h"
#include "properties/CC_PropertyValue.h"

/// Whether a number may be shown to the other party, as Q.931 says it. Not settable by text.
///
///     adapter.setOwn(Key::PRESENTATION_INDICATOR, QPresentationIndicator::RESTRICTED);
class CC_EXPORT CC_PropertyPresentationIndicator
    : public CC_PropertyValue<CC_PropertyPresentationIndicator, QPresentationIndicator>
{
public:
    static constexpr char const* TYPE_NAME = "Presentation-Indicator";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    /// Replaces `out` by the value's name in Q.931, ERROR::INVALID for a value without one.
    String& getValueString(String& out) const override;
};
