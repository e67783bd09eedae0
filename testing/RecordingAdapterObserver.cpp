#include "testing/RecordingAdapterObserver.h"

#include "properties/CC_Flags.h"
#include "services/CC_Service.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

#include <limits>

RecordingAdapterObserver::~RecordingAdapterObserver() = default;

void RecordingAdapterObserver::notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags)
{
    {
        FailingAllocator::Pause const unseen;
        record("peer changed (" + PROPERTY_NAMES(flags) + ")");
        Ids ids;
        for (unsigned int id = flags.getFirstSet(0); id != std::numeric_limits<unsigned int>::max();
             id = flags.getFirstSet(id + 1))
            ids.push_back(id);
        m_flagSets.push_back(ids);
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
