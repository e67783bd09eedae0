#include "tests/support/FaultyModule.h"

#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyKeys.h"
#include "properties/CC_PropertyUnsigned.h"
#include "services/CC_ServiceUserInput.h"

#include <new>
#include <tuple>
#include <utility>

using State = CC_PropertyCallLegState;

namespace
{
/// No exception leaves a module.
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

FaultyModule::FaultyModule(FaultyWire& wire, Fault fault)
    : CC_Provider("faulty", "")
    , CC_Endpoint(nullptr, nullptr)
    , m_wire(wire)
    , m_fault(fault)
    , m_patience(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_NO_ANSWER, this)
{
    bind();
    std::ignore = CallControl::ADD_PROVIDER("SWITCH", m_name, *this);
}

FaultyModule::~FaultyModule()
{
    if (CallControl::GET_PROVIDER("SWITCH", m_name) == this)
        CallControl::REMOVE_PROVIDER("SWITCH", m_name);
}

/// Ends with the context, which is early enough for its call to end as calls do.
struct FaultyModule::LeftBehind : CC_Context::Observer
{
    explicit LeftBehind(std::unique_ptr<FaultyModule> left) : module(std::move(left)) {}
    void aboutDestroy(CC_Context&) override { delete this; }
    void aboutAddProvider(CC_Context&, String const&) override {}
    void aboutRemoveProvider(CC_Context&, String const&) override {}
    void aboutCreateCall(CC_Context&, CC_Call*) override {}
    void aboutDestroyCall(CC_Context&, CC_Call*) override {}

    std::unique_ptr<FaultyModule> module;
};

void FaultyModule::LEAVE_BEHIND(std::unique_ptr<FaultyModule> module)
{
    module->m_patience.stop();
    module->m_isLeftBehind = true;
    std::ignore = CallControl::GET_CONTEXT("SWITCH")->addContextObserver(*new LeftBehind(std::move(module)));
}

void FaultyModule::bind()
{
    m_adapter.cleanup();
    std::ignore = m_adapter.setup("line", *this, this); // a name this short needs no memory
}

// --- the wire --------------------------------------------------------------------------------------------------------

void FaultyModule::onCall(String const& number)
{
    if (m_adapter.getCall() != nullptr)
        return;
    m_isFromWire = true;
    m_hadPeer = m_hasRung = m_isAnswered = m_isOffered = m_isEnding = false;
    auto const dial = [&]
    {
        String dialled = number;
        if (is(Fault::DIALS_HALF_THE_NUMBER))
            dialled.deleteRegion(4, number.length());
        CC_CallAdapterE164::DialForm form{.providerName = ModuleDriver::PEER, .destination = dialled};
        form.calling.number = NUMBER;
        form.called.number = dialled;
        return m_adapter.dial(form);
    };
    if (GUARDED(dial).isOk())
        return;
    if (!is(Fault::STAYS_BROKEN_WITHOUT_MEMORY))
        bind();
    m_wire.onClear(QCause::RESOURCE_UNAVAILABLE);
}

void FaultyModule::onRinging()
{
    if (!is(Fault::DOES_NOT_SAY_ALERTING))
        std::ignore = m_adapter.setOwn(Key::STATE, State::ALERTING); // without memory it is not told; the answer may be
}

void FaultyModule::onAnswer()
{
    m_patience.stop();
    if (!m_adapter.setOwn(Key::STATE, State::CONNECTED).isOk())
        end(QCause::RESOURCE_UNAVAILABLE);
}

void FaultyModule::onClear(QCause cause)
{
    if (is(Fault::CHANGES_CAUSES_FROM_THE_WIRE) && cause == QCause::CALL_REJECTED)
        cause = QCause::NORMAL_UNSPECIFIED;
    if (is(Fault::CLEARS_BACK) && m_isFromWire)
        m_wire.onClear(QCause::NORMAL_CALL_CLEARING);
    drop(cause);
}

void FaultyModule::onDigit(char digit)
{
    if (is(Fault::LOSES_DIGITS_FROM_THE_WIRE))
        return;
    std::ignore = GUARDED(
        [&]
        {
            CC_ServiceUserInput input(String(&digit, 1));
            m_adapter.invokeSynchronousService(input);
            return XCode(XCode::OK);
        });
}

// --- offers ----------------------------------------------------------------------------------------------------------

XCode FaultyModule::dial(CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offered)
{
    return offer(call, destination, offered);
}

XCode FaultyModule::handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& offered)
{
    if (m_adapter.getCall() == nullptr)
    {
        auto const number = offered.get(Key::E164_NUMBER);
        return answerOffer(call, number ? number->getValue() : name);
    }
    if (is(Fault::IGNORES_OFFERS_WHEN_BUSY))
        return XCode::OK;
    if (is(Fault::DROPS_THE_FIRST_FOR_THE_SECOND))
        end(QCause::PREEMPTION);
    actionRejectOfferedCall_WithCause(call, CC_PropertyContainer::EMPTY(), QCause::USER_BUSY);
    return XCode::OK;
}

