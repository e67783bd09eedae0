#include "properties/CC_PropertyFilterContainer.h"

#include "platform/base/NestingGuard.h"
#include "properties/CC_PropertyBrief.h"
#include "properties/CC_PropertyContainer.h"
#include "recorder/CC_FilterNotes.h"
#include "recorder/CC_RecordWriter.h"

#include <array>
#include <cstring>
#include <new>
#include <typeinfo>
#include <utility>

namespace
{
constexpr unsigned int AT_THE_END = 0xffffffff;
unsigned int s_infoDepth = 0; // of all filter containers' dumps
} // namespace

CC_PropertyFilter::~CC_PropertyFilter() = default;

CC_PropertyFilterContainer::~CC_PropertyFilterContainer()
{
    while (m_filters.getFirst() != nullptr)
        removeFilter(0);
}

CC_PropertyFilter const* CC_PropertyFilterContainer::getFilter(unsigned int index) const
{
    Element const* const element = find(index);
    return element != nullptr ? element->getValue() : nullptr;
}

XCode CC_PropertyFilterContainer::addFilter(CC_PropertyFilter const& filter) { return addFilter(filter, AT_THE_END); }

XCode CC_PropertyFilterContainer::addFilter(CC_PropertyFilter const& filter, unsigned int index)
{
    CC_PropertyFilter* const copy = filter.clone();
    return copy != nullptr ? insert(copy, index) : XCode::NO_ELEMENT;
}

XCode CC_PropertyFilterContainer::replaceFilter(CC_PropertyFilter const& filter, unsigned int index)
{
    CC_PropertyFilter* const copy = filter.clone();
    if (copy == nullptr)
        return XCode::NO_ELEMENT;
    Element* const element = find(index);
    if (element == nullptr)
        return insert(copy, index);
    CC_PropertyFilter const* const replaced = element->getValue();
    element->setValue(nullptr); // the element stays, so that there is no memory to be refused
    delete replaced;
    if (!isThere(element))
        return insert(copy, index);
    element->setValue(copy);
    return XCode::OK;
}

void CC_PropertyFilterContainer::removeFilter(unsigned int index)
{
    Element* const element = find(index);
    if (element == nullptr)
        return;
    CC_PropertyFilter const* const removed = element->getValue();
    ++m_changes;
    m_filters.remove(element);
    delete removed;
}

namespace
{
/// A filter is a module's code, and building a property may lack memory: that is a failure of the filter like any
/// other.
XCode APPLY(CC_PropertyFilter const& filter, CC_PropertyContainer& properties)
{
    try
    {
        return filter.apply(properties);
    }
    catch (std::bad_alloc const&)
    {
        return XCode::NO_ELEMENT;
    }
}

} // namespace

/// Notes for a recording which filter makes which property different. Without notes, because the properties are not on
/// their way to a leg or call, it does nothing.
///
/// Only what the filter has had for writing is looked at, and the container is walked as a constant one: its marks tell
/// who copies it what is to be copied again.
class CC_PropertyFilterContainer::Changes
{
public:
    Changes(CC_PropertyContainer& properties, CC_FilterNotes* notes) : m_properties(properties), m_notes(notes)
    {
        if (m_notes == nullptr)
            return;
        m_marks = m_properties.takeMarks();
        for (CC_Property const& property : std::as_const(m_properties))
            add(property);
    }
    ~Changes() { m_properties.mark(m_marks); }
    Changes(Changes const&) = delete;
    Changes& operator=(Changes const&) = delete;

    /// Those since the last time, as that filter's. `name`: of its class, as the compiler writes it.
    void note(char const* name, unsigned int place)
    {
        CC_PropertyContainer::Marks const marks = m_notes != nullptr ? m_properties.takeMarks() : 0;
        if (marks == 0)
            return;
        m_marks = static_cast<CC_PropertyContainer::Marks>(m_marks | marks);
        unsigned int index = 0;
        for (CC_Property const& property : std::as_const(m_properties))
            if ((marks & CC_PropertyContainer::MARK_AT(index++)) != 0 && hasChanged(property))
                m_notes->add({property.getId(), place, name});
    }

private:
    static constexpr std::size_t MOST = 48; // beyond these nothing is noted
    struct Value
    {
        unsigned int id;
        CC_PropertyBrief brief;
    };
    union Place // of which as many hold a value as were counted
    {
        Place() {}
        Value value;
    };

