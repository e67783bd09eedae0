#include "Exchange.h"

#include <algorithm>
#include <cstring>
#include <vector>

namespace
{
constexpr int CHECK_SUM = 2;
constexpr int CHANNEL_MASK = 0xff;
constexpr int TYPE_SHIFT = 4;
constexpr int PRESENTATION_SHIFT = 5;
constexpr unsigned int HOLD = 50; // milliseconds
constexpr int LOW_BITS = 3;
constexpr int DEFLECTION = 4; // Q.931; the stack says 3
constexpr std::size_t FIRST_DIGITS = 2;
constexpr long long TICK = 20; // milliseconds

pri_party_id PARTY(std::string const& number, std::string const& name, unsigned int plan, unsigned int presentation)
{
    pri_party_id party = {};
    party.number.valid = !number.empty() || presentation != 0;
    party.number.plan = static_cast<int>(plan);
    party.number.presentation = static_cast<int>(presentation);
    party.number.str[number.copy(party.number.str, sizeof party.number.str - 1)] = '\0';
    party.name.valid = !name.empty();
    party.name.char_set = PRI_CHAR_SET_ISO8859_1;
    party.name.str[name.copy(party.name.str, sizeof party.name.str - 1)] = '\0';
    return party;
}

/// An NSAP address whose authority and format say IA5 (X.213).
pri_party_subaddress SUBADDRESS(std::string const& text)
{
    constexpr char IA5 = 0x50;
    pri_party_subaddress subaddress = {};
    subaddress.valid = !text.empty();
    std::string const octets = IA5 + text.substr(0, 19);
    subaddress.length = static_cast<int>(octets.size());
    std::copy(octets.begin(), octets.end(), subaddress.data);
    return subaddress;
}

int BEARER(std::string const& name)
{
    return name == "digital" ? PRI_TRANS_CAP_DIGITAL
           : name == "audio" ? PRI_TRANS_CAP_3_1K_AUDIO
                             : PRI_TRANS_CAP_SPEECH;
}

/// They cannot be given back; here nobody takes them for lost.
std::vector<pri*>& ENDED_STACKS()
{
    static auto& s_stacks = *new std::vector<pri*>;
    return s_stacks;
}

template <class Advice>
void WRITE_CHARGE(std::string const& currency, unsigned int units, Advice& advice)
{
    advice.charge = currency.empty() ? PRI_AOC_DE_CHARGE_UNITS : PRI_AOC_DE_CHARGE_CURRENCY;
    if (currency.empty())
    {
        advice.recorded.unit.num_items = 1;
        advice.recorded.unit.item[0].number = static_cast<long>(units);
        advice.recorded.unit.item[0].type = -1;
        return;
    }
    auto& money = advice.recorded.money;
    money.amount.cost = static_cast<long>(units);
    money.amount.multiplier = PRI_AOC_MULTIPLIER_HUNDREDTH;
    money.currency[currency.copy(money.currency, sizeof money.currency - 1)] = '\0';
}
} // namespace

Exchange::Exchange(IsdnWires&& wires, Plan const& plan, Capture& capture, Report& report)
    : m_line(std::move(wires)), m_plan(plan), m_capture(capture), m_report(report)
{
    m_stack = pri_new_cb(0, plan.isUser ? PRI_CPE : PRI_NETWORK, PRI_SWITCH_EUROISDN_E1, READ, WRITE, this);
    pri_set_overlapdial(m_stack, 1);
    pri_facility_enable(m_stack);
    pri_aoc_events_enable(m_stack, 1);
    pri_hangup_fix_enable(m_stack, 1);
    pri_hold_enable(m_stack, 1);
    pri_transfer_enable(m_stack, 1);
    if (plan.t200 != 0)
        pri_set_timer(m_stack, PRI_TIMER_T200, static_cast<int>(plan.t200));
}

Exchange::~Exchange()
{
    for (auto const& [handle, call] : m_calls) // that the line has cut off
        countSpeech(*call);
    pri_set_userdata(m_stack, nullptr);
    ENDED_STACKS().push_back(m_stack);
}

