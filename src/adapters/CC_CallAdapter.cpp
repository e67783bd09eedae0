#include "adapters/CC_CallAdapter.h"

#include "adapters/CC_CallAdapterObserver.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "adapters/CC_CallAdapter_Log.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "platform/base/NameOf.h"
#include "platform/base/NestingGuard.h"
#include "recorder/CC_RecordWriter.h"
#include "services/CC_Service.h"

#include <array>
#include <cstdio>
#include <new>
#include <tuple>
#include <utility>

unsigned int CC_CallAdapter::s_numberOfInstances = 0;
TYInstances<CC_CallAdapter> CC_CallAdapter::s_instances;

CC_CallAdapterObserver::~CC_CallAdapterObserver() = default;

CC_CallAdapter::CC_CallAdapter()
{
    ++s_numberOfInstances;
    s_instances.add(*this);
}

CC_CallAdapter::~CC_CallAdapter()
{
    CC_CallAdapter::cleanup();
    s_instances.remove(*this);
    --s_numberOfInstances;
}

XCode CC_CallAdapter::setup(String const& name, CC_Endpoint& endpoint, CC_CallAdapterObserver* observer)
{
    TYLifeline::Watch const self(m_lifeline);
    String newName; // made first: the given one may be that of the leg
    try
    {
        newName = nameOrAddress(name);
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
    bool const wasResetting = std::exchange(m_isResetting, true);
    dropOwnCallLeg(QCause::UNSPECIFIED, 0);
    if (!self.isAlive())
        return XCode::FAILURE;
    m_isResetting = wasResetting; // the outermost one ends it
    m_name = std::move(newName);
    m_observer = observer;
    m_endpoint = &endpoint;
    return XCode::OK;
}

void CC_CallAdapter::cleanup()
{
    TYLifeline::Watch const self(m_lifeline);
    bool const wasResetting = std::exchange(m_isResetting, true);
    dropOwnCallLeg(QCause::UNSPECIFIED, 0);
    if (!self.isAlive())
        return;
    letGoOfTheRest();
    if (!self.isAlive())
        return;
    m_isResetting = wasResetting;
    m_endpoint = nullptr;
    m_name.clear();
    m_observer = nullptr;
}

String CC_CallAdapter::nameOrAddress(String const& name) const
{
    return name.isEmpty() ? String::addressOf(this) : name;
}

void CC_CallAdapter::setName(String const& name)
{
    try
    {
        String newName = nameOrAddress(name);
        if (newName == m_name)
            return;
        TYLifeline::Watch const self(m_lifeline);
        if (Log const log(*this, RTD::LEVEL_NAMING); log.isWanted())
            log->debug("[EP %s/%s] Set name: %s", log.getEndpointName(), m_name.c_str(), newName.c_str());
        if (!self.isAlive())
            return;
        m_name = std::move(newName);
        if (m_ownCallLeg == nullptr)
            return;
        String const legName = makeCallLegName(); // the endpoint may end us, or the leg
        if (self.isAlive() && m_ownCallLeg != nullptr)
            std::ignore = m_ownCallLeg->setName(legName); // without memory the leg keeps its old name
    }
    catch (std::bad_alloc const&)
    {
        // the name is for logs and dumps: the old one serves
    }
}

char const* CC_CallAdapter::getEndpointName() const
{
    return m_endpoint != nullptr ? m_endpoint->getName().c_str() : "";
}

String CC_CallAdapter::makeCallLegName() const
{
    String const name = String("/") += m_name; // first: the endpoint may destroy us when it is asked for its own
    return m_endpoint->getName() + name;
}

String const& CC_CallAdapter::getCallLegName() const
{
    return m_ownCallLeg != nullptr ? m_ownCallLeg->getName() : String::s_empty;
}

CC_Call* CC_CallAdapter::getCall() const { return m_ownCallLeg != nullptr ? m_ownCallLeg->getCall() : nullptr; }

void CC_CallAdapter::invokeSynchronousService(CC_Service& service)
{
    if (m_ownCallLeg == nullptr)
        return;
    Attempt const attempt(*this);
    try
    {
        if (Log const log(*this, RTD::LEVEL_FLOW); log.isWanted())
            if (String const text = service.getInfo(); !attempt.isOver())
                log->debug("[EP %s/%s] Invoke service: %s", log.getEndpointName(), m_name.c_str(), text.c_str());
    }
    catch (std::bad_alloc const&)
    {
        // a log line is not worth a service
    }
    if (!attempt.isOver())
        m_ownCallLeg->invokeSynchronousService(service);
}

InfoContainer& CC_CallAdapter::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                       unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    static unsigned int s_infoDepth = 0;
    static String const NEAR_END("Near End ");
    static String const FAR_END("Far End ");
    static String const CALL("Call ");
    NestingGuard const nesting(s_infoDepth);
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Call Adapter", m_name);
    if (level >= maxLevel || detail > maxDetail || !nesting.isOutermost())
        return info;
    TYLifeline::Watch const self(m_lifeline); // the endpoint, and what a property says of itself, may end us
    auto const dump = [&](auto const& what, String const& side)
    { what.getInfo(info, maxLevel, level + 1, maxDetail, detail, side); };
    if (m_endpoint != nullptr)
        dump(*m_endpoint, NEAR_END);
    if (self.isAlive())
        dump(m_ownView.getProperties(), NEAR_END);
    if (self.isAlive())
        dump(m_peerView.getProperties(), FAR_END);
    if (self.isAlive())
        dump(m_callView.getProperties(), CALL);
    if (self.isAlive() && m_ownCallLeg != nullptr)
        dump(*m_ownCallLeg, NEAR_END);
    if (self.isAlive() && m_peerCallLeg != nullptr)
        dump(*m_peerCallLeg, FAR_END);
    return info;
}

