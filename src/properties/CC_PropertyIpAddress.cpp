#include "properties/CC_PropertyIpAddress.h"

CC_PropertyIpAddress::TypeId CC_PropertyIpAddress::s_typeId;

String& CC_PropertyIpAddress::getValueString(String& out) const { return getValue().getIpAddrAsString(out); }

XCode CC_PropertyIpAddress::setValueString(String& error, String const& text)
{
    IpAddress address;
    if (!address.setIpAddrAsString(text).isOk())
        return REFUSE(error, "Invalid IP-Address");
    if (!address.isHostType() && !address.isNetType())
        return REFUSE(error, "Invalid host or network address");
    setValue(address);
    return XCode::OK;
}
