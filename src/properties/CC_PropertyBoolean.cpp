#include "properties/CC_PropertyBoolean.h"

CC_PropertyBoolean::TypeId CC_PropertyBoolean::s_typeId;

String& CC_PropertyBoolean::getValueString(String& out) const { return out = String::stringOf(getValue()); }

XCode CC_PropertyBoolean::setValueString(String& error, String const& text)
{
    for (bool const value : {false, true})
        if (text == TRUE_FALSE(value))
        {
            setValue(value);
            return XCode::OK;
        }
    return REFUSE(error, "Invalid boolean value, expecting 'true' or 'false'");
}
