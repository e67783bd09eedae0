#include "properties/CC_PropertyPresentationIndicator.h"

unsigned int CC_PropertyPresentationIndicator::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyPresentationIndicator::getValueString(String& out) const
{
    return out = QPRESENTATION_INDICATOR_NAME(getValue());
}
