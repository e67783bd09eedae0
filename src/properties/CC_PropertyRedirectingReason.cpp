#include "properties/CC_PropertyRedirectingReason.h"

unsigned int CC_PropertyRedirectingReason::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyRedirectingReason::getValueString(String& out) const
{
    return out = QREASON_FOR_REDIRECTION_NAME(getValue());
}
