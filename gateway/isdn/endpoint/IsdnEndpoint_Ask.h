#pragma once

#include "isdn/endpoint/IsdnEndpoint.h"
#include "isdn/endpoint/IsdnInterface.h"

/// Asks something of the stack about the call.
template <class Work>
auto IsdnEndpoint::ask(Work const& work)
{
    return m_interface.getLink().ask(work);
}
