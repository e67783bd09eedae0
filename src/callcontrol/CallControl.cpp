#include "callcontrol/CallControl.h"

#include "callcontrol/CC_Context.h"
#include "platform/base/Assert.h"
#include "platform/base/TYVector.h"
#include "properties/CC_PropertyFactory.h"

#include <algorithm>
#include <memory>
#include <new>
#include <tuple>

CallControl* CallControl::s_pInstance = nullptr;

namespace
{
constexpr std::size_t FACTORY_BUCKETS = 32;
constexpr std::size_t CONTEXT_BUCKETS = 8;

template <class T>
void REMOVE_IF_NULL(TYList<T*>& list)
{
    for (auto* element = list.getFirst(); element != nullptr;)
    {
        auto* const next = element->getNext();
        if (element->getValue() == nullptr)
            list.remove(element);
        element = next;
    }
}
} // namespace

CallControl::ContextObserver::~ContextObserver() = default;

CallControl* CallControl::INSTANCE()
{
    if (s_pInstance == nullptr)
    {
        s_pInstance = new CallControl;
        CC_Environment::s_current = &s_pInstance->m_environment;
    }
    return s_pInstance;
}

CallControl::CallControl() : m_factoryTable(FACTORY_BUCKETS), m_contextTable(CONTEXT_BUCKETS) {}

CallControl::~CallControl()
{
    // out of the table first: what a context's observers ask for meanwhile is not there any more
    while (auto const* const entry = m_contextTable.getFirst())
    {
        std::unique_ptr<CC_Context> const context(entry->getValue());
        m_contextTable.remove(context->getName());
    }
    m_environment.m_ccEventLoop = nullptr;
    m_environment.m_dpEventLoop = nullptr;
    m_environment.m_mgContextRepository.set(nullptr);
    m_environment.m_mgTerminationRepository.set(nullptr);
    if (s_pInstance != this)
        return;
    s_pInstance = nullptr;
    CC_Environment::s_current = nullptr;
}

TYSyncEvent& CallControl::getCcSyncEvent(EventPrio::Type priority) const
{
    return m_environment.m_ccEventLoop->getSyncEvent(priority);
}

TYSyncEvent& CallControl::getDpSyncEvent(EventPrio::Type priority) const
{
    return m_environment.m_dpEventLoop->getSyncEvent(priority);
}

CC_Property* CallControl::createProperty(unsigned int id) const
{
    CC_PropertyFactory* const factory = m_factoryTable.get(id);
    return factory != nullptr ? factory->createProperty(id) : nullptr;
}

XCode CallControl::addPropertyFactory(CC_PropertyFactory* factory)
{
    if (factory == nullptr)
        return XCode::REFUSED;
    try
    {
        TYVector<unsigned int> ids;
        std::ignore = ids.reserve(8);
        factory->getPropertyIds(ids);
        if (ids.hasRefused())
            return XCode::FAILURE;
        if (std::any_of(ids.begin(), ids.end(), [this](unsigned int id) { return m_factoryTable.find(id) != nullptr; }))
            return XCode::REFUSED;
        for (unsigned int const id : ids)
            if (m_factoryTable.add(id, factory) == XCode::NO_ELEMENT) // REFUSED: the factory names the id twice
            {
                for (unsigned int const added : ids)
                    m_factoryTable.remove(added);
                return XCode::FAILURE;
            }
        return XCode::OK;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

void CallControl::removePropertyFactory(CC_PropertyFactory* factory)
{
    if (factory == nullptr)
        return;
    TYVector<unsigned int> ids;
    factory->getPropertyIds(ids);
    // whoever holds the id: a factory that takes over from another one removes the other's registration, on purpose
    for (unsigned int const id : ids)
        m_factoryTable.remove(id);
    // a list that memory cut short must not leave ids behind that lead to a factory which is gone
    for (auto const* entry = m_factoryTable.getFirst(); ids.hasRefused() && entry != nullptr;)
    {
        auto const* const next = entry->getNext();
        if (entry->getValue() == factory)
            m_factoryTable.remove(unsigned{entry->getKey()});
        entry = next;
    }
}

XCode CallControl::createContext(String const& name)
{
    if (m_contextTable.find(name) != nullptr)
        return XCode::REFUSED;
    try
    {
        auto context = std::make_unique<CC_Context>(name);
        if (!m_contextTable.add(name, context.get()).isOk())
            return XCode::FAILURE;
        std::ignore = context.release(); // the table owns it now
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
    tellContextObservers([&](ContextObserver& observer) { observer.contextAdded(name); });
    return XCode::OK;
}

void CallControl::destroyContext(String const& name)
{
    String kept;
    String const* used = &name;
    try
    {
        kept = name; // the given one may be the context's own, and an observer be faster
        used = &kept;
    }
    catch (std::bad_alloc const&)
    {
        // then the given one has to do
    }
    tellContextObservers([&](ContextObserver& observer) { observer.contextDestroyed(*used); });
    std::unique_ptr<CC_Context> const context(m_contextTable.get(*used));
    m_contextTable.remove(*used);
}

XCode CallControl::createContextNamed(std::string_view name)
{
    if (m_contextTable.find(name) != nullptr)
        return XCode::REFUSED;
    String kept;
    return kept.assign(name).isOk() ? createContext(kept) : XCode::FAILURE;
}

void CallControl::destroyContextNamed(std::string_view name)
{
    String kept;
    if (kept.assign(name).isOk())
        return destroyContext(kept);
    auto const* entry = m_contextTable.find(name);
    tellContextObservers(
        [&](ContextObserver& observer)
        {
            if (entry != nullptr)
                observer.contextDestroyed(entry->getKey());
            entry = m_contextTable.find(name); // the observer may have been faster
        });
    std::unique_ptr<CC_Context> const context(m_contextTable.get(name));
    m_contextTable.remove(name);
}

CC_Context* CallControl::getContext(String const& name) const { return m_contextTable.get(name); }

void CallControl::registerContextObserver(ContextObserver& observer)
{
    if (m_contextObservers.find(&observer) == nullptr)
        std::ignore = m_contextObservers.append(&observer); // without memory it is not held
}

void CallControl::unregisterContextObserver(ContextObserver& observer)
{
    for (auto* element = m_contextObservers.getFirst(); element != nullptr; element = element->getNext())
        if (element->getValue() == &observer)
            element->setValue(nullptr);
    if (m_contextObserverWalks == 0)
        REMOVE_IF_NULL(m_contextObservers);
}

/// An observer that is unregistered meanwhile is nulled and taken out after the outermost walk.
template <class Tell>
void CallControl::tellContextObservers(Tell&& tell)
{
    ++m_contextObserverWalks;
    for (auto* element = m_contextObservers.getFirst(); element != nullptr; element = element->getNext())
        if (element->getValue() != nullptr)
            tell(*element->getValue());
    if (--m_contextObserverWalks == 0)
        REMOVE_IF_NULL(m_contextObservers);
}
