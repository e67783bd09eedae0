// The static interface: each function asks the one object.
#include "callcontrol/CallControl.h"

TYEventLoop* CallControl::GET_CC_EVENT_LOOP() { return INSTANCE()->getCcEventLoop(); }

void CallControl::SET_CC_EVENT_LOOP(TYEventLoop* loop) { INSTANCE()->setCcEventLoop(loop); }

TYSyncEvent& CallControl::GET_CC_SYNC_EVENT(EventPrio::Type priority) { return INSTANCE()->getCcSyncEvent(priority); }

TYEventLoop* CallControl::GET_DP_EVENT_LOOP() { return INSTANCE()->getDpEventLoop(); }

void CallControl::SET_DP_EVENT_LOOP(TYEventLoop* loop) { INSTANCE()->setDpEventLoop(loop); }

TYSyncEvent& CallControl::GET_DP_SYNC_EVENT(EventPrio::Type priority) { return INSTANCE()->getDpSyncEvent(priority); }

MG_IContextRepository* CallControl::GET_MG_CONTEXT_REPOSITORY() { return INSTANCE()->getMgContextRepository(); }

void CallControl::SET_MG_CONTEXT_REPOSITORY(MG_IContextRepository* repository)
{
    INSTANCE()->setMgContextRepository(repository);
}

MG_ITerminationRepository* CallControl::GET_MG_TERMINATION_REPOSITORY()
{
    return INSTANCE()->getMgTerminationRepository();
}

void CallControl::SET_MG_TERMINATION_REPOSITORY(MG_ITerminationRepository* repository)
{
    INSTANCE()->setMgTerminationRepository(repository);
}

CC_Property* CallControl::CREATE_PROPERTY(unsigned int id) { return INSTANCE()->createProperty(id); }

XCode CallControl::ADD_PROPERTY_FACTORY(CC_PropertyFactory* factory) { return INSTANCE()->addPropertyFactory(factory); }

void CallControl::REMOVE_PROPERTY_FACTORY(CC_PropertyFactory* factory) { INSTANCE()->removePropertyFactory(factory); }

XCode CallControl::CREATE_CONTEXT(String const& name) { return INSTANCE()->createContext(name); }

void CallControl::DESTROY_CONTEXT(String const& name) { INSTANCE()->destroyContext(name); }

CC_Context* CallControl::GET_CONTEXT(String const& name) { return INSTANCE()->getContext(name); }

void CallControl::REGISTER_CONTEXT_OBSERVER(ContextObserver& observer)
{
    INSTANCE()->registerContextObserver(observer);
}

void CallControl::UNREGISTER_CONTEXT_OBSERVER(ContextObserver& observer)
{
    INSTANCE()->unregisterContextObserver(observer);
}

String const& CallControl::GET_NATIONAL_PREFIX(String const& contextName)
{
    return INSTANCE()->getNationalPrefix(contextName);
}

XCode CallControl::SET_NATIONAL_PREFIX(String const& contextName, String const& prefix)
{
    return INSTANCE()->setNationalPrefix(contextName, prefix);
}

String const& CallControl::GET_INTERNATIONAL_PREFIX(String const& contextName)
{
    return INSTANCE()->getInternationalPrefix(contextName);
}

XCode CallControl::SET_INTERNATIONAL_PREFIX(String const& contextName, String const& prefix)
{
    return INSTANCE()->setInternationalPrefix(contextName, prefix);
}

unsigned int CallControl::GET_MAX_HOPS(String const& contextName) { return INSTANCE()->getMaxHops(contextName); }

XCode CallControl::SET_MAX_HOPS(String const& contextName, unsigned int maxHops)
{
    return INSTANCE()->setMaxHops(contextName, maxHops);
}

XCode CallControl::ADD_PROVIDER(String const& contextName, String const& providerName, CC_Provider& provider)
{
    return INSTANCE()->addProvider(contextName, providerName, provider);
}

void CallControl::REMOVE_PROVIDER(String const& contextName, String const& providerName)
{
    INSTANCE()->removeProvider(contextName, providerName);
}

unsigned int CallControl::GET_NUMBER_OF_PROVIDERS(String const& contextName)
{
    return INSTANCE()->getNumberOfProviders(contextName);
}

CC_Provider* CallControl::GET_PROVIDER(String const& contextName, unsigned int index)
{
    return INSTANCE()->getProvider(contextName, index);
}

CC_Provider* CallControl::GET_PROVIDER(String const& contextName, String const& providerName)
{
    return INSTANCE()->getProvider(contextName, providerName);
}

InfoContainer& CallControl::GET_PROVIDER_INFO(InfoContainer& info, String const& contextName, unsigned int maxLevel,
                                              unsigned int level, unsigned int maxDetail, unsigned int detail,
                                              String const& prefix)
{
    return INSTANCE()->getProviderInfo(info, contextName, maxLevel, level, maxDetail, detail, prefix);
}

CC_CallPool* CallControl::GET_CALL_POOL(String const& contextName) { return INSTANCE()->getCallPool(contextName); }

CC_Call* CallControl::ACQUIRE_CALL(String const& contextName) { return INSTANCE()->acquireCall(contextName); }

CC_Call* CallControl::ACQUIRE_CALL(String const& contextName, MG_IContext* mgContext)
{
    return INSTANCE()->acquireCall(contextName, mgContext);
}

void CallControl::RELEASE_CALL(String const& contextName, CC_Call* call) { INSTANCE()->releaseCall(contextName, call); }

unsigned int CallControl::GET_NUMBER_OF_CALLS() { return INSTANCE()->getNumberOfCalls(); }

unsigned int CallControl::GET_NUMBER_OF_CALLS(String const& contextName)
{
    return INSTANCE()->getNumberOfCalls(contextName);
}

CC_Call* CallControl::GET_CALL(String const& contextName, unsigned int index)
{
    return INSTANCE()->getCall(contextName, index);
}

InfoContainer& CallControl::GET_CALL_INFO(InfoContainer& info, String const& contextName, unsigned int maxLevel,
                                          unsigned int level, unsigned int maxDetail, unsigned int detail,
                                          String const& prefix)
{
    return INSTANCE()->getCallInfo(info, contextName, maxLevel, level, maxDetail, detail, prefix);
}
