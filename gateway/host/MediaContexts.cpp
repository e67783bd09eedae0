#include "host/MediaContexts.h"

#include <new>

unsigned int MediaContext::s_numberOfInstances = 0;

XCode MediaContextRepository::createContext(TYPtr<MG_IContext>& context)
{
    MediaContext* const made = new (std::nothrow) MediaContext(m_lastId + 1);
    if (made == nullptr)
        return XCode::NO_ELEMENT;
    ++m_lastId;
    context.set(made);
    return XCode::OK;
}
