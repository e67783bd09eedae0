#include "platform/base/TYUUID.h"

#include <cstddef>

TY::UUID const& TY::UUID::INVALID()
{
    static UUID const s_invalid;
    return s_invalid;
}

String TY::UUID::getString() const
{
    String text;
    for (std::size_t i = 0; i < m_octets.size(); ++i)
        text.concatf(i == 4 || i == 6 || i == 8 || i == 10 ? "-%02x" : "%02x", static_cast<unsigned int>(m_octets[i]));
    return text;
}
