#include "testing/FakeMediaContextRepository.h"

#include "callcontrol/CallControl.h"
#include "testing/FailingAllocator.h"
#include "testing/FakeMediaContext.h"

FakeMediaContextRepository::FakeMediaContextRepository()
{
    addReference(); // our own: counted pointers never find the last one
    CallControl::SET_MG_CONTEXT_REPOSITORY(this);
}

FakeMediaContextRepository::~FakeMediaContextRepository()
{
    if (CallControl::GET_MG_CONTEXT_REPOSITORY() == this)
        CallControl::SET_MG_CONTEXT_REPOSITORY(nullptr);
}

XCode FakeMediaContextRepository::createContext(TYPtr<MG_IContext>& context)
{
    ++m_requests;
    m_onRequest();
    if (m_isFailing)
        return XCode::FAILURE;
    FailingAllocator::Pause const unseen;
    context.set(new FakeMediaContext(++m_lastId));
    return XCode::OK;
}
