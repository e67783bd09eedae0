#pragma once

#include "environment/CC_Environment.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/TYHashTable.h"
#include "platform/base/TYList.h"
#include "platform/base/XCode.h"
#include "platform/eventloop/TYEventLoop.h"

class CC_Call;
class CC_CallPool;
class CC_Context;
class CC_Property;
class CC_PropertyFactory;
class CC_Provider;

/// The root of call control: event loops, media repositories, property factories and named contexts.
///
/// One object per process, made on first use and never deleted by the library. Each operation exists as an instance
/// method and as a static function of the same meaning in upper case, which asks the one object. Nothing here takes a
/// lock: the first `INSTANCE()` belongs to the thread that initialises the application, everything after it to the
/// call-control loop's thread.
///
///     CallControl::SET_CC_EVENT_LOOP(&loop);
///     CallControl::SET_MG_CONTEXT_REPOSITORY(&mediaContexts);
///     std::ignore = CallControl::ADD_PROPERTY_FACTORY(&factory);  // a CC_Factory
///     std::ignore = CallControl::CREATE_CONTEXT("SWITCH");
///     std::ignore = CallControl::ADD_PROVIDER("SWITCH", "sip", sipProvider);
///
/// The operations on a context by name, from `getNationalPrefix` down, take the empty name for "SWITCH";
/// `createContext`, `destroyContext` and `getContext` take it as it is. That difference is intended.
class CC_EXPORT CallControl
{
public:
    /// The name that the empty name stands for.
    static constexpr char const* DEFAULT_CONTEXT_NAME = "SWITCH";

    /// Hears of contexts that come and go.
    class CC_EXPORT ContextObserver
    {
    public:
        virtual ~ContextObserver();
        /// The context can be found from now on.
        virtual void contextAdded(String const& name) = 0;
        /// Told before the context is destroyed, and also for a name that has none.
        virtual void contextDestroyed(String const& name) = 0;
    };

    /// Throws std::bad_alloc when memory is out.
    static CallControl* INSTANCE();

    CallControl();
    /// Deletes the contexts without telling the context observers.
    virtual ~CallControl();
    CallControl(CallControl const&) = delete;
    CallControl& operator=(CallControl const&) = delete;

    // --- environment, set by the application before the first call ---------------------------------------------------

    /// The loop on which all call-control work runs; null until set. It must outlive all calls. @{
    TYEventLoop* getCcEventLoop() const { return m_environment.m_ccEventLoop; }
    void setCcEventLoop(TYEventLoop* loop) { m_environment.m_ccEventLoop = loop; }
    /// @}
    /// REQUIRES: the loop was set.
    TYSyncEvent& getCcSyncEvent(EventPrio::Type priority) const;
    /// The loop of the datapath; null until set. @{
    TYEventLoop* getDpEventLoop() const { return m_environment.m_dpEventLoop; }
    void setDpEventLoop(TYEventLoop* loop) { m_environment.m_dpEventLoop = loop; }
    /// @}
    /// REQUIRES: the loop was set.
    TYSyncEvent& getDpSyncEvent(EventPrio::Type priority) const;
    /// The media layer's repositories; a counted reference is held. Null until set; null gives the held one up. @{
    MG_IContextRepository* getMgContextRepository() const { return m_environment.m_mgContextRepository.get(); }
    void setMgContextRepository(MG_IContextRepository* repository)
    {
        m_environment.m_mgContextRepository.set(repository);
    }
    MG_ITerminationRepository* getMgTerminationRepository() const
    {
        return m_environment.m_mgTerminationRepository.get();
    }
    void setMgTerminationRepository(MG_ITerminationRepository* repository)
    {
        m_environment.m_mgTerminationRepository.set(repository);
    }
    /// @}

    /// The same, asked of the one object. @{
    static TYEventLoop* GET_CC_EVENT_LOOP();
    static void SET_CC_EVENT_LOOP(TYEventLoop* loop);
    static TYSyncEvent& GET_CC_SYNC_EVENT(EventPrio::Type priority);
    static TYEventLoop* GET_DP_EVENT_LOOP();
    static void SET_DP_EVENT_LOOP(TYEventLoop* loop);
    static TYSyncEvent& GET_DP_SYNC_EVENT(EventPrio::Type priority);
    static MG_IContextRepository* GET_MG_CONTEXT_REPOSITORY();
    static void SET_MG_CONTEXT_REPOSITORY(MG_IContextRepository* repository);
    static MG_ITerminationRepository* GET_MG_TERMINATION_REPOSITORY();
    static void SET_MG_TERMINATION_REPOSITORY(MG_ITerminationRepository* repository);
    /// @}

