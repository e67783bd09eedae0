#include "operation/record/CallWatch.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "host/EmergencyCall.h"
#include "properties/CC_PropertyKeys.h"

#include <chrono>
#include <new>
#include <stdexcept>

namespace
{
using State = CC_PropertyCallLegState;
using Presentation = CallRecord::Presentation;

constexpr double NANOSECONDS = 1e9; // in a second

template <class Clock>
std::int64_t NOW()
{
    return std::chrono::duration_cast<std::chrono::nanoseconds>(Clock::now().time_since_epoch()).count();
}

template <class Property>
Property const* GET(CC_CallLeg const& leg, CC_PropertyKey<Property> const& key)
{
    return dynamic_cast<Property const*>(leg.getProperties().get(key.getId()));
}

std::string TEXT(CC_CallLeg const& leg, CC_PropertyKey<CC_PropertyString> const& key)
{
    CC_PropertyString const* const property = GET(leg, key);
    return property != nullptr ? std::string(property->getValue().view()) : std::string();
}

template <class Property>
std::string VALUE(CC_CallLeg const& leg, CC_PropertyKey<Property> const& key)
{
    String text;
    if (Property const* const property = GET(leg, key))
        property->getValueString(text);
    return std::string(text.view());
}

Presentation PRESENTATION(CC_CallLeg const& leg, CC_PropertyKey<CC_PropertyPresentationIndicator> const& key)
{
    CC_PropertyPresentationIndicator const* const property = GET(leg, key);
    QPresentationIndicator const value = property != nullptr ? property->getValue() : QPresentationIndicator::ALLOWED;
    if (value == QPresentationIndicator::ALLOWED)
        return Presentation::ALLOWED;
    return value == QPresentationIndicator::NOT_AVAILABLE ? Presentation::NOT_AVAILABLE : Presentation::RESTRICTED;
}

void READ_STATISTICS(CC_QoS::MediaInfo::RTP::RtpStat::Stat const& local, CallRecord::Quality& quality)
{
    auto const number = [](AsnInteger const& value) { return static_cast<std::uint32_t>(value); };
    quality.isMeasured = true;
    quality.received = number(local.m_rxPackets);
    quality.receivedOctets = number(local.m_rxOctets);
    quality.sent = number(local.m_txPackets);
    quality.sentOctets = number(local.m_txOctets);
    quality.lost = number(local.m_rxPacketsLost);
    quality.jitter = number(local.m_rxJitter);
    quality.roundTrip = number(local.m_roundTripTime);
}

std::optional<CallRecord::Quality> QUALITY(CC_CallLeg const& leg)
{
    CC_PropertyQoS const* const property = GET(leg, Key::QUALITY_OF_SERVICE);
    if (property == nullptr)
        return std::nullopt;
    CC_QoS const& record = property->getValue();
    CallRecord::Quality quality;
    quality.opinion = static_cast<int>(record.m_meanOpinionScore) / 100.0;
    CC_QoS::MediaInfo::RTP const& rtp = record.m_mediaInfo.m_rtp;
    if (!record.m_mediaInfo.isSelected(rtp))
        return quality;
    if (rtp.isPresent(rtp.m_config))
        quality.codec = MG_Rtp::ECodec::NAME(rtp.m_config.m_mediaType.get().codec);
    if (rtp.isPresent(rtp.m_statistics) && rtp.m_statistics.isPresent(rtp.m_statistics.m_local))
        READ_STATISTICS(rtp.m_statistics.m_local, quality);
    return quality;
}

void READ_CAUSE(CC_CallLeg const& leg, CallRecord::Leg& record)
{
    CC_PropertyCause const* const cause = GET(leg, Key::CAUSE);
    if (cause == nullptr)
        return;
    record.cause = static_cast<int>(cause->getCause());
    record.sipStatus = cause->getSipCode();
    record.causeText = cause->getText().view();
}

/// As it is now, over what was noted before.
void READ(CC_CallLeg const& leg, CallRecord::Leg& record)
{
    record.number = TEXT(leg, Key::E164_NUMBER);
    record.name = TEXT(leg, Key::NAME);
    record.presentation = PRESENTATION(leg, Key::PRESENTATION_INDICATOR);
    record.redirecting = TEXT(leg, Key::REDIRECTING_E164_NUMBER);
    record.redirectingReason = record.redirecting.empty() ? "" : VALUE(leg, Key::REDIRECTING_REASON);
    record.isRedirectingRestricted =
        PRESENTATION(leg, Key::DIVERSION_PRESENTATION_INDICATOR) == Presentation::RESTRICTED;
    if (CC_PropertyParametrizedString const* const id = GET(leg, Key::UNIQUE_IDENTIFIER))
        record.id = id->getContent().content.view();
    record.charge = VALUE(leg, Key::CHARGE);
    READ_CAUSE(leg, record);
    record.quality = QUALITY(leg);
}

CallRecord::Leg* FIND(CallRecord& record, CC_CallLeg const& leg)
{
    for (CallRecord::Leg& known : record.legs)
        if (known.serial == leg.getSerial())
            return &known;
    return nullptr;
}

void JOIN(CallRecord& record, CC_CallLeg const& leg, double seconds)
{
    if (FIND(record, leg) != nullptr)
        return;
    CallRecord::Leg& joined = record.legs.emplace_back();
    joined.joined = seconds;
    joined.serial = leg.getSerial();
    joined.isCalling = record.legs.size() == 1;
    joined.interface = TEXT(leg, Key::NETWORK);
    READ(leg, joined);
    joined.dialled = joined.number;
}

/// Whether that says something new of the call.
bool FOLLOW_STATE(CallRecord& record, CallRecord::Leg& known, int state, double seconds)
{
    if (state == State::ALERTING && !known.isCalling && !record.ringing)
        record.ringing = seconds;
    else if (state == State::CONNECTED && !known.isCalling && !record.answered)
        record.answered = seconds;
    else if (state <= State::DISCONNECTING && state != State::IDLE && record.clearedBy == 0)
        record.clearedBy = known.serial;
    else
        return false;
    return true;
}
} // namespace