XCode FaultyModule::answerOffer(CC_Call& call, String const& number)
{
    XCode const result = GUARDED([&] { return m_adapter.acceptAs(call, {.number = NUMBER}); });
    if (!result.isOk())
    {
        if (!is(Fault::STAYS_BROKEN_WITHOUT_MEMORY))
            bind();
        return result;
    }
    if (is(Fault::ANSWERS_OFFERS_TWICE))
        actionRejectOfferedCall_WithCause(call, CC_PropertyContainer::EMPTY(), QCause::USER_BUSY);
    m_isFromWire = m_hasRung = m_isAnswered = m_isOffered = m_isEnding = false;
    m_hadPeer = true;
    m_peerId = 0;
    m_collected.clear();
    collect(number);
    return XCode::OK;
}

void FaultyModule::collect(String const& digits)
{
    std::ignore = GUARDED([&] { return m_collected += digits, XCode(XCode::OK); }); // then the number stays incomplete
    if (m_collected == NUMBER || (is(Fault::OFFERS_BEFORE_ALL_DIGITS) && !m_isOffered))
    {
        m_isOffered = true;
        m_patience.start(PATIENCE);
        m_wire.onOffer(is(Fault::OFFERS_HALF_THE_NUMBER) && digits == NUMBER ? "4989" : NUMBER);
    }
    else if (String(NUMBER).startsWith(m_collected))
        std::ignore = m_adapter.setOwn(Key::STATE, State::ADDRESS_INCOMPLETE); // the peer may send more all the same
    else
        drop(QCause::UNALLOCATED_NUMBER);
}

void FaultyModule::ON_NO_ANSWER(void* module)
{
    auto& self = *static_cast<FaultyModule*>(module);
    if (!self.is(Fault::NEVER_GIVES_UP))
        self.end(QCause::NO_USER_RESPONDING);
}

// --- the peer --------------------------------------------------------------------------------------------------------

void FaultyModule::notifyPeerPropertyChange(CC_CallAdapter&, CC_Flags const&)
{
    if (m_isLeftBehind)
        return;
    if (is(Fault::THROWS_WITHOUT_MEMORY))
        m_needed = std::make_unique<int>();
    auto const state = m_adapter.getPeer(Key::STATE);
    bool const isLost = !state && m_hadPeer && !is(Fault::WAITS_FOR_RELEASED);
    if (isLost || state == State::RELEASED)
    {
        QCause const cause = m_adapter.getPeer(Key::CAUSE, QCause::NONE);
        if (is(Fault::CLEARS_NO_WIRE_THAT_RINGS) && m_hasRung && !m_isAnswered && cause == QCause::NORMAL_CALL_CLEARING)
            drop(cause);
        else
            end(cause != QCause::NONE && cause != QCause::UNSPECIFIED ? cause : QCause::NORMAL_CALL_CLEARING);
        return;
    }
    m_hadPeer = m_hadPeer || state;
    unsigned long long const id = m_adapter.getPeerCallLegId();
    if (is(Fault::ENDS_WITH_A_NEW_PEER) && state && std::exchange(m_peerId, id) != id && m_peerId != 0 && m_isAnswered)
        end(QCause::NORMAL_CALL_CLEARING);
    else if (m_isFromWire)
        followPeer();
}

