#include "properties/CC_PropertyCodecs.h"

CC_PropertyCodecs::TypeId CC_PropertyCodecs::s_typeId;

String& CC_PropertyCodecs::getValueString(String& out) const { return getValue().getShortInfo(out); }
