#include "RingRhythm.h"

unsigned int RingRhythm::s_typeId = CC_Property::NO_TYPE_ID;

String& RingRhythm::getValueString(String& out) const { return out.format("rhythm %u", getValue()); }