bool Exchange::isHit(unsigned int perCent) { return perCent != 0 && m_random() % 100 < perCent; }

int Exchange::READ(pri* stack, void* buffer, int length)
{
    auto* const self = static_cast<Exchange*>(pri_get_userdata(stack));
    if (self == nullptr || length < CHECK_SUM)
        return 0;
    auto* const octets = static_cast<unsigned char*>(buffer);
    std::size_t const got = self->m_line.receive({octets, static_cast<std::size_t>(length - CHECK_SUM)});
    self->m_hasRead = got != 0;
    if (got == 0)
        return 0;
    self->m_capture.write({octets, got}, self->m_plan.isUser);
    if (self->isHit(self->m_plan.lost))
        return 0;
    std::memset(octets + got, 0, CHECK_SUM);
    return static_cast<int>(got) + CHECK_SUM;
}

int Exchange::WRITE(pri* stack, void* buffer, int length)
{
    auto* const self = static_cast<Exchange*>(pri_get_userdata(stack));
    if (self == nullptr || length <= CHECK_SUM)
        return length;
    std::vector<unsigned char> const frame =
        self->spoil({static_cast<unsigned char const*>(buffer), static_cast<std::size_t>(length - CHECK_SUM)});
    self->m_capture.write(frame, !self->m_plan.isUser);
    if (!self->isHit(self->m_plan.lost))
        self->m_line.send(frame);
    if (self->isHit(self->m_plan.repeated))
        self->m_line.send(frame);
    return length;
}

/// With the faults of the call that it is about.
std::vector<unsigned char> Exchange::spoil(std::span<unsigned char const> frame) const
{
    std::vector<unsigned char> result(frame.begin(), frame.end());
    int reference = 0;
    bool isOfOriginator = false;
    if (!Fault::READ_REFERENCE(frame, reference, isOfOriginator))
        return result;
    for (auto const& [handle, call] : m_calls)
    {
        int lowBits = 0; // three of them, as GR-303 has its call references
        int const highBits = pri_get_crv(m_stack, handle, &lowBits);
        bool const isIt = (call->own != nullptr) == isOfOriginator && (highBits << LOW_BITS | lowBits) == reference;
        bool const isOwn = call->own != nullptr;
        if (!isIt || (!isOwn && call->subscriber == nullptr))
            continue;
        for (Fault const& fault : isOwn ? call->own->faults : call->subscriber->faults)
            result = fault.apply(result);
    }
    return result;
}

void Exchange::after(unsigned int milliseconds, CallHandle const& call,
                     std::function<void(CallHandle const&)> const& work)
{
    std::weak_ptr<Call> const watched = call;
    m_timers.emplace(m_now + milliseconds,
                     [this, watched, work]
                     {
                         CallHandle const still = watched.lock();
                         if (still != nullptr && m_calls.count(still->handle) != 0)
                             work(still);
                     });
}

void Exchange::run(long long now)
{
    m_now = now;
    do
    {
        m_hasRead = false;
        if (pri_event* const event = pri_check_event(m_stack))
            takeEvent(*event);
    } while (m_hasRead && m_line.isOpen());
    while (pri_event* const event = pri_schedule_run(m_stack))
        takeEvent(*event);
    while (!m_timers.empty() && m_timers.begin()->first <= now)
        m_timers.extract(m_timers.begin()).mapped()();
    placeWaiting();
    for (m_nextTick = std::max(m_nextTick, now - 3 * TICK); m_nextTick <= now; m_nextTick += TICK)
        for (auto const& [handle, call] : m_calls)
            if (call->speech != nullptr)
                call->speech->tick();
}

Exchange::CallHandle Exchange::find(q931_call* handle) const
{
    auto const found = m_calls.find(handle);
    return found != m_calls.end() ? found->second : nullptr;
}

