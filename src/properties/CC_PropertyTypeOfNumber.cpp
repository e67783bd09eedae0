#include "properties/CC_PropertyTypeOfNumber.h"

CC_PropertyTypeOfNumber::TypeId CC_PropertyTypeOfNumber::s_typeId;

String& CC_PropertyTypeOfNumber::getValueString(String& out) const { return out = QTYPE_OF_NUMBER_NAME(getValue()); }
