#include "properties/CC_PropertyNumberingPlan.h"

CC_PropertyNumberingPlan::TypeId CC_PropertyNumberingPlan::s_typeId;

String& CC_PropertyNumberingPlan::getValueString(String& out) const { return out = QNUMBERING_PLAN_NAME(getValue()); }
