#include "properties/CC_PropertyWaitForMessage.h"

#include "platform/base/NameOf.h"

CC_PropertyWaitForMessage::TypeId CC_PropertyWaitForMessage::s_typeId;

String& CC_PropertyWaitForMessage::getValueString(String& out) const
{
    switch (m_state)
    {
    case NOT_CAPABLE:
        return out += "Not Capable";
    case IDLE:
        return out += "Idle";
    case WAIT_FOR_MESSAGE:
        return out.concatf("WaitForMessage ( %s )", NAME(m_messageType));
    case MESSAGE_ARRIVED:
        return out.concatf("MessageArrived ( %s )", NAME(m_messageType));
    }
    return out += ERROR::INVALID;
}

char const* CC_PropertyWaitForMessage::NAME(MessageType messageType)
{
    static constexpr NamedValue<MessageType> NAMES[] = {{UNDEFINED, "Undefined"}, {PRACK, "Prack"}};
    return NAME_OF(NAMES, messageType, "<invalid>");
}
