#pragma once

#include "properties/CC_PropertyClass.h"

/// Whether a side waits for a signalling message before it goes on, and for which. Not settable by text.
///
///     using Wait = CC_PropertyWaitForMessage;
///     leg.setProperty(Wait(CC_PropertyId::WAIT_FOR_MESSAGE, Wait::WAIT_FOR_MESSAGE, Wait::PRACK));
class CC_EXPORT CC_PropertyWaitForMessage : public CC_PropertyClass<CC_PropertyWaitForMessage>
{
public:
    /// How far a side's wait has come.
    enum State : int
    {
        NOT_CAPABLE = 0,
        IDLE = 1,
        WAIT_FOR_MESSAGE = 2,
        MESSAGE_ARRIVED = 3
    };
    /// The message that is waited for.
    enum MessageType : int
    {
        UNDEFINED = 0,
        PRACK = 1
    };

    static constexpr char const* TYPE_NAME = "WaitForMessage";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< not capable
    CC_PropertyWaitForMessage(unsigned int id, State state, MessageType messageType = UNDEFINED)
        : CC_PropertyClass(id), m_state(state), m_messageType(messageType)
    {
    }

    /// Appends to `out` what state it is, with the message type in the last two: intended, unlike other classes.
    /// ERROR::INVALID for a number that is no state.
    String& getValueString(String& out) const override;

    /// State and type are set apart; the type says nothing in NOT_CAPABLE and IDLE. @{
    State getState() const { return m_state; }
    void setState(State state) { m_state = state; }
    MessageType getMessageType() const { return m_messageType; }
    void setMessageType(MessageType messageType) { m_messageType = messageType; }
    /// @}

    bool hasSameValue(CC_PropertyWaitForMessage const& other) const
    {
        return m_state == other.m_state && m_messageType == other.m_messageType;
    }

    /// "Undefined", "Prack"; "<invalid>" for any other number.
    static char const* NAME(MessageType messageType);

private:
    State m_state = NOT_CAPABLE;
    MessageType m_messageType = UNDEFINED;
};
