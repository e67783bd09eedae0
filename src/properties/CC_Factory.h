#pragma once

#include "properties/CC_PropertyFactory.h"

/// The built-in factory of the ids in CC_PropertyTable. It has no state; the application makes one and registers it.
///
///     static CC_Factory factory;
///     XCode const result = CallControl::ADD_PROPERTY_FACTORY(&factory);
class CC_EXPORT CC_Factory : public CC_PropertyFactory
{
public:
    CC_Factory();
    ~CC_Factory() override;
    /// Appends the 57 listed ids in their fixed order, or none when memory is out. Gives the library's classes, those
    /// that other factories make included, their type numbers: registering the factory is what settles them.
    void getPropertyIds(TYVector<unsigned int>& ids) const override;
    /// As the base says. URI, SIP Headers and Quality-Of-Service have names but come from elsewhere.
    CC_Property* createProperty(unsigned int id) override;
};