XCode CC_CallAdapter::Attempt::fail(char const* reason, XCode result) const
{
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON(); recorder != nullptr && !isOver())
    {
        std::array<char, CC_RecordFormat::LARGEST_TEXT> text;
        std::snprintf(text.data(), text.size(), "%s failed: %s", m_operation, reason);
        recorder->addText(CC_RecordFormat::Kind::FAILED, m_adapter.getCallSerial(), m_adapter.getLegSerial(), 0,
                          text.data());
    }
    if (isOver())
        return result;
    if (Log const log(m_adapter, RTD::LEVEL_FAILURE); log.isWanted() && !isOver())
        log->debug("[EP %s/%s] %s failed: %s", log.getEndpointName(), m_adapter.m_name.c_str(), m_operation, reason);
    return result;
}

void CC_CallAdapter::Attempt::record(CC_RecordFormat::Kind kind, XCode result) const
{
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON(); recorder != nullptr && !isOver())
        recorder->add(kind, m_adapter.getCallSerial(), m_adapter.getLegSerial(),
                      static_cast<unsigned int>(result.getValue()));
}

unsigned long long CC_CallAdapter::getLegSerial() const
{
    return m_ownCallLeg != nullptr ? m_ownCallLeg->getSerial() : 0;
}

unsigned long long CC_CallAdapter::getCallSerial() const
{
    CC_Call const* const call = getCall();
    return call != nullptr ? call->getSerial() : 0;
}

void CC_CallAdapter::notifyPeerPropertyChange(CC_Flags const&) {}

void CC_CallAdapter::notifyPeerSynchronousService(CC_Service&) {}

char const* CC_CallAdapter::DESTINATION_TYPE_NAME(DestinationType type)
{
    static constexpr NamedValue<DestinationType> NAMES[] = {{NONE, "none"}, {PROVIDER, "provider"}, {TABLE, "table"}};
    return NAME_OF(NAMES, type);
}
