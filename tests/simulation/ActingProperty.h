#pragma once

#include "properties/CC_Property.h"

namespace Simulation
{
/// A module's property of a number, written without the library's help: it calls out when it is cloned, assigned,
/// compared, printed and ended.
class ActingProperty : public CC_Property
{
public:
    ActingProperty(unsigned int id, unsigned int number) : CC_Property(id), m_number(number) {}
    ActingProperty(ActingProperty const&) = default;
    ~ActingProperty() override;

    unsigned int getNumber() const { return m_number; }
    CC_Property& assign(CC_Property const& other) override;
    CC_Property* clone() const override;
    String& getValueString(String& out) const override;
    bool isEqual(CC_Property const& other) const override;

private:
    unsigned int m_number;
};
} // namespace Simulation
