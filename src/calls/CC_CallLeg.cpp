#include "calls/CC_CallLeg.h"

#include "calls/CC_Call.h"
#include "calls/CC_Monitor.h"
#include "platform/base/NestingGuard.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyBrief.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyKind.h"
#include "recorder/CC_RecordWriter.h"
#include "services/CC_Service.h"

#include <limits>
#include <new>
#include <tuple>
#include <typeinfo>
#include <utility>

unsigned int CC_CallLeg::s_numberOfInstances = 0;
TYInstances<CC_CallLeg> CC_CallLeg::s_instances;

namespace
{
unsigned int s_infoDepth = 0;
unsigned long long s_lastSerial = 0;

/// A leg's news that is under way, on the stack of who tells it.
struct Telling
{
    CC_CallLeg const& leg;
    unsigned int number;
    Telling const* outer;
};
Telling const* s_telling = nullptr;

/// Whether somebody logs it.
bool LOG_PROPERTY(String const& legName, CC_Property const& property)
{
    // a quality record prints as many lines
    bool const isBulky = property.getId() == CC_PropertyId::QUALITY_OF_SERVICE;
    RTD::Monitor const* const monitor = CC_Monitor::FOR(isBulky ? RTD::LEVEL_BULK : RTD::LEVEL_CHANGE);
    if (monitor == nullptr)
        return false;
    try
    {
        String value;
        property.getValueString(value);
        if (isBulky)
            monitor->debug("[EP %s] Set call-leg property: %s\n%s", legName.c_str(), property.getPropertyName(),
                           value.c_str());
        else
            monitor->debug("[EP %s] Set call-leg property: %s -> %s", legName.c_str(), property.getPropertyName(),
                           value.c_str());
    }
    catch (std::bad_alloc const&)
    {
        // a log line is not worth a call
    }
    return true;
}

bool IS_LOGGED() { return CC_Monitor::FOR(RTD::LEVEL_CHANGE) != nullptr; }

using State = CC_PropertyCallLegState;

bool IS_RELEASED(CC_Property const& property)
{
    auto const* const state = State::FROM(&property);
    return state != nullptr && state->getState() == State::RELEASED;
}
} // namespace

CC_CallLeg::CC_CallLeg() : m_serial(++s_lastSerial), m_start(CC_Moment::NOW()), m_stateSince(m_start)
{
    ++s_numberOfInstances;
    s_instances.add(*this);
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->add(CC_RecordFormat::Kind::LEG_MADE, 0, m_serial);
    // straight into the container: this is the one time that the state is IDLE. What memory refuses is absent, and a
    // leg without State counts as released.
    m_properties.append<CC_PropertyCallLegState>(CC_PropertyId::STATE, CC_PropertyCallLegState::IDLE);
    m_state = m_properties.get(CC_PropertyId::STATE) != nullptr ? State::IDLE : State::RELEASED;
    m_properties.append<CC_PropertyBoolean>(CC_PropertyId::PROVIDES_DATA);
    m_properties.append<CC_PropertyCause>(CC_PropertyId::CAUSE);
}

CC_CallLeg::~CC_CallLeg()
{
    m_isEnding = true;
    // an observer that takes and gives up a reference in here must not find the last one a second time
    m_referenceCount.store(std::numeric_limits<int>::max() / 2, std::memory_order_relaxed);
    if (m_call != nullptr)
    {
        m_observers.broadcastEvent(CC_EvCallLegCallRelinked(*this, nullptr, m_call),
                                   &CC_CallLegObserver::onCallLegCallRelinked);
        m_call = nullptr;
    }
    m_observers.broadcastEvent(CC_EvCallLegObservationEnded(*this), &CC_CallLegObserver::onCallLegObservationEnded);
    m_observers.silence();
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->add(CC_RecordFormat::Kind::LEG_ENDED, 0, m_serial);
    s_instances.remove(*this);
    --s_numberOfInstances;
}

void CC_CallLeg::addReference() { m_referenceCount.fetch_add(1); }

void CC_CallLeg::removeReference()
{
    if (m_referenceCount.fetch_sub(1) == 1)
        delete this;
}