void FaultyModule::followPeer()
{
    auto const state = m_adapter.getPeer(Key::STATE);
    bool const isUp = state == State::CONNECTED || state == State::HELD;
    if (state == State::ALERTING && !std::exchange(m_hasRung, true) && !is(Fault::DOES_NOT_RING_THE_WIRE))
        m_wire.onRinging();
    if (!isUp || (is(Fault::WAITS_FOR_ALERTING) && !m_hasRung))
        return;
    bool const isAgain = is(Fault::ANSWERS_THE_WIRE_AGAIN) && state == State::HELD;
    if (!std::exchange(m_isAnswered, true) || isAgain)
        m_wire.onAnswer();
}

void FaultyModule::notifyPeerSynchronousService(CC_CallAdapter&, CC_Service& service)
{
    if (m_isLeftBehind || !service.isOfType(CC_ServiceUserInput::TYPE()))
        return;
    String const& input = static_cast<CC_ServiceUserInput&>(service).getInput();
    if (m_adapter.getOwn(Key::STATE) == State::ADDRESS_INCOMPLETE)
    {
        if (!is(Fault::LOSES_LATE_DIGITS))
            collect(input);
    }
    else if (!is(Fault::LOSES_DIGITS_TO_THE_WIRE))
        m_wire.onDigits(input);
}

/// The call ends at the other side or for a reason of our own: the wire is told.
void FaultyModule::end(QCause cause)
{
    if (std::exchange(m_isEnding, true))
        return;
    if (is(Fault::CHANGES_CAUSES_TO_THE_WIRE) && cause == QCause::CALL_REJECTED)
        cause = QCause::NORMAL_UNSPECIFIED;
    bool const isConfirmed = m_wire.onClear(cause);
    if (is(Fault::CLEARS_THE_WIRE_TWICE))
        m_wire.onClear(cause);
    if (isConfirmed || !is(Fault::WAITS_FOR_THE_WIRE))
        drop(cause);
}

void FaultyModule::drop(QCause cause)
{
    m_patience.stop();
    if (is(Fault::KEEPS_ITS_LEG) || is(Fault::WRITES_AFTER_RELEASED))
    {
        std::ignore = m_adapter.setOwn(Key::CAUSE, cause, 0u);
        std::ignore = m_adapter.setOwn(Key::STATE, State::RELEASED);
    }
    if (is(Fault::WRITES_AFTER_RELEASED))
        std::ignore = m_adapter.setOwnDisplay("bye");
    if (!is(Fault::KEEPS_ITS_LEG))
        m_adapter.drop(cause, 0);
}

// --- the driver ------------------------------------------------------------------------------------------------------

FaultyDriver::~FaultyDriver()
{
    if (m_fault == Fault::LEAVES_ITS_LEG_BEHIND && m_module->hasCall())
        FaultyModule::LEAVE_BEHIND(std::move(m_module));
}

void FaultyDriver::ring()
{
    if (!m_isSilent)
        m_module->onRinging();
}

void FaultyDriver::answer()
{
    if (!m_isSilent)
        m_module->onAnswer();
}

void FaultyDriver::clear(QCause cause)
{
    if (!m_isSilent)
        m_module->onClear(cause);
}

bool FaultyDriver::onClear(QCause cause)
{
    sawCleared(cause);
    return !m_isSilent;
}
