#include "host/CallControlHost.h"

#include "callcontrol/CallControl.h"
#include "host/EmergencyCall.h"
#include "host/MediaContexts.h"
#include "media/context/MediaLayer.h"
#include "platform/driver/DRIVER.h"
#include "properties/CC_PropertyTable.h"

#include <stdexcept>
#include <tuple>

CallControlHost::CallControlHost(TYEventLoop& callControl, TYEventLoop& datapath, String const& contextName,
                                 MediaLayer* media)
    : m_callControl(callControl), m_contextName(contextName), m_rebootLock(new RebootLock)
{
    CallControl::SET_CC_EVENT_LOOP(&callControl);
    CallControl::SET_DP_EVENT_LOOP(media != nullptr ? &media->getDatapathLoop() : &datapath);
    CallControl::SET_MG_CONTEXT_REPOSITORY(media != nullptr ? media->getContexts() : new MediaContextRepository);
    CallControl::SET_MG_TERMINATION_REPOSITORY(media != nullptr ? media->getTerminations()
                                                                : new MediaTerminationRepository);
    if (!DRIVER::INSTANCE().addDriverInterface(m_rebootLock.get(), TY::UUID::INVALID(), "reboot").isOk() ||
        !CallControl::ADD_PROPERTY_FACTORY(&m_factory).isOk() || !CallControl::CREATE_CONTEXT(contextName).isOk())
        throw std::runtime_error("call control cannot be set up");
    if (CC_PropertyTable::FIND(EmergencyCall::PROPERTY) == nullptr) // for logs alone
        std::ignore = CC_PropertyTable::DECLARE(EmergencyCall::PROPERTY, "Emergency", "emergency");
}

CallControlHost::~CallControlHost()
{
    runPending(); // calls that ended a moment ago go back to their pool
    CallControl::DESTROY_CONTEXT(m_contextName);
    runPending();
    CallControl::REMOVE_PROPERTY_FACTORY(&m_factory);
    DRIVER::INSTANCE().removeDriverInterface(m_rebootLock.get());
    CallControl::SET_MG_TERMINATION_REPOSITORY(nullptr);
    CallControl::SET_MG_CONTEXT_REPOSITORY(nullptr);
    CallControl::SET_DP_EVENT_LOOP(nullptr);
    CallControl::SET_CC_EVENT_LOOP(nullptr);
}

void CallControlHost::runPending()
{
    while (m_callControl.runTurn())
    {
    }
}

CallControlHost::Registration::Registration(String const& contextName, String const& name, CC_Provider& provider)
    : m_contextName(contextName), m_name(name)
{
    if (!CallControl::ADD_PROVIDER(m_contextName, m_name, provider).isOk())
        throw std::runtime_error("the name is taken");
}

CallControlHost::Registration::~Registration() { CallControl::REMOVE_PROVIDER(m_contextName, m_name); }
