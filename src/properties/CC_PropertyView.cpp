#include "properties/CC_PropertyView.h"

#include <typeinfo>

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

void CC_PropertyView::assign(CC_PropertyContainer const& source, CC_Flags const* changed)
{
    auto const take = [](CC_Property& former, CC_Property const& current)
    {
        unsigned int const failedBefore = CC_Property::NUMBER_OF_FAILED_ASSIGNMENTS();
        if (typeid(former) != typeid(current))
            return false;
        former.assign(current);
        return CC_Property::NUMBER_OF_FAILED_ASSIGNMENTS() == failedBefore;
    };
    if (takeChanged(source, changed, take))
        return;
    m_properties = source;
    m_written = NONE;
    m_inStepWith = m_properties.getNumberOfProperties() == source.getNumberOfProperties() ? &source : nullptr;
}
