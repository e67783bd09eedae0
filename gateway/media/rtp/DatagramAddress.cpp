#include "media/rtp/DatagramAddress.h"

#include <arpa/inet.h>

DatagramAddress::DatagramAddress(MediaAddress const& address) : version6()
{
    if (address.host.getVersion() == 6)
    {
        version6.sin6_family = AF_INET6;
        std::memcpy(&version6.sin6_addr, address.host.getOctets().data(), sizeof version6.sin6_addr);
        length = sizeof version6;
    }
    else
    {
        version4.sin_family = AF_INET;
        std::memcpy(&version4.sin_addr, address.host.getOctets().data(), sizeof version4.sin_addr);
        length = sizeof version4;
    }
    setPort(address.isSomewhere() ? address.port : 0);
}

MediaAddress DatagramAddress::get() const
{
    char text[INET6_ADDRSTRLEN] = "";
    if (any.sa_family == AF_INET6)
        inet_ntop(AF_INET6, &version6.sin6_addr, text, sizeof text);
    else
        inet_ntop(AF_INET, &version4.sin_addr, text, sizeof text);
    return MediaAddress::OF(text, getPort());
}
