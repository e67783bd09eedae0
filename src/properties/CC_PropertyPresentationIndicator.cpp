#include "properties/CC_PropertyPresentationIndicator.h"

CC_PropertyPresentationIndicator::TypeId CC_PropertyPresentationIndicator::s_typeId;

String& CC_PropertyPresentationIndicator::getValueString(String& out) const
{
    return out = QPRESENTATION_INDICATOR_NAME(getValue());
}
