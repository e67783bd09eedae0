#pragma once

#include "callcontrol/CC_ObserverContainerOld.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/TYHashTable.h"
#include "platform/base/TYLifeline.h"
#include "platform/base/XCode.h"

#include <memory>

class CC_Call;
class CC_CallPool;
class CC_Provider;
class MG_IContext;

/// One named domain of call control: its providers, the pool of its calls, its dialling prefixes and its hop limit.
///
/// Created, found and destroyed by name through CallControl, which owns it. Belongs to the call-control loop's thread.
///
///     std::ignore = CallControl::CREATE_CONTEXT("SWITCH");
///     std::ignore = CallControl::GET_CONTEXT("SWITCH")->addContextObserver(observer);
class CC_EXPORT CC_Context
{
public:
    /// Hears of the context's providers and calls. Inside these an observer may do anything, destroying the context
    /// included.
    class CC_EXPORT Observer
    {
    public:
        Observer() = default;
        virtual ~Observer();
        /// The context is being destroyed.
        virtual void aboutDestroy(CC_Context& context) = 0;
        /// The provider can be found under that name from now on.
        virtual void aboutAddProvider(CC_Context& context, String const& name) = 0;
        /// Told also of a name that had no provider.
        virtual void aboutRemoveProvider(CC_Context& context, String const& name) = 0;
        /// The call was acquired.
        virtual void aboutCreateCall(CC_Context& context, CC_Call* call) = 0;
        /// The call is about to be released through the context. A call that ends by itself is not announced.
        virtual void aboutDestroyCall(CC_Context& context, CC_Call* call) = 0;
    };

    /// Throws std::bad_alloc when memory is out.
    explicit CC_Context(String const& name);
    /// Tells the observers `aboutDestroy`, and nobody anything after that. Calls that are up live on until their legs
    /// are gone; providers are left alone.
    ~CC_Context();
    CC_Context(CC_Context const&) = delete;
    CC_Context& operator=(CC_Context const&) = delete;

    /// OK, or NO_ELEMENT when memory is out. Registrations are counted, without a floor (CC_CountedObservers). @{
    XCode addContextObserver(Observer& observer);
    void removeContextObserver(Observer const& observer);
    /// @}

    /// The name under which CallControl finds it.
    String const& getName() const { return m_name; }
    /// Prefixes are kept as they are given. The setters: OK, or FAILURE when memory is out. @{
    String const& getNationalPrefix() const { return m_nationalPrefix; }
    XCode setNationalPrefix(String const& prefix);
    String const& getInternationalPrefix() const { return m_internationalPrefix; }
    XCode setInternationalPrefix(String const& prefix);
    /// @}
    /// How many hops a call may have made; 0: not set. Setting is always OK. @{
    unsigned int getMaxHops() const { return m_maxHops; }
    XCode setMaxHops(unsigned int maxHops);
    /// @}

    /// OK; REFUSED when the name is taken, nobody is told then; FAILURE when memory is out. The provider stays the
    /// module's.
    XCode addProvider(String const& name, CC_Provider& provider);
    /// Frees the name and tells the observers, also when it had no provider. The provider is left alone.
    void removeProvider(String const& name);
    /// The places of `getProvider` are those below it.
    unsigned int getNumberOfProviders() const { return m_providerTable.getCount(); }
    /// The provider at that place in the order of adding; null past the end.
    CC_Provider* getProvider(unsigned int index) const;
    /// Null when there is none of that name.
    CC_Provider* getProvider(String const& name) const { return m_providerTable.get(name); }

    /// The pool of its calls, which the context owns.
    CC_CallPool* getCallPool() const { return m_callPool.get(); }
    /// Calls that are up. The places of `getCall` are those below it.
    unsigned int getNumberOfCalls() const;
    /// The call at that place in the order of acquisition; null past the end.
    CC_Call* getCall(unsigned int index);
    /// A new call, null when none could be had. The media context (null: a new one is asked for) becomes its property
    /// Context (0x400400). @{
    CC_Call* acquireCall() { return acquireCall(nullptr); }
    CC_Call* acquireCall(MG_IContext* mgContext);
    /// @}
    /// Announces the end of the call, then gives it back to the pool. Null is ignored.
    void releaseCall(CC_Call* call);

    /// Diagnostic dumps; they return `info`. @{
    InfoContainer& getProviderInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                   unsigned int maxDetail, unsigned int detail, String const& prefix) const;
    InfoContainer& getCallInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                               unsigned int detail, String const& prefix) const;
    /// @}

    /// What the observers are called through. `data` is what the notification passes: null, a `String const*` with the
    /// provider's name, or the CC_Call*. It is lent for the call: nothing of it is to be kept, changed or deleted. @{
    static void NOTIFY_OBSERVER_ABOUT_DESTROY(Observer& observer, CC_Context& context, void* data);
    static void NOTIFY_OBSERVER_ABOUT_ADD_PROVIDER(Observer& observer, CC_Context& context, void* data);
    static void NOTIFY_OBSERVER_ABOUT_REMOVE_PROVIDER(Observer& observer, CC_Context& context, void* data);
    static void NOTIFY_OBSERVER_ABOUT_CREATE_CALL(Observer& observer, CC_Context& context, void* data);
    static void NOTIFY_OBSERVER_ABOUT_DESTROY_CALL(Observer& observer, CC_Context& context, void* data);
    /// @}

private:
    friend class CallControl;

    // by names of which nobody has made a String
    CC_Provider* findProvider(std::string_view name) const { return m_providerTable.get(name); }
    void removeProviderNamed(std::string_view name);

    String m_name;
    CC_ObserverContainerOld<Observer, CC_Context> m_observers;
    String m_nationalPrefix;
    String m_internationalPrefix;
    unsigned int m_maxHops = 0;
    TYStringHashTable<CC_Provider*> m_providerTable;
    std::unique_ptr<CC_CallPool> m_callPool;
    TYLifeline m_lifeline;
};
