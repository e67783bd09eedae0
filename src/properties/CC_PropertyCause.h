#pragma once

#include "platform/signalling/QCause.h"
#include "properties/CC_PropertyClass.h"

/// Why a call ended: a Q.850 cause, a SIP status code, or both, and the peer's own words. Whichever the signalling side
/// supplied; nothing is converted from one to the other. Not settable by text.
///
///     CC_PropertyCause const cause(CC_PropertyId::CAUSE, QCause::USER_BUSY, 486);
///     String header;
///     cause.getReasonHeaderString(header); // Q.850;cause=17;text="User busy"
class CC_EXPORT CC_PropertyCause : public CC_PropertyClass<CC_PropertyCause>
{
public:
    static constexpr char const* TYPE_NAME = "Cause";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< no cause, no code, no text
    /// `sipCode`: 0 for none. `text`: empty for none.
    CC_PropertyCause(unsigned int id, QCause cause, unsigned int sipCode, String const& text = String::s_empty)
        : CC_PropertyClass(id), m_cause(cause), m_sipCode(sipCode), m_text(text)
    {
    }

    /// Replaces `out` by the text, or without one by the name of the Q.850 cause; " (486)" follows for a SIP code.
    String& getValueString(String& out) const override;

    /// NONE, 0 and empty for what the signalling side did not supply. Setting a text throws std::bad_alloc when memory
    /// is out; the old one stays. @{
    QCause getCause() const { return m_cause; }
    void setCause(QCause cause) { m_cause = cause; }
    unsigned int getSipCode() const { return m_sipCode; }
    void setSipCode(unsigned int sipCode) { m_sipCode = sipCode; }
    String const& getText() const { return m_text; }
    void setText(String const& text) { m_text = text; }
    /// @}

    /// Replaces `out` by the value of a SIP Reason header and returns it. The Q.850 form wins whenever there is a cause
    /// (UNSPECIFIED counts as one, 4294967295); otherwise the SIP form with the text or the code's phrase; without
    /// either the empty text. The text is not escaped: who sends the header escapes what needs it. Throws
    /// std::bad_alloc when memory is out.
    String& getReasonHeaderString(String& out) const;
    /// The reason phrase of a SIP status code, "UNKNOWN CAUSE" for one without. Throws std::bad_alloc when memory is
    /// out.
    String getSipTextFromCode(unsigned int sipCode) const;

    bool hasSameValue(CC_PropertyCause const& other) const
    {
        return m_cause == other.m_cause && m_sipCode == other.m_sipCode && m_text == other.m_text;
    }

private:
    friend CC_PropertyClass<CC_PropertyCause>;
    void takeWhole(CC_PropertyCause const& other)
    {
        if (m_text != other.m_text) // comparing is cheaper than copying
            m_text = other.m_text;  // throws before anything has changed
        m_cause = other.m_cause;
        m_sipCode = other.m_sipCode;
        CC_Property::operator=(other);
    }

    QCause m_cause = QCause::NONE;
    unsigned int m_sipCode = 0;
    String m_text;
};
