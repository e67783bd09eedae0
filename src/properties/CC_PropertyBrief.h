#pragma once

#include "platform/base/Export.h"
#include "recorder/CC_RecordFormat.h"

#include <array>
#include <cstddef>

class CC_Property;
class CC_PropertyKind;
class CC_RecordWriter;

/// What a recording keeps of a property's value. It allocates nothing and calls nobody but the media layer, for a
/// context's id; of a module's class it keeps the name alone.
///
///     CC_PropertyBrief const before(stored);
///     ...
///     before.recordChange(Kind::LEG_CHANGED, call, leg, id, property);
class CC_EXPORT CC_PropertyBrief
{
public:
    /// Null: no property.
    explicit CC_PropertyBrief(CC_Property const* property);

    CC_RecordFormat::Brief const& get() const
    {
        return *reinterpret_cast<CC_RecordFormat::Brief const*>(m_place.data());
    }
    std::size_t getSize() const { return m_size; }

    /// Records, if that is on, that this was the value and `after` is it now.
    void recordChange(CC_RecordFormat::Kind kind, unsigned long long call, unsigned long long leg,
                      unsigned int propertyId, CC_Property const* after) const;

    /// The values of two properties of that kind, straight into the record that is being written. Null: no property.
    /// REQUIRES: the kind is self-contained, so that nobody is called.
    static void APPEND(CC_RecordWriter& recorder, CC_PropertyKind const& kind, CC_Property const* before,
                       CC_Property const& after);

private:
    alignas(CC_RecordFormat::Brief) std::array<char, sizeof(CC_RecordFormat::Brief)> m_place;
    std::size_t m_size;
};
