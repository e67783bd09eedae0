#include "callcontrol/provider/CC_Endpoint.h"

#include "calls/CC_Call.h"
#include "platform/base/TYLifeline.h"
#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "recorder/CC_RecordWriter.h"

#include <tuple>
#include <typeinfo>

unsigned int CC_Endpoint::s_numberOfInstances = 0;

CC_Endpoint::Observer::~Observer() = default;

CC_Endpoint::CC_Endpoint(CC_PropertyFilterContainer* inputFilters, CC_PropertyFilterContainer* outputFilters)
    : m_inputFilterContainer(inputFilters), m_outputFilterContainer(outputFilters)
{
    ++s_numberOfInstances;
}

CC_Endpoint::~CC_Endpoint()
{
    m_observers.notifyObservers(NOTIFY_OBSERVER_ABOUT_DESTROY, *this, nullptr);
    m_observers.silence();
    m_inputFilterContainer = nullptr;
    m_outputFilterContainer = nullptr;
    --s_numberOfInstances;
}

XCode CC_Endpoint::addEndpointObserver(Observer& observer)
{
    // FAILURE where a context reports NO_ELEMENT, as for providers
    return m_observers.addObserver(observer).isOk() ? XCode::OK : XCode::FAILURE;
}

void CC_Endpoint::removeEndpointObserver(Observer& observer) { m_observers.removeObserver(observer); }

XCode CC_Endpoint::offer(CC_Call& call, String const& name, CC_PropertyContainer const& properties)
{
    if (CC_RecordWriter::ON() != nullptr)
        return offerRecorded(call, name, properties);
    return offerFiltered(call, name, properties);
}

XCode CC_Endpoint::offerRecorded(CC_Call& call, String const& name, CC_PropertyContainer const& properties)
{
    using Kind = CC_RecordFormat::Kind;
    unsigned long long const serial = call.getSerial(); // whoever is offered the call may end it, and the endpoint
    char const* const endpoint = typeid(*this).name();
    CC_RecordWriter::INSTANCE().addText(Kind::OFFERED, serial, 0, 0, endpoint);
    XCode const result = offerFiltered(call, name, properties);
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON())
        recorder->addText(Kind::OFFER_TAKEN, serial, 0, static_cast<unsigned int>(result.getValue()), endpoint);
    return result;
}

XCode CC_Endpoint::offerFiltered(CC_Call& call, String const& name, CC_PropertyContainer const& properties)
{
    if (m_outputFilterContainer == nullptr)
        return handleOffer(call, name, properties);
    TYLifeline::Watch const self(m_observers.getLifeline()); // a property's copying or a filter may end this endpoint,
    CC_Call::Hold const held(&call);                         // and the call
    CC_PropertyContainer filtered(properties);
    if (!self.isAlive() || filtered.getNumberOfProperties() != properties.getNumberOfProperties())
        return XCode::FAILURE; // gone, or memory is out
    if (m_outputFilterContainer != nullptr)
        std::ignore = m_outputFilterContainer->applyFilters(filtered); // what the filters leave is what is offered
    return self.isAlive() && !held.isReleased() ? handleOffer(call, name, filtered) : XCode(XCode::FAILURE);
}

void CC_Endpoint::NOTIFY_OBSERVER_ABOUT_FINISHED(Observer& observer, CC_Endpoint& endpoint, void*)
{
    observer.aboutFinished(endpoint);
}

void CC_Endpoint::NOTIFY_OBSERVER_ABOUT_DESTROY(Observer& observer, CC_Endpoint& endpoint, void*)
{
    observer.aboutDestroy(endpoint);
}
