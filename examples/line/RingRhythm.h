#pragma once

#include "properties/CC_PropertyValue.h"

/// In which rhythm a line is to ring: a property between lines, of which nobody else knows.
class RingRhythm : public CC_PropertyValue<RingRhythm, unsigned int>
{
public:
    static constexpr unsigned int ID = 0x4002e0; // the group 0x200, which travels with parties and numbers
    static constexpr char const* TYPE_NAME = "Ring-Rhythm";
    static unsigned int s_typeId;
    using CC_PropertyValue::CC_PropertyValue;
    String& getValueString(String& out) const override;
};
