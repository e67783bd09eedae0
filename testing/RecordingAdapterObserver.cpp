#include "testing/RecordingAdapterObserver.h"

#include "adapters/CC_CallAdapter.h"
#include "properties/CC_Flags.h"
#include "properties/CC_Property.h"
#include "services/CC_Service.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

#include <limits>

namespace
{
std::string VALUE_OF(CC_CallAdapter const& adapter, unsigned int id)
{
    CC_Property const* const peers = adapter.getPeerProperty(id);
    CC_Property const* const property = peers != nullptr ? peers : adapter.getCallProperty(id);
    String value;
    return (property != peers ? "call's " : "") + PROPERTY_NAME(id) + ": " +
           (property != nullptr ? property->getValueString(value).c_str() : "absent");
}
} // namespace

RecordingAdapterObserver::~RecordingAdapterObserver() = default;

void RecordingAdapterObserver::notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags)
{
    {
        FailingAllocator::Pause const unseen;
        record("peer changed (" + PROPERTY_NAMES(flags) + ")");
        Ids ids;
        std::string values;
        for (unsigned int id = flags.getFirstSet(0); id != std::numeric_limits<unsigned int>::max();
             id = flags.getFirstSet(id + 1))
        {
            ids.push_back(id);
            values += (values.empty() ? "" : ", ") + VALUE_OF(adapter, id);
        }
        m_flagSets.push_back(ids);
        m_values.push_back(values);
    }
    m_onPeerPropertyChange(adapter, flags);
}

void RecordingAdapterObserver::notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service)
{
    {
        FailingAllocator::Pause const unseen;
        String const text = service.getInfo();
        record(std::string("peer asked (") + text.c_str() + ")");
        m_services.push_back(text.c_str());
    }
    m_onPeerSynchronousService(adapter, service);
}
