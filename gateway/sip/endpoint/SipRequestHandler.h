#pragma once

#include "sip/stack/Sofia.h"

/// Answers the requests of one dialog, or those that belong to none.
class SipRequestHandler
{
public:
    virtual ~SipRequestHandler() = default;
    /// Returns the status with which the stack answers; 0: the answer comes later or there is none. A handler that has
    /// sent a final answer itself returns its status, and the transaction is given up.
    virtual int handleRequest(nta_leg_t* leg, nta_incoming_t* transaction, sip_t const* request) = 0;

    /// The callback for `nta_leg_tcreate`.
    static int HANDLE(SipRequestHandler* handler, nta_leg_t* leg, nta_incoming_t* transaction, sip_t const* request)
    {
        return handler->handleRequest(leg, transaction, request);
    }
};
