#include "properties/CC_PropertyInformationTransferCapability.h"

CC_PropertyInformationTransferCapability::TypeId CC_PropertyInformationTransferCapability::s_typeId;

String& CC_PropertyInformationTransferCapability::getValueString(String& out) const
{
    return out = QINFORMATION_TRANSFER_CAPABILITY_NAME(getValue());
}
