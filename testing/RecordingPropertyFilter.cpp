#include "testing/RecordingPropertyFilter.h"

#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

#include <utility>

RecordingPropertyFilter::RecordingPropertyFilter(std::string name, Journal* journal)
    : m_shared(std::make_shared<Shared>(std::move(name), journal))
{
}

RecordingPropertyFilter::RecordingPropertyFilter(RecordingPropertyFilter const& other)
    : CC_PropertyFilter(other), m_shared(other.m_shared)
{
    ++m_shared->alive;
}

RecordingPropertyFilter::~RecordingPropertyFilter() { --m_shared->alive; }

CC_PropertyFilter* RecordingPropertyFilter::clone() const
{
    if (m_shared->isRefusing)
        return nullptr;
    FailingAllocator::Pause const unseen;
    ++m_shared->clones;
    return new RecordingPropertyFilter(*this);
}

XCode RecordingPropertyFilter::apply(CC_PropertyContainer& properties) const
{
    std::shared_ptr<Shared> const shared = m_shared; // the hook may destroy the filter
    {
        FailingAllocator::Pause const unseen;
        shared->record("apply (" + PROPERTY_NAMES(properties) + ")");
    }
    return shared->apply(properties);
}

InfoContainer& RecordingPropertyFilter::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                                unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Filter", m_shared->getRecorderName().c_str());
    return info;
}
