#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "platform/eventloop/TYTimer.h"
#include "testing/DrivenClock.h"
#include "testing/ModuleDriver.h"

#include <memory>
#include <vector>

/// What a FaultyModule does wrong.
enum class Fault
{
    NONE,
    IGNORES_OFFERS_WHEN_BUSY,
    ANSWERS_OFFERS_TWICE,
    OFFERS_HALF_THE_NUMBER,
    DOES_NOT_RING_THE_WIRE,
    DIALS_HALF_THE_NUMBER,
    DOES_NOT_SAY_ALERTING,
    KEEPS_ITS_LEG,
    WRITES_AFTER_RELEASED,
    CLEARS_THE_WIRE_TWICE,
    CLEARS_NO_WIRE_THAT_RINGS,
    CLEARS_BACK,
    CHANGES_CAUSES_TO_THE_WIRE,
    CHANGES_CAUSES_FROM_THE_WIRE,
    WAITS_FOR_ALERTING,
    ENDS_WITH_A_NEW_PEER,
    ANSWERS_THE_WIRE_AGAIN,
    WAITS_FOR_RELEASED,
    WAITS_FOR_THE_WIRE,
    NEVER_GIVES_UP,
    DROPS_THE_FIRST_FOR_THE_SECOND,
    LOSES_DIGITS_FROM_THE_WIRE,
    LOSES_DIGITS_TO_THE_WIRE,
    LOSES_LATE_DIGITS,
    OFFERS_BEFORE_ALL_DIGITS,
    STAYS_BROKEN_WITHOUT_MEMORY,
    THROWS_WITHOUT_MEMORY,
    LEAVES_ITS_LEG_BEHIND
};

/// The far side of a wire in memory.
class FaultyWire
{
public:
    virtual void onOffer(String const& number) = 0;
    virtual void onRinging() = 0;
    virtual void onAnswer() = 0;
    /// Whether the wire confirms it.
    virtual bool onClear(QCause cause) = 0;
    virtual void onDigits(String const& digits) = 0;

protected:
    ~FaultyWire() = default;
};

/// A small module of one call at a time that keeps every rule of ModuleConformance, but for the one fault that it is
/// made with.
class FaultyModule : public CC_Provider, public CC_Endpoint, public CC_CallAdapterObserver
{
public:
    static constexpr char const* NUMBER = "4989123";
    static constexpr unsigned int PATIENCE = 30000; ///< milliseconds until a call that the wire does not answer ends

    FaultyModule(FaultyWire& wire, Fault fault);
    ~FaultyModule() override;

    // what the wire says
    void onCall(String const& number);
    void onRinging();
    void onAnswer();
    void onClear(QCause cause);
    void onDigit(char digit);

    XCode dial(CC_Call& call, String const& providerName, String const& destination,
               CC_PropertyContainer const& offered) override;
    ProviderType getProviderType() const override { return USER_DEFINED_INTERFACE; }
    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_name; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }
    XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& offered) override;
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& changed) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;

    bool hasCall() const { return m_adapter.getCall() != nullptr; }
    /// The wire ends, and the module, which has a call up, does not; it does with the context.
    static void LEAVE_BEHIND(std::unique_ptr<FaultyModule> module);

private:
    struct LeftBehind;

    bool is(Fault fault) const { return m_fault == fault; }
    void bind();
    XCode answerOffer(CC_Call& call, String const& number);
    void collect(String const& digits);
    void followPeer();
    void end(QCause cause);
    void drop(QCause cause);
    static void ON_NO_ANSWER(void* module);

    FaultyWire& m_wire;
    Fault m_fault;
    String m_name{"faulty"};
    String m_collected;
    TYTimer m_patience;
    bool m_isFromWire = false;
    bool m_hadPeer = false;
    bool m_hasRung = false;
    bool m_isAnswered = false;
    bool m_isOffered = false;
    bool m_isEnding = false;
    bool m_isLeftBehind = false;
    unsigned long long m_peerId = 0;
    std::unique_ptr<int> m_needed; // what a fault does with memory that it does not get
    CC_CallAdapterE164 m_adapter;
};

/// Drives a FaultyModule.
class FaultyDriver : public ModuleDriver, public FaultyWire
{
public:
    explicit FaultyDriver(Fault fault = Fault::NONE)
        : m_fault(fault), m_module(std::make_unique<FaultyModule>(*this, fault))
    {
    }
    ~FaultyDriver() override;

    String getProviderName() const override { return "faulty"; }
    String getNumber() const override { return FaultyModule::NUMBER; }
    void placeCall(String const& number) override { m_module->onCall(number); }
    void ring() override;
    void answer() override;
    void clear(QCause cause) override;
    void sendDigit(char digit) override { m_module->onDigit(digit); }
    void goSilent() override { m_isSilent = true; }
    void letTimePass() override { m_clock.advance(FaultyModule::PATIENCE); }

private:
    void onOffer(String const& number) override { saw(Seen::OFFERED, number); }
    void onRinging() override { saw(Seen::RINGING); }
    void onAnswer() override { saw(Seen::ANSWERED); }
    bool onClear(QCause cause) override;
    void onDigits(String const& digits) override { saw(Seen::DIGITS, digits); }

    DrivenClock m_clock;
    Fault m_fault;
    bool m_isSilent = false;
    std::unique_ptr<FaultyModule> m_module;
};
