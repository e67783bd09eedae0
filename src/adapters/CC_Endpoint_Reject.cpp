// How an endpoint rejects: through an adapter, like any other answer.
#include "adapters/CC_CallAdapter.h"
#include "callcontrol/provider/CC_Endpoint.h"

#include <tuple>

void CC_Endpoint::actionRejectOfferedCall_WithCause(CC_Call& call, CC_PropertyContainer const& properties, QCause cause)
{
    // a failed step leaves the adapter idle, and dropping an idle adapter does nothing
    CC_CallAdapter adapter;
    std::ignore = adapter.setup("reject", *this, nullptr);
    std::ignore = adapter.accept(call, properties);
    adapter.drop(cause, 0);
}
