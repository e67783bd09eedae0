#include "configuration/SocketAddress.h"

#include "configuration/AddressRange.h"
#include "platform/base/IpAddress.h"

#include <charconv>
#include <stdexcept>
#include <system_error>

namespace
{
bool IS_ADDRESS(std::string const& host, bool isVersion6)
{
    IpAddress address;
    if (!address.setIpAddrAsString(host.c_str()).isOk() || address.isNetType())
        return false;
    return isVersion6 == (address.getVersion() == 6);
}
} // namespace

bool SocketAddress::isUnspecified() const
{
    return AddressRange::PARSE("0.0.0.0").contains(AddressRange::PARSE(host).getFirst()) ||
           AddressRange::PARSE("::").contains(AddressRange::PARSE(host).getFirst());
}

bool SocketAddress::isMulticast() const
{
    return AddressRange::PARSE("224.0.0.0/4").contains(AddressRange::PARSE(host).getFirst()) ||
           AddressRange::PARSE("ff00::/8").contains(AddressRange::PARSE(host).getFirst());
}

bool SocketAddress::isName() const
{
    return !isVersion6() && host.find_first_not_of("0123456789.") != std::string::npos;
}

std::string SocketAddress::text() const
{
    return (isVersion6() ? "[" + host + "]" : host) + (port != 0 ? ":" + std::to_string(port) : std::string());
}

SocketAddress SocketAddress::PARSE_NAMED(std::string const& text)
{
    constexpr char const* OF_NAMES = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789-.";
    SocketAddress result;
    result.host = text.substr(0, text.rfind(':'));
    bool const isName = result.isName() && result.host.find_first_not_of(OF_NAMES) == std::string::npos &&
                        result.host.front() != '.' && result.host.front() != '-';
    if (!isName)
        return PARSE(text);
    if (result.host.size() != text.size())
        result.port = PARSE("192.0.2.1" + text.substr(result.host.size())).port;
    return result;
}

SocketAddress SocketAddress::PARSE(std::string const& text)
{
    std::size_t const colon = text.rfind(':');
    if (colon == std::string::npos)
        throw std::invalid_argument("expected an address and a port, as in \"192.0.2.1:5060\"");
    SocketAddress result;
    result.host = text.substr(0, colon);
    bool const isBracketed = result.host.size() > 2 && result.host.front() == '[' && result.host.back() == ']';
    if (isBracketed)
        result.host = result.host.substr(1, result.host.size() - 2);
    if (!IS_ADDRESS(result.host, isBracketed))
        throw std::invalid_argument("'" + text.substr(0, colon) + "' is not an address");
    char const* const begin = text.data() + colon + 1;
    char const* const end = text.data() + text.size();
    auto const [stop, error] = std::from_chars(begin, end, result.port);
    if (error != std::errc() || stop != end || result.port == 0)
        throw std::invalid_argument("'" + text.substr(colon + 1) + "' is not a port");
    return result;
}
