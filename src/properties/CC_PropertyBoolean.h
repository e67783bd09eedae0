#pragma once

#include "properties/CC_PropertyValue.h"

/// A yes or no. Text: exactly "true" or "false".
///
///     leg.setProperty(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
class CC_EXPORT CC_PropertyBoolean : public CC_PropertyValue<CC_PropertyBoolean, bool>
{
public:
    static constexpr char const* TYPE_NAME = "Boolean";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;
    /// A pointer, "true" among them, would silently count as true.
    template <class T>
    CC_PropertyBoolean(unsigned int id, T* pointer) = delete;

    String& getValueString(String& out) const override;
    XCode setValueString(String& error, String const& text) override;
};
