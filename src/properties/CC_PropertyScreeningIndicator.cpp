#include "properties/CC_PropertyScreeningIndicator.h"

CC_PropertyScreeningIndicator::TypeId CC_PropertyScreeningIndicator::s_typeId;

String& CC_PropertyScreeningIndicator::getValueString(String& out) const
{
    return out = QSCREENING_INDICATOR_NAME(getValue());
}