void Exchange::takeEvent(pri_event& event)
{
    switch (event.e)
    {
    case PRI_EVENT_DCHAN_UP:
        if (!std::exchange(m_isUp, true))
            for (Plan::Call const& own : m_plan.calls)
                for (unsigned int i = 0; i < own.count; ++i)
                    m_timers.emplace(m_now + own.after + i * own.interval, [this, &own] { m_waiting.push_back(&own); });
        break;
    case PRI_EVENT_RING:
        onRing(event.ring);
        break;
    case PRI_EVENT_INFO_RECEIVED:
        if (CallHandle const call = find(event.ring.call); call != nullptr && call->subscriber == nullptr)
        {
            call->number += event.ring.callednum;
            consider(call, event.ring.complete != 0);
        }
        break;
    case PRI_EVENT_SETUP_ACK:
        if (CallHandle const call = find(event.setup_ack.call))
            dialOn(call);
        break;
    case PRI_EVENT_ANSWER:
        onAnswer(event.answer);
        break;
    case PRI_EVENT_HOLD_ACK:
        if (CallHandle const call = find(event.hold_ack.call))
            onHeld(call);
        break;
    case PRI_EVENT_RETRIEVE_ACK:
        if (CallHandle const call = find(event.retrieve_ack.call))
            takeBack(call, event.retrieve_ack.channel);
        break;
    case PRI_EVENT_KEYPAD_DIGIT:
        ++m_report.keyed[event.digit.digits];
        break;
    case PRI_EVENT_HANGUP_REQ:
    case PRI_EVENT_HANGUP:
    case PRI_EVENT_HANGUP_ACK:
        onHangUp(event);
        break;
    default:
        break;
    }
}

void Exchange::onRing(pri_event_ring const& ring)
{
    ++m_report.received;
    auto const call = std::make_shared<Call>();
    call->handle = ring.call;
    call->channel = ring.channel;
    call->number = ring.callednum;
    m_calls[ring.call] = call;
    bool const isAny = ring.channel < 0 || (ring.channel & CHANNEL_MASK) == CHANNEL_MASK;
    if (isAny)
        call->channel = hunt();
    consider(call, ring.complete != 0);
}

void Exchange::consider(CallHandle const& call, bool isComplete)
{
    bool mayBecome = false;
    for (Plan::Subscriber const& subscriber : m_plan.subscribers)
        if (subscriber.number == call->number)
        {
            call->subscriber = &subscriber;
            begin(call);
            return;
        }
        else
            mayBecome = mayBecome || subscriber.number.starts_with(call->number);
    if (!isComplete && mayBecome)
    {
        if (!std::exchange(call->isAcknowledged, true))
            pri_setup_ack(m_stack, call->handle, call->channel, 0, 0);
        return;
    }
    pri_proceeding(m_stack, call->handle, call->channel, 0);
    release(call, PRI_CAUSE_UNALLOCATED);
}

void Exchange::begin(CallHandle const& call)
{
    Plan::Subscriber const& subscriber = *call->subscriber;
    if (subscriber.does == "silent")
        return;
    pri_proceeding(m_stack, call->handle, call->channel, 0);
    if (subscriber.tariff != 0)
        tellTariff(*call);
    if (subscriber.does == "busy")
        release(call, PRI_CAUSE_USER_BUSY);
    else if (subscriber.does == "reject")
        release(call, subscriber.cause);
    else
        after(subscriber.rings, call,
              [this](CallHandle const& one)
              {
                  if (one->subscriber->isInBand)
                      speak(one, one->subscriber->speaks, one->subscriber->file, one->subscriber->record);
                  if (!one->subscriber->userUser.empty())
                      pri_call_set_useruser(one->handle, one->subscriber->userUser.c_str());
                  pri_acknowledge(m_stack, one->handle, one->channel, one->subscriber->isInBand);
              });
    if (subscriber.does == "answer")
        after(subscriber.answers, call, [this](CallHandle const& one) { answer(one); });
}

