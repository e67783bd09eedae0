#include "properties/CC_PropertyInformationTransferCapability.h"

unsigned int CC_PropertyInformationTransferCapability::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyInformationTransferCapability::getValueString(String& out) const
{
    return out = QINFORMATION_TRANSFER_CAPABILITY_NAME(getValue());
}
