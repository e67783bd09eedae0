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
    if (takeChanged(source, told, CC_PropertyContainer::IS_MADE_A_COPY))
        return;
    m_properties = source;
    m_lastHeard = told.number;
    m_written = NONE;
    m_inStepWith = m_properties.getNumberOfProperties() == source.getNumberOfProperties() ? &source : nullptr;
}
