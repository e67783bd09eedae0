#include "properties/CC_PropertyCodec.h"

unsigned int CC_PropertyCodec::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyCodec::getValueString(String& out) const { return getValue().getShortInfo(out); }
