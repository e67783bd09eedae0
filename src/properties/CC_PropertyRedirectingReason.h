#pragma once

#include "platform/signalling/QReasonForRedirection.h"
#include "properties/CC_PropertyValue.h"

/// Why a call was redirected, as Q.931 says it. Not settable by text.
///
///     adapter.setOwn(Key::REDIRECTING_REASON, QReasonForRedirection::FORWARDING_BUSY);
class CC_EXPORT CC_PropertyRedirectingReason
    : public CC_PropertyValue<CC_PropertyRedirectingReason, QReasonForRedirection>
{
public:
    static constexpr char const* TYPE_NAME = "Redirecting-Reason";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    /// Replaces `out` by the value's name in Q.931, ERROR::INVALID for a value without one.
    String& getValueString(String& out) const override;
};