    bool hasChanged(CC_Property const& property)
    {
        for (std::size_t i = 0; i < m_count; ++i)
        {
            Value& known = m_values[i].value;
            if (known.id != property.getId())
                continue;
            CC_PropertyBrief const before = std::exchange(known.brief, CC_PropertyBrief(&property));
            return before.getOctets() != known.brief.getOctets();
        }
        return add(property);
    }
    bool add(CC_Property const& property)
    {
        if (m_count == MOST)
            return false;
        new (&m_values[m_count++]) Value{property.getId(), CC_PropertyBrief(&property)};
        return true;
    }

    CC_PropertyContainer& m_properties;
    CC_FilterNotes* m_notes;
    CC_PropertyContainer::Marks m_marks = 0; // which we have taken
    std::size_t m_count = 0;
    std::array<Place, MOST> m_values;
};

XCode CC_PropertyFilterContainer::applyFilters(CC_PropertyContainer& properties) const
{
    CC_RecordWriter* const recorder = CC_RecordWriter::ON();
    if (recorder != nullptr)
        return applyRecorded(properties, CC_Writing::NOTES(*recorder));
    XCode result = XCode::OK;
    forEach(
        [&](CC_PropertyFilter const& filter)
        {
            if (XCode const applied = APPLY(filter, properties); result.isOk())
                result = applied;
        });
    return result;
}

XCode CC_PropertyFilterContainer::applyRecorded(CC_PropertyContainer& properties, CC_FilterNotes* notes) const
{
    Changes changes(properties, notes);
    XCode result = XCode::OK;
    unsigned int place = 0;
    forEach(
        [&](CC_PropertyFilter const& filter)
        {
            CC_Writing const pastTheAdapter(CC_RecordFormat::Writer::FILTER);
            char const* const name = typeid(filter).name(); // the filter may be gone afterwards
            if (XCode const applied = APPLY(filter, properties); result.isOk())
                result = applied;
            changes.note(name, place++);
        });
    return result;
}

InfoContainer& CC_PropertyFilterContainer::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                                   unsigned int maxDetail, unsigned int detail,
                                                   String const& prefix) const
{
    NestingGuard const nesting(s_infoDepth);
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Call-Control Property Filter Container",
                   String::s_empty);
    if (level + 1 <= maxLevel && detail <= maxDetail && nesting.isOutermost())
        forEach([&](CC_PropertyFilter const& filter)
                { filter.getInfo(info, maxLevel, level + 1, maxDetail, detail, String::s_empty); });
    return info;
}

/// Calls `visit(filter)` for each, which may change the list: the walk goes on behind the visited element if it is
/// still there, otherwise with what has taken its place. Elements that are gone are compared by address and not
/// touched.
template <class Visit>
void CC_PropertyFilterContainer::forEach(Visit const& visit) const
{
    unsigned int index = 0;
    for (Element const* element = m_filters.getFirst(); element != nullptr;)
    {
        unsigned int const changes = m_changes;
        if (element->getValue() != nullptr)
            visit(*element->getValue());
        if (m_changes == changes)
        {
            ++index;
            element = element->getNext();
            continue;
        }
        unsigned int place = 0;
        Element const* found = m_filters.getFirst();
        for (; found != nullptr && found != element; found = found->getNext())
            ++place;
        if (found != nullptr)
            index = place + 1;
        element = found != nullptr ? found->getNext() : find(index);
    }
}

bool CC_PropertyFilterContainer::isThere(Element const* element) const
{
    Element const* other = m_filters.getFirst();
    while (other != nullptr && other != element)
        other = other->getNext();
    return other != nullptr;
}

CC_PropertyFilterContainer::Element* CC_PropertyFilterContainer::find(unsigned int index) const
{
    Element* element = m_filters.getFirst();
    while (element != nullptr && index-- != 0)
        element = element->getNext();
    return element;
}

/// Takes the filter over, also when it fails.
XCode CC_PropertyFilterContainer::insert(CC_PropertyFilter* owned, unsigned int index)
{
    ++m_changes;
    Element* const added = m_filters.append(nullptr);
    if (added == nullptr)
    {
        delete owned;
        return XCode::NO_ELEMENT;
    }
    // the list only appends: from the position on, every filter moves one element up
    for (Element* element = index < getNumberOfFilters() ? find(index) : added; element != nullptr;
         element = element->getNext())
    {
        CC_PropertyFilter* const displaced = element->getValue();
        element->setValue(owned);
        owned = displaced;
    }
    return XCode::OK;
}
