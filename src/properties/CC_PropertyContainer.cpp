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

CC_PropertyContainer& CC_PropertyContainer::operator=(CC_PropertyContainer const& other)
{
    if (this == &other)
        return *this;
    clear();
    for (CC_Property const& property : other)
    {
        CC_Property* const copy = property.clone();
        if (copy != nullptr && !m_properties.append(copy).isOk())
            delete copy;
    }
    return *this;
}

CC_Property* CC_PropertyContainer::get(unsigned int id) { return find(id); }

CC_Property const* CC_PropertyContainer::get(unsigned int id) const { return find(id); }

CC_Property* CC_PropertyContainer::getByIndex(unsigned int index) { return findByIndex(index); }

CC_Property const* CC_PropertyContainer::getByIndex(unsigned int index) const { return findByIndex(index); }

XCode CC_PropertyContainer::set(CC_Property const& property)
{
    if (CC_Property* const stored = find(property.getId()))
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
