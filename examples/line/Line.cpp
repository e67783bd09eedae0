#include "Line.h"

#include "RingRhythm.h"
#include "WithholdRestricted.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyKeys.h"
#include "services/CC_ServiceBlindTransfer.h"
#include "services/CC_ServiceBlindTransferStatus.h"
#include "services/CC_ServiceUserInput.h"

#include <new>
#include <tuple>
#include <utility>

using Tones = MG_Tones::ECallProgressTone;

namespace
{
/// The result of an operation that may run out of memory: texts and services throw then, and call control, which calls
/// us, expects no exceptions.
template <class Operation>
XCode GUARDED(Operation const& operation)
{
    try
    {
        return operation();
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}
} // namespace

Line::Line(String const& name, String const& number, Telephone& telephone, Route route, bool isEnBloc)
    : CC_Provider(name, "")
    , CC_Endpoint(nullptr, &m_filters)
    , m_name(name)
    , m_number(number)
    , m_telephone(telephone)
    , m_route(route)
    , m_isEnBloc(isEnBloc)
    , m_noAnswer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_NO_ANSWER, this)
{
}

XCode Line::open()
{
    if (XCode const result = DECLARE_RING_RHYTHM(); !result.isOk())
        return result;
    if (!m_filters.addFilter(WithholdRestricted()).isOk() || !bind(*m_call).isOk() || !bind(*m_consultation).isOk())
        return XCode::FAILURE;
    return CallControl::ADD_PROVIDER("SWITCH", m_name, *this);
}

XCode Line::bind(CC_CallAdapterE164& adapter)
{
    adapter.cleanup();
    return adapter.setup(&adapter == &m_adapters[0] ? "first" : "second", *this, this);
}

Line::~Line()
{
    m_consultation->cleanup();
    m_call->cleanup();
    if (CallControl::GET_PROVIDER("SWITCH", m_name) == this)
        CallControl::REMOVE_PROVIDER("SWITCH", m_name);
}

// --- placing calls ---------------------------------------------------------------------------------------------------

XCode Line::call(String const& number, bool isComplete, unsigned int rhythm)
{
    return place(*m_call, number, isComplete, rhythm);
}

XCode Line::place(CC_CallAdapterE164& adapter, String const& number, bool isComplete, unsigned int rhythm)
{
    if (adapter.getCall() != nullptr)
        return XCode::REFUSED;
    CC_PropertyContainer offer;
    if (rhythm != 0)
        if (XCode const result = offer.set(RING_RHYTHM, rhythm); !result.isOk())
            return result;
    auto const dial = [&]
    {
        return adapter.dial({.providerName = m_route(number),
                             .destination = number,
                             .calling = getParty(),
                             .called = {.number = number, .typeOfNumber = QTypeOfNumber::INTERNATIONAL},
                             .sendingComplete = isComplete,
                             .extraOfferProperties = &offer});
    };
    XCode const result = GUARDED(dial);
    if (!result.isOk())
    {
        std::ignore = bind(adapter); // idle for certain, also when memory ran out half-way
        m_telephone.hear(Tones::CONGESTION);
    }
    return result;
}

CC_CallAdapterE164::Party Line::getParty() const
{
    return {.number = m_number,
            .typeOfNumber = QTypeOfNumber::INTERNATIONAL,
            .presentation = m_isRestricted ? QPresentationIndicator::RESTRICTED : QPresentationIndicator::ALLOWED,
            .screening = QScreeningIndicator::NETWORK_PROVIDED,
            .name = m_name};
}

void Line::key(String const& digits)
{
    auto const send = [&]
    {
        CC_ServiceUserInput input(digits);
        m_call->invokeSynchronousService(input);
        return XCode(XCode::OK);
    };
    std::ignore = GUARDED(send); // a key that memory refuses is a key not pressed
}

// --- being called ----------------------------------------------------------------------------------------------------

XCode Line::dial(CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offered)
{
    return offer(call, destination, offered);
}

XCode Line::handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& offered)
{
    if (m_call->getOwn(Key::STATE) == State::ADDRESS_INCOMPLETE)
        m_call->drop(QCause::NORMAL_CALL_CLEARING, 0); // the caller dials once more, with more digits
    if (m_call->getCall() != nullptr)
    {
        actionRejectOfferedCall_WithCause(call, CC_PropertyContainer::EMPTY(), QCause::USER_BUSY);
        return XCode::OK;
    }
    if (XCode const result = GUARDED([&] { return m_call->acceptAs(call, getParty()); }); !result.isOk())
    {
        std::ignore = bind(*m_call);
        return result;
    }
    m_rhythm = offered.get(RING_RHYTHM).getValueOr(0u);
    m_collected.clear();
    auto const number = offered.get(Key::E164_NUMBER);
    return collect(number ? number->getValue() : name);
}

XCode Line::collect(String const& digits)
{
    if (XCode const result = GUARDED([&] { return m_collected += digits, XCode(XCode::OK); }); !result.isOk())
        return result;
    if (m_collected == m_number)
    {
        m_telephone.ring(m_call->getPeerE164(), m_call->getPeerName(), m_rhythm);
        m_noAnswer.start(RINGING_TIME);
        return become(State::ALERTING);
    }
    if (m_number.startsWith(m_collected))
    {
        std::ignore = m_call->setOwnSupportsOverlapReceiving(!m_isEnBloc); // unsaid, we can do both
        return become(State::ADDRESS_INCOMPLETE);
    }
    m_call->drop(QCause::UNALLOCATED_NUMBER, 0);
    return XCode::OK;
}

