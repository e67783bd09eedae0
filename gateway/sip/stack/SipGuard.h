#pragma once

#include "host/ConnectionGuard.h"
#include "sip/SipConfiguration.h"
#include "sip/stack/Sofia.h"

#include <cstddef>
#include <optional>
#include <vector>

class SipStack;

/// What one interface lets in: messages and connections of the sources that it serves, messages of a size, and so many
/// connections of each source. All else ends here, before the SIP stack looks at it, and is counted.
///
///     SipGuard guard(configuration);
///     guard.watch(agent); // after the agent has its ports
///
/// The stack has no place to ask, and of a stream's messages it limits only the first. So this module defines some of
/// the functions that the stack calls, which the dynamic linker then prefers to the stack's own; they ask the guards
/// and call on. `PROVE` sees to it that this is so. Owned by its interface, which ends the agent first; belongs to the
/// thread of the stack's loop.
class SipGuard
{
public:
    struct Counters
    {
        unsigned long long strangers = 0; ///< messages from elsewhere, dropped without a word
        unsigned long long tooLarge = 0;  ///< messages, answered with 413 where they are requests
    };

    explicit SipGuard(SipConfiguration const& configuration);
    ~SipGuard();
    SipGuard(SipGuard const&) = delete;
    SipGuard& operator=(SipGuard const&) = delete;

    /// Guards the agent's ports from now on.
    void watch(nta_agent_t* agent);
    Counters const& getCounters() const { return m_counters; }
    /// On all transports.
    unsigned long long getNumberOfRefused() const
    {
        return m_connections.getNumberOfRefused() + (m_secured ? m_secured->getNumberOfRefused() : 0);
    }

    /// Two messages go over a connection of the process with itself, on a free port of the `host`: throws
    /// std::runtime_error unless the stack then called every function that it should. Once per process.
    static void PROVE(SipStack& stack, std::string const& host);

    /// What the stack is to be told as the limit of a message, so that `maxMessageSize` can be kept exactly: it gives
    /// up a connection whose waiting octets do not fit beside what it has.
    static usize_t LIMIT_OF(SipConfiguration const& configuration);

    /// Who may send: what `allow` says, or else the peers.
    static std::vector<AddressRange> SERVED_BY(SipConfiguration const& configuration);

    // --- what the stack calls
    /// Whether the stack may have the message; one that it may not have is the caller's to give up.
    static bool ADMIT(tport_t const* port, msg_t* message);

private:
    bool admit(msg_t* message);

    std::vector<AddressRange> m_allow;
    std::size_t m_maxMessageSize;
    std::size_t m_maxHeaderSize;
    ConnectionGuard m_connections;
    std::optional<ConnectionGuard> m_secured; // those of TLS
    std::vector<tport_t const*> m_ports;
    Counters m_counters;
};
