#include "properties/CC_PropertyCallProgressTone.h"

CC_PropertyCallProgressTone::TypeId CC_PropertyCallProgressTone::s_typeId;

String& CC_PropertyCallProgressTone::getValueString(String& out) const
{
    return out = MG_Tones::ECallProgressTone::NAME(m_tone);
}
