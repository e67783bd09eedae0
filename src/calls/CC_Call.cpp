#include "calls/CC_Call.h"

#include "calls/CC_CallLeg.h"
#include "calls/CC_Monitor.h"
#include "environment/CC_Environment.h"
#include "platform/base/Assert.h"
#include "platform/base/NameOf.h"
#include "platform/base/NestingGuard.h"
#include "platform/eventloop/TYEventLoop.h"
#include "properties/CC_PropertyBrief.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "recorder/CC_RecordWriter.h"

#include <limits>
#include <new>
#include <tuple>
#include <utility>

unsigned int CC_Call::s_numberOfInstances = 0;
TYInstances<CC_Call> CC_Call::s_instances;

namespace
{
unsigned int s_infoDepth = 0;
unsigned long long s_lastSerial = 0;
unsigned int s_numberOfChanges = 0;

void LOG_PROPERTY(String const& callName, CC_Property const& property)
{
    RTD::Monitor const* const monitor = CC_Monitor::FOR(RTD::LEVEL_CHANGE);
    if (monitor == nullptr)
        return;
    try
    {
        String value;
        property.getValueString(value);
        monitor->debug("[Call %s] Set call property: %s -> %s", callName.c_str(), property.getPropertyName(),
                       value.c_str());
    }
    catch (std::bad_alloc const&)
    {
        // a log line is not worth a call
    }
}
} // namespace

CC_Call::CC_Call()
    : m_name(String::addressOf(this)) // short enough to need no memory
    , m_serial(++s_lastSerial)
    , m_start(CC_Moment::NOW())
    , m_stateSince(m_start)
{
    ++s_numberOfInstances;
    s_instances.add(*this);
    TYEventLoop* const loop = CC_Environment::CC_EVENT_LOOP();
    TY_ASSERT(loop != nullptr, "a call before CallControl::SET_CC_EVENT_LOOP");
    TY_ASSERT(loop->isLoopThread(), "a call made off the call-control loop's thread");
    if (loop != nullptr)
        m_deferredEvent = new (std::nothrow) TYEvent(*loop, EventPrio::HIGH, DEFERRED, this);
    std::ignore = addCallLegObserver(this); // the first entry needs no memory
}

CC_Call::~CC_Call()
{
    m_isEnding = true;
    ++m_holds; // who releases the call from in here finds it held
    removeCallLegObserver(this);
    destroyParticipatingCallLegs();
    m_callLegObservers.silence();
    m_callObservers.broadcastEvent(CC_EvCallObservationEnded(*this), &CC_CallObserver::onCallObservationEnded);
    m_callObservers.silence();
    if (m_deferredEvent != nullptr)
        std::exchange(m_deferredEvent, nullptr)->destroy();
    m_callPool = nullptr;
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->add(CC_RecordFormat::Kind::CALL_ENDED, m_serial, 0);
    s_instances.remove(*this);
    --s_numberOfInstances;
}

void CC_Call::destroy()
{
    if (m_holds == 0)
        delete this;
    else
    {
        m_isReleased = true;
        m_callPool = nullptr;
    }
}

CC_Call::Hold::Hold(CC_Call* call) : m_call(call)
{
    if (m_call != nullptr)
        ++m_call->m_holds;
}

CC_Call::Hold::~Hold()
{
    if (m_call != nullptr && --m_call->m_holds == 0 && m_call->m_isReleased)
        delete m_call;
}

XCode CC_Call::addCallObserver(CC_CallObserver* observer) { return m_callObservers.addObserver(observer); }

void CC_Call::removeCallObserver(CC_CallObserver const* observer) { m_callObservers.removeObserver(observer); }

XCode CC_Call::addCallLegObserver(CC_CallLegObserver* observer)
{
    if (XCode const result = m_callLegObservers.addObserver(observer); !result.isOk())
        return result;
    for (unsigned int i = 0; i < m_callLegs.getSize(); ++i)
    {
        if (addLegObserver(*m_callLegs[i], observer).isOk())
            continue;
        // whoever is refused does not unregister, so nothing may stay
        while (i-- > 0)
            removeLegObserver(*m_callLegs[i], observer);
        m_callLegObservers.removeObserver(observer);
        return XCode::NO_ELEMENT;
    }
    return XCode::OK;
}

