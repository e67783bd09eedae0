#include "properties/CC_PropertyTypeOfNumber.h"

unsigned int CC_PropertyTypeOfNumber::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyTypeOfNumber::getValueString(String& out) const { return out = QTYPE_OF_NUMBER_NAME(getValue()); }
