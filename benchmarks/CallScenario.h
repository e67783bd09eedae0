#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "platform/eventloop/TYEventLoop.h"
#include "properties/CC_Factory.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyFilter.h"
#include "properties/CC_PropertyFilterContainer.h"

#include <memory>
#include <string>
#include <vector>

// The calls that are measured: what two modules do with their adapters, and nothing around it.

/// Says what failed and ends the program.
[[noreturn]] void FAIL(XCode result, char const* what);

/// A benchmark of what fails would measure nothing.
inline void MUST(XCode result, char const* what)
{
    if (!result.isOk()) [[unlikely]]
        FAIL(result, what);
}
inline void MUST(bool isAsExpected, char const* what) { MUST(isAsExpected ? XCode::OK : XCode::FAILURE, what); }

/// Call control ready for calls: the loop, the built-in properties and a number of contexts, "SWITCH", "SWITCH-1" ...
/// No media repository: what a media layer does for a call is not call control's cost.
class World
{
public:
    explicit World(unsigned int contexts = 1);
    ~World();
    World(World const&) = delete;
    World& operator=(World const&) = delete;

    /// Runs turns until nothing is pending.
    void settle();
    static String CONTEXT_NAME(unsigned int index);

private:
    TYEventLoop m_loop;
    CC_Factory m_factory;
    unsigned int m_contexts;
};

/// A module of any number of lines: provider, endpoint and observer of them all. What it is offered it has accepted by
/// the line that is to answer next, and it takes notice of the changes it is told without keeping them.
///
/// Where a step of a call hands over to the other side, the module says so through `m_onStep`, so that a step's cost
/// can be told from that of the step inside it.
class Exchange : public CC_Provider, public CC_Endpoint, public CC_CallAdapterObserver
{
public:
    using OnStep = void (*)(char const* step);

    Exchange(String const& name, unsigned int contexts = 1, CC_PropertyFilterContainer* inputFilters = nullptr,
             CC_PropertyFilterContainer* outputFilters = nullptr, OnStep onStep = nullptr);
    ~Exchange() override;

    void answerNextWith(CC_CallAdapterE164& line) { m_answering = &line; }

    XCode dial(CC_Call& call, String const& providerName, String const& destination,
               CC_PropertyContainer const& offerProperties) override;
    XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties) override;
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;
    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_name; }
    ProviderType getProviderType() const override { return USER_DEFINED_INTERFACE; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    unsigned int m_notifications = 0;

private:
    void step(char const* name) const;

    String m_name;
    unsigned int m_contexts;
    OnStep m_onStep;
    CC_CallAdapterE164* m_answering = nullptr;
};

/// Two lines and the call between them, step by step.
///
///     TwoPartyCall call(left, right);
///     call.dial();
///     call.alert();
///     call.connect();
///     world.settle();
///     call.drop();
///     world.settle();
class TwoPartyCall
{
public:
    using State = CC_PropertyCallLegState;

    TwoPartyCall(Exchange& left, Exchange& right);

    /// By number; the other side accepts by number at once.
    void dial(unsigned int context = 0) { dial(World::CONTEXT_NAME(context)); }
    void dial(String const& contextName);
    void alert() { become(State::ALERTING); }
    void connect() { become(State::CONNECTED); }
    /// One changed property of the calling or the called side; `round` makes the value differ from the last one.
    void changeCaller(unsigned int round) { change(m_caller, round); }
    void changeCallee(unsigned int round) { change(m_callee, round); }
    void drop();

    /// A whole call up to its end: each change is told to the other side before the next comes, as signalling messages
    /// bring them.
    void talk(World& world);
    /// And its end, with the clean-up.
    void hangUp(World& world);
    static constexpr unsigned int CHANGES_EACH_WAY = 10;

    CC_CallAdapterE164 m_caller;
    CC_CallAdapterE164 m_callee;

private:
    void become(State::State state);
    static void change(CC_CallAdapterE164& line, unsigned int round);

    Exchange& m_left;
    Exchange& m_right;
};

/// A filter as modules have them: it takes a number's international prefix away, and writes only when there is one.
class PrefixFilter : public CC_PropertyFilter
{
public:
    CC_PropertyFilter* clone() const override;
    XCode apply(CC_PropertyContainer& properties) const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;
};

/// The same, but it asks for the number so that it may write to it: it counts as changed whatever comes of it.
class WritingPrefixFilter : public PrefixFilter
{
public:
    CC_PropertyFilter* clone() const override;
    XCode apply(CC_PropertyContainer& properties) const override;
};
