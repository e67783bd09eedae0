#pragma once

#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyKey.h"
#include "properties/CC_PropertyValue.h"

/// In which rhythm a line is to ring: a property between lines, of which nobody else knows.
class RingRhythm : public CC_PropertyValue<RingRhythm, unsigned int>
{
public:
    static constexpr char const* TYPE_NAME = "Ring-Rhythm";
    static TypeId s_typeId;
    using CC_PropertyValue::CC_PropertyValue;
    String& getValueString(String& out) const override;
};

/// The id, one of those that are set apart for modules, together with the class.
inline constexpr CC_PropertyKey<RingRhythm> RING_RHYTHM(CC_PropertyId::FIRST_OF_MODULES + 0x20);

/// Declares the names with which dumps and logs show it, once for the process: OK, or why not.
XCode DECLARE_RING_RHYTHM();
