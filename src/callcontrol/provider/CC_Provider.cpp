#include "callcontrol/provider/CC_Provider.h"

#include "platform/base/NameOf.h"

unsigned int CC_Provider::s_numberOfInstances = 0;

CC_Provider::Observer::~Observer() = default;

CC_Provider::CC_Provider(String const& first, String const& second) : m_first(first), m_second(second)
{
    ++s_numberOfInstances;
}

CC_Provider::~CC_Provider()
{
    m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_DESTROY, *this, nullptr);
    m_observers.silence();
    --s_numberOfInstances;
}

XCode CC_Provider::addProviderObserver(Observer& observer)
{
    // a provider reports FAILURE where a context reports NO_ELEMENT, on purpose: modules ask for that
    return m_observers.addObserver(observer).isOk() ? XCode::OK : XCode::FAILURE;
}

void CC_Provider::removeProviderObserver(Observer const& observer) { m_observers.removeObserver(observer); }

void CC_Provider::NOTIFY_OBSERVER_ABOUT_DESTROY(Observer& observer, CC_Provider& provider, void*)
{
    observer.aboutDestroy(provider);
}

char const* CC_Provider::PROVIDER_TYPE_NAME(ProviderType type)
{
    static constexpr NamedValue<ProviderType> NAMES[] = {
        {HIDDEN_INTERNAL_INTERFACE, "Hidden Internal Interface"},
        {INTERNAL_INTERFACE, "Internal Interface"},
        {USER_DEFINED_INTERFACE, "User-Defined Interface"},
        {HIDDEN_INTERNAL_SERVICE, "Hidden Internal Service"},
        {INTERNAL_SERVICE, "Internal Service"},
        {USER_DEFINED_SERVICE, "User-Defined Service"},
    };
    return NAME_OF(NAMES, type);
}

char const* CC_Provider::PROVIDER_TYPE_SHORT_NAME(ProviderType type)
{
    static constexpr NamedValue<ProviderType> NAMES[] = {
        {HIDDEN_INTERNAL_INTERFACE, "iif"},     {INTERNAL_INTERFACE, "sif"}, {USER_DEFINED_INTERFACE, "dif"},
        {HIDDEN_INTERNAL_SERVICE, "isvc"},      {INTERNAL_SERVICE, "ssvc"},  {USER_DEFINED_SERVICE, "dsvc"},
        {CUSTOM_USER_DEFINED_SERVICE, "cdsvc"},
    };
    return NAME_OF(NAMES, type);
}