void CC_Call::removeCallLegObserver(CC_CallLegObserver const* observer)
{
    m_callLegObservers.removeObserver(observer);
    for (CC_CallLeg* const leg : m_callLegs)
        removeLegObserver(*leg, observer);
}

XCode CC_Call::setPropertyNoNotification(CC_Property const& property, bool& changed)
{
    Hold const self(this); // the property and whoever logs it are others' code
    changed = false;
    CC_Property const* const stored = m_properties.get(property.getId());
    if (stored != nullptr && stored->isEqual(property))
        return XCode::OK;
    LOG_PROPERTY(m_name, property);
    if (!replace(property).isOk())
        return XCode::REFUSED;
    changed = true;
    return XCode::OK;
}

XCode CC_Call::replace(CC_Property const& property)
{
    return CC_RecordWriter::ON() == nullptr ? m_properties.set(property) : replaceRecorded(property);
}

/// Apart, so that who does not record does not pay for it.
__attribute__((noinline)) XCode CC_Call::replaceRecorded(CC_Property const& property)
{
    return CC_PropertyBrief::REPLACE(m_properties, m_properties.find(property.getId()), property,
                                     CC_RecordFormat::Kind::CALL_CHANGED, m_serial, 0);
}

unsigned int CC_Call::GET_NUMBER_OF_CHANGES() { return s_numberOfChanges; }

/// Hands the flags over.
void CC_Call::tellChange(CC_Flags& flags)
{
    ++s_numberOfChanges;
    CC_Writing const byWhoeverIsTold(CC_RecordFormat::Writer::OUTSIDE);
    m_callObservers.broadcastEvent(CC_EvCallPropertyChanged(*this, std::move(flags)),
                                   &CC_CallObserver::onCallPropertyChanged);
}

XCode CC_Call::setProperty(CC_Property const& property)
{
    Hold const self(this);
    bool changed = false;
    if (!setPropertyNoNotification(property, changed).isOk())
        return XCode::FAILURE;
    if (changed)
    {
        CC_Flags flags;
        std::ignore = flags.set(property.getId(), true); // without memory the observers hear of a change, not of which
        tellChange(flags);
    }
    return XCode::OK;
}

XCode CC_Call::setProperties(CC_PropertyContainer const& properties)
{
    Hold const self(this);
    if (m_properties.takesUndisturbed(properties))
        return storeAll(properties, XCode::OK);
    CC_PropertyContainer kept; // a module's classes may change or end the given ones meanwhile
    XCode const isWhole = kept.copy(properties);
    return storeAll(kept, isWhole.isOk() ? XCode::OK : XCode::REFUSED);
}

/// `result`: that of what was done before.
XCode CC_Call::storeAll(CC_PropertyContainer const& properties, XCode result)
{
    CC_Flags flags;
    for (CC_Property const& property : properties)
    {
        bool changed = false;
        if (XCode const stored = setPropertyNoNotification(property, changed); result.isOk())
            result = stored;
        if (changed)
            std::ignore = flags.set(property.getId(), true); // as in setProperty
    }
    tellChange(flags);
    return result;
}

CC_CallLeg* CC_Call::getCallLeg(unsigned int index) const
{
    return index < m_callLegs.getSize() ? m_callLegs[index] : nullptr;
}

unsigned int CC_Call::getNumberOfOtherCallLegs(CC_CallLeg const& leg) const
{
    return m_callLegs.getSize() - (isListed(leg) ? 1 : 0);
}

CC_CallLeg* CC_Call::getOtherCallLeg(unsigned int index, CC_CallLeg const& leg) const
{
    for (CC_CallLeg* const other : m_callLegs)
        if (other != &leg && index-- == 0)
            return other;
    return nullptr;
}

namespace
{
template <class CallLegs>
CC_CallLeg* MOST_ACTIVE(CallLegs const& callLegs, CC_CallLeg const* excluded, CC_CallLeg const* preferred)
{
    CC_CallLeg* result = nullptr;
    int best = std::numeric_limits<int>::min();
    for (CC_CallLeg* const leg : callLegs)
    {
        if (leg == excluded)
            continue;
        int const level = leg->getActivityLevel();
        if (level > best || (level == best && leg == preferred))
        {
            result = leg;
            best = level;
        }
    }
    return result;
}
} // namespace

