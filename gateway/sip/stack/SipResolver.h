#pragma once

#include "configuration/SocketAddress.h"

#include <string>

/// What the SIP stack reads when it asks for names: the resolver of the configuration, in the form of the system's own
/// file, which it also looks into later. Owned by whoever owns the agent, which ends before.
class SipResolver
{
public:
    /// Port 0: that of the system. Throws std::runtime_error when the system refuses.
    explicit SipResolver(SocketAddress const& address);
    ~SipResolver();
    SipResolver(SipResolver const&) = delete;
    SipResolver& operator=(SipResolver const&) = delete;

    /// Null: the system's.
    char const* getFile() const { return m_file.empty() ? nullptr : m_file.c_str(); }

private:
    int m_descriptor = -1;
    std::string m_file;
};
