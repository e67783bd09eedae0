#include "properties/CC_PropertyUnsigned.h"

CC_PropertyUnsigned::TypeId CC_PropertyUnsigned::s_typeId;

String& CC_PropertyUnsigned::getValueString(String& out) const { return out.format("0x%8.8llx", getValue()); }

unsigned long long CC_PropertyUnsigned::getValue() const { return m_value; }

void CC_PropertyUnsigned::setValue(unsigned long long value) { m_value = value; }
