#pragma once

#include "platform/signalling/QInformationTransferCapability.h"
#include "properties/CC_PropertyValue.h"

/// What the bearer of a call has to carry, as Q.931 says it: speech, 3.1 kHz audio, data. Not settable by text.
///
///     adapter.setOwn(Key::INFORMATION_TRANSFER_CAPABILITY, QInformationTransferCapability::SPEECH);
class CC_EXPORT CC_PropertyInformationTransferCapability
    : public CC_PropertyValue<CC_PropertyInformationTransferCapability, QInformationTransferCapability>
{
public:
    static constexpr char const* TYPE_NAME = "Information-Transfer-Capability";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    /// Replaces `out` by the value's name in Q.931, ERROR::INVALID for a value without one.
    String& getValueString(String& out) const override;
};