void Exchange::answer(CallHandle const& call)
{
    Plan::Subscriber const& subscriber = *call->subscriber;
    ++m_report.answered;
    call->isUp = true;
    pri_party_connected_line connected = {};
    connected.id = PARTY(subscriber.connected.empty() ? subscriber.number : subscriber.connected, subscriber.name,
                         subscriber.connectedType << TYPE_SHIFT | PRI_NPI_E163_E164,
                         subscriber.connectedPresentation << PRESENTATION_SHIFT | subscriber.connectedScreening);
    connected.id.subaddress = SUBADDRESS(subscriber.connectedSubaddress);
    pri_connected_line_update(m_stack, call->handle, &connected);
    pri_answer(m_stack, call->handle, call->channel, subscriber.isForeign);
    if (call->speech == nullptr)
        speak(call, subscriber.speaks, subscriber.file, subscriber.record);
    if (subscriber.holds)
        hold(call);
    if (!subscriber.becomes.empty())
        after(HOLD, call, [this](CallHandle const& one) { handOver(*one); });
    if (subscriber.parks != 0)
        park(call, subscriber.parks);
    if (subscriber.drops != 0)
        after(subscriber.drops, call, [this](CallHandle const&) { m_line.close(); });
    if (subscriber.units != 0)
        after(subscriber.interval, call, [this](CallHandle const& one) { charge(one); });
    if (subscriber.releases != 0)
        after(subscriber.releases, call,
              [this](CallHandle const& one) { release(one, one->subscriber->releaseCause); });
}

void Exchange::speak(CallHandle const& call, std::string const& what, std::string const& file,
                     std::string const& record)
{
    IsdnDescriptor channel = m_line.openChannel(static_cast<unsigned int>(call->channel & CHANNEL_MASK));
    if (channel.get() >= 0)
        call->speech = std::make_unique<Speech>(std::move(channel), what, file, record);
}

/// What its user does is told to the far side's (EN 300 141-1), again and again.
void Exchange::hold(CallHandle const& call)
{
    after(HOLD, call,
          [this](CallHandle const& one)
          {
              one->isHeld = !one->isHeld;
              if (one->isUp)
                  pri_notify(m_stack, one->handle, 0,
                             one->isHeld ? PRI_NOTIFY_REMOTE_HOLD : PRI_NOTIFY_REMOTE_RETRIEVAL);
              hold(one);
          });
}

/// Another one has the call (EN 300 369-1): once it is up, the stack tells that with EctInform.
void Exchange::handOver(Call const& call)
{
    pri_party_connected_line connected = {};
    connected.id = PARTY(call.subscriber->becomes, {}, call.subscriber->connectedType << TYPE_SHIFT | PRI_NPI_E163_E164,
                         call.subscriber->connectedScreening);
    pri_connected_line_update(m_stack, call.handle, &connected);
}

/// HOLD, and RETRIEVE on whatever channel is free then (EN 300 141-1, 9).
void Exchange::park(CallHandle const& call, unsigned int milliseconds)
{
    after(HOLD, call,
          [this, milliseconds](CallHandle const& one)
          {
              pri_hold(m_stack, one->handle);
              after(milliseconds, one,
                    [this](CallHandle const& held)
                    {
                        held->channel = hunt();
                        pri_retrieve(m_stack, held->handle, held->channel);
                    });
          });
}

void Exchange::takeBack(CallHandle const& call, int channel)
{
    call->channel = channel;
    if (call->own != nullptr)
        speak(call, call->own->speaks, call->own->file, call->own->record);
    else
        speak(call, call->subscriber->speaks, call->subscriber->file, call->subscriber->record);
}