std::optional<CallRecord::Quality> CallWatch::GET_QUALITY(CC_CallLeg const& leg) { return QUALITY(leg); }

double CallWatch::Call::getAge() const
{
    return static_cast<double>(NOW<std::chrono::steady_clock>() - begin) / NANOSECONDS;
}

template <class Work>
void CallWatch::note(unsigned long long serial, Work const& work)
{
    auto const found = m_calls.find(serial);
    if (found == m_calls.end())
        return;
    try
    {
        work(found->second);
    }
    catch (std::bad_alloc const&)
    {
        m_calls.erase(found);
        ++m_lost;
    }
}

void CallWatch::watch(String const& contextName)
{
    CC_Context* const context = CallControl::GET_CONTEXT(contextName);
    if (context == nullptr || !context->addContextObserver(*this).isOk())
        throw std::runtime_error("calls cannot be watched");
}

void CallWatch::aboutDestroy(CC_Context& context) { context.removeContextObserver(*this); }

void CallWatch::aboutCreateCall(CC_Context&, CC_Call* call)
{
    try
    {
        Call& known = m_calls[call->getSerial()];
        known.record.serial = call->getSerial();
        known.record.start = NOW<std::chrono::system_clock>();
        known.begin = NOW<std::chrono::steady_clock>();
        if (!call->addCallObserver(this).isOk() || !call->addCallLegObserver(this).isOk())
            throw std::bad_alloc();
    }
    catch (std::bad_alloc const&)
    {
        m_calls.erase(call->getSerial());
        ++m_lost;
    }
}

void CallWatch::onCallCallLegAdded(CC_Event<CC_Call> const& event)
{
    CC_CallLeg const& leg = *CC_EvCallCallLegModified::FROM(event).getCallLeg();
    bool const isEmergency = event.getSource()->getProperties().get(EmergencyCall::PROPERTY) != nullptr;
    note(event.getSource()->getSerial(),
         [&](Call& call)
         {
             call.record.isEmergency = call.record.isEmergency || isEmergency;
             JOIN(call.record, leg, call.getAge());
             tellChangeOf(call);
         });
}

void CallWatch::onCallCallLegRemoved(CC_Event<CC_Call> const& event)
{
    CC_CallLeg const& leg = *CC_EvCallCallLegModified::FROM(event).getCallLeg();
    note(event.getSource()->getSerial(),
         [&](Call& call)
         {
             if (CallRecord::Leg* const known = FIND(call.record, leg))
                 READ(leg, *known);
         });
}

/// A leg is read when it is released and when it leaves: what comes in between is told by the last values.
void CallWatch::onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event)
{
    CC_CallLeg const& leg = *event.getSource();
    if (leg.getCall() == nullptr || !CC_EvCallLegPropertyChanged::FROM(event).getFlags().get(CC_PropertyId::STATE))
        return;
    note(leg.getCall()->getSerial(),
         [&](Call& call)
         {
             CallRecord::Leg* const known = FIND(call.record, leg);
             if (known == nullptr)
                 return;
             bool const isNew = FOLLOW_STATE(call.record, *known, leg.getState(), call.getAge());
             if (leg.getState() == State::RELEASED)
                 READ(leg, *known);
             if (isNew)
                 tellChangeOf(call);
         });
}

void CallWatch::onCallObservationEnded(CC_Event<CC_Call> const& event) { end(event.getSource()->getSerial()); }

void CallWatch::end(unsigned long long serial)
{
    auto const found = m_calls.find(serial);
    if (found == m_calls.end())
        return;
    CallRecord record = std::move(found->second.record);
    record.ended = found->second.getAge();
    m_calls.erase(found);
    for (Sink const& sink : m_sinks)
        try
        {
            sink(record);
        }
        catch (std::bad_alloc const&)
        {
            ++m_lost;
        }
}

void CallWatch::tellChangeOf(Call const& call) const
{
    for (Sink const& sink : m_changeSinks)
        sink(call.record);
}

void CallWatch::noteCleared(unsigned long long serial)
{
    note(serial, [](Call& call) { call.record.isClearedByGateway = true; });
}

void CallWatch::noteAllCleared()
{
    for (auto& [serial, call] : m_calls)
        call.record.isClearedByGateway = true;
}

CallRecord const* CallWatch::find(unsigned long long serial) const
{
    auto const found = m_calls.find(serial);
    return found != m_calls.end() ? &found->second.record : nullptr;
}
