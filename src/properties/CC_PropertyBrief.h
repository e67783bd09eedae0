#pragma once

#include "platform/base/Export.h"
#include "recorder/CC_RecordFormat.h"

class CC_Property;

/// What a recording keeps of a property's value.
class CC_EXPORT CC_PropertyBrief
{
public:
    /// Allocates nothing and calls nobody but the media layer, for a context's id; of a module's class it keeps the
    /// name alone. Null: no property.
    static CC_RecordFormat::Brief OF(CC_Property const* property);
};