/// AOC-S (EN 300 182-1): by the minute, in steps.
void Exchange::tellTariff(Call const& call)
{
    pri_subcmd_aoc_s advice = {};
    advice.num_items = 1;
    pri_aoc_s_element& item = advice.item[0];
    item.chargeable = PRI_AOC_CHARGED_ITEM_BASIC_COMMUNICATION;
    item.rate_type = PRI_AOC_RATE_TYPE_DURATION;
    pri_aoc_duration& duration = item.rate.duration;
    std::string const& currency = call.subscriber->currency;
    duration.currency[currency.copy(duration.currency, sizeof duration.currency - 1)] = '\0';
    duration.amount.cost = static_cast<long>(call.subscriber->tariff);
    duration.amount.multiplier = PRI_AOC_MULTIPLIER_HUNDREDTH;
    duration.time.length = 1;
    duration.time.scale = PRI_AOC_TIME_SCALE_MINUTE;
    duration.charging_type = 1;
    pri_aoc_s_send(m_stack, call.handle, &advice);
}

/// AOC-D, again and again (EN 300 182-1).
void Exchange::charge(CallHandle const& call)
{
    if (!call->isUp)
        return; // it is being released
    call->units += call->subscriber->units;
    m_report.units += call->subscriber->units;
    pri_subcmd_aoc_d advice = {};
    WRITE_CHARGE(call->subscriber->currency, call->units, advice);
    pri_aoc_d_send(m_stack, call->handle, &advice);
    after(call->subscriber->interval, call, [this](CallHandle const& one) { charge(one); });
}

/// AOC-E: goes with the message that clears.
void Exchange::chargeFinally(Call& call)
{
    bool const wasUp = std::exchange(call.isUp, false);
    if (call.subscriber == nullptr || call.subscriber->units == 0 || !wasUp)
        return;
    pri_subcmd_aoc_e advice = {};
    WRITE_CHARGE(call.subscriber->currency, call.units, advice);
    pri_aoc_e_send(m_stack, call.handle, &advice);
}

void Exchange::release(CallHandle const& call, int cause)
{
    chargeFinally(*call);
    pri_hangup(m_stack, call->handle, cause);
}

void Exchange::onHangUp(pri_event& event)
{
    CallHandle const call = find(event.hangup.call);
    int const cause = event.hangup.cause;
    bool const isRequest = event.e == PRI_EVENT_HANGUP_REQ;
    if (call != nullptr && event.e != PRI_EVENT_HANGUP_ACK)
        ++m_report.causes[cause];
    if (call != nullptr && isRequest)
        chargeFinally(*call);
    if (call != nullptr && call->own != nullptr && !isRequest)
        ++m_report.over;
    if (call != nullptr && !isRequest)
        countSpeech(*call);
    if (!isRequest)
        m_calls.erase(event.hangup.call);
    if (event.e != PRI_EVENT_HANGUP_ACK) // then the stack has it no more
        pri_hangup(m_stack, event.hangup.call, isRequest ? cause : -1);
}

void Exchange::countSpeech(Call const& call)
{
    if (call.speech != nullptr)
        m_report.blocks += call.speech->getNumberOfBlocks();
}

// --- calls of its own ------------------------------------------------------------------------------------------------

/// The network begins at the top, the user at the bottom.
int Exchange::hunt() const
{
    int const last = static_cast<int>(IsdnLine::LAST_TIMESLOT);
    for (int i = 1; i <= last; ++i)
    {
        int const timeslot = m_plan.isUser ? i : last + 1 - i;
        bool const isTaken =
            std::any_of(m_calls.begin(), m_calls.end(),
                        [&](auto const& one) { return (one.second->channel & CHANNEL_MASK) == timeslot; });
        if (!isTaken && IsdnLine::IS_B_CHANNEL(static_cast<unsigned int>(timeslot)))
            return timeslot;
    }
    return 0;
}

void Exchange::placeWaiting()
{
    auto const hasRoom = [this]
    {
        auto const count =
            std::count_if(m_calls.begin(), m_calls.end(), [](auto const& one) { return one.second->own != nullptr; });
        return m_plan.atOnce == 0 || static_cast<unsigned int>(count) < m_plan.atOnce;
    };
    for (; !m_waiting.empty() && hasRoom(); m_waiting.pop_front())
        place(*m_waiting.front());
}

