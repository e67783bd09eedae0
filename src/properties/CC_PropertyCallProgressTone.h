#pragma once

#include "platform/media/MG_Tones.h"
#include "properties/CC_PropertyClass.h"

/// The tone that a party is to hear, with an accompanying text such as a parameter of the tone. Not settable by text.
///
/// A side says it of its own leg; the module at the other side hears that its peer's changed, and plays it.
///
///     adapter.setOwn(Key::CALL_PROGRESS_TONE, MG_Tones::ECallProgressTone::RINGING);
class CC_EXPORT CC_PropertyCallProgressTone : public CC_PropertyClass<CC_PropertyCallProgressTone>
{
public:
    /// NONE: no tone is to be heard.
    using Tone = MG_Tones::ECallProgressTone::Type;

    static constexpr char const* TYPE_NAME = "Call-Progress-Tone";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< no tone, no text
    CC_PropertyCallProgressTone(unsigned int id, Tone tone, String const& text = String::s_empty)
        : CC_PropertyClass(id), m_tone(tone), m_text(text)
    {
    }

    /// Replaces `out` by the tone's name. The text is not printed: tones that differ in it print the same, and are not
    /// equal.
    String& getValueString(String& out) const override;

    /// Setting a text throws std::bad_alloc when memory is out; the old one stays. @{
    Tone getTone() const { return m_tone; }
    void setTone(Tone tone) { m_tone = tone; }
    String const& getText() const { return m_text; }
    void setText(String const& text) { m_text = text; }
    /// @}

    bool hasSameValue(CC_PropertyCallProgressTone const& other) const
    {
        return m_tone == other.m_tone && m_text == other.m_text;
    }

private:
    Tone m_tone = MG_Tones::ECallProgressTone::NONE;
    String m_text;
};
