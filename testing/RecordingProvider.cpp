#include "testing/RecordingProvider.h"

#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

#include <utility>

RecordingProvider::RecordingProvider(std::string name, Journal* journal, ProviderType type)
    : CC_Provider(name.c_str(), ""), Recorder(std::move(name), journal), m_type(type)
{
}

RecordingProvider::~RecordingProvider() = default;

XCode RecordingProvider::dial(CC_Call& call, String const& providerName, String const& destination,
                              CC_PropertyContainer const& offerProperties)
{
    {
        FailingAllocator::Pause const unseen;
        record(std::string("dial ") + providerName.c_str() + " " + destination.c_str() + " (" +
               PROPERTY_NAMES(offerProperties) + ")");
    }
    return m_dial(call, providerName, destination, offerProperties);
}

InfoContainer& RecordingProvider::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                          unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Provider", getRecorderName().c_str());
    return info;
}
