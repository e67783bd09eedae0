#pragma once

#include "properties/CC_PropertyClass.h"

/// Where a side stands in agreeing on a codec with the other, and the value they agreed on. Not settable by text.
///
///     using Negotiating = CC_PropertyCodecNegotiating;
///     leg.setProperty(Negotiating(CC_PropertyId::CODEC_NEGOTIATING, Negotiating::NEGOTIATED, payloadType));
class CC_EXPORT CC_PropertyCodecNegotiating : public CC_PropertyClass<CC_PropertyCodecNegotiating>
{
public:
    /// How far a side has come in agreeing on a codec.
    enum State : int
    {
        NOT_CAPABLE = 0,
        IDLE = 1,
        REQUEST = 2,
        NEGOTIATED = 3
    };

    static constexpr char const* TYPE_NAME = "CodecNegotiating";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< not capable
    CC_PropertyCodecNegotiating(unsigned int id, State state, unsigned int negotiatedValue = 0)
        : CC_PropertyClass(id), m_state(state), m_negotiatedValue(negotiatedValue)
    {
    }

    /// Appends to `out` what state it is, with the negotiated value in the last one: intended, unlike other classes.
    /// ERROR::INVALID for a number that is no state.
    String& getValueString(String& out) const override;

    /// State and value are set apart; the value is what was agreed on, and says nothing before NEGOTIATED. @{
    State getState() const { return m_state; }
    void setState(State state) { m_state = state; }
    unsigned int getNegotiatedValue() const { return m_negotiatedValue; }
    void setNegotiatedValue(unsigned int negotiatedValue) { m_negotiatedValue = negotiatedValue; }
    /// @}

    bool hasSameValue(CC_PropertyCodecNegotiating const& other) const
    {
        return m_state == other.m_state && m_negotiatedValue == other.m_negotiatedValue;
    }

private:
    State m_state = NOT_CAPABLE;
    unsigned int m_negotiatedValue = 0;
};