    // --- property factories ------------------------------------------------------------------------------------------

    /// A new property of that id, owned by the caller; null when no factory is registered for the id or the one that is
    /// makes none.
    CC_Property* createProperty(unsigned int id) const;
    /// Registers the factory for all ids that it names, or for none: OK; REFUSED for null or when one of the ids has a
    /// factory already; FAILURE when memory is out. The factory stays the caller's.
    XCode addPropertyFactory(CC_PropertyFactory* factory);
    /// Removes the registration of every id that the factory names, even where another factory holds it; null is
    /// ignored.
    void removePropertyFactory(CC_PropertyFactory* factory);

    /// The same, asked of the one object. @{
    static CC_Property* CREATE_PROPERTY(unsigned int id);
    static XCode ADD_PROPERTY_FACTORY(CC_PropertyFactory* factory);
    static void REMOVE_PROPERTY_FACTORY(CC_PropertyFactory* factory);
    /// @}

    // --- contexts ----------------------------------------------------------------------------------------------------

    /// OK; REFUSED when the name is taken, nobody is told then; FAILURE when memory is out.
    XCode createContext(String const& name);
    /// Tells the context observers, also for an unknown name, and then destroys the context.
    void destroyContext(String const& name);
    /// The context of that name, null if there is none.
    CC_Context* getContext(String const& name) const;
    /// An observer is held once however often it is registered; when memory is out it is not held. @{
    void registerContextObserver(ContextObserver& observer);
    void unregisterContextObserver(ContextObserver& observer);
    /// @}

    /// The same, asked of the one object. @{
    static XCode CREATE_CONTEXT(String const& name);
    static void DESTROY_CONTEXT(String const& name);
    static CC_Context* GET_CONTEXT(String const& name);
    static void REGISTER_CONTEXT_OBSERVER(ContextObserver& observer);
    static void UNREGISTER_CONTEXT_OBSERVER(ContextObserver& observer);
    /// @}

    /// @name Operations of a context, by its name
    /// CC_Context tells what they do. Without such a context: the empty string, 0 or null from the getters, FAILURE
    /// from what returns an XCode, and the dumps add nothing.
    /// @{

    /// As the context's own operation.
    String const& getNationalPrefix(String const& contextName) const;
    XCode setNationalPrefix(String const& contextName, String const& prefix);
    String const& getInternationalPrefix(String const& contextName) const;
    XCode setInternationalPrefix(String const& contextName, String const& prefix);
    unsigned int getMaxHops(String const& contextName) const;
    XCode setMaxHops(String const& contextName, unsigned int maxHops);
    XCode addProvider(String const& contextName, String const& providerName, CC_Provider& provider);
    void removeProvider(String const& contextName, String const& providerName);
    unsigned int getNumberOfProviders(String const& contextName) const;
    CC_Provider* getProvider(String const& contextName, unsigned int index) const;
    CC_Provider* getProvider(String const& contextName, String const& providerName) const;
    InfoContainer& getProviderInfo(InfoContainer& info, String const& contextName, unsigned int maxLevel,
                                   unsigned int level, unsigned int maxDetail, unsigned int detail,
                                   String const& prefix) const;
    CC_CallPool* getCallPool(String const& contextName) const;
    CC_Call* acquireCall(String const& contextName);
    CC_Call* acquireCall(String const& contextName, MG_IContext* mgContext);
    void releaseCall(String const& contextName, CC_Call* call);
    /// Over all contexts, but no more than the first 64 of them: the bound is deliberate, it keeps the sum free of
    /// memory.
    unsigned int getNumberOfCalls() const;
    unsigned int getNumberOfCalls(String const& contextName) const;
    CC_Call* getCall(String const& contextName, unsigned int index) const;
    InfoContainer& getCallInfo(InfoContainer& info, String const& contextName, unsigned int maxLevel,
                               unsigned int level, unsigned int maxDetail, unsigned int detail,
                               String const& prefix) const;

