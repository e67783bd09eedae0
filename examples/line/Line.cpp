#include "Line.h"

#include "RingRhythm.h"
#include "WithholdRestricted.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyCallProgressTone.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
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
{
}

XCode Line::open()
{
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
        if (XCode const result = offer.set(RingRhythm(RingRhythm::ID, rhythm)); !result.isOk())
            return result;
    auto const dial = [&]
    {
        return adapter.dial("SWITCH", m_route(number), number, m_number, QTypeOfNumber::INTERNATIONAL,
                            QNumberingPlan::ISDN, getPresentation(), QScreeningIndicator::NETWORK_PROVIDED, m_name,
                            number, QTypeOfNumber::INTERNATIONAL, QNumberingPlan::ISDN, "", isComplete,
                            QInformationTransferCapability::SPEECH, nullptr, nullptr, &offer, nullptr);
    };
    XCode const result = GUARDED(dial);
    if (!result.isOk())
    {
        std::ignore = bind(adapter); // idle for certain, also when memory ran out half-way
        m_telephone.hear(Tones::CONGESTION);
    }
    return result;
}

QPresentationIndicator Line::getPresentation() const
{
    return m_isRestricted ? QPresentationIndicator::RESTRICTED : QPresentationIndicator::ALLOWED;
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
    auto const* const own = State::FROM(m_call->getOwnProperty(CC_PropertyId::STATE));
    if (own != nullptr && own->getState() == State::ADDRESS_INCOMPLETE)
        m_call->drop(QCause::NORMAL_CALL_CLEARING, 0); // the caller dials once more, with more digits
    if (m_call->getCall() != nullptr)
    {
        actionRejectOfferedCall_WithCause(call, CC_PropertyContainer::EMPTY(), QCause::USER_BUSY);
        return XCode::OK;
    }
    if (XCode const result = m_call->accept(call, m_number, QTypeOfNumber::INTERNATIONAL, QNumberingPlan::ISDN,
                                            getPresentation(), QScreeningIndicator::NETWORK_PROVIDED, m_name);
        !result.isOk())
    {
        std::ignore = bind(*m_call);
        return result;
    }
    auto const* const rhythm = RingRhythm::FROM(offered.get(RingRhythm::ID));
    m_rhythm = rhythm != nullptr ? rhythm->getValue() : 0;
    m_collected.clear();
    auto const* const number = CC_PropertyString::FROM(offered.get(CC_PropertyId::E164_NUMBER));
    return collect(number != nullptr ? number->getValue() : name);
}

XCode Line::collect(String const& digits)
{
    if (XCode const result = GUARDED([&] { return m_collected += digits, XCode(XCode::OK); }); !result.isOk())
        return result;
    if (m_collected == m_number)
    {
        m_telephone.ring(m_call->getPeerE164(), m_call->getPeerName(), m_rhythm);
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

XCode Line::become(State::State state) { return m_call->setOwnProperty(State(CC_PropertyId::STATE, state)); }

// --- what the other side does ----------------------------------------------------------------------------------------

void Line::notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& changed)
{
    auto& told = static_cast<CC_CallAdapterE164&>(adapter);
    if (changed.get(CC_PropertyId::CALL_PROGRESS_TONE))
        if (auto const* const tone =
                CC_PropertyCallProgressTone::FROM(told.getPeerProperty(CC_PropertyId::CALL_PROGRESS_TONE)))
            m_telephone.hear(tone->getTone());
    if (changed.get(CC_PropertyId::DISPLAY))
        m_telephone.show(told.getPeerDisplay());
    if (changed.get(CC_PropertyId::CHARGE))
        if (CC_Property const* const charge = told.getPeerProperty(CC_PropertyId::CHARGE))
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
    auto const* const peer = State::FROM(adapter.getPeerProperty(CC_PropertyId::STATE));
    if (peer == nullptr)
        return; // nobody else is in the call any more, or not yet
    if (peer->getState() == State::ALERTING)
        m_telephone.hear(Tones::RINGING);
    else if (peer->getState() == State::HELD)
        m_telephone.hear(Tones::HOLD);
    else if (peer->getState() == State::CONNECTED)
        m_telephone.hear(Tones::NONE);
    else if (peer->getState() == State::RELEASED)
    {
        auto const* const cause = CC_PropertyCause::FROM(adapter.getPeerCauseProperty());
        QCause const why = cause != nullptr ? cause->getCause() : QCause::NORMAL_CALL_CLEARING;
        adapter.drop(QCause::NORMAL_CALL_CLEARING, 0);
        m_telephone.clear(why);
    }
}

void Line::notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service)
{
    auto& asked = static_cast<CC_CallAdapterE164&>(adapter);
    auto const* const own = State::FROM(asked.getOwnProperty(CC_PropertyId::STATE));
    if (service.isOfType(CC_ServiceUserInput::TYPE()) && own != nullptr && own->getState() == State::ADDRESS_INCOMPLETE)
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

// --- the end ---------------------------------------------------------------------------------------------------------

void Line::hangUp()
{
    m_consultation->drop(QCause::NORMAL_CALL_CLEARING, 0);
    m_call->drop(QCause::NORMAL_CALL_CLEARING, 0);
}

InfoContainer& Line::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                             unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Line", m_number);
    return m_call->getInfo(info, maxLevel, level + 1, maxDetail, detail, "Call");
}
