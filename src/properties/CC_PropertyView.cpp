#include "properties/CC_PropertyView.h"

void CC_PropertyView::clear()
{
    m_inStepWith = nullptr;
    interrupt();
    m_properties.clear(); // last: an ending property may destroy us
}

XCode CC_PropertyView::write(CC_Property const& property)
{
    if (m_written != NONE && m_written != property.getId())
        m_inStepWith = nullptr;
    m_written = property.getId();
    return m_properties.set(property);
}

XCode CC_PropertyView::write(CC_PropertyContainer const& properties)
{
    m_inStepWith = nullptr;
    return m_properties.set(properties);
}

bool CC_PropertyView::ASSIGN_ONE(CC_Property& former, CC_Property const& current)
{
    CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(former, current);
    return kind != nullptr && kind->isSelfContained && kind->assign(former, current);
}

void CC_PropertyView::assign(CC_PropertyContainer const& source, Told const& told)
{
    auto const take = [](CC_Property& former, CC_Property const& current) { return ASSIGN_ONE(former, current); };
    if (takeChanged(source, told, take))
        return;
    bool const isUndisturbed = m_properties.isSelfContained() && source.isSelfContained();
    m_lastHeard = told.number;
    m_written = NONE;
    m_inStepWith = nullptr;
    m_properties.interruptFollowing(); // who assigns later knows more
    if (!isUndisturbed)
        return assignCopy(source);
    m_properties = source;
    if (m_properties.getNumberOfProperties() == source.getNumberOfProperties())
        m_inStepWith = &source;
}

/// A module's class may do anything when it is cloned or ended: assign as well, which is then the later time, or
/// destroy us.
void CC_PropertyView::assignCopy(CC_PropertyContainer const& source)
{
    CC_PropertyContainer::Following const self(m_properties);
    CC_PropertyContainer copy;
    std::ignore = copy.copy(source); // what memory refuses is missing
    if (self.isAlive())
        m_properties.swap(copy); // what was there before ends last
}

void CC_PropertyView::assignMarked(CC_PropertyContainer const& copy, CC_PropertyContainer::Marks marks,
                                   unsigned int number)
{
    auto const take = [](CC_Property& former, CC_Property const& current) { return ASSIGN_ONE(former, current); };
    if (!takeMarked(copy, marks, number, take))
        assign(copy, {nullptr, number});
}

bool CC_PropertyView::hasAllOfOwnKinds(CC_PropertyContainer const& copy, CC_PropertyContainer const& source)
{
    for (CC_Property const& property : source)
        if (CC_PropertyKind::OF(property) != nullptr && copy.get(property.getId()) == nullptr)
            return false;
    return true;
}