XCode CC_CallLeg::setName(String const& name)
{
    try
    {
        m_name = name;
        if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
            recorder->addText(CC_RecordFormat::Kind::LEG_NAMED, getCallSerial(), m_serial, 0, m_name);
        return XCode::OK;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

XCode CC_CallLeg::addCallLegObserver(CC_CallLegObserver* observer) { return m_observers.addObserver(observer); }

void CC_CallLeg::removeCallLegObserver(CC_CallLegObserver const* observer) { m_observers.removeObserver(observer); }

int CC_CallLeg::getState() const
{
    return m_mayChangeUntold || !m_properties.isSelfContained() ? findState() : m_state;
}

__attribute__((noinline)) int CC_CallLeg::findState() const
{
    auto const* const state = CC_PropertyCallLegState::FROM(m_properties.get(CC_PropertyId::STATE));
    return state != nullptr ? state->getState() : CC_PropertyCallLegState::RELEASED;
}

XCode CC_CallLeg::setPropertyNoNotification(CC_Property const& property, bool& changed)
{
    Reference const self(*this);
    m_mayChangeUntold = true;
    return store(property, changed);
}

/// `isNew`: there is none of that id, and nobody was called since that was known.
XCode CC_CallLeg::store(CC_Property const& property, bool& changed, bool isNew)
{
    changed = false;
    CC_Property* stored = isNew ? nullptr : m_properties.find(property.getId());
    if (stored != nullptr && stored->isEqual(property))
        return XCode::OK;
    auto const isLeftOut = [&]
    { return m_isStateFixed && property.getId() == CC_PropertyId::STATE && !IS_RELEASED(property); };
    if (isLeftOut())
        return XCode::OK;
    if (LOG_PROPERTY(m_name, property) || !m_properties.isSelfContained())
    {
        stored = m_properties.find(property.getId()); // a monitor is the host's code, a comparison maybe a module's
        if (isLeftOut())
            return XCode::OK; // let go meanwhile
    }
    bool const isState = property.getId() == CC_PropertyId::STATE;
    changed = (isState ? replaceState(stored, property) : replace(stored, property)).isOk();
    return changed ? XCode::OK : XCode::REFUSED;
}

/// A leg never goes back to IDLE, and its State is of no other class. The state of the call is that of its legs: it
/// changes where one becomes active or ceases to be.
XCode CC_CallLeg::replaceState(CC_Property* stored, CC_Property const& property)
{
    auto const* const state = State::FROM(&property);
    if (state == nullptr || state->getState() == State::IDLE)
        return XCode::REFUSED;
    int const level = state->getState();
    if (!replace(stored, property).isOk())
        return XCode::REFUSED;
    if (m_state != State::IDLE || m_observers.getNumberOfEntries() != 0)
        m_stateSince = CC_Moment::NOW();
    bool const wasActive = isSeenActive();
    m_state = level;
    if (m_call != nullptr && isSeenActive() != wasActive)
        m_call->noticeState(&m_stateSince);
    return XCode::OK;
}

XCode CC_CallLeg::replace(CC_Property* stored, CC_Property const& property)
{
    return CC_RecordWriter::ON() == nullptr ? m_properties.replace(stored, property)
                                            : replaceRecorded(stored, property);
}

/// Apart, so that who does not record does not pay for it.
__attribute__((noinline)) XCode CC_CallLeg::replaceRecorded(CC_Property* stored, CC_Property const& property)
{
    return CC_PropertyBrief::REPLACE(m_properties, stored, property, CC_RecordFormat::Kind::LEG_CHANGED,
                                     getCallSerial(), m_serial);
}

unsigned long long CC_CallLeg::getCallSerial() const { return m_call != nullptr ? m_call->getSerial() : 0; }

XCode CC_CallLeg::setProperty(CC_Property const& property)
{
    Reference const self(*this); // the property and whoever logs it are others' code, as observers are
    CC_Flags flags;
    bool changed = false;
    if (!storeAndMark(property, flags, changed).isOk())
        return XCode::FAILURE;
    if (changed)
        notifyPropertyChange(flags);
    return XCode::OK;
}

XCode CC_CallLeg::setProperties(CC_PropertyContainer const& properties)
{
    Reference const self(*this);
    CC_Flags flags;
    XCode const result = storeAny(properties, flags);
    notifyPropertyChange(flags);
    return result;
}

XCode CC_CallLeg::setMarked(CC_PropertyContainer const& properties, Marks& marks)
{
    Reference const self(*this);
    CC_Flags flags;
    XCode result = XCode::OK;
    if (!storeMarked(properties, marks, flags, result))
    {
        result = storeAny(properties, flags);
        marks = differencesTo(properties);
    }
    notifyPropertyChange(flags);
    return result;
}

/// Whether the leg and the properties have the same ids at the marked places, and nobody is called; otherwise nothing,
/// or not all, is stored.
bool CC_CallLeg::storeMarked(CC_PropertyContainer const& properties, Marks& marks, CC_Flags& flags, XCode& result)
{
    if (marks == CC_PropertyContainer::ALL_MARKED || IS_LOGGED() || !m_properties.isSelfContained() ||
        !properties.isSelfContained() || properties.getNumberOfProperties() != m_properties.getNumberOfProperties())
        return false;
    CC_RecordWriter::Batch const together;
    bool const isRecorded = CC_RecordWriter::ON() != nullptr;
    unsigned int differing = 0;
    CC_Property const* state = nullptr;
    auto const storeNext = [&](CC_Property& stored, CC_Property const& property, unsigned int mark)
    {
        CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(stored, property);
        if (kind == nullptr)
            return false; // the long way knows what to do with another class
        if (kind->isEqual(stored, property))
            return true;
        differing |= mark;
        if (property.getId() == CC_PropertyId::STATE)
            state = &property;
        else if (isRecorded ? replaceRecorded(&stored, property).isOk() : kind->assign(stored, property))
            markChanged(property.getId(), flags);
        else if (result.isOk())
            result = XCode::REFUSED;
        return true;
    };
    if (!m_properties.forEachMarked(properties, marks, storeNext))
        return false;
    bool changed = false;
    if (state != nullptr)
        if (XCode const stored = storeAndMark(*state, flags, changed); result.isOk())
            result = stored;
    marks = static_cast<Marks>(differing);
    return true;
}

/// What is to be compared the next time, after all was written: everything, unless both have the same order.
CC_CallLeg::Marks CC_CallLeg::differencesTo(CC_PropertyContainer const& properties) const
{
    if (!m_properties.isSelfContained() || !properties.isSelfContained() ||
        properties.getNumberOfProperties() != m_properties.getNumberOfProperties())
        return CC_PropertyContainer::ALL_MARKED;
    unsigned int differing = 0;
    auto const compare = [&](CC_Property const& stored, CC_Property const& property, unsigned int mark)
    {
        if (!stored.isEqual(property))
            differing |= mark;
        return true;
    };
    bool const areAlike = m_properties.forEachMarked(properties, CC_PropertyContainer::ALL_MARKED, compare);
    return areAlike ? static_cast<Marks>(differing) : CC_PropertyContainer::ALL_MARKED;
}

XCode CC_CallLeg::storeAny(CC_PropertyContainer const& properties, CC_Flags& flags)
{
    if (m_properties.takesUndisturbed(properties))
        return storeAll(properties, XCode::OK, flags);
    CC_PropertyContainer kept; // a module's classes may change or end the given ones meanwhile
    XCode const isWhole = kept.copy(properties);
    return storeAll(kept, isWhole.isOk() ? XCode::OK : XCode::REFUSED, flags);
}

/// `result`: that of what was done before.
XCode CC_CallLeg::storeAll(CC_PropertyContainer const& properties, XCode result, CC_Flags& flags)
{
    CC_RecordWriter::Batch const together;
    CC_Property const* state = nullptr;
    // nearly all that come through filters are known; of the first ones none is, and need not be looked for twice
    CC_PropertyContainer::Cursor formers(m_properties);
    auto const areOurs = [&] { return m_properties.isSelfContained() && properties.isSelfContained(); };
    bool areKnown = properties.getNumberOfProperties() <= m_properties.getNumberOfProperties() && areOurs();
    bool const areFirst = !areKnown && !IS_LOGGED(); // who logs may write to the leg
    CC_PropertyContainer::Met ids;                   // of the leg
    if (areFirst)
        for (CC_Property const& property : m_properties)
            std::ignore = ids.meets(property.getId());
    auto const storeNext = [&](CC_Property const& property)
    {
        CC_Property const* const former = areKnown ? formers.find(property.getId()) : nullptr;
        if (former != nullptr && former->isEqual(property))
            return;
        bool changed = false;
        bool const isNew = areFirst && !ids.meets(property.getId()) && areOurs();
        if (XCode const stored = storeAndMark(property, flags, changed, isNew); result.isOk())
            result = stored;
        areKnown = former != nullptr && areOurs();
        formers = CC_PropertyContainer::Cursor(m_properties); // who logs it may have written to the leg
    };
    for (CC_Property const& property : properties)
    {
        if (property.getId() == CC_PropertyId::STATE)
            state = &property;
        else
            storeNext(property);
    }
    if (state != nullptr)
        storeNext(*state);
    return result;
}

/// Stores one property and marks it in the flags if it changed.
XCode CC_CallLeg::storeAndMark(CC_Property const& property, CC_Flags& flags, bool& changed, bool isNew)
{
    XCode const result = store(property, changed, isNew);
    if (changed)
        markChanged(property.getId(), flags);
    return result;
}

void CC_CallLeg::markChanged(unsigned int id, CC_Flags& flags)
{
    bool const isTold = flags.set(id, true).isOk();
    if (!isTold)
        m_mayChangeUntold = true;
    // a change that memory keeps from being told must not keep the call from being cleaned up
    if ((!isTold || m_isMissedByCall) && m_call != nullptr)
        m_call->defer();
}

/// Hands the flags over: a copy could lack memory, and the call must hear of a State.
void CC_CallLeg::notifyPropertyChange(CC_Flags& flags)
{
    Telling const telling{*this, ++m_numberOfNotifications, s_telling};
    s_telling = &telling;
    CC_RecordWriter::ON() == nullptr ? tell(flags) : tellRecorded(flags);
    s_telling = telling.outer;
}

bool CC_CallLeg::isTellingTheLast() const
{
    Telling const* telling = s_telling;
    while (telling != nullptr && &telling->leg != this)
        telling = telling->outer;
    return telling != nullptr && telling->number == m_numberOfNotifications;
}

void CC_CallLeg::tell(CC_Flags& flags)
{
    m_observers.broadcastEvent(CC_EvCallLegPropertyChanged(*this, std::move(flags)),
                               &CC_CallLegObserver::onCallLegPropertyChanged);
}

/// Apart, as above.
__attribute__((noinline)) void CC_CallLeg::tellRecorded(CC_Flags& flags)
{
    CC_Writing::Outside const byWhoeverIsTold;
    tell(flags);
}

void CC_CallLeg::invokeSynchronousService(CC_Service& service)
{
    Reference const self(*this);
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->addText(CC_RecordFormat::Kind::SERVICE, getCallSerial(), m_serial, 0, typeid(service).name());
    m_observers.broadcastEvent(CC_EvCallLegSynchronousService(*this, service),
                               &CC_CallLegObserver::onCallLegSynchronousService);
}

InfoContainer& CC_CallLeg::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                   unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    NestingGuard const nesting(s_infoDepth);
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Call Leg",
                   m_name.isEmpty() ? String::addressOf(this) : m_name);
    if (level < maxLevel && detail < maxDetail && nesting.isOutermost())
    {
        Reference const self(const_cast<CC_CallLeg&>(*this)); // what a property says of itself may drop it
        if (m_call != nullptr)
            m_call->getInfo(info, maxLevel, level + 1, maxDetail, detail + 1, String::s_empty);
        m_properties.getInfo(info, maxLevel, level + 1, maxDetail, detail + 1, String::s_empty);
    }
    return info;
}
