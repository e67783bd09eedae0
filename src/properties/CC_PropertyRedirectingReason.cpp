#include "properties/CC_PropertyRedirectingReason.h"

CC_PropertyRedirectingReason::TypeId CC_PropertyRedirectingReason::s_typeId;

String& CC_PropertyRedirectingReason::getValueString(String& out) const
{
    return out = QREASON_FOR_REDIRECTION_NAME(getValue());
}
