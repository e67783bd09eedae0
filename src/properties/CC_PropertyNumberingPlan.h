#pragma once

#include "platform/signalling/QNumberingPlan.h"
#include "properties/CC_PropertyValue.h"

/// The plan that a number belongs to, as Q.931 says it. Not settable by text.
///
///     leg.setProperty(CC_PropertyNumberingPlan(CC_PropertyId::NUMBERING_PLAN, QNumberingPlan::ISDN));
class CC_EXPORT CC_PropertyNumberingPlan : public CC_PropertyValue<CC_PropertyNumberingPlan, QNumberingPlan>
{
public:
    static constexpr char const* TYPE_NAME = "Numbering-Plan";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    /// Replaces `out` by the value's name in Q.931, ERROR::INVALID for a value without one.
    String& getValueString(String& out) const override;
};
