#include "callcontrol/CC_CallPool.h"

#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "calls/CC_Monitor.h"
#include "platform/base/NestingGuard.h"
#include "platform/driver/DRIVER.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyId.h"
#include "recorder/CC_RecordWriter.h"

#include <new>
#include <optional>
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

/// The reboot management may destroy the pool that asks it, so it is asked through a holder of our own.
template <class Ask>
void ASK(TYPPtr<IRebootMgmt> const& holder, Ask&& ask)
{
    TYPPtr<IRebootMgmt> own(holder);
    if (own.isEmpty())
        return;
    TYLockPtr<IRebootMgmt> rebootMgmt(own);
    ask(*rebootMgmt.lock());
    rebootMgmt.unlock();
}

void RECORD(CC_RecordFormat::Kind kind, unsigned long long call = 0)
{
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->add(kind, call, 0);
}

void RELEASE_LOCK(TYPPtr<IRebootMgmt> const& holder)
{
    if (!holder.isEmpty())
        RECORD(CC_RecordFormat::Kind::LOCK_GIVEN_BACK);
    ASK(holder, [](IRebootMgmt& rebootMgmt)
        { std::ignore = rebootMgmt.releaseGracefulLock(LOCK_OWNER); }); // nothing could be done about a refusal
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
    TYLifeline::Watch const self(m_lifeline);
    CC_Call* const call = new (std::nothrow) CC_Call;
    if (call == nullptr)
        return nullptr;
    CC_Call::Hold const keepCall(call);
    bool const isFirst = m_calls.isEmpty();
    if (isFirst)
        addReloadGracefulLock(); // the reboot management may destroy us
    // a call that came inside has one of its own
    bool const hasTwoLocks = isFirst && self.isAlive() && !m_calls.isEmpty();
    if (!self.isAlive() || !list(*call))
    {
        call->destroy();
        if (self.isAlive() && (hasTwoLocks || m_calls.isEmpty()))
            releaseReloadGracefulLock();
        return nullptr;
    }
    s_statistics.onCallAdded();
    RECORD(CC_RecordFormat::Kind::CALL_ACQUIRED, call->getSerial());
    if (hasTwoLocks)
        releaseReloadGracefulLock(); // not before ours is there: the call that has the other may end in here
    if (self.isAlive() && !keepCall.isReleased())
        giveContext(*call, mgContext); // the media layer may do all that, too
    if (self.isAlive() && !keepCall.isReleased())
        return call;
    call->defer(); // nobody else would look at it
    return nullptr;
}

/// Puts the call into our list. Not without its clean-up event: it would never end.
bool CC_CallPool::list(CC_Call& call)
{
    if (call.m_deferredEvent == nullptr)
        return false;
    call.m_poolElement = m_calls.append(&call);
    if (call.m_poolElement == nullptr)
        return false;
    call.m_listedIn = this;
    call.setCallPool(this);
    return true;
}

/// Making the property asks the media layer for a context when there is none: a call out, though it looks like a value.
void CC_CallPool::giveContext(CC_Call& call, MG_IContext* mgContext)
{
    CC_PropertyContextId const context(CC_PropertyId::CONTEXT, mgContext);
    CC_Writing const writing(CC_RecordFormat::Writer::POOL);
    std::ignore = call.setProperty(context); // without it: no media
}

/// The lock of a pool that its last call is leaving: given back after the call's end, which may destroy the pool, or
/// bring it another call with a lock of its own.
class CC_CallPool::Lock
{
public:
    explicit Lock(CC_CallPool const& pool)
    {
        if (pool.m_calls.isEmpty())
            m_rebootMgmt.emplace(pool.m_rebootMgmt);
    }
    void giveBack()
    {
        if (m_rebootMgmt)
            RELEASE_LOCK(*m_rebootMgmt);
    }

private:
    std::optional<TYPPtr<IRebootMgmt>> m_rebootMgmt; // none if other calls stay: the last of them gives it back
};

