#include "testing/CallControlFixture.h"

#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"

#include <cstdio>
#include <cstdlib>

namespace
{
void EXPECT_SET_UP(XCode result, char const* what)
{
    if (result.isOk())
        return;
    std::fprintf(stderr, "CallControlFixture: %s gave 0x%x; is another fixture alive?\n", what, result.getValue());
    std::abort();
}
} // namespace

CallControlFixture::CallControlFixture()
{
    EXPECT_SET_UP(CallControl::ADD_PROPERTY_FACTORY(&m_factory), "ADD_PROPERTY_FACTORY");
    EXPECT_SET_UP(CallControl::CREATE_CONTEXT(CallControl::DEFAULT_CONTEXT_NAME), "CREATE_CONTEXT");
}

CallControlFixture::~CallControlFixture()
{
    m_loop.settle();
    if (getContext() != nullptr)
        CallControl::DESTROY_CONTEXT(CallControl::DEFAULT_CONTEXT_NAME);
    m_loop.settle();
    CallControl::REMOVE_PROPERTY_FACTORY(&m_factory);
}

CC_Context* CallControlFixture::getContext() const
{
    return CallControl::GET_CONTEXT(CallControl::DEFAULT_CONTEXT_NAME);
}

CC_CallPool* CallControlFixture::getPool() const
{
    return CallControl::GET_CALL_POOL(CallControl::DEFAULT_CONTEXT_NAME);
}
