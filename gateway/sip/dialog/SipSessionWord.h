#pragma once

#include "platform/base/String.h"
#include "properties/CC_PropertyClass.h"

/// One side's word to the other about their session, while the peers exchange media themselves: an offer, or what
/// became of the other side's. A property of the leg (SipPropertyId::SESSION_OFFER, SESSION_ANSWER).
///
/// Each side counts its offers; an answer bears the number of the offer that it belongs to. A word is addressed to a
/// leg, so that who takes that leg's place does not think it meant for itself.
class SipSessionWord : public CC_PropertyClass<SipSessionWord>
{
public:
    static constexpr char const* TYPE_NAME = "Session-Word";
    static TypeId s_typeId;

    struct Content
    {
        unsigned long long to = 0; ///< the Call-Leg-ID of whom it is for; 0: of whoever is offered the call
        unsigned int number = 0;   ///< of the offer
        unsigned int refusal = 0;  ///< of an answer: the SIP status with which the offer is refused; 0: it is not
        bool isQuick = false; ///< an offer of which nobody is to be asked; an answer that binds before the call is up
        String description{}; ///< of an offer, empty: the other side is asked to offer

        friend bool operator==(Content const&, Content const&) = default;
    };

    using CC_PropertyClass::CC_PropertyClass; ///< number 0: no word
    SipSessionWord(unsigned int id, Content content) : CC_PropertyClass(id), m_content(std::move(content)) {}

    /// "2 (120 bytes)", "2 (488)"
    String& getValueString(String& out) const override;
    bool hasSameValue(SipSessionWord const& other) const { return m_content == other.m_content; }

    Content const& get() const { return m_content; }

private:
    Content m_content;
};
