#pragma once

#include "platform/base/Export.h"
#include "platform/base/TYVector.h"

class CC_Property;

/// Makes properties by their ids. Implemented by whoever adds ids of its own, registered with
/// `CallControl::ADD_PROPERTY_FACTORY`; it belongs to its creator, who keeps it alive while it is registered.
///
///     void MyFactory::getPropertyIds(TYVector<unsigned int>& ids) const { std::ignore = ids.append(MY_ID); }
///     CC_Property* MyFactory::createProperty(unsigned int id)
///     {
///         return id == MY_ID ? CC_PropertyString(MY_ID).clone() : nullptr;
///     }
class CC_EXPORT CC_PropertyFactory
{
public:
    CC_PropertyFactory() = default;

    virtual ~CC_PropertyFactory();
    /// Appends the ids that the factory creates; what the vector holds stays in front of them.
    virtual void getPropertyIds(TYVector<unsigned int>& ids) const = 0;
    /// A new property of that id, owned by the caller; null for an id of another factory and when memory is out.
    virtual CC_Property* createProperty(unsigned int id) = 0;

protected:
    /// For derived classes. @{
    CC_PropertyFactory(CC_PropertyFactory const&) = default;
    CC_PropertyFactory& operator=(CC_PropertyFactory const&) = default;
    /// @}
};
