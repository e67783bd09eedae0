#include "sip/stack/SipResolver.h"

#include <stdexcept>
#include <sys/mman.h>
#include <sys/types.h>
#include <unistd.h>

SipResolver::SipResolver(SocketAddress const& address)
{
    if (address.port == 0)
        return;
    std::string const text = "nameserver " + address.host + "\nport " + std::to_string(address.port) + "\n";
    m_descriptor = memfd_create("resolver", MFD_CLOEXEC);
    if (m_descriptor < 0 || write(m_descriptor, text.data(), text.size()) != static_cast<ssize_t>(text.size()))
    {
        close(m_descriptor);
        throw std::runtime_error("the resolver cannot be told to the SIP stack");
    }
    m_file = "/proc/self/fd/" + std::to_string(m_descriptor);
}

SipResolver::~SipResolver()
{
    if (m_descriptor >= 0)
        close(m_descriptor);
}
