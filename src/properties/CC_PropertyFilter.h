#pragma once

#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/XCode.h"

class CC_PropertyContainer;

/// Reworks the properties that cross an endpoint: removes, rewrites or derives them. Implemented by modules and kept,
/// as a copy, in a CC_PropertyFilterContainer.
///
///     XCode WithholdName::apply(CC_PropertyContainer& properties) const
///     {
///         properties.remove(CC_PropertyId::NAME);
///         return XCode::OK;
///     }
class CC_EXPORT CC_PropertyFilter
{
public:
    CC_PropertyFilter() = default;
    /// For derived classes, whose `clone` copies. @{
    CC_PropertyFilter(CC_PropertyFilter const&) = default;
    CC_PropertyFilter& operator=(CC_PropertyFilter const&) = default;
    /// @}

    virtual ~CC_PropertyFilter();
    /// A copy, owned by the caller; null when memory is out.
    virtual CC_PropertyFilter* clone() const = 0;
    /// Reworks the container in place: OK or the filter's own code. What it has changed before a failure stays changed.
    virtual XCode apply(CC_PropertyContainer& properties) const = 0;
    /// Adds the filter's description to a dump and returns `info`.
    virtual InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                   unsigned int maxDetail, unsigned int detail, String const& prefix) const = 0;
};
