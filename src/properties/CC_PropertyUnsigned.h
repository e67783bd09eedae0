#pragma once

#include "properties/CC_PropertyClass.h"

/// A number from 0 to 2^64 - 1. Not settable by text.
///
/// A class that derives from it may compute its value: comparisons ask both sides' `getValue`. Copying and assigning
/// copy the stored number.
///
///     leg.setProperty(CC_PropertyUnsigned(CC_PropertyId::HOPS, 5));
class CC_EXPORT CC_PropertyUnsigned : public CC_PropertyClass<CC_PropertyUnsigned>
{
public:
    static constexpr char const* TYPE_NAME = "Unsigned";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< 0
    CC_PropertyUnsigned(unsigned int id, unsigned long long value) : CC_PropertyClass(id), m_value(value) {}

    /// Replaces `out` by "0x" and at least eight lower-case hexadecimal digits.
    String& getValueString(String& out) const override;

    /// A derived class may compute the number, and do with one that is set what it likes. @{
    virtual unsigned long long getValue() const;
    virtual void setValue(unsigned long long value);
    /// @}

    bool hasSameValue(CC_PropertyUnsigned const& other) const { return getValue() == other.getValue(); }

private:
    unsigned long long m_value = 0;
};