CC_CallLeg* CC_Call::getMostActiveCallLeg(CC_CallLeg const* preferred) const
{
    return MOST_ACTIVE(m_callLegs, nullptr, preferred);
}

CC_CallLeg* CC_Call::getOtherMostActiveCallLeg(CC_CallLeg const& excluded, CC_CallLeg const* preferred) const
{
    return MOST_ACTIVE(m_callLegs, &excluded, preferred);
}

namespace
{
template <class IsActive>
CC_Call::State STATE_OF(TYSmallVector<CC_CallLeg*, 4> const& legs, IsActive const& isActive)
{
    unsigned int active = 0;
    for (CC_CallLeg const* const leg : legs)
        if (isActive(*leg))
            ++active;
    return active < 2 ? CC_Call::INACTIVE : active == 2 ? CC_Call::ACTIVE : CC_Call::CONFERENCE;
}
} // namespace

CC_Call::State CC_Call::getState() const
{
    return STATE_OF(m_callLegs, [](CC_CallLeg const& leg)
                    { return leg.getActivityLevel() >= CC_PropertyCallLegState::DISCONNECTING; });
}

/// An active leg has joined or left, or a leg has become active or ceased to be, at that moment (null: now).
void CC_Call::noticeState(CC_Moment const* moment)
{
    State const state = STATE_OF(m_callLegs, [](CC_CallLeg const& leg) { return leg.isSeenActive(); });
    if (state == m_noticedState)
        return;
    m_noticedState = state;
    m_stateSince = moment != nullptr ? *moment : CC_Moment::NOW();
}

void CC_Call::onCallLegObservationEnded(CC_Event<CC_CallLeg> const&) {}

void CC_Call::onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) {}

void CC_Call::onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event)
{
    CC_Flags const& flags = CC_EvCallLegPropertyChanged::FROM(event).getFlags();
    if (flags.get(CC_PropertyId::STATE) || flags.get(CC_PropertyId::NETWORK))
        defer();
}

void CC_Call::onCallLegSynchronousService(CC_Event<CC_CallLeg> const&) {}

InfoContainer& CC_Call::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                                unsigned int detail, String const& prefix) const
{
    NestingGuard const nesting(s_infoDepth);
    Hold const self(const_cast<CC_Call*>(this)); // what a property says of itself may end it, or move legs
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Call", m_name);
    if (maxLevel >= level + 1)
    {
        info.addWithin(maxLevel, level + 1, maxDetail, detail + 1, String::s_empty, "State", STATE_NAME(getState()));
        if (maxDetail >= detail + 1 && nesting.isOutermost())
            m_properties.getInfo(info, maxLevel, level + 1, maxDetail, detail + 1, String::s_empty);
        info.addWithin(maxLevel, level + 1, maxDetail, detail + 4, String::s_empty, "Pool",
                       String::addressOf(m_callPool));
        info.addWithin(maxLevel, level + 1, maxDetail, detail + 1, String::s_empty, "Call Legs", String::s_empty);
    }
    if (nesting.isOutermost() && maxLevel >= level + 2 && maxDetail >= detail + 1)
        for (unsigned int i = 0; i < m_callLegs.getSize(); ++i)
            m_callLegs[i]->getInfo(info, maxLevel, level + 2, maxDetail, detail + 1, String::s_empty);
    return info;
}

char const* CC_Call::STATE_NAME(State state)
{
    static constexpr NamedValue<State> NAMES[] = {
        {INACTIVE, "INACTIVE"}, {ACTIVE, "ACTIVE"}, {CONFERENCE, "CONFERENCE"}};
    return NAME_OF(NAMES, state);
}

char const* CC_Call::LIVE_STATE_NAME(LiveState state)
{
    static constexpr NamedValue<LiveState> NAMES[] = {{RELEASED, "RELEASED"}, {ACQUIRED, "ACQUIRED"}};
    return NAME_OF(NAMES, state);
}