    static String const& GET_NATIONAL_PREFIX(String const& contextName);
    static XCode SET_NATIONAL_PREFIX(String const& contextName, String const& prefix);
    static String const& GET_INTERNATIONAL_PREFIX(String const& contextName);
    static XCode SET_INTERNATIONAL_PREFIX(String const& contextName, String const& prefix);
    static unsigned int GET_MAX_HOPS(String const& contextName);
    static XCode SET_MAX_HOPS(String const& contextName, unsigned int maxHops);
    static XCode ADD_PROVIDER(String const& contextName, String const& providerName, CC_Provider& provider);
    static void REMOVE_PROVIDER(String const& contextName, String const& providerName);
    static unsigned int GET_NUMBER_OF_PROVIDERS(String const& contextName);
    static CC_Provider* GET_PROVIDER(String const& contextName, unsigned int index);
    static CC_Provider* GET_PROVIDER(String const& contextName, String const& providerName);
    static InfoContainer& GET_PROVIDER_INFO(InfoContainer& info, String const& contextName, unsigned int maxLevel,
                                            unsigned int level, unsigned int maxDetail, unsigned int detail,
                                            String const& prefix);
    static CC_CallPool* GET_CALL_POOL(String const& contextName);
    static CC_Call* ACQUIRE_CALL(String const& contextName);
    static CC_Call* ACQUIRE_CALL(String const& contextName, MG_IContext* mgContext);
    static void RELEASE_CALL(String const& contextName, CC_Call* call);
    static unsigned int GET_NUMBER_OF_CALLS();
    static unsigned int GET_NUMBER_OF_CALLS(String const& contextName);
    static CC_Call* GET_CALL(String const& contextName, unsigned int index);
    static InfoContainer& GET_CALL_INFO(InfoContainer& info, String const& contextName, unsigned int maxLevel,
                                        unsigned int level, unsigned int maxDetail, unsigned int detail,
                                        String const& prefix);
    /// @}

    /// @name The same by names that are no Strings
    /// Literals, pointers to texts, views, std::string. They make none, so a name of any length takes no memory of the
    /// caller's, and none at all where something is looked up. What keeps a name makes its own and tells by the result
    /// that memory is out, as told above; that a name which is not there was removed is then not announced.
    /// @{

