#include "media/context/MediaAddress.h"

MediaAddress MediaAddress::OF(std::string const& host, unsigned short port)
{
    MediaAddress made;
    if (made.host.setIpAddrAsString(String(host.c_str())).isOk() && !made.host.isNetType())
        made.port = port;
    return made;
}

std::string MediaAddress::text() const
{
    String buffer;
    std::string const address = host.getIpAddrAsString(buffer).c_str();
    return (host.getVersion() == 6 ? "[" + address + "]" : address) + ":" + std::to_string(port);
}
