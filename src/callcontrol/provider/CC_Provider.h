#pragma once

#include "callcontrol/CC_ObserverContainerOld.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/XCode.h"

class CC_Call;
class CC_PropertyContainer;

/// A signalling module's side towards call control that is asked to carry calls: an interface or a service of the
/// gateway.
///
/// Implemented by the module, which owns it; registered under a name in a context (`CallControl::ADD_PROVIDER`). Take
/// it out again (`CallControl::REMOVE_PROVIDER`) before it is destroyed. Belongs to the call-control loop's thread.
///
///     class SipInterface : public CC_Provider
///     {
///         XCode dial(CC_Call& call, String const& providerName, String const& destination,
///                    CC_PropertyContainer const& offerProperties) override
///         {
///             return m_endpoint.offer(call, destination, offerProperties);
///         }
///         ...
///     };
class CC_EXPORT CC_Provider
{
public:
    /// What it is to who configures the gateway; call control treats all alike.
    enum ProviderType : int
    {
        HIDDEN_INTERNAL_INTERFACE = 0,
        INTERNAL_INTERFACE = 1,
        USER_DEFINED_INTERFACE = 2,
        HIDDEN_INTERNAL_SERVICE = 3,
        INTERNAL_SERVICE = 4,
        USER_DEFINED_SERVICE = 5,
        CUSTOM_USER_DEFINED_SERVICE = 6
    };

    /// Hears of the end of a provider.
    class CC_EXPORT Observer
    {
    public:
        Observer() = default;
        virtual ~Observer();
        /// The provider is being destroyed: its own class's part is gone already.
        virtual void aboutDestroy(CC_Provider& provider) = 0;
    };

    /// Two texts of the module's own; call control keeps them and reads neither. Throws std::bad_alloc when memory is
    /// out.
    CC_Provider(String const& first, String const& second);
    CC_Provider(CC_Provider const&) = delete;
    CC_Provider& operator=(CC_Provider const&) = delete;

    /// Tells the observers `aboutDestroy`.
    virtual ~CC_Provider();
    /// OK, or FAILURE when memory is out. Registrations are counted (CC_CountedObservers).
    virtual XCode addProviderObserver(Observer& observer);
    /// Counts one registration less; an observer that was never added is ignored.
    virtual void removeProviderObserver(Observer const& observer);
    /// Carry the call to `destination` (in the provider's own notation): offer it to an endpoint. `providerName` is the
    /// name under which the provider was found. OK when the call was offered, also when the endpoint then rejects it
    /// (`CC_Endpoint::actionRejectOfferedCall_WithCause`): a failure makes the caller drop with its own cause, 38.
    /// A provider that has no endpoint for the destination rejects with a cause of its own through a leg that it drops:
    ///
    ///     CC_CallAdapter adapter; // set up with any endpoint of the module
    ///     std::ignore = adapter.setup("reject", m_anyEndpoint, nullptr);
    ///     std::ignore = adapter.accept(call, CC_PropertyContainer::EMPTY());
    ///     adapter.drop(QCause::UNALLOCATED_NUMBER, 0);
    ///
    virtual XCode dial(CC_Call& call, String const& providerName, String const& destination,
                       CC_PropertyContainer const& offerProperties) = 0;
    /// Call control does not ask for it.
    virtual ProviderType getProviderType() const = 0;
    /// Diagnostic dump; returns `info`.
    virtual InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                   unsigned int maxDetail, unsigned int detail, String const& prefix) const = 0;

    /// What the observers are called through; call control passes null for `data` and nothing reads it.
    static void NOTIFY_OBSERVER_ABOUT_DESTROY(Observer& observer, CC_Provider& provider, void* data);
    /// ERROR::INVALID for other values; the type 6 has a short name and no long one, on purpose: it is not shown. @{
    static char const* PROVIDER_TYPE_NAME(ProviderType type);
    static char const* PROVIDER_TYPE_SHORT_NAME(ProviderType type);
    /// @}

    /// The number of providers alive.
    static unsigned int s_numberOfInstances;

private:
    String m_first;
    String m_second;
    CC_ObserverContainerOld<Observer, CC_Provider> m_observers;
};
