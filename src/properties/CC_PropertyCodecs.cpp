#include "properties/CC_PropertyCodecs.h"

unsigned int CC_PropertyCodecs::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyCodecs::getValueString(String& out) const { return getValue().getShortInfo(out); }
