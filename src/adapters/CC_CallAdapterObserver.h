#pragma once

#include "platform/base/Export.h"

class CC_CallAdapter;
class CC_Flags;
class CC_Service;

/// What a signalling module implements to hear from its adapter, on the call-control loop's thread.
///
/// Inside either operation the module may drop, reuse or destroy the adapter.
class CC_EXPORT CC_CallAdapterObserver
{
public:
    virtual ~CC_CallAdapterObserver();
    /// Properties of the peer leg or of the call changed: `flags` holds their ids, each once however often it changed
    /// since the last turn of the loop. Read the present values from the adapter; one that is absent was removed, or
    /// the peer has gone: with all of them the State, and there is no cause then.
    virtual void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) = 0;
    /// Another side of the call asks a service; the object lives for this call only and takes the answer.
    virtual void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) = 0;
};
