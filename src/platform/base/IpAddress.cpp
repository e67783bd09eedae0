#include "platform/base/IpAddress.h"

#include <algorithm>
#include <arpa/inet.h>
#include <charconv>
#include <string_view>

namespace
{
/// A prefix length as people write it: decimal digits without a needless zero, at most `maximum`; -1 for anything else.
int PREFIX_LENGTH_OF(std::string_view text, unsigned int maximum)
{
    unsigned int value = 0;
    char const* const end = text.data() + text.size();
    auto const [stop, error] = std::from_chars(text.data(), end, value); // takes neither blanks nor signs
    bool const isPadded = text.size() > 1 && text.front() == '0';
    return error == std::errc() && stop == end && !isPadded && value <= maximum ? static_cast<int>(value) : -1;
}
} // namespace

bool IpAddress::isHostType() const
{
    return !isNetType() &&
           std::any_of(m_octets.begin(), m_octets.end(), [](unsigned char octet) { return octet != 0; });
}

unsigned int IpAddress::getPrefixLength() const
{
    return isNetType() ? static_cast<unsigned int>(m_prefixLength) : getNumberOfBits();
}

bool IpAddress::hasBitsBehindPrefix() const
{
    for (unsigned int bit = getPrefixLength(); bit < getNumberOfBits(); ++bit)
        if ((m_octets[bit / 8] & (0x80U >> bit % 8)) != 0)
            return true;
    return false;
}

String& IpAddress::getIpAddrAsString(String& out) const
{
    char text[INET6_ADDRSTRLEN];
    inet_ntop(m_version == 4 ? AF_INET : AF_INET6, m_octets.data(), text, sizeof text);
    return isNetType() ? out.format("%s/%d", text, m_prefixLength) : out.format("%s", text);
}

XCode IpAddress::setIpAddrAsString(String const& text)
{
    std::string_view const all = text.view();
    std::size_t const slash = all.find('/');
    std::string_view const address = all.substr(0, slash);
    char terminated[INET6_ADDRSTRLEN]{};
    if (address.size() >= sizeof terminated || address.find('\0') != std::string_view::npos)
        return XCode::FAILURE;
    address.copy(terminated, address.size());

    IpAddress parsed;
    if (inet_pton(AF_INET, terminated, parsed.m_octets.data()) != 1)
    {
        parsed.m_version = 6;
        if (inet_pton(AF_INET6, terminated, parsed.m_octets.data()) != 1)
            return XCode::FAILURE;
    }
    if (slash != std::string_view::npos)
    {
        parsed.m_prefixLength = PREFIX_LENGTH_OF(all.substr(slash + 1), parsed.getNumberOfBits());
        if (!parsed.isNetType() || parsed.hasBitsBehindPrefix())
            return XCode::FAILURE;
    }
    *this = parsed;
    return XCode::OK;
}
