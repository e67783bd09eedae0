#pragma once

#include "properties/CC_PropertyClass.h"

/// What a call is for: a conversation, or the delivery of a message. Not settable by text.
///
///     leg.setProperty(CC_PropertyCallType(CC_PropertyId::CALL_TYPE, CC_PropertyCallType::MESSAGE));
class CC_EXPORT CC_PropertyCallType : public CC_PropertyClass<CC_PropertyCallType>
{
public:
    /// The numbers are the system's own.
    enum _eCallType : int
    {
        NORMAL = 0,
        MESSAGE = 1
    };

    static constexpr char const* TYPE_NAME = "CallType";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< normal
    CC_PropertyCallType(unsigned int id, _eCallType value) : CC_PropertyClass(id), m_value(value) {}

    /// Replaces `out` by CALL_TYPE_NAME.
    String& getValueString(String& out) const override;

    /// A number that is none of them is kept as it is. @{
    _eCallType getValue() const { return m_value; }
    void setValue(_eCallType value) { m_value = value; }
    /// @}
    bool hasSameValue(CC_PropertyCallType const& other) const { return m_value == other.m_value; }

    /// "normal", "message"; "invalid" for any other number.
    static char const* CALL_TYPE_NAME(_eCallType value);

private:
    _eCallType m_value = NORMAL;
};
