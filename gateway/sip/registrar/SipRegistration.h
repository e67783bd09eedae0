#pragma once

#include "platform/base/TYTime.h"
#include "platform/eventloop/TYTimer.h"
#include "sip/SipConfiguration.h"
#include "sip/access/SipSender.h"
#include "sip/stack/SipHandles.h"

#include <functional>
#include <string>

/// Keeps an interface registered with its peer, a provider's registrar (RFC 3261, 10.2): from `start` to `end`.
///
///     IDLE -- start --> TRYING -- 2xx --> REGISTERED -- time to refresh --> TRYING
///     TRYING -- 423 --> TRYING for longer    -- no answer, refusal --> WAITING -- time --> TRYING
///     any -- end --> ENDING, if the provider has a contact of ours -- answer, or none in time --> OVER
///
/// Belongs to the thread of the call-control loop. Its interface owns it, and ends the agent and the sender after it.
class SipRegistration
{
public:
    /// `onOver` is told when what `end` has begun is over.
    SipRegistration(SipConfiguration const& configuration, nta_agent_t* agent, SipSender& sender,
                    std::function<void()> onOver);
    ~SipRegistration();
    SipRegistration(SipRegistration const&) = delete;
    SipRegistration& operator=(SipRegistration const&) = delete;

    void start();
    void end();
    bool isEnding() const { return m_state == ENDING; }
    /// Whether the provider has our contact.
    bool isBound() const;
    long long getSecondsLeft() const; ///< 0: it is not
    /// A line for the dump.
    std::string describe() const;

    // --- the rules, by themselves
    /// Seconds for which a 200 says that the contact is registered; 0: it is not.
    static unsigned int GRANTED(sip_t const* response, char const* contact, unsigned int asked);
    /// Milliseconds until what was granted for so many seconds is to be asked for again.
    static unsigned int REFRESH_AFTER(unsigned int seconds) { return seconds * 800; }
    /// Seconds until another try: they double from failure to failure, up to half an hour.
    static unsigned int WAIT_AFTER(unsigned int failures, unsigned int first);

private:
    enum State
    {
        IDLE,
        TRYING,
        REGISTERED,
        WAITING,
        ENDING,
        OVER
    };

    void send(unsigned int seconds);
    static int HANDLE_RESPONSE(SipEndpoint* registration, nta_outgoing_t* request, sip_t const* response);
    void onResponse(nta_outgoing_t* request, sip_t const* response);
    void take(unsigned int status, sip_t const* response);
    void onRegistered(unsigned int seconds);
    bool askForLonger(sip_t const* response);
    void onFailed(unsigned int status, sip_t const* response);
    static void ON_TIMER(void* registration);
    void onTimer();
    void forgetRequest();
    void finish();
    /// The stack hands back what it was given, whose type is that of most who send.
    SipEndpoint* asMagic() { return reinterpret_cast<SipEndpoint*>(this); }

    SipConfiguration const& m_configuration;
    SipSender& m_sender;
    std::function<void()> m_onOver;
    std::string m_uri; // of the registrar
    std::string m_route;
    std::string m_contact;
    SipLeg m_leg;
    nta_outgoing_t* m_request = nullptr;
    TYTimer m_timer;
    State m_state = IDLE;
    unsigned int m_expires; // seconds to ask for
    unsigned char m_challenges = 0;
    bool m_wasTooBrief = false;  // the last request
    unsigned int m_failures = 0; // since the last success
    TY::Time m_boundUntil;
    unsigned long long m_sent = 0;
    unsigned long long m_failed = 0;
};
