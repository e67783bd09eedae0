#include "callcontrol/CC_CallPool.h"

#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "platform/base/NestingGuard.h"
#include "platform/driver/DRIVER.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyId.h"

#include <new>
#include <tuple>
#include <utility>

CC_CallPool::Statistics CC_CallPool::s_statistics;
TY::Time CC_CallPool::s_tLastUpdate;
TY::Time CC_CallPool::Statistics::s_tLastUpdate;
TYMutex CC_CallPool::Statistics::s_mutex(1);

namespace
{
String const LOCK_OWNER("Call-Control");
String const LOCK_REASON("Calls are ongoing");
unsigned int s_infoDepth = 0;

void RELEASE_LOCK(TYPPtr<IRebootMgmt>& holder)
{
    if (holder.isEmpty())
        return;
    TYLockPtr<IRebootMgmt> rebootMgmt(holder);
    std::ignore = rebootMgmt.lock()->releaseGracefulLock(LOCK_OWNER); // nothing could be done about a refusal
    rebootMgmt.unlock();
}

void REMOVE_CALL_LEGS(CC_Call& call)
{
    // no more than there are now: an observer that always puts one back must not keep us here for ever
    for (unsigned int left = call.getNumberOfCallLegs(); left > 0; --left)
        if (CC_CallLeg* const leg = call.getCallLeg(0))
            call.removeCallLeg(*leg);
}
} // namespace

CC_CallPool::~CC_CallPool()
{
    while (TYList<CC_Call*>::Element* const element = m_calls.getFirst())
    {
        CC_Call& call = *element->getValue();
        unlist(call);
        call.setCallPool(nullptr);
        s_statistics.onCallRemoved();
    }
}

CC_Call* CC_CallPool::acquireCall(MG_IContext* mgContext)
{
    CC_Call* const call = new (std::nothrow) CC_Call;
    if (call == nullptr)
        return nullptr;
    call->setCallPool(this);
    if (m_calls.isEmpty())
        addReloadGracefulLock();
    call->m_poolElement = m_calls.append(call);
    call->m_listedIn = call->m_poolElement != nullptr ? this : nullptr;
    if (call->m_listedIn == nullptr || call->m_deferredEvent == nullptr) // could not be kept, or never be cleaned up
    {
        unlist(*call);
        call->destroy();
        if (m_calls.isEmpty())
            releaseReloadGracefulLock();
        return nullptr;
    }
    s_statistics.onCallAdded();
    std::ignore = call->setProperty(CC_PropertyContextId(CC_PropertyId::CONTEXT, mgContext)); // without it: no media
    return call;
}

void CC_CallPool::releaseCall(CC_Call* call)
{
    if (call == nullptr)
        return;
    // the call's observers may destroy us; the lock is given back all the same when this was the last call
    TYLifeline::Watch const self(m_lifeline);
    TYPPtr<IRebootMgmt> rebootMgmt(m_rebootMgmt);
    unlist(*call);
    bool const wasLast = m_calls.isEmpty();
    s_statistics.onCallRemoved();
    call->destroy();
    if (self.isAlive() ? m_calls.isEmpty() : wasLast)
        RELEASE_LOCK(self.isAlive() ? m_rebootMgmt : rebootMgmt);
}

/// Takes the call out of our list if it is there, in constant time.
void CC_CallPool::unlist(CC_Call& call)
{
    if (call.m_listedIn != this)
        return;
    call.m_listedIn = nullptr;
    m_calls.remove(std::exchange(call.m_poolElement, nullptr));
}

CC_Call* CC_CallPool::getAcquiredCall(unsigned int index)
{
    TYList<CC_Call*>::Element const* element = m_calls.getFirst();
    while (element != nullptr && index-- > 0)
        element = element->getNext();
    return element != nullptr ? element->getValue() : nullptr;
}

void CC_CallPool::dropCalls(String const&, String const& callName)
{
    TYLifeline::Watch const self(m_lifeline);
    String name; // the given one may be a call's own, which can end in here
    try
    {
        name = callName;
    }
    catch (std::bad_alloc const&)
    {
        return; // longer than any call's name
    }
    for (TYList<CC_Call*>::Element* element = m_calls.getFirst(); element != nullptr;)
    {
        CC_Call& call = *element->getValue();
        CC_Call::Hold const keepCall(&call);
        CC_Call::Hold const keepNext(element->getNext() != nullptr ? element->getNext()->getValue() : nullptr);
        if (name.isEmpty() || name == call.getName())
            REMOVE_CALL_LEGS(call);
        if (!self.isAlive())
            return;
        // an observer may have released the next call: begin again, the calls before have no legs any more
        CC_Call const* const next = keepNext.get();
        element = next == nullptr ? nullptr : next->m_listedIn == this ? next->m_poolElement : m_calls.getFirst();
    }
}

void CC_CallPool::addReloadGracefulLock()
{
    if (m_rebootMgmt.isEmpty())
    {
        TYVector<TYPtr<IRebootMgmt>> found;
        std::ignore = DRIVER::INSTANCE().getDriverInterfaces(found, TY::UUID::INVALID(), String::s_empty);
        if (found.isEmpty()) // no driver, or no memory: calls go on without the lock
            return;
        m_rebootMgmt.set(found[0].get());
        if (m_rebootMgmt.isEmpty())
            return;
    }
    TYLockPtr<IRebootMgmt> rebootMgmt(m_rebootMgmt);
    std::ignore = rebootMgmt.lock()->addGracefulLock(LOCK_OWNER, LOCK_REASON, 0); // a refusal stops no call
    rebootMgmt.unlock();
}

void CC_CallPool::releaseReloadGracefulLock() { RELEASE_LOCK(m_rebootMgmt); }

InfoContainer& CC_CallPool::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                    unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    NestingGuard const nesting(s_infoDepth);
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Call Pool", String::addressOf(this));
    if (maxLevel >= level + 1 && maxDetail >= detail && nesting.isOutermost())
        for (auto const* element = m_calls.getFirst(); element != nullptr; element = element->getNext())
            element->getValue()->getInfo(info, maxLevel, level + 1, maxDetail, detail, String::s_empty);
    return info;
}
