#include "properties/CC_PropertyView.h"

void CC_PropertyView::clear()
{
    m_properties.clear();
    m_inStepWith = nullptr;
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

void CC_PropertyView::assign(CC_PropertyContainer const& source, Told const& told)
{
    auto const take = [](CC_Property& former, CC_Property const& current)
    {
        CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(former, current);
        return kind != nullptr && kind->isSelfContained && kind->assign(former, current);
    };
    if (takeChanged(source, told, take))
        return;
    m_properties = source;
    m_lastHeard = told.number;
    m_written = NONE;
    bool const isWhole = m_properties.getNumberOfProperties() == source.getNumberOfProperties();
    m_inStepWith = isWhole && source.isSelfContained() ? &source : nullptr;
}

bool CC_PropertyView::hasAllOfOwnKinds(CC_PropertyContainer const& copy, CC_PropertyContainer const& source)
{
    for (CC_Property const& property : source)
        if (CC_PropertyKind::OF(property) != nullptr && copy.get(property.getId()) == nullptr)
            return false;
    return true;
}
