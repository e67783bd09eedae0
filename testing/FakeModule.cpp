#include "testing/FakeModule.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "services/CC_ServiceUserInput.h"
#include "testing/FailingAllocator.h"

#include <cstdio>
#include <cstdlib>
#include <tuple>
#include <utility>

namespace
{
void EXPECT_REGISTERED(XCode result, String const& name)
{
    if (result.isOk())
        return;
    std::fprintf(stderr, "FakeModule: provider %s gave 0x%x; is there a context, and no other module of that name?\n",
                 name.c_str(), result.getValue());
    std::abort();
}

std::string TEXT(CC_Property const* property)
{
    FailingAllocator::Pause const unseen;
    String text;
    return property != nullptr ? property->getValueString(text).c_str() : "absent";
}
} // namespace

FakeModule::FakeModule(std::string const& name, String const& network, Journal* journal,
                       CC_PropertyFilterContainer* inputFilters, CC_PropertyFilterContainer* outputFilters)
    : m_provider(name, journal != nullptr ? journal : &m_ownJournal)
    , m_endpoint(name, network.isEmpty() ? name.c_str() : network, &m_provider.getJournal(), inputFilters,
                 outputFilters)
    , m_observer(name, &m_provider.getJournal())
{
    m_provider.m_dial = [this](CC_Call& call, String const&, String const& number, CC_PropertyContainer const& offered)
    { return m_endpoint.offer(call, number, offered); };
    FailingAllocator::Pause const unseen;
    EXPECT_REGISTERED(CallControl::ADD_PROVIDER(CallControl::DEFAULT_CONTEXT_NAME, getName(), m_provider), getName());
    acceptOffers();
    renew();
}

FakeModule::~FakeModule()
{
    m_adapter.reset();
    if (CallControl::GET_PROVIDER(CallControl::DEFAULT_CONTEXT_NAME, getName()) == &m_provider)
        CallControl::REMOVE_PROVIDER(CallControl::DEFAULT_CONTEXT_NAME, getName());
}

void FakeModule::acceptOffers()
{
    m_endpoint.m_handleOffer = [this](CC_Call& call, String const&, CC_PropertyContainer const&)
    { return accept(call); };
}

void FakeModule::rejectOffers(QCause cause)
{
    m_endpoint.m_handleOffer = [this, cause](CC_Call& call, String const&, CC_PropertyContainer const&)
    { return reject(call, cause); };
}

void FakeModule::holdOffers()
{
    m_endpoint.m_handleOffer = [this](CC_Call& call, String const&, CC_PropertyContainer const&) { return hold(call); };
}

XCode FakeModule::accept(CC_Call& call)
{
    if (getCall() != nullptr || isHolding())
        return reject(call, QCause::USER_BUSY);
    return m_adapter != nullptr ? m_adapter->accept(call, getOwnProperties()) : XCode::FAILURE;
}

XCode FakeModule::reject(CC_Call& call, QCause cause)
{
    m_endpoint.actionRejectOfferedCall_WithCause(call, CC_PropertyContainer::EMPTY(), cause);
    return XCode::OK;
}

XCode FakeModule::hold(CC_Call& call)
{
    if (getCall() != nullptr || isHolding())
        return reject(call, QCause::USER_BUSY);
    FailingAllocator::Pause const unseen;
    m_heldObserver = std::make_unique<RecordingCallObserver>("held");
    m_heldObserver->m_onEnded = [this](CC_EvCallObservationEnded const&) { m_heldCall = nullptr; };
    XCode const result = m_heldObserver->observe(call);
    m_heldCall = result.isOk() ? &call : nullptr;
    return result;
}

XCode FakeModule::acceptHeld()
{
    m_heldObserver.reset();
    CC_Call* const call = std::exchange(m_heldCall, nullptr);
    return call != nullptr ? accept(*call) : XCode::ABSENT;
}

void FakeModule::rejectHeld(QCause cause)
{
    m_heldObserver.reset();
    if (CC_Call* const call = std::exchange(m_heldCall, nullptr))
        std::ignore = reject(*call, cause); // always OK
}

CC_PropertyContainer FakeModule::getOwnProperties() const
{
    FailingAllocator::Pause const unseen;
    CC_PropertyContainer own;
    if (!m_number.isEmpty())
        std::ignore = own.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, m_number)); // no memory fails here
    return own;
}

XCode FakeModule::dial(FakeModule const& callee, String const& number)
{
    auto const& none = CC_PropertyContainer::EMPTY();
    return dial(callee.getName(), number, getOwnProperties(), none, none);
}

XCode FakeModule::dial(String const& providerName, String const& number, CC_PropertyContainer const& own,
                       CC_PropertyContainer const& offer, CC_PropertyContainer const& call)
{
    CC_PropertyContainer whole;
    {
        FailingAllocator::Pause const unseen;
        std::ignore = whole.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, number)); // nor here
        std::ignore = whole.set(offer);
    }
    return m_adapter->dial(CallControl::DEFAULT_CONTEXT_NAME, providerName, number, own, whole, call, nullptr);
}

XCode FakeModule::become(State::State state) { return say(State(CC_PropertyId::STATE, state)); }

XCode FakeModule::say(CC_Property const& property) { return m_adapter->setOwnProperty(property); }

XCode FakeModule::say(unsigned int id, String const& text) { return say(CC_PropertyString(id, text)); }

void FakeModule::key(String const& digits)
{
    CC_ServiceUserInput input(digits);
    m_adapter->invokeSynchronousService(input);
}

void FakeModule::hangUp(QCause cause)
{
    if (m_adapter != nullptr)
        m_adapter->drop(cause, 0);
}

void FakeModule::renew()
{
    FailingAllocator::Pause const unseen;
    m_adapter = std::make_unique<CC_CallAdapterE164>();
    std::ignore = m_adapter->setup("line", m_endpoint, &m_observer); // no memory fails here
}

CC_Call* FakeModule::getCall() const { return m_adapter != nullptr ? m_adapter->getCall() : nullptr; }

std::string FakeModule::getPeerState() const
{
    State const* const state = State::FROM(m_adapter->getPeerProperty(CC_PropertyId::STATE));
    return state != nullptr ? State::STATE_NAME(state->getState()) : "none";
}

std::string FakeModule::getOwnValue(unsigned int id) const { return TEXT(m_adapter->getOwnProperty(id)); }

std::string FakeModule::getPeerValue(unsigned int id) const { return TEXT(m_adapter->getPeerProperty(id)); }

std::string FakeModule::getCallValue(unsigned int id) const { return TEXT(m_adapter->getCallProperty(id)); }
