#pragma once

#include "sip/stack/Sofia.h"

#include <memory>

/// Owners of the stack's objects, which give them up as the stack wants it.
struct SipDeleter
{
    void operator()(su_home_t* home) const { su_home_unref(home); }
    void operator()(nta_agent_t* agent) const { nta_agent_destroy(agent); }
    void operator()(nta_leg_t* leg) const { nta_leg_destroy(leg); }
    void operator()(msg_t* message) const { msg_destroy(message); }
};

using SipHome = std::unique_ptr<su_home_t, SipDeleter>;
using SipAgent = std::unique_ptr<nta_agent_t, SipDeleter>;
using SipHeldMessage = std::unique_ptr<msg_t, SipDeleter>;
using SipLeg = std::unique_ptr<nta_leg_t, SipDeleter>;