    /// What the operation of that name does with a String.
    template <TYText Name>
    XCode createContext(Name const& name)
    {
        return createContextNamed(String::VIEW_OF(name));
    }
    template <TYText Name>
    void destroyContext(Name const& name)
    {
        destroyContextNamed(String::VIEW_OF(name));
    }
    template <TYText Name>
    CC_Context* getContext(Name const& name) const
    {
        return m_contextTable.get(String::VIEW_OF(name));
    }
    template <TYText Name>
    String const& getNationalPrefix(Name const& contextName) const
    {
        return getNationalPrefix(keyOf(String::VIEW_OF(contextName)));
    }
    template <TYText Context, TYText Name>
    XCode setNationalPrefix(Context const& contextName, Name const& prefix)
    {
        return setNationalPrefixFrom(String::VIEW_OF(contextName), String::VIEW_OF(prefix));
    }
    template <TYText Name>
    String const& getInternationalPrefix(Name const& contextName) const
    {
        return getInternationalPrefix(keyOf(String::VIEW_OF(contextName)));
    }
    template <TYText Context, TYText Name>
    XCode setInternationalPrefix(Context const& contextName, Name const& prefix)
    {
        return setInternationalPrefixFrom(String::VIEW_OF(contextName), String::VIEW_OF(prefix));
    }
    template <TYText Name>
    unsigned int getMaxHops(Name const& contextName) const
    {
        return getMaxHops(keyOf(String::VIEW_OF(contextName)));
    }
    template <TYText Name>
    XCode setMaxHops(Name const& contextName, unsigned int maxHops)
    {
        return setMaxHops(keyOf(String::VIEW_OF(contextName)), maxHops);
    }
    template <TYText Context, TYText Name>
    XCode addProvider(Context const& contextName, Name const& providerName, CC_Provider& provider)
    {
        return addProviderNamed(String::VIEW_OF(contextName), String::VIEW_OF(providerName), provider);
    }
    template <TYText Context, TYText Name>
    void removeProvider(Context const& contextName, Name const& providerName)
    {
        removeProviderNamed(String::VIEW_OF(contextName), String::VIEW_OF(providerName));
    }
    template <TYText Name>
    unsigned int getNumberOfProviders(Name const& contextName) const
    {
        return getNumberOfProviders(keyOf(String::VIEW_OF(contextName)));
    }
    template <TYText Name>
    CC_Provider* getProvider(Name const& contextName, unsigned int index) const
    {
        return getProvider(keyOf(String::VIEW_OF(contextName)), index);
    }
    template <TYText Context, TYText Name>
    CC_Provider* getProvider(Context const& contextName, Name const& providerName) const
    {
        return findProvider(String::VIEW_OF(contextName), String::VIEW_OF(providerName));
    }
    template <TYText Name>
    CC_CallPool* getCallPool(Name const& contextName) const
    {
        return getCallPool(keyOf(String::VIEW_OF(contextName)));
    }
    template <TYText Name>
    CC_Call* acquireCall(Name const& contextName)
    {
        return acquireCall(keyOf(String::VIEW_OF(contextName)));
    }
    template <TYText Name>
    CC_Call* acquireCall(Name const& contextName, MG_IContext* mgContext)
    {
        return acquireCall(keyOf(String::VIEW_OF(contextName)), mgContext);
    }
    template <TYText Name>
    void releaseCall(Name const& contextName, CC_Call* call)
    {
        releaseCall(keyOf(String::VIEW_OF(contextName)), call);
    }
    template <TYText Name>
    unsigned int getNumberOfCalls(Name const& contextName) const
    {
        return getNumberOfCalls(keyOf(String::VIEW_OF(contextName)));
    }
    template <TYText Name>
    CC_Call* getCall(Name const& contextName, unsigned int index) const
    {
        return getCall(keyOf(String::VIEW_OF(contextName)), index);
    }
    template <TYText Name>
    InfoContainer& getProviderInfo(InfoContainer& info, Name const& contextName, unsigned int maxLevel,
                                   unsigned int level, unsigned int maxDetail, unsigned int detail,
                                   String const& prefix) const
    {
        return getProviderInfo(info, keyOf(String::VIEW_OF(contextName)), maxLevel, level, maxDetail, detail, prefix);
    }
    template <TYText Name>
    InfoContainer& getCallInfo(InfoContainer& info, Name const& contextName, unsigned int maxLevel, unsigned int level,
                               unsigned int maxDetail, unsigned int detail, String const& prefix) const
    {
        return getCallInfo(info, keyOf(String::VIEW_OF(contextName)), maxLevel, level, maxDetail, detail, prefix);
    }

