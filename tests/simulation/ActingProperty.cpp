#include "tests/simulation/ActingProperty.h"

#include "tests/simulation/World.h"

#include <new>

namespace Simulation
{
ActingProperty::~ActingProperty() { World::CALL_OUT(CallOut::PROPERTY_END); }

// what the call-out may end is not touched after it
CC_Property& ActingProperty::assign(CC_Property const& other)
{
    if (auto const* const same = dynamic_cast<ActingProperty const*>(&other))
    {
        CC_Property::operator=(other);
        m_number = same->m_number;
    }
    World::CALL_OUT(CallOut::PROPERTY_ASSIGN);
    return *this;
}

CC_Property* ActingProperty::clone() const
{
    CC_Property* const copy = new (std::nothrow) ActingProperty(*this);
    World::CALL_OUT(CallOut::PROPERTY_CLONE);
    return copy;
}

String& ActingProperty::getValueString(String& out) const
{
    out.format("%u", m_number);
    World::CALL_OUT(CallOut::PROPERTY_TEXT);
    return out;
}

bool ActingProperty::isEqual(CC_Property const& other) const
{
    auto const* const same = dynamic_cast<ActingProperty const*>(&other);
    bool const isSame = same != nullptr && same->m_number == m_number;
    World::CALL_OUT(CallOut::PROPERTY_COMPARE);
    return isSame;
}
} // namespace Simulation
