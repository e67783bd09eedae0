#include "properties/CC_PropertyCodec.h"

CC_PropertyCodec::TypeId CC_PropertyCodec::s_typeId;

String& CC_PropertyCodec::getValueString(String& out) const { return getValue().getShortInfo(out); }
