#include "sip/dialog/SipSessionWord.h"

SipSessionWord::TypeId SipSessionWord::s_typeId;

String& SipSessionWord::getValueString(String& out) const
{
    if (m_content.refusal != 0)
        return out.format("%u (%u)", m_content.number, m_content.refusal);
    return out.format("%u (%zu bytes)", m_content.number, m_content.description.length());
}
