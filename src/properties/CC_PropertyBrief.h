#pragma once

#include "platform/base/Export.h"
#include "platform/base/XCode.h"
#include "recorder/CC_RecordFormat.h"

#include <array>
#include <cstddef>
#include <string_view>

class CC_Property;
class CC_PropertyContainer;

/// What a recording keeps of a property's value. It allocates nothing and calls nobody but the media layer, for a
/// context's id; of a module's class it keeps the name alone.
///
///     return CC_PropertyBrief::REPLACE(m_properties, stored, property, Kind::LEG_CHANGED, call, leg);
class CC_EXPORT CC_PropertyBrief
{
public:
    /// Null: no property.
    explicit CC_PropertyBrief(CC_Property const* property);

    /// As they stand in a recording: the same ones for the same value.
    std::string_view getOctets() const { return {m_place.data(), m_size}; }

    /// As the container's `replace`, recorded as a change of that call or leg when it was done. REQUIRES: something is
    /// recorded.
    static XCode REPLACE(CC_PropertyContainer& in, CC_Property* stored, CC_Property const& property,
                         CC_RecordFormat::Kind kind, unsigned long long call, unsigned long long leg);

private:
    static XCode REPLACE_OF_ANY_CLASS(CC_PropertyContainer& in, CC_Property* stored, CC_Property const& property,
                                      CC_RecordFormat::Kind kind, unsigned long long call, unsigned long long leg);
    static XCode REPLACE_OF_ANY_KIND(CC_PropertyContainer& in, CC_Property const& property, CC_RecordFormat::Kind kind,
                                     unsigned long long call, unsigned long long leg);

    // a text is filled up to its last word before it is written
    alignas(CC_RecordFormat::BriefHead) std::array<char, CC_RecordFormat::LARGEST_BRIEF + 4> m_place;
    std::size_t m_size;
};
