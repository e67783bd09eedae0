#include "testing/RecordingEndpoint.h"

#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

#include <utility>

RecordingEndpoint::RecordingEndpoint(std::string name, String const& network, Journal* journal,
                                     CC_PropertyFilterContainer* inputFilters,
                                     CC_PropertyFilterContainer* outputFilters)
    : CC_Endpoint(inputFilters, outputFilters)
    , Recorder(std::move(name), journal)
    , m_name(getRecorderName().c_str())
    , m_network(network)
{
}

RecordingEndpoint::~RecordingEndpoint() = default;

InfoContainer& RecordingEndpoint::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                          unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Endpoint", m_name);
    return info;
}

XCode RecordingEndpoint::handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties)
{
    {
        FailingAllocator::Pause const unseen;
        record(std::string("offer ") + name.c_str() + " (" + PROPERTY_NAMES(properties) + ")");
    }
    return m_handleOffer(call, name, properties);
}
