#include "properties/CC_PropertyUnsigned.h"

unsigned int CC_PropertyUnsigned::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyUnsigned::getValueString(String& out) const { return out.format("0x%8.8llx", getValue()); }

unsigned long long CC_PropertyUnsigned::getValue() const { return m_value; }

void CC_PropertyUnsigned::setValue(unsigned long long value) { m_value = value; }
