#pragma once

#include "callcontrol/CC_ObserverContainerOld.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/XCode.h"
#include "platform/signalling/QCause.h"

class CC_Call;
class CC_PropertyContainer;
class CC_PropertyFilterContainer;

/// A party of a signalling module: what a call is offered to, and what drives a call leg through a call adapter.
///
/// Implemented by the module, which owns it and keeps it alive while an adapter is bound to it. Its filters shape what
/// it sends into call control (input) and what it is shown (output). Belongs to the call-control loop's thread.
///
///     XCode Line::handleOffer(CC_Call& call, String const& number, CC_PropertyContainer const& properties)
///     {
///         if (isBusy())
///             actionRejectOfferedCall_WithCause(call, CC_PropertyContainer::EMPTY(), QCause::USER_BUSY);
///         else
///             ring(call, number, properties);
///         return XCode::OK;
///     }
class CC_EXPORT CC_Endpoint
{
public:
    /// Hears of the end of an endpoint.
    class CC_EXPORT Observer
    {
    public:
        Observer() = default;
        virtual ~Observer();
        /// The endpoint's work is done. Told by the module alone, through NOTIFY_OBSERVER_ABOUT_FINISHED.
        virtual void aboutFinished(CC_Endpoint& endpoint) = 0;
        /// The endpoint is being destroyed: its own class's part is gone already.
        virtual void aboutDestroy(CC_Endpoint& endpoint) = 0;
    };

    /// The filters stay the caller's and must outlive the endpoint's use of them; either may be null.
    CC_Endpoint(CC_PropertyFilterContainer* inputFilters, CC_PropertyFilterContainer* outputFilters);
    CC_Endpoint(CC_Endpoint const&) = delete;
    CC_Endpoint& operator=(CC_Endpoint const&) = delete;

    /// Tells the observers `aboutDestroy`.
    virtual ~CC_Endpoint();
    /// OK, or FAILURE when memory is out. Registrations are counted (CC_CountedObservers).
    virtual XCode addEndpointObserver(Observer& observer);
    /// Counts one registration less; an observer that was never added is ignored.
    virtual void removeEndpointObserver(Observer& observer);
    /// Offers the call to the endpoint under the called name or number; the properties pass through a copy made by the
    /// output filters. What `handleOffer` returns; FAILURE when memory is out.
    virtual XCode offer(CC_Call& call, String const& name, CC_PropertyContainer const& properties);
    /// The endpoint's name, for logs and call-leg names.
    virtual String const& getName() const = 0;
    /// The name of the network that the endpoint belongs to; two legs of one network may form a loop.
    virtual String const& getNetwork() const = 0;
    /// Diagnostic dump; returns `info`.
    virtual InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                   unsigned int maxDetail, unsigned int detail, String const& prefix) const = 0;
    /// A call is offered: accept it now or later through a call adapter, or reject it.
    virtual XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties) = 0;
    /// Rejects an offered call with a Q.850 cause, by the way of any other answer: a leg with these properties joins
    /// the call and is dropped at once.
    virtual void actionRejectOfferedCall_WithCause(CC_Call& call, CC_PropertyContainer const& properties, QCause cause);

    /// May be null. A dial under way goes on with the input filters that it began with, so they have to stay until it
    /// has returned. @{
    void setInputFilterContainer(CC_PropertyFilterContainer* filters) { m_inputFilterContainer = filters; }
    void setOutputFilterContainer(CC_PropertyFilterContainer* filters) { m_outputFilterContainer = filters; }
    CC_PropertyFilterContainer* getInputFilterContainer() const { return m_inputFilterContainer; }
    CC_PropertyFilterContainer* getOutputFilterContainer() const { return m_outputFilterContainer; }
    /// @}

    /// What the observers are called through; call control passes null for `data` and nothing reads it. @{
    static void NOTIFY_OBSERVER_ABOUT_FINISHED(Observer& observer, CC_Endpoint& endpoint, void* data);
    static void NOTIFY_OBSERVER_ABOUT_DESTROY(Observer& observer, CC_Endpoint& endpoint, void* data);
    /// @}

    /// The number of endpoints alive.
    static unsigned int s_numberOfInstances;

private:
    XCode offerRecorded(CC_Call& call, String const& name, CC_PropertyContainer const& properties);
    XCode offerFiltered(CC_Call& call, String const& name, CC_PropertyContainer const& properties);
    CC_ObserverContainerOld<Observer, CC_Endpoint> m_observers;
    CC_PropertyFilterContainer* m_inputFilterContainer;
    CC_PropertyFilterContainer* m_outputFilterContainer;
};
