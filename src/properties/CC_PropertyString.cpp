#include "properties/CC_PropertyString.h"

#include <new>

CC_PropertyString::TypeId CC_PropertyString::s_typeId;

String& CC_PropertyString::getValueString(String& out) const { return out = getValue(); }

XCode CC_PropertyString::setValueString(String& error, String const& text)
{
    try
    {
        setValue(text);
        return XCode::OK;
    }
    catch (std::bad_alloc const&)
    {
        return REFUSE(error, "Out of memory");
    }
}
