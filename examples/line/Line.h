#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "platform/eventloop/TYTimer.h"
#include "platform/media/MG_Tones.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyFilterContainer.h"

/// The device at the end of a line; a driver implements it.
class Telephone
{
public:
    using Tone = MG_Tones::ECallProgressTone::Type;

    virtual ~Telephone() = default;
    virtual void ring(String const& number, String const& name, unsigned int rhythm) = 0;
    virtual void hear(Tone tone) = 0; ///< NONE: what the other side sends
    virtual void show(String const& text) = 0;
    virtual void clear(QCause cause) = 0; ///< the call is over, and the user did not end it
};

/// A telephone line: a module with one number, one call and a second one to consult somebody. Registered under its name
/// while it lives. Everything happens on the call-control loop's thread; that loop is set before the line is made.
class Line : public CC_Provider, public CC_Endpoint, public CC_CallAdapterObserver
{
public:
    using State = CC_PropertyCallLegState;

    static constexpr unsigned int RINGING_TIME = 60000; ///< milliseconds until a call that nobody answers ends

    /// The name of the provider that carries a number, or its first digits: routing is the application's.
    using Route = char const* (*)(String const& number);

    /// `isEnBloc`: a number that comes bit by bit is of no use here. Throws std::bad_alloc when memory is out.
    Line(String const& name, String const& number, Telephone& telephone, Route route, bool isEnBloc = false);
    ~Line() override;
    /// Registers the line: OK, REFUSED when the name is taken, another result when memory is out.
    XCode open();

    // what the user does; the results are those of the adapters
    XCode call(String const& number, bool isComplete = true, unsigned int rhythm = 0);
    void key(String const& digits);
    XCode answer();
    void hangUp();
    XCode hold() { return become(State::HELD); }
    XCode retrieve() { return become(State::CONNECTED); }
    XCode consult(String const& number);
    XCode transfer();
    XCode confer();
    XCode transferTo(String const& number);
    void restrict(bool isRestricted) { m_isRestricted = isRestricted; }

    // CC_Provider
    XCode dial(CC_Call& call, String const& providerName, String const& destination,
               CC_PropertyContainer const& offered) override;
    ProviderType getProviderType() const override { return USER_DEFINED_INTERFACE; }
    // CC_Endpoint
    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_name; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;
    XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& offered) override;
    // CC_CallAdapterObserver
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& changed) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;

private:
    XCode bind(CC_CallAdapterE164& adapter);
    XCode place(CC_CallAdapterE164& adapter, String const& number, bool isComplete, unsigned int rhythm);
    XCode become(State::State state);
    XCode collect(String const& digits);
    void followState(CC_CallAdapterE164& adapter);
    void follow(CC_CallAdapterE164& adapter, String const& number);
    CC_CallAdapterE164::Party getParty() const;
    static void ON_NO_ANSWER(void* line);

    String m_name;
    String m_number;
    Telephone& m_telephone;
    Route m_route;
    bool m_isEnBloc;
    bool m_isRestricted = false;
    String m_collected;        // of the called number
    unsigned int m_rhythm = 0; // of the call that is offered
    TYTimer m_noAnswer;
    CC_PropertyFilterContainer m_filters;
    CC_CallAdapterE164 m_adapters[2];
    CC_CallAdapterE164* m_call = &m_adapters[0];
    CC_CallAdapterE164* m_consultation = &m_adapters[1];
};
