#include "media/context/LegMedia.h"

#include "media/context/MediaCore.h"

LegMedia::LegMedia(CallMedia& call, MediaObserver& observer, unsigned long long number)
    : m_number(number), m_call(&call), m_observer(observer)
{
    m_description.mode = VoipCodecAndMode::INACTIVE;
}

LegMedia::~LegMedia()
{
    m_call->m_core->remove(*this);
    m_call->m_core->post(*m_call, MediaOrder::End{m_number});
}

void LegMedia::describe(MediaDescription const& description)
{
    if (description == m_description)
        return;
    m_description = description;
    m_call->m_core->post(*m_call, MediaOrder::Describe{m_number, description});
}

void LegMedia::setMode(VoipCodecAndMode::Mode mode)
{
    MediaDescription description = m_description;
    description.mode = mode;
    describe(description);
}

void LegMedia::moveTo(CallMedia& call)
{
    if (m_call.get() == &call)
        return;
    MediaCore& core = *m_call->m_core;
    MediaLoop* const from = core.getLoopOf(*m_call);
    MediaLoop* const to = core.getLoopOf(call);
    if (from == to)
        core.post(*m_call, MediaOrder::Connect{m_number, call.m_number});
    else if (from != nullptr && to != nullptr)
    {
        to->post(MediaOrder::Expect{m_number});
        from->post(MediaOrder::HandOver{m_number, call.m_number, to});
    }
    m_call.set(&call);
}

void LegMedia::playTone(MG_Tones::ECallProgressTone::Type tone)
{
    m_call->m_core->post(*m_call, MediaOrder::Tone{m_number, tone});
}

void LegMedia::sendDigit(char digit, unsigned int milliseconds)
{
    m_call->m_core->post(*m_call, MediaOrder::Digit{m_number, digit, milliseconds});
}

void LegMedia::setDigitsAside(bool isAside) { m_call->m_core->post(*m_call, MediaOrder::Aside{m_number, isAside}); }

void LegMedia::askQuality() { m_call->m_core->post(*m_call, MediaOrder::Ask{m_number}); }

void LegMedia::detectDigits(bool isWanted) { m_call->m_core->post(*m_call, MediaOrder::Detect{m_number, isWanted}); }

void LegMedia::playSound(SharedSound const& sound, bool isEndless)
{
    m_call->m_core->post(*m_call, MediaOrder::Play{m_number, sound, isEndless});
}
