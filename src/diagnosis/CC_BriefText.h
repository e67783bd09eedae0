#pragma once

#include "platform/base/Export.h"
#include "recorder/CC_RecordFormat.h"

#include <string>
#include <string_view>

/// What a recorded value prints as: as the property itself did, as far as the recording holds it.
namespace CC_BriefText
{
/// "(none)" for no property; what was cut short ends in "..."; of a record of charge, tariff or quality, and of a
/// module's value, the class in brackets. Throws std::bad_alloc when memory is out.
CC_EXPORT std::string OF(unsigned int propertyId, CC_RecordFormat::Brief const& brief);

/// Takes a value off the front of a recording's octets: no property where there is none, less where not all is there.
CC_EXPORT CC_RecordFormat::Brief TAKE(std::string_view& octets);
} // namespace CC_BriefText
