#include "properties/CC_PropertyCallProgressTone.h"

unsigned int CC_PropertyCallProgressTone::s_typeId = CC_Property::NO_TYPE_ID;

String& CC_PropertyCallProgressTone::getValueString(String& out) const
{
    return out = MG_Tones::ECallProgressTone::NAME(m_tone);
}
