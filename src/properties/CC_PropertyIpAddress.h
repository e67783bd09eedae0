#pragma once

#include "platform/base/IpAddress.h"
#include "properties/CC_PropertyValue.h"

/// An internet address of a host or of a network; unspecified unless it is given. Text: what IpAddress reads, as far as
/// it names a host or a network.
///
///     CC_PropertyIpAddress peer(CC_PropertyId::IP_ADDRESS);
///     String error;
///     if (!peer.setValueString(error, "192.0.2.1").isOk())
///         ...
class CC_EXPORT CC_PropertyIpAddress : public CC_PropertyValue<CC_PropertyIpAddress, IpAddress>
{
public:
    static constexpr char const* TYPE_NAME = "IP-Address";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    String& getValueString(String& out) const override;
    XCode setValueString(String& error, String const& text) override;
};
