#pragma once

#include "platform/signalling/QTypeOfNumber.h"
#include "properties/CC_PropertyValue.h"

/// What a number begins with, as Q.931 says it: international, national, subscriber. Not settable by text.
///
///     leg.setProperty(CC_PropertyTypeOfNumber(CC_PropertyId::TYPE_OF_NUMBER, QTypeOfNumber::INTERNATIONAL));
class CC_EXPORT CC_PropertyTypeOfNumber : public CC_PropertyValue<CC_PropertyTypeOfNumber, QTypeOfNumber>
{
public:
    static constexpr char const* TYPE_NAME = "Type-Of-Number";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    /// Replaces `out` by the value's name in Q.931, ERROR::INVALID for a value without one.
    String& getValueString(String& out) const override;
};