void CC_CallPool::releaseCall(CC_Call* call)
{
    if (call == nullptr)
        return;
    CC_CallPool& lister = call->m_listedIn != nullptr ? *call->m_listedIn : *this;
    lister.unlist(*call);
    if (&lister == this)
        return end(*call);
    Lock ofTheLister(lister); // the call is another pool's
    end(*call);
    ofTheLister.giveBack();
}

void CC_CallPool::end(CC_Call& call)
{
    Lock lock(*this);
    RECORD(CC_RecordFormat::Kind::CALL_GIVEN_BACK, call.getSerial());
    s_statistics.onCallRemoved();
    call.destroy();
    lock.giveBack();
}

/// Takes the call out of our list if it is there, in constant time.
void CC_CallPool::unlist(CC_Call& call)
{
    if (call.m_listedIn != this)
        return;
    call.m_listedIn = nullptr;
    m_calls.remove(std::exchange(call.m_poolElement, nullptr));
}

CC_Call* CC_CallPool::getAcquiredCall(unsigned int index) { return AT(getElement(index)); }

CC_Call* CC_CallPool::AT(TYList<CC_Call*>::Element const* element)
{
    return element != nullptr ? element->getValue() : nullptr;
}

TYList<CC_Call*>::Element* CC_CallPool::getElement(unsigned int index) const
{
    TYList<CC_Call*>::Element* element = m_calls.getFirst();
    while (element != nullptr && index-- > 0)
        element = element->getNext();
    return element;
}

void CC_CallPool::dropCalls(String const&, String const& callName)
{
    String name; // the given one may be a call's own, which can end in here
    try
    {
        name = callName;
    }
    catch (std::bad_alloc const&)
    {
        return; // longer than any call's name
    }
    auto const drop = [&name](CC_Call& call)
    {
        if (name.isEmpty() || name == call.getName())
            dropCall(call);
    };
    forEachCall(drop, Lost::FROM_START); // the calls before have no legs any more
}

/// Whatever the visits release, and whatever ends in here, us among them.
template <class Visit>
void CC_CallPool::forEachCall(Visit const& visit, Lost whenNextIsLost) const
{
    TYLifeline::Watch const self(m_lifeline);
    CC_Call::Hold current(AT(m_calls.getFirst()));
    for (unsigned int visited = 1; current.get() != nullptr; ++visited)
    {
        {
            CC_Call& call = *current.get();
            CC_Call::Hold next(AT(call.m_poolElement->getNext()));
            visit(call);
            current.swap(next); // with the scope the visited call may end, and who hears of it may release others
        }
        while (self.isAlive() && current.get() != nullptr && current.get()->m_listedIn != this)
        {
            CC_Call::Hold other(AT(getElement(whenNextIsLost == Lost::FROM_START ? 0 : visited)));
            current.swap(other);
        }
        if (!self.isAlive())
            return;
    }
}

void CC_CallPool::dropCall(CC_Call& call)
{
    CC_Call::Hold const keepCall(&call);
    if (call.removeAllCallLegs())
        return;
    if (RTD::Monitor const* const monitor = CC_Monitor::FOR(RTD::LEVEL_FAILURE))
        monitor->debug("[Call %s] Legs come back for ever: some stay", call.getName().c_str());
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
    TYLifeline::Watch const self(m_lifeline);
    TYPPtr<IRebootMgmt> const own(m_rebootMgmt);
    RECORD(CC_RecordFormat::Kind::LOCK_TAKEN);
    ASK(own, [](IRebootMgmt& rebootMgmt)
        { std::ignore = rebootMgmt.addGracefulLock(LOCK_OWNER, LOCK_REASON, 0); }); // a refusal stops no call
    if (!self.isAlive())
        RELEASE_LOCK(own); // nobody else would
}

void CC_CallPool::releaseReloadGracefulLock() { RELEASE_LOCK(m_rebootMgmt); }

InfoContainer& CC_CallPool::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                    unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    NestingGuard const nesting(s_infoDepth);
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Call Pool", String::addressOf(this));
    if (maxLevel < level + 1 || maxDetail < detail || !nesting.isOutermost())
        return info;
    forEachCall([&](CC_Call const& call)
                { call.getInfo(info, maxLevel, level + 1, maxDetail, detail, String::s_empty); },
                Lost::GO_ON);
    return info;
}
