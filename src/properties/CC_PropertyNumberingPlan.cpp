#include "properties/CC_PropertyNumberingPlan.h"

unsigned int CC_PropertyNumberingPlan::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyNumberingPlan::getValueString(String& out) const { return out = QNUMBERING_PLAN_NAME(getValue()); }
