#include "properties/CC_PropertyContainer.h"

#include "platform/base/NestingGuard.h"
#include "properties/CC_PropertyKind.h"

#include <tuple>

namespace
{
unsigned int s_infoDepth = 0; // of all containers' dumps

bool IS_SELF_CONTAINED(CC_Property const& property)
{
    CC_PropertyKind const* const kind = CC_PropertyKind::OF(property);
    return kind != nullptr && kind->isSelfContained;
}

bool IS_MADE_A_COPY(CC_Property& stored, CC_Property const& property)
{
    CC_PropertyKind const* const kind =
        stored.getId() == property.getId() ? CC_PropertyKind::OF_BOTH(stored, property) : nullptr;
    return kind != nullptr && kind->assign(stored, property);
}
} // namespace

/// A walk that goes on whatever the properties that it visits do to the container meanwhile.
///
/// It finds its place again by the visited one's address, which is compared and not followed. Should another property
/// have come to that address, the walk goes on behind that one.
class CC_PropertyContainer::Walk
{
public:
    /// `isUndisturbed`: whether nobody is called meanwhile.
    explicit Walk(CC_PropertyContainer const& container, bool isUndisturbed = false)
        : m_container(container), m_isUndisturbed(isUndisturbed), m_position(container.m_properties.begin())
    {
        m_visited = isAtEnd() ? nullptr : &*m_position;
    }
    bool isAtEnd() const { return m_position == m_container.m_properties.end(); }
    CC_Property& operator*() const { return *m_visited; }
    CC_Property* operator->() const { return m_visited; }

    /// Behind the visited one if it is still there, otherwise to what has taken its place.
    void goOn()
    {
        if (m_isUndisturbed)
        {
            ++m_position;
            m_visited = isAtEnd() ? nullptr : &*m_position;
            return;
        }
        Position position = m_container.m_properties.begin();
        unsigned int index = 0;
        for (; position != m_container.m_properties.end() && &*position != m_visited; ++position)
            ++index;
        goTo(position != m_container.m_properties.end() ? index + 1 : m_index);
    }

private:
    void goTo(unsigned int index)
    {
        m_position = m_container.m_properties.begin();
        for (m_index = 0; m_index < index && !isAtEnd(); ++m_index)
            ++m_position;
        m_visited = isAtEnd() ? nullptr : &*m_position;
    }

    CC_PropertyContainer const& m_container;
    bool m_isUndisturbed;
    Position m_position;
    CC_Property* m_visited;
    unsigned int m_index = 0;
};

CC_PropertyContainer& CC_PropertyContainer::operator=(CC_PropertyContainer const& other)
{
    if (this == &other)
        return *this;
    if (m_isSelfContained && other.m_isSelfContained)
    {
        takeOver(other);
        return *this;
    }
    clear();
    for (Walk source(other); !source.isAtEnd(); source.goOn())
        std::ignore = replace(nullptr, *source); // what memory refuses is missing
    return *this;
}

/// The same where nobody is called, who could tell it from all being deleted and copied anew.
void CC_PropertyContainer::takeOver(CC_PropertyContainer const& other)
{
    Position stored = m_properties.begin();
    Position source = other.m_properties.begin();
    while (stored != m_properties.end() && source != other.m_properties.end() && IS_MADE_A_COPY(*stored, *source))
    {
        ++stored;
        ++source;
    }
    removeFrom(stored);
    for (; source != other.m_properties.end(); ++source)
        std::ignore = appendCopy(*source); // what memory refuses is missing
}

CC_Property* CC_PropertyContainer::get(unsigned int id) { return find(id); }

CC_Property const* CC_PropertyContainer::get(unsigned int id) const { return find(id); }

CC_Property* CC_PropertyContainer::getByIndex(unsigned int index) { return findByIndex(index); }

CC_Property const* CC_PropertyContainer::getByIndex(unsigned int index) const { return findByIndex(index); }

XCode CC_PropertyContainer::set(CC_Property const& property) { return replace(find(property.getId()), property); }

XCode CC_PropertyContainer::replace(CC_Property* stored, CC_Property const& property)
{
    if (stored != nullptr)
        return CC_Property::ASSIGN(*stored, property);
    CC_Property* const copy = property.clone();
    if (copy == nullptr)
        return XCode::NO_ELEMENT;
    if (!IS_SELF_CONTAINED(*copy))
        return appendOfAnyKind(copy);
    std::ignore = m_properties.append(copy); // it is in no list
    return XCode::OK;
}

/// Takes the copy over, also when it fails.
XCode CC_PropertyContainer::appendOfAnyKind(CC_Property* copy)
{
    m_isSelfContained = false;
    CC_Property* const stored = find(copy->getId()); // what the clone stored itself
    if (stored == nullptr && m_properties.append(copy).isOk())
        return XCode::OK;
    XCode const result = stored != nullptr ? CC_Property::ASSIGN(*stored, *copy) : XCode::FAILURE;
    delete copy;
    return result;
}

XCode CC_PropertyContainer::set(CC_PropertyContainer const& other, unsigned int mask)
{
    bool const isUndisturbed = m_isSelfContained && other.m_isSelfContained;
    for (Walk source(other, isUndisturbed); !source.isAtEnd(); source.goOn())
        if ((source->getId() & mask) != 0 && !set(*source).isOk())
            return XCode::FAILURE;
    return XCode::OK;
}

void CC_PropertyContainer::take(CC_PropertyContainer& other)
{
    for (Position position = other.m_properties.begin(); position != other.m_properties.end();)
    {
        CC_Property& property = *position;
        ++position;
        if ((property.getId() & ALL_GROUPS) != 0)
            other.m_properties.moveTo(m_properties, property);
    }
    m_isSelfContained = m_isSelfContained && other.m_isSelfContained;
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
        for (Walk walk(*this); !walk.isAtEnd(); walk.goOn())
            walk->getInfo(info, maxLevel, level + 1, maxDetail, detail, String::s_empty);
    return info;
}

CC_PropertyContainer const& CC_PropertyContainer::EMPTY()
{
    static CC_PropertyContainer const empty;
    return empty;
}

CC_Property* CC_PropertyContainer::Cursor::findElsewhere(unsigned int id)
{
    Position position = m_container.m_properties.begin();
    while (position != m_container.m_properties.end() && position->getId() != id)
        ++position;
    if (position == m_container.m_properties.end())
        return nullptr;
    CC_Property& found = *position;
    m_next = ++position;
    return &found;
}

/// REQUIRES: they are self-contained.
void CC_PropertyContainer::removeFrom(Position position)
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
