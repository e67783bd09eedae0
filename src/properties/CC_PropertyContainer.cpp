#include "properties/CC_PropertyContainer.h"

#include "platform/base/NestingGuard.h"
#include "properties/CC_PropertyKind.h"

#include <algorithm>
#include <tuple>
#include <utility>

namespace
{
unsigned int s_infoDepth = 0;                  // of all containers' dumps
constexpr unsigned int MOST_REMOVALS = 100000; // of one `clear`, should ending properties always bring others

/// REQUIRES: the same id.
bool IS_MADE_A_COPY(CC_Property& stored, CC_Property const& property)
{
    CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(stored, property);
    return kind != nullptr && kind->assign(stored, property);
}
} // namespace

namespace
{
thread_local void* t_innermostWatch __attribute__((tls_model("initial-exec"))) = nullptr;
thread_local void* t_innermostFollowing __attribute__((tls_model("initial-exec"))) = nullptr;
} // namespace

CC_PropertyContainer::Watch::Watch(CC_PropertyContainer const& container)
    : m_container(&container), m_outer(static_cast<Watch*>(t_innermostWatch))
{
    container.m_isWatched = true;
    t_innermostWatch = this;
}

CC_PropertyContainer::Watch::~Watch() { t_innermostWatch = m_outer; }

void CC_PropertyContainer::tellWatches() const
{
    for (auto* watch = static_cast<Watch*>(t_innermostWatch); watch != nullptr; watch = watch->m_outer)
        if (watch->m_container == this)
            watch->m_container = nullptr;
}

CC_PropertyContainer::Following::Following(CC_PropertyContainer const& container)
    : m_watch(container), m_outer(static_cast<Following*>(t_innermostFollowing))
{
    t_innermostFollowing = this;
}

CC_PropertyContainer::Following::~Following() { t_innermostFollowing = m_outer; }

void CC_PropertyContainer::tellFollowing() const
{
    for (auto* former = static_cast<Following*>(t_innermostFollowing); former != nullptr; former = former->m_outer)
        if (former->m_watch.m_container == this)
            former->m_watch.m_container = nullptr;
}

/// A walk that goes on whatever the properties that it visits do to the container meanwhile.
///
/// It finds its place again by the visited one's address, which is compared and not followed. Should another property
/// have come to that address, the walk goes on behind that one. When the container is destroyed it has ended.
class CC_PropertyContainer::Walk
{
public:
    explicit Walk(CC_PropertyContainer const& container) : m_container(container), m_watch(container) { goTo(0); }
    bool isAtEnd() const { return m_visited == nullptr; }
    CC_Property& operator*() const { return *m_visited; }
    CC_Property* operator->() const { return m_visited; }

    /// Behind the visited one if it is still there, otherwise to what has taken its place.
    void goOn()
    {
        if (!m_watch.isAlive())
        {
            m_visited = nullptr;
            return;
        }
        unsigned int index = 0;
        for (CC_Property const& property : m_container.m_properties)
        {
            if (&property == m_visited)
                return goTo(index + 1);
            ++index;
        }
        goTo(m_index);
    }

private:
    void goTo(unsigned int index)
    {
        m_index = index;
        m_visited = m_container.findByIndex(index);
    }

    CC_PropertyContainer const& m_container;
    Watch const m_watch;
    CC_Property* m_visited = nullptr;
    unsigned int m_index = 0;
};

CC_PropertyContainer& CC_PropertyContainer::operator=(CC_PropertyContainer const& other)
{
    if (this == &other)
        return *this;
    if (m_isSelfContained && other.m_isSelfContained)
    {
        markAll();
        std::ignore = takeOver(other);
        return *this;
    }
    std::ignore = copy(other); // what memory refuses is missing
    return *this;
}

XCode CC_PropertyContainer::copy(CC_PropertyContainer const& other)
{
    Watch const self(*this);
    Watch const source(other);
    clear();
    if (!self.isAlive() || !source.isAlive())
        return XCode::FAILURE; // an ending property was faster
    XCode result = XCode::OK;
    for (Walk walk(other); !walk.isAtEnd() && self.isAlive(); walk.goOn())
        if (XCode const stored = set(*walk); result.isOk())
            result = stored;
    return self.isAlive() ? result : XCode::FAILURE;
}

bool CC_PropertyContainer::takeMarked(CC_PropertyContainer const& other, Marks marks)
{
    auto const takeOne = [](CC_Property& stored, CC_Property const& source, unsigned int)
    { return IS_MADE_A_COPY(stored, source); };
    return marks != ALL_MARKED && m_properties.getCount() == other.m_properties.getCount() &&
           forEachMarked(other, marks, takeOne);
}

/// The same where nobody is called, who could tell it from all being deleted and copied anew.
unsigned int CC_PropertyContainer::takeOver(CC_PropertyContainer const& other)
{
    unsigned int kept = 0;
    Position stored = m_properties.begin();
    Position source = other.m_properties.begin();
    while (stored != m_properties.end() && source != other.m_properties.end() && stored->getId() == source->getId() &&
           IS_MADE_A_COPY(*stored, *source))
    {
        ++stored;
        ++source;
        ++kept;
    }
    removeFrom(stored);
    for (; source != other.m_properties.end(); ++source)
        std::ignore = appendCopy(*source); // what memory refuses is missing
    return kept;
}

CC_PropertyContainer::Marks CC_PropertyContainer::findMark(unsigned int id) const
{
    unsigned int index = 0;
    for (CC_Property const& property : m_properties)
    {
        if (property.getId() == id)
            return MARK_AT(index);
        ++index;
    }
    return 0;
}

