#include "testing/RecordingPropertyFactory.h"

#include "properties/CC_PropertyString.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

#include <tuple>
#include <utility>

RecordingPropertyFactory::RecordingPropertyFactory(std::string name, std::vector<unsigned int> ids, Journal* journal)
    : Recorder(std::move(name), journal), m_ids(std::move(ids))
{
}

RecordingPropertyFactory::~RecordingPropertyFactory() = default;

void RecordingPropertyFactory::getPropertyIds(TYVector<unsigned int>& ids) const
{
    for (unsigned int const id : m_ids)
        std::ignore = ids.append(id); // without memory the id is not named
}

CC_Property* RecordingPropertyFactory::createProperty(unsigned int id)
{
    FailingAllocator::Pause const unseen;
    record("create " + PROPERTY_NAME(id));
    return m_create ? m_create(id) : new CC_PropertyString(id);
}
