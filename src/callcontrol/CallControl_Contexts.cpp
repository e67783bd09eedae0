// The operations of a context, by its name.
#include "callcontrol/CallControl.h"

#include "callcontrol/CC_Context.h"

#include <algorithm>

namespace
{
constexpr unsigned int COUNTED_CONTEXTS = 64;
String const DEFAULT_NAME(CallControl::DEFAULT_CONTEXT_NAME);
String const NO_CONTEXT; // stands for a name that no context has; known by its address
} // namespace

/// The context that an operation addresses; null when there is none.
CC_Context* CallControl::findContext(String const& name) const
{
    if (&name == &NO_CONTEXT)
        return nullptr;
    return m_contextTable.get(name.isEmpty() ? DEFAULT_NAME : name);
}

/// The name under which the context that an operation addresses stands in the table.
String const& CallControl::keyOf(std::string_view contextName) const
{
    auto const* const entry = m_contextTable.find(contextName.empty() ? DEFAULT_NAME : contextName);
    return entry != nullptr ? entry->getKey() : NO_CONTEXT;
}

CC_Provider* CallControl::findProvider(std::string_view contextName, std::string_view providerName) const
{
    CC_Context const* const context = findContext(keyOf(contextName));
    return context != nullptr ? context->findProvider(providerName) : nullptr;
}

XCode CallControl::setNationalPrefixFrom(std::string_view contextName, std::string_view prefix)
{
    String kept;
    return kept.assign(prefix).isOk() ? setNationalPrefix(keyOf(contextName), kept) : XCode::FAILURE;
}

XCode CallControl::setInternationalPrefixFrom(std::string_view contextName, std::string_view prefix)
{
    String kept;
    return kept.assign(prefix).isOk() ? setInternationalPrefix(keyOf(contextName), kept) : XCode::FAILURE;
}

XCode CallControl::addProviderNamed(std::string_view contextName, std::string_view providerName, CC_Provider& provider)
{
    if (findProvider(contextName, providerName) != nullptr)
        return XCode::REFUSED;
    String kept;
    return kept.assign(providerName).isOk() ? addProvider(keyOf(contextName), kept, provider) : XCode::FAILURE;
}

void CallControl::removeProviderNamed(std::string_view contextName, std::string_view providerName)
{
    if (CC_Context* const context = findContext(keyOf(contextName)))
        context->removeProviderNamed(providerName);
}

String const& CallControl::getNationalPrefix(String const& contextName) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getNationalPrefix() : String::s_empty;
}

XCode CallControl::setNationalPrefix(String const& contextName, String const& prefix)
{
    CC_Context* const context = findContext(contextName);
    return context != nullptr ? context->setNationalPrefix(prefix) : XCode::FAILURE;
}

String const& CallControl::getInternationalPrefix(String const& contextName) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getInternationalPrefix() : String::s_empty;
}

XCode CallControl::setInternationalPrefix(String const& contextName, String const& prefix)
{
    CC_Context* const context = findContext(contextName);
    return context != nullptr ? context->setInternationalPrefix(prefix) : XCode::FAILURE;
}

unsigned int CallControl::getMaxHops(String const& contextName) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getMaxHops() : 0;
}

XCode CallControl::setMaxHops(String const& contextName, unsigned int maxHops)
{
    CC_Context* const context = findContext(contextName);
    return context != nullptr ? context->setMaxHops(maxHops) : XCode::FAILURE;
}

XCode CallControl::addProvider(String const& contextName, String const& providerName, CC_Provider& provider)
{
    CC_Context* const context = findContext(contextName);
    return context != nullptr ? context->addProvider(providerName, provider) : XCode::FAILURE;
}

void CallControl::removeProvider(String const& contextName, String const& providerName)
{
    if (CC_Context* const context = findContext(contextName))
        context->removeProvider(providerName);
}

unsigned int CallControl::getNumberOfProviders(String const& contextName) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getNumberOfProviders() : 0;
}

CC_Provider* CallControl::getProvider(String const& contextName, unsigned int index) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getProvider(index) : nullptr;
}

CC_Provider* CallControl::getProvider(String const& contextName, String const& providerName) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getProvider(providerName) : nullptr;
}

InfoContainer& CallControl::getProviderInfo(InfoContainer& info, String const& contextName, unsigned int maxLevel,
                                            unsigned int level, unsigned int maxDetail, unsigned int detail,
                                            String const& prefix) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getProviderInfo(info, maxLevel, level, maxDetail, detail, prefix) : info;
}

CC_CallPool* CallControl::getCallPool(String const& contextName) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getCallPool() : nullptr;
}

CC_Call* CallControl::acquireCall(String const& contextName) { return acquireCall(contextName, nullptr); }

CC_Call* CallControl::acquireCall(String const& contextName, MG_IContext* mgContext)
{
    CC_Context* const context = findContext(contextName);
    return context != nullptr ? context->acquireCall(mgContext) : nullptr;
}

void CallControl::releaseCall(String const& contextName, CC_Call* call)
{
    if (CC_Context* const context = findContext(contextName))
        context->releaseCall(call);
}

unsigned int CallControl::getNumberOfCalls() const
{
    unsigned int calls = 0;
    unsigned int contexts = 0;
    for (auto const* entry = m_contextTable.getFirst(); entry != nullptr && contexts < COUNTED_CONTEXTS;
         entry = entry->getNext(), ++contexts)
        calls += entry->getValue()->getNumberOfCalls();
    return calls;
}

unsigned int CallControl::getNumberOfCalls(String const& contextName) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getNumberOfCalls() : 0;
}

CC_Call* CallControl::getCall(String const& contextName, unsigned int index) const
{
    CC_Context* const context = findContext(contextName);
    return context != nullptr ? context->getCall(index) : nullptr;
}

InfoContainer& CallControl::getCallInfo(InfoContainer& info, String const& contextName, unsigned int maxLevel,
                                        unsigned int level, unsigned int maxDetail, unsigned int detail,
                                        String const& prefix) const
{
    CC_Context const* const context = findContext(contextName);
    return context != nullptr ? context->getCallInfo(info, maxLevel, level, maxDetail, detail, prefix) : info;
}
