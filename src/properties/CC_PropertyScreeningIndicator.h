#pragma once

#include "platform/signalling/QScreeningIndicator.h"
#include "properties/CC_PropertyValue.h"

/// Who gave a number and whether the network has checked it, as Q.931 says it. Not settable by text.
///
///     adapter.setOwn(Key::SCREENING_INDICATOR, QScreeningIndicator::NETWORK_PROVIDED);
class CC_EXPORT CC_PropertyScreeningIndicator
    : public CC_PropertyValue<CC_PropertyScreeningIndicator, QScreeningIndicator>
{
public:
    static constexpr char const* TYPE_NAME = "Screening-Indicator";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    /// Replaces `out` by the value's name in Q.931, ERROR::INVALID for a value without one.
    String& getValueString(String& out) const override;
};
