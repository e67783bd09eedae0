#include "CallScenario.h"

#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyKeys.h"
#include "properties/CC_PropertyString.h"

#include <cstdio>
#include <cstdlib>
#include <string_view>
#include <tuple>

void FAIL(XCode result, char const* what)
{
    std::fprintf(stderr, "%s failed with 0x%x\n", what, result.getValue());
    std::abort();
}

World::World(unsigned int contexts) : m_contexts(contexts)
{
    CallControl::SET_CC_EVENT_LOOP(&m_loop);
    MUST(CallControl::ADD_PROPERTY_FACTORY(&m_factory), "ADD_PROPERTY_FACTORY");
    for (unsigned int i = 0; i < m_contexts; ++i)
        MUST(CallControl::CREATE_CONTEXT(CONTEXT_NAME(i)), "CREATE_CONTEXT");
}

World::~World()
{
    settle();
    for (unsigned int i = 0; i < m_contexts; ++i)
        CallControl::DESTROY_CONTEXT(CONTEXT_NAME(i));
    CallControl::REMOVE_PROPERTY_FACTORY(&m_factory);
    CallControl::SET_CC_EVENT_LOOP(nullptr);
}

void World::settle()
{
    while (m_loop.runTurn())
    {
    }
}

String World::CONTEXT_NAME(unsigned int index)
{
    String name = CallControl::DEFAULT_CONTEXT_NAME;
    return index == 0 ? name : name.concatf("-%u", index);
}

Exchange::Exchange(String const& name, unsigned int contexts, CC_PropertyFilterContainer* inputFilters,
                   CC_PropertyFilterContainer* outputFilters, OnStep onStep)
    : CC_Provider(name, String::s_empty)
    , CC_Endpoint(inputFilters, outputFilters)
    , m_name(name)
    , m_contexts(contexts)
    , m_onStep(onStep)
{
    for (unsigned int i = 0; i < m_contexts; ++i)
        MUST(CallControl::ADD_PROVIDER(World::CONTEXT_NAME(i), m_name, *this), "ADD_PROVIDER");
}

Exchange::~Exchange()
{
    for (unsigned int i = 0; i < m_contexts; ++i)
        CallControl::REMOVE_PROVIDER(World::CONTEXT_NAME(i), m_name);
}

void Exchange::step(char const* name) const
{
    if (m_onStep != nullptr)
        m_onStep(name);
}

XCode Exchange::dial(CC_Call& call, String const&, String const& destination,
                     CC_PropertyContainer const& offerProperties)
{
    step("offer");
    XCode const offered = offer(call, destination, offerProperties);
    step("dial");
    return offered;
}

XCode Exchange::handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const&)
{
    step("accept");
    XCode const accepted =
        m_answering->accept(call, name, QTypeOfNumber::INTERNATIONAL, QNumberingPlan::ISDN,
                            QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED, "Charles");
    step("offer");
    return accepted;
}

void Exchange::notifyPeerPropertyChange(CC_CallAdapter&, CC_Flags const&) { ++m_notifications; }

void Exchange::notifyPeerSynchronousService(CC_CallAdapter&, CC_Service&) { ++m_notifications; }

InfoContainer& Exchange::getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                                 String const&) const
{
    return info;
}

TwoPartyCall::TwoPartyCall(Exchange& left, Exchange& right) : m_left(left), m_right(right)
{
    MUST(m_caller.setup("line 1", m_left, &m_left), "setup");
    MUST(m_callee.setup("line 2", m_right, &m_right), "setup");
}

void TwoPartyCall::dial(String const& contextName)
{
    m_right.answerNextWith(m_callee);
    MUST(m_caller.dial(contextName, m_right.getNetwork(), "4989123", "4420791234", QTypeOfNumber::INTERNATIONAL,
                       QNumberingPlan::ISDN, QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED,
                       "Ada", "4989123", QTypeOfNumber::INTERNATIONAL, QNumberingPlan::ISDN, "Charles", true,
                       QInformationTransferCapability::SPEECH, nullptr, nullptr, nullptr, nullptr),
         "dial");
}

void TwoPartyCall::become(State::State state)
{
    MUST(m_callee.setOwnProperty(State(CC_PropertyId::STATE, state)), "setOwnProperty");
}

void TwoPartyCall::change(CC_CallAdapterE164& line, unsigned int round)
{
    static String const names[] = {"Ada Lovelace", "A. Lovelace"};
    MUST(line.setOwnName(names[round % 2]), "setOwnName");
}

void TwoPartyCall::talk(World& world)
{
    dial();
    world.settle();
    alert();
    world.settle();
    connect();
    world.settle();
    for (unsigned int round = 0; round < CHANGES_EACH_WAY; ++round)
    {
        changeCaller(round);
        world.settle();
        changeCallee(round);
        world.settle();
    }
    MUST(m_callee.getPeerName() == m_caller.getOwnName(), "telling the caller's last change");
}

void TwoPartyCall::hangUp(World& world)
{
    drop();
    world.settle();
}

void TwoPartyCall::drop()
{
    m_caller.drop(QCause::NORMAL_CALL_CLEARING, 0);
    m_callee.drop(QCause::NORMAL_CALL_CLEARING, 0);
}

CC_PropertyFilter* PrefixFilter::clone() const { return new (std::nothrow) PrefixFilter; }

XCode PrefixFilter::apply(CC_PropertyContainer& properties) const
{
    auto const number = properties.get(Key::E164_NUMBER);
    if (!number || !number->getValue().startsWith("00"))
        return XCode::OK;
    return properties.set(Key::E164_NUMBER, String(number->getValue().view().substr(2)));
}

InfoContainer& PrefixFilter::getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                                     String const&) const
{
    return info;
}

CC_PropertyFilter* WritingPrefixFilter::clone() const { return new (std::nothrow) WritingPrefixFilter; }

XCode WritingPrefixFilter::apply(CC_PropertyContainer& properties) const
{
    auto* const number = CC_PropertyString::FROM(properties.get(CC_PropertyId::E164_NUMBER));
    if (number != nullptr && number->getValue().startsWith("00"))
        number->setValue(String(number->getValue().view().substr(2)));
    return XCode::OK;
}
