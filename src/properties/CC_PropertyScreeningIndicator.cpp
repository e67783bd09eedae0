#include "properties/CC_PropertyScreeningIndicator.h"

unsigned int CC_PropertyScreeningIndicator::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyScreeningIndicator::getValueString(String& out) const
{
    return out = QSCREENING_INDICATOR_NAME(getValue());
}