    template <TYText Name>
    static XCode CREATE_CONTEXT(Name const& name)
    {
        return INSTANCE()->createContext(name);
    }
    template <TYText Name>
    static void DESTROY_CONTEXT(Name const& name)
    {
        INSTANCE()->destroyContext(name);
    }
    template <TYText Name>
    static CC_Context* GET_CONTEXT(Name const& name)
    {
        return INSTANCE()->getContext(name);
    }
    template <TYText Name>
    static String const& GET_NATIONAL_PREFIX(Name const& contextName)
    {
        return INSTANCE()->getNationalPrefix(contextName);
    }
    template <TYText Context, TYText Name>
    static XCode SET_NATIONAL_PREFIX(Context const& contextName, Name const& prefix)
    {
        return INSTANCE()->setNationalPrefix(contextName, prefix);
    }
    template <TYText Name>
    static String const& GET_INTERNATIONAL_PREFIX(Name const& contextName)
    {
        return INSTANCE()->getInternationalPrefix(contextName);
    }
    template <TYText Context, TYText Name>
    static XCode SET_INTERNATIONAL_PREFIX(Context const& contextName, Name const& prefix)
    {
        return INSTANCE()->setInternationalPrefix(contextName, prefix);
    }
    template <TYText Name>
    static unsigned int GET_MAX_HOPS(Name const& contextName)
    {
        return INSTANCE()->getMaxHops(contextName);
    }
    template <TYText Name>
    static XCode SET_MAX_HOPS(Name const& contextName, unsigned int maxHops)
    {
        return INSTANCE()->setMaxHops(contextName, maxHops);
    }
    template <TYText Context, TYText Name>
    static XCode ADD_PROVIDER(Context const& contextName, Name const& providerName, CC_Provider& provider)
    {
        return INSTANCE()->addProvider(contextName, providerName, provider);
    }
    template <TYText Context, TYText Name>
    static void REMOVE_PROVIDER(Context const& contextName, Name const& providerName)
    {
        INSTANCE()->removeProvider(contextName, providerName);
    }
    template <TYText Name>
    static unsigned int GET_NUMBER_OF_PROVIDERS(Name const& contextName)
    {
        return INSTANCE()->getNumberOfProviders(contextName);
    }
    template <TYText Name>
    static CC_Provider* GET_PROVIDER(Name const& contextName, unsigned int index)
    {
        return INSTANCE()->getProvider(contextName, index);
    }
    template <TYText Context, TYText Name>
    static CC_Provider* GET_PROVIDER(Context const& contextName, Name const& providerName)
    {
        return INSTANCE()->getProvider(contextName, providerName);
    }
    template <TYText Name>
    static CC_CallPool* GET_CALL_POOL(Name const& contextName)
    {
        return INSTANCE()->getCallPool(contextName);
    }
    template <TYText Name>
    static CC_Call* ACQUIRE_CALL(Name const& contextName)
    {
        return INSTANCE()->acquireCall(contextName);
    }
    template <TYText Name>
    static CC_Call* ACQUIRE_CALL(Name const& contextName, MG_IContext* mgContext)
    {
        return INSTANCE()->acquireCall(contextName, mgContext);
    }
    template <TYText Name>
    static void RELEASE_CALL(Name const& contextName, CC_Call* call)
    {
        INSTANCE()->releaseCall(contextName, call);
    }
    template <TYText Name>
    static unsigned int GET_NUMBER_OF_CALLS(Name const& contextName)
    {
        return INSTANCE()->getNumberOfCalls(contextName);
    }
    template <TYText Name>
    static CC_Call* GET_CALL(Name const& contextName, unsigned int index)
    {
        return INSTANCE()->getCall(contextName, index);
    }
    template <TYText Name>
    static InfoContainer& GET_PROVIDER_INFO(InfoContainer& info, Name const& contextName, unsigned int maxLevel,
                                            unsigned int level, unsigned int maxDetail, unsigned int detail,
                                            String const& prefix)
    {
        return INSTANCE()->getProviderInfo(info, contextName, maxLevel, level, maxDetail, detail, prefix);
    }
    template <TYText Name>
    static InfoContainer& GET_CALL_INFO(InfoContainer& info, Name const& contextName, unsigned int maxLevel,
                                        unsigned int level, unsigned int maxDetail, unsigned int detail,
                                        String const& prefix)
    {
        return INSTANCE()->getCallInfo(info, contextName, maxLevel, level, maxDetail, detail, prefix);
    }
    /// @}

private:
    CC_Context* findContext(String const& name) const;
    String const& keyOf(std::string_view contextName) const;
    CC_Provider* findProvider(std::string_view contextName, std::string_view providerName) const;
    XCode createContextNamed(std::string_view name);
    void destroyContextNamed(std::string_view name);
    XCode setNationalPrefixFrom(std::string_view contextName, std::string_view prefix);
    XCode setInternationalPrefixFrom(std::string_view contextName, std::string_view prefix);
    XCode addProviderNamed(std::string_view contextName, std::string_view providerName, CC_Provider& provider);
    void removeProviderNamed(std::string_view contextName, std::string_view providerName);
    template <class Tell>
    void tellContextObservers(Tell&& tell);

    CC_Environment m_environment;
    TYUInt32HashTable<CC_PropertyFactory*> m_factoryTable;
    INStringHashTable<CC_Context*> m_contextTable;
    TYList<ContextObserver*> m_contextObservers;
    unsigned int m_contextObserverWalks = 0;

    static CallControl* s_pInstance;
};
