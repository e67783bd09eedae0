#include "properties/CC_PropertyCallType.h"

#include "platform/base/NameOf.h"

CC_PropertyCallType::TypeId CC_PropertyCallType::s_typeId;

String& CC_PropertyCallType::getValueString(String& out) const { return out = CALL_TYPE_NAME(m_value); }

char const* CC_PropertyCallType::CALL_TYPE_NAME(_eCallType value)
{
    static constexpr NamedValue<_eCallType> NAMES[] = {{NORMAL, "normal"}, {MESSAGE, "message"}};
    return NAME_OF(NAMES, value, "invalid");
}