CC_Property* CC_PropertyContainer::get(unsigned int id)
{
    unsigned int index = 0;
    for (CC_Property& property : m_properties)
    {
        if (property.getId() == id)
        {
            mark(MARK_AT(index));
            return &property;
        }
        ++index;
    }
    return nullptr;
}

CC_Property const* CC_PropertyContainer::get(unsigned int id) const { return find(id); }

CC_Property* CC_PropertyContainer::getByIndex(unsigned int index)
{
    CC_Property* const property = findByIndex(index);
    if (property != nullptr)
        mark(MARK_AT(index));
    return property;
}

CC_Property const* CC_PropertyContainer::getByIndex(unsigned int index) const { return findByIndex(index); }

XCode CC_PropertyContainer::set(CC_Property const& property)
{
    CC_Property* const stored = get(property.getId()); // which marks it
    if (stored == nullptr)
        markAll();
    return replace(stored, property);
}

XCode CC_PropertyContainer::replace(CC_Property* stored, CC_Property const& property)
{
    if (stored != nullptr)
        return CC_Property::ASSIGN(*stored, property); // and nothing else: an assign may destroy us
    CC_PropertyKind const* const kind = CC_PropertyKind::OF(property);
    if (kind == nullptr)
        return appendForeign(property);
    if (!appendCopy(property))
        return XCode::NO_ELEMENT;
    m_isSelfContained = m_isSelfContained && kind->isSelfContained;
    return XCode::OK;
}

XCode CC_PropertyContainer::set(CC_Property const& property, Following const& self)
{
    if (find(property.getId()) != nullptr || CC_PropertyKind::OF(property) != nullptr)
        return set(property);
    markAll();
    return appendForeign(property, self.m_watch);
}

XCode CC_PropertyContainer::appendForeign(CC_Property const& property) { return appendForeign(property, Watch(*this)); }

/// `self`: whether that is still to be done when the property has been cloned.
XCode CC_PropertyContainer::appendForeign(CC_Property const& property, Watch const& self)
{
    CC_Property* const copy = property.clone();
    if (copy == nullptr)
        return XCode::NO_ELEMENT;
    XCode result = XCode::FAILURE;
    if (self.isAlive())
    {
        m_isSelfContained = false;
        m_hasForeign = true;
        CC_Property* const stored = find(copy->getId()); // what the clone stored itself
        if (stored == nullptr && m_properties.append(copy).isOk())
            return XCode::OK;
        if (stored != nullptr)
            result = CC_Property::ASSIGN(*stored, *copy);
    }
    delete copy;
    return result;
}

/// As long as an ending property adds others they end as well, up to a bound.
void CC_PropertyContainer::clearOfAnyKind()
{
    Watch const self(*this);
    for (unsigned int left = MOST_REMOVALS; left > 0 && self.isAlive() && !m_properties.isEmpty(); --left)
        m_properties.remove(*m_properties.begin());
    if (!self.isAlive())
        return;
    m_isSelfContained = m_properties.isEmpty();
    m_hasForeign = !m_isSelfContained;
}

XCode CC_PropertyContainer::set(CC_PropertyContainer const& other, unsigned int mask)
{
    if (takesUndisturbed(other))
    {
        for (CC_Property const& property : other)
            if ((property.getId() & mask) != 0 && !set(property).isOk())
                return XCode::FAILURE;
        return XCode::OK;
    }
    return setDisturbed(other, mask);
}

/// The same where a module's class may do anything to both.
XCode CC_PropertyContainer::setDisturbed(CC_PropertyContainer const& other, unsigned int mask)
{
    Watch const self(*this);
    for (Walk source(other); !source.isAtEnd(); source.goOn())
        if ((source->getId() & mask) != 0 && (!set(*source).isOk() || !self.isAlive()))
            return XCode::FAILURE;
    return XCode::OK;
}

XCode CC_PropertyContainer::setEach(CC_PropertyContainer const& other, unsigned int mask)
{
    XCode result = XCode::OK;
    auto const setOne = [&](CC_Property const& property)
    {
        if ((property.getId() & mask) == 0)
            return;
        if (XCode const stored = set(property); result.isOk())
            result = stored;
    };
    if (takesUndisturbed(other))
    {
        std::for_each(other.begin(), other.end(), setOne);
        return result;
    }
    Watch const self(*this);
    for (Walk source(other); !source.isAtEnd() && self.isAlive(); source.goOn())
        setOne(*source);
    return result;
}

void CC_PropertyContainer::swap(CC_PropertyContainer& other)
{
    unsigned int const taken = other.m_properties.getCount();
    while (!m_properties.isEmpty())
        m_properties.moveTo(other.m_properties, *m_properties.begin());
    for (unsigned int i = 0; i < taken; ++i)
        other.m_properties.moveTo(m_properties, *other.m_properties.begin());
    markAll();
    other.markAll();
    std::swap(m_isSelfContained, other.m_isSelfContained);
    bool const hasForeign = m_hasForeign;
    m_hasForeign = other.m_hasForeign;
    other.m_hasForeign = hasForeign;
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
    markAll();
    m_isSelfContained = m_isSelfContained && other.m_isSelfContained;
    m_hasForeign = m_hasForeign || other.m_hasForeign;
}

bool CC_PropertyContainer::remove(unsigned int id)
{
    markAll();
    CC_Property* const property = find(id);
    if (property != nullptr)
        m_properties.remove(*property);
    return property != nullptr;
}

bool CC_PropertyContainer::removeByIndex(unsigned int index)
{
    markAll();
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
    Position position = m_container->m_properties.begin();
    while (position != m_container->m_properties.end() && position->getId() != id)
        ++position;
    if (position == m_container->m_properties.end())
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