Exchange::CallHandle Exchange::place(Plan::Call const& own)
{
    ++m_report.placed;
    auto call = std::make_shared<Call>();
    call->channel = hunt();
    call->own = &own;
    call->number = own.to;
    if (call->channel == 0)
    {
        ++m_report.causes[PRI_CAUSE_NORMAL_CIRCUIT_CONGESTION];
        ++m_report.over;
        return nullptr;
    }
    call->handle = pri_new_call(m_stack);
    m_calls[call->handle] = call;
    call->dialled = own.isOverlap ? std::min(FIRST_DIGITS, own.to.size()) : own.to.size();
    std::string first = own.to.substr(0, call->dialled);
    pri_sr* const request = pri_sr_new();
    pri_sr_set_channel(request, call->channel, own.isExclusive, 0);
    pri_sr_set_bearer(request, BEARER(own.bearer), own.bearer == "digital" ? -1 : PRI_LAYER_1_ALAW);
    pri_sr_set_called(request, first.data(), static_cast<int>(own.toType << TYPE_SHIFT | own.toPlan), !own.isOverlap);
    pri_party_id caller = PARTY(own.from, own.name, own.type << TYPE_SHIFT | own.plan,
                                own.presentation << PRESENTATION_SHIFT | own.screening);
    caller.subaddress = SUBADDRESS(own.subaddress);
    pri_sr_set_caller_party(request, &caller);
    if (pri_party_subaddress const called = SUBADDRESS(own.calledSubaddress); called.valid != 0)
        pri_sr_set_called_subaddress(request, &called);
    if (!own.redirecting.empty())
    {
        pri_party_redirecting redirecting = {};
        redirecting.from = PARTY(own.redirecting, {}, own.redirectingType << TYPE_SHIFT | PRI_NPI_E163_E164,
                                 own.redirectingPresentation << PRESENTATION_SHIFT);
        redirecting.count = static_cast<int>(own.redirections);
        redirecting.reason =
            static_cast<int>(own.reason) == DEFLECTION ? PRI_REDIR_DEFLECTION : static_cast<int>(own.reason);
        pri_sr_set_redirecting_parties(request, &redirecting);
    }
    if (!own.userUser.empty())
        pri_sr_set_useruser(request, own.userUser.c_str());
    pri_setup(m_stack, call->handle, request);
    pri_sr_free(request);
    return call;
}

/// Its channel is free. Who transfers calls somebody else now (EN 300 369-1).
void Exchange::onHeld(CallHandle const& call)
{
    call->channel = 0;
    countSpeech(*call);
    call->speech.reset();
    if (call->own == nullptr || call->own->transfersTo.empty())
        return;
    Plan::Call& consultation = m_consultations.emplace_back(*call->own);
    consultation.to = std::exchange(consultation.transfersTo, {});
    if (CallHandle const second = place(consultation))
        second->held = call;
}

void Exchange::dialOn(CallHandle const& call)
{
    if (call->own == nullptr)
        return;
    for (; call->dialled < call->number.size(); ++call->dialled)
        pri_information(m_stack, call->handle, call->number[call->dialled]);
}

void Exchange::onAnswer(pri_event_answer const& answer)
{
    CallHandle const call = find(answer.call);
    if (call == nullptr || call->own == nullptr)
        return;
    ++m_report.placedAnswered;
    call->isUp = true;
    call->channel = answer.channel;
    speak(call, call->own->speaks, call->own->file, call->own->record);
    if (!call->own->keys.empty())
        pri_keypad_facility(m_stack, call->handle, call->own->keys.c_str());
    if (!call->own->transfersTo.empty())
        pri_hold(m_stack, call->handle);
    if (call->held != nullptr)
        pri_channel_bridge(call->held->handle, call->handle);
    if (call->own->holds)
        hold(call);
    if (call->own->parks != 0)
        park(call, call->own->parks);
    after(call->own->length, call, [this](CallHandle const& one) { release(one, one->own->cause); });
}
