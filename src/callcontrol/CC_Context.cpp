#include "callcontrol/CC_Context.h"

#include "callcontrol/CC_CallPool.h"
#include "calls/CC_Call.h"
#include "platform/base/NestingGuard.h"

#include <new>

namespace
{
constexpr std::size_t PROVIDER_BUCKETS = 32;

XCode ASSIGN(String& to, std::string_view text)
{
    try
    {
        to = String(text);
        return XCode::OK;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

/// Names travel through a notification's datum without being copied.
void* DATUM(String const& name) { return const_cast<String*>(&name); }
String const& NAME(void* datum) { return *static_cast<String const*>(datum); }
} // namespace

CC_Context::Observer::~Observer() = default;

CC_Context::CC_Context(String const& name)
    : m_name(name), m_providerTable(PROVIDER_BUCKETS), m_callPool(new CC_CallPool)
{
}

CC_Context::~CC_Context()
{
    m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_DESTROY, *this, nullptr);
    m_observers.silence();
    m_callPool.reset();
    m_providerTable.clear();
}

XCode CC_Context::addContextObserver(Observer& observer) { return m_observers.addObserver(observer); }

void CC_Context::removeContextObserver(Observer const& observer) { m_observers.removeObserver(observer); }

XCode CC_Context::setNationalPrefix(String const& prefix) { return ASSIGN(m_nationalPrefix, prefix); }

XCode CC_Context::setInternationalPrefix(String const& prefix) { return ASSIGN(m_internationalPrefix, prefix); }

XCode CC_Context::setMaxHops(unsigned int maxHops)
{
    m_maxHops = maxHops;
    return XCode::OK;
}

XCode CC_Context::addProvider(String const& name, CC_Provider& provider)
{
    XCode const added = m_providerTable.add(name, &provider);
    if (added == XCode::REFUSED)
        return added;
    if (!added.isOk())
        return XCode::FAILURE;
    m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_ADD_PROVIDER, *this, DATUM(name));
    return XCode::OK;
}

void CC_Context::removeProvider(String const& name)
{
    m_providerTable.remove(name);
    // told for an unknown name too, on purpose: who waits for the name to be free hears that it is
    m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_REMOVE_PROVIDER, *this, DATUM(name));
}

void CC_Context::removeProviderNamed(std::string_view name)
{
    String told;
    if (!m_providerTable.remove(name, &told) && !ASSIGN(told, name).isOk())
        return; // nothing was removed, and there is no memory to say so
    m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_REMOVE_PROVIDER, *this, DATUM(told));
}

CC_Provider* CC_Context::getProvider(unsigned int index) const
{
    auto const* entry = m_providerTable.getFirst();
    while (entry != nullptr && index-- > 0)
        entry = entry->getNext();
    return entry != nullptr ? entry->getValue() : nullptr;
}

unsigned int CC_Context::getNumberOfCalls() const
{
    return m_callPool != nullptr ? m_callPool->getNumberOfAcquiredCalls() : 0;
}

CC_Call* CC_Context::getCall(unsigned int index)
{
    return m_callPool != nullptr ? m_callPool->getAcquiredCall(index) : nullptr;
}

CC_Call* CC_Context::acquireCall(MG_IContext* mgContext)
{
    if (m_callPool == nullptr)
        return nullptr;
    CC_Call* const call = m_callPool->acquireCall(mgContext);
    if (call == nullptr) // none could be had, or whoever was asked for it has destroyed us
        return nullptr;
    CC_Call::Hold const keepCall(call);
    m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_CREATE_CALL, *this, call);
    return keepCall.isReleased() ? nullptr : call; // an observer may have released it at once
}

void CC_Context::releaseCall(CC_Call* call)
{
    if (call == nullptr || m_callPool == nullptr)
        return;
    TYLifeline::Watch const self(m_lifeline);
    CC_Call::Hold const keepCall(call);
    m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_DESTROY_CALL, *this, call);
    if (keepCall.isReleased())
        return; // by an observer
    if (self.isAlive() && m_callPool != nullptr)
        m_callPool->releaseCall(call);
    else
        call->destroy(); // its pool has ended with us
}

InfoContainer& CC_Context::getProviderInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                           unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Call Control", m_name);
    info.addWithin(maxLevel, level + 1, maxDetail, detail + 1, String::s_empty, "Providers", String::s_empty);
    for (auto const* entry = m_providerTable.getFirst(); entry != nullptr; entry = entry->getNext())
        info.addWithin(maxLevel, level + 2, maxDetail, detail + 1, entry->getKey(), "", String::s_empty);
    return info;
}

InfoContainer& CC_Context::getCallInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                       unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    static unsigned int getInfoCalls = 0;
    NestingGuard const nesting(getInfoCalls);
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Call Control", m_name);
    if (maxLevel >= level + 1 && nesting.isOutermost())
    {
        TYLifeline::Watch const self(m_lifeline); // what a property says of itself may destroy it
        if (m_callPool != nullptr)
            m_callPool->getInfo(info, maxLevel, level + 1, maxDetail, detail, String::s_empty);
        if (self.isAlive())
            m_observers.getInfo(info, maxLevel, level + 1, maxDetail, detail + 4, "Context ");
    }
    return info;
}

void CC_Context::NOTIFY_OBSERVER_ABOUT_DESTROY(Observer& observer, CC_Context& context, void*)
{
    observer.aboutDestroy(context);
}

void CC_Context::NOTIFY_OBSERVER_ABOUT_ADD_PROVIDER(Observer& observer, CC_Context& context, void* data)
{
    observer.aboutAddProvider(context, NAME(data));
}

void CC_Context::NOTIFY_OBSERVER_ABOUT_REMOVE_PROVIDER(Observer& observer, CC_Context& context, void* data)
{
    observer.aboutRemoveProvider(context, NAME(data));
}

void CC_Context::NOTIFY_OBSERVER_ABOUT_CREATE_CALL(Observer& observer, CC_Context& context, void* data)
{
    observer.aboutCreateCall(context, static_cast<CC_Call*>(data));
}

void CC_Context::NOTIFY_OBSERVER_ABOUT_DESTROY_CALL(Observer& observer, CC_Context& context, void* data)
{
    observer.aboutDestroyCall(context, static_cast<CC_Call*>(data));
}
