#include "properties/CC_PropertyContextId.h"

#include "environment/CC_Environment.h"

#include <tuple>

CC_PropertyContextId::TypeId CC_PropertyContextId::s_typeId;

CC_PropertyContextId::CC_PropertyContextId(unsigned int id, MG_IContext* context) : CC_PropertyClass(id)
{
    setContext(context);
}

String& CC_PropertyContextId::getValueString(String& out) const
{
    if (!m_context)
        return out = "(none)";
    return out.format("0x%8.8x", m_context->getId());
}

void CC_PropertyContextId::setContext(MG_IContext* context)
{
    if (context != nullptr)
        m_context.set(context);
    else if (TYPtr<MG_IContextRepository> const repository(CC_Environment::MG_CONTEXT_REPOSITORY()); repository)
        std::ignore = repository->createContext(m_context); // a call without media is still a call
}
