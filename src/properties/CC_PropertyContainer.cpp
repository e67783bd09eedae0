#include "properties/CC_PropertyContainer.h"

#include "platform/base/NestingGuard.h"

namespace
{
unsigned int s_infoDepth = 0; // of all containers' dumps

/// Whether memory sufficed; a value of another class is left out silently.
bool ASSIGN(CC_Property& stored, CC_Property const& property)
{
    unsigned int const failedBefore = CC_Property::NUMBER_OF_FAILED_ASSIGNMENTS();
    stored.assign(property);
    return CC_Property::NUMBER_OF_FAILED_ASSIGNMENTS() == failedBefore;
}

} // namespace

bool CC_PropertyContainer::IS_MADE_A_COPY(CC_Property& stored, CC_Property const& property)
{
    unsigned int const wholeBefore = CC_Property::NUMBER_OF_WHOLE_ASSIGNMENTS();
    stored.assign(property);
    return CC_Property::NUMBER_OF_WHOLE_ASSIGNMENTS() != wholeBefore;
}

CC_PropertyContainer& CC_PropertyContainer::operator=(CC_PropertyContainer const& other)
{
    if (this == &other)
        return *this;
    Iterator stored = m_properties.begin();
    ConstIterator source = other.begin();
    while (stored != m_properties.end() && source != other.end() && stored->getId() == source->getId() &&
           IS_MADE_A_COPY(*stored, *source))
    {
        ++stored;
        ++source;
    }
    removeFrom(stored);
    for (; source != other.end(); ++source)
    {
        CC_Property* const copy = source->clone();
        if (copy != nullptr && !m_properties.append(copy).isOk())
            delete copy;
    }
    return *this;
}

CC_Property* CC_PropertyContainer::get(unsigned int id) { return find(id); }

CC_Property const* CC_PropertyContainer::get(unsigned int id) const { return find(id); }

CC_Property* CC_PropertyContainer::getByIndex(unsigned int index) { return findByIndex(index); }

CC_Property const* CC_PropertyContainer::getByIndex(unsigned int index) const { return findByIndex(index); }

XCode CC_PropertyContainer::set(CC_Property const& property) { return replace(find(property.getId()), property); }

XCode CC_PropertyContainer::replace(CC_Property* stored, CC_Property const& property)
{
    if (stored != nullptr)
        return ASSIGN(*stored, property) ? XCode::OK : XCode::NO_ELEMENT;
    CC_Property* const copy = property.clone();
    if (copy == nullptr)
        return XCode::NO_ELEMENT;
    if (m_properties.append(copy).isOk())
        return XCode::OK;
    delete copy;
    return XCode::FAILURE;
}

XCode CC_PropertyContainer::set(CC_PropertyContainer const& other, unsigned int mask)
{
    for (CC_Property const& property : other)
        if ((property.getId() & mask) != 0 && !set(property).isOk())
            return XCode::FAILURE;
    return XCode::OK;
}

void CC_PropertyContainer::take(CC_PropertyContainer& other)
{
    for (Iterator position = other.m_properties.begin(); position != other.m_properties.end();)
    {
        CC_Property& property = *position;
        ++position;
        if ((property.getId() & ALL_GROUPS) != 0)
            other.m_properties.moveTo(m_properties, property);
    }
}

bool CC_PropertyContainer::remove(unsigned int id)
{
    CC_Property* const property = find(id);
    if (property != nullptr)
        m_properties.remove(*property);
    return property != nullptr;
}

bool CC_PropertyContainer::removeByIndex(unsigned int index)
{
    CC_Property* const property = findByIndex(index);
    if (property != nullptr)
        m_properties.remove(*property);
    return property != nullptr;
}

InfoContainer& CC_PropertyContainer::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                             unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    NestingGuard const nesting(s_infoDepth);
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Properties", String::s_empty);
    if (level + 1 <= maxLevel && detail <= maxDetail && nesting.isOutermost())
        for (CC_Property const& property : *this)
            property.getInfo(info, maxLevel, level + 1, maxDetail, detail, String::s_empty);
    return info;
}

CC_PropertyContainer const& CC_PropertyContainer::EMPTY()
{
    static CC_PropertyContainer const empty;
    return empty;
}

CC_Property* CC_PropertyContainer::Cursor::findElsewhere(unsigned int id)
{
    Iterator position = m_container.m_properties.begin();
    while (position != m_container.m_properties.end() && position->getId() != id)
        ++position;
    if (position == m_container.m_properties.end())
        return nullptr;
    CC_Property& found = *position;
    m_next = ++position;
    return &found;
}

void CC_PropertyContainer::removeFrom(Iterator position)
{
    while (position != m_properties.end())
    {
        CC_Property& removed = *position;
        ++position;
        m_properties.remove(removed);
    }
}

CC_Property* CC_PropertyContainer::find(unsigned int id) const
{
    for (CC_Property& property : m_properties)
        if (property.getId() == id)
            return &property;
    return nullptr;
}

CC_Property* CC_PropertyContainer::findByIndex(unsigned int index) const
{
    for (CC_Property& property : m_properties)
        if (index-- == 0)
            return &property;
    return nullptr;
}
