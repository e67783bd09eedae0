#pragma once

#include "properties/CC_PropertyValue.h"

/// A text: a number, a name, a header. Any text is taken as it is.
///
///     leg.setProperty(CC_PropertyString(CC_PropertyId::E164_NUMBER, "49891234"));
class CC_EXPORT CC_PropertyString : public CC_PropertyValue<CC_PropertyString, String>
{
public:
    static constexpr char const* TYPE_NAME = "String";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    String& getValueString(String& out) const override;
    /// OK; FAILURE only when memory is out.
    XCode setValueString(String& error, String const& text) override;

private:
    friend CC_PropertyClass<CC_PropertyString>;
    void takeWhole(CC_PropertyString const& other)
    {
        if (getValue() != other.getValue()) // comparing is cheaper than copying
            setValue(other.getValue());     // throws before it changes anything
        CC_Property::operator=(other);
    }
};