XCode Line::answer() { return become(State::CONNECTED); }

XCode Line::become(State::State state) { return m_call->setOwn(Key::STATE, state); }

// --- what the other side does ----------------------------------------------------------------------------------------

void Line::notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& changed)
{
    auto& told = static_cast<CC_CallAdapterE164&>(adapter);
    if (changed.get(CC_PropertyId::CALL_PROGRESS_TONE))
        if (auto const tone = told.getPeer(Key::CALL_PROGRESS_TONE))
            m_telephone.hear(tone->getTone());
    if (changed.get(CC_PropertyId::DISPLAY))
        m_telephone.show(told.getPeerDisplay());
    if (changed.get(CC_PropertyId::CHARGE))
        if (auto const charge = told.getPeer(Key::CHARGE))
        {
            auto const show = [&]
            {
                String text;
                m_telephone.show(charge->getValueString(text));
                return XCode(XCode::OK);
            };
            std::ignore = GUARDED(show);
        }
    if (changed.get(CC_PropertyId::STATE))
        followState(told);
}

void Line::followState(CC_CallAdapterE164& adapter)
{
    auto const peer = adapter.getPeer(Key::STATE);
    if (peer == State::ALERTING)
        m_telephone.hear(Tones::RINGING);
    else if (peer == State::HELD)
        m_telephone.hear(Tones::HOLD);
    else if (peer == State::CONNECTED)
        m_telephone.hear(Tones::NONE);
    else if (!peer || peer == State::RELEASED) // without a peer the leg was taken out of the call
    {
        QCause const why = adapter.getPeer(Key::CAUSE, QCause::NORMAL_CALL_CLEARING);
        adapter.drop(QCause::NORMAL_CALL_CLEARING, 0);
        m_telephone.clear(why);
    }
}

void Line::notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service)
{
    auto& asked = static_cast<CC_CallAdapterE164&>(adapter);
    if (service.isOfType(CC_ServiceUserInput::TYPE()) && asked.getOwn(Key::STATE) == State::ADDRESS_INCOMPLETE)
        std::ignore = collect(static_cast<CC_ServiceUserInput&>(service).getInput());
    else if (service.isOfType(CC_ServiceBlindTransfer::TYPE()))
        follow(asked, static_cast<CC_ServiceBlindTransfer&>(service).getNumber());
    else if (service.isOfType(CC_ServiceBlindTransferStatus::TYPE()) &&
             static_cast<CC_ServiceBlindTransferStatus&>(service).getCause() == QCause::NONE)
        hangUp();
}

// --- more than one party ---------------------------------------------------------------------------------------------

XCode Line::consult(String const& number)
{
    XCode const held = hold();
    return held.isOk() ? place(*m_consultation, number, true, 0) : held;
}

XCode Line::transfer()
{
    XCode const result = m_call->transfer(*m_consultation, true);
    if (result.isOk())
        hangUp();
    return result;
}

XCode Line::confer()
{
    XCode const result = m_call->transfer(*m_consultation, false);
    if (!result.isOk())
        return result;
    m_consultation->drop(QCause::NORMAL_CALL_CLEARING, 0);
    return retrieve();
}

XCode Line::transferTo(String const& number)
{
    auto const ask = [&]
    {
        CC_ServiceBlindTransfer service("", number);
        m_call->invokeSynchronousService(service);
        return XCode(XCode::OK);
    };
    return GUARDED(ask);
}

void Line::follow(CC_CallAdapterE164& adapter, String const& number)
{
    XCode const result = place(*m_consultation, number, true, 0);
    CC_ServiceBlindTransferStatus status(result.isOk() ? QCause::NONE : QCause::NO_ROUTE_TO_DESTINATION);
    adapter.invokeSynchronousService(status); // who asked may hang up inside
    if (!result.isOk())
        return;
    adapter.drop(QCause::NORMAL_CALL_CLEARING, 0);
    std::swap(m_call, m_consultation); // the new call is the line's
}

// --- time ------------------------------------------------------------------------------------------------------------

void Line::ON_NO_ANSWER(void* line)
{
    auto& self = *static_cast<Line*>(line);
    if (self.m_call->getOwn(Key::STATE) != State::ALERTING)
        return; // the call that rang has gone on, or ended
    self.m_call->drop(QCause::NO_ANSWER_FROM_USER, 0);
    self.m_telephone.clear(QCause::NO_ANSWER_FROM_USER);
}

// --- the end ---------------------------------------------------------------------------------------------------------

void Line::hangUp()
{
    m_noAnswer.stop();
    m_consultation->drop(QCause::NORMAL_CALL_CLEARING, 0);
    m_call->drop(QCause::NORMAL_CALL_CLEARING, 0);
}

InfoContainer& Line::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                             unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Line", m_number);
    return m_call->getInfo(info, maxLevel, level + 1, maxDetail, detail, "Call");
}
