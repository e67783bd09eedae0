#include "sip/stack/SipResolver.h"

#include "sip/stack/Sofia.h"
#include "sip/stack/StackFunction.h"

#include <sofia-resolv/sres.h>
#include <sofia-resolv/sres_record.h>

#include <cstdint>
#include <optional>
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

// --- in place of the stack's own -------------------------------------------------------------------------------------

#define IN_PLACE extern "C" __attribute__((visibility("default")))

struct sipdns_tport; // a way that the stack knows

/// Which way the stack takes of those that a name has (NAPTR, RFC 3263, 4.1), `answers` as they are sorted. The stack's
/// own takes the one of the best preference, though the order goes before it, and providers number the orders and leave
/// all preferences alike: so the preferences become the places in the list, which says the same by either, also in the
/// stack's cache, where it is said once more each time. And where a name has none it takes the first way that there is;
/// null leaves it to ask for the service of each.
IN_PLACE sipdns_tport const* outgoing_naptr_tport(nta_outgoing_t* request, sres_record_t** answers)
{
    static auto* const s_original =
        STACK_FUNCTION<sipdns_tport const*(nta_outgoing_t*, sres_record_t**)>("outgoing_naptr_tport");
    std::uint16_t place = 0;
    std::optional<std::uint32_t> last;
    for (sres_record_t** answer = answers; answer != nullptr && *answer != nullptr; ++answer)
    {
        sres_naptr_record_t& record = *(*answer)->sr_naptr;
        if (record.na_record->r_type != sres_type_naptr || record.na_record->r_status != 0)
            continue;
        std::uint32_t const rank = std::uint32_t{record.na_order} << 16u | record.na_prefer;
        if (last && rank != *last)
            ++place;
        last = rank;
        record.na_prefer = place;
    }
    return last ? s_original(request, answers) : nullptr;
}
