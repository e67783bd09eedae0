#include "properties/CC_PropertyContainerContainer.h"

#include "platform/base/NestingGuard.h"

namespace
{
constexpr unsigned int NUMBER_OF_BUCKETS = 32;
unsigned int s_infoDepth = 0; // of all these containers' dumps
} // namespace

CC_PropertyContainerContainer::CC_PropertyContainerContainer() : m_containers(NUMBER_OF_BUCKETS) {}

XCode CC_PropertyContainerContainer::add(CC_PropertyContainerType type, CC_PropertyContainer* container)
{
    return container != nullptr ? m_containers.add(type, container) : XCode::REFUSED;
}

void CC_PropertyContainerContainer::remove(CC_PropertyContainerType type) { m_containers.remove(type); }

InfoContainer& CC_PropertyContainerContainer::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                                      unsigned int maxDetail, unsigned int detail,
                                                      String const& prefix) const
{
    NestingGuard const nesting(s_infoDepth);
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Property Containers", String::s_empty);
    if (level + 1 > maxLevel || detail > maxDetail || !nesting.isOutermost())
        return info;
    unsigned int index = 0;
    for (auto const* entry = m_containers.getFirst(); entry != nullptr; entry = getNextAfterCall(entry, index))
    {
        char const* const side =
            CC_PROPERTY_CONTAINER_TYPE_NAME(static_cast<CC_PropertyContainerType>(entry->getKey()));
        entry->getValue()->getInfo(info, maxLevel, level + 1, maxDetail, detail, side);
    }
    return info;
}

/// The entry behind the one at `index` if that is still there, otherwise what has taken its place: a property may have
/// changed the table while it was dumped. What is gone is compared by address and not touched.
CC_PropertyContainerContainer::Entry const* CC_PropertyContainerContainer::getNextAfterCall(Entry const* visited,
                                                                                            unsigned int& index) const
{
    unsigned int place = 0;
    Entry const* entry = m_containers.getFirst();
    for (; entry != nullptr && entry != visited; entry = entry->getNext())
        ++place;
    if (entry != nullptr)
    {
        index = place + 1;
        return entry->getNext();
    }
    entry = m_containers.getFirst();
    for (place = 0; place < index && entry != nullptr; ++place)
        entry = entry->getNext();
    return entry;
}

CC_PropertyContainerContainer const& CC_PropertyContainerContainer::EMPTY()
{
    static CC_PropertyContainerContainer const empty;
    return empty;
}
