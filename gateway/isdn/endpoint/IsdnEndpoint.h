#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "host/RouteHunt.h"
#include "isdn/element/IsdnBearer.h"
#include "isdn/element/IsdnParty.h"
#include "isdn/endpoint/IsdnCallState.h"
#include "isdn/endpoint/IsdnChannels.h"
#include "isdn/link/LibPri.h"
#include "media/context/LegMedia.h"
#include "media/context/MediaObserver.h"
#include "platform/eventloop/TYTimer.h"
#include "properties/CC_PropertyCallLegState.h"

#include <memory>
#include <new>
#include <string>

class CC_ServiceUserInput;
class IsdnInterface;

/// One side of one call: a call of the line on the one hand, a call leg on the other.
///
/// On the calling side it answers the SETUP that its interface received, on the called side it sends one for the call
/// that it was offered. What the peer leg does becomes a message, and the other way round:
///
///     SETUP ACK ADDRESS-INCOMPLETE     CALL PROC, PROGRESS PROCEEDING     ALERTING ALERTING     CONNECT CONNECTED
///     HOLD, NOTIFY of remote hold HELD     the end RELEASED and a cause
///
/// How the call on the wire goes on is the table of IsdnCallState.
///
/// Owned by its interface, which destroys it once both the call on the wire is over and the leg dropped. Belongs to the
/// call-control loop's thread.
class IsdnEndpoint : public CC_Endpoint, public CC_CallAdapterObserver, private MediaObserver
{
public:
    IsdnEndpoint(IsdnInterface& interface, unsigned int callNumber);
    ~IsdnEndpoint() override;

    /// The calling side: takes over a call of the wire. Throws std::bad_alloc before it has done so.
    void receiveSetup(pri_event_ring& ring);
    /// What came for it.
    void onEvent(pri_event& event);
    bool isInCall(unsigned long long serial) const;
    /// The other sides of the two calls are connected with each other: whether they are.
    bool joinCallOf(IsdnEndpoint& other);
    /// Clears the call for a reason of the gateway's own.
    void clear(QCause cause);

    /// The stack has given its call up without a word, and the next one has the same address.
    void loseCall();

    unsigned int getTimeslot() const { return m_timeslot; }
    /// Gives the channel up to a call of the network's; false when the network has confirmed it.
    bool yieldChannel();

    // --- CC_Endpoint
    String const& getName() const override;
    String const& getNetwork() const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;
    /// The called side: accepts the call and sends a SETUP.
    XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties) override;

    // --- CC_CallAdapterObserver
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;

private:
    using LegState = CC_PropertyCallLegState;

    // calling side: IsdnEndpoint_Calling.cpp
    bool takeRequestedChannel(int channel, bool isFlexible);
    void readSetup(pri_event_ring const& ring);
    void collect(std::string_view digits);
    IsdnParty getDialled() const;
    void dialIfComplete(bool isComplete);
    void dial(bool isComplete);
    void placeCall(MG_IContext* datapathContext);
    bool tryNextRoute(QCause cause);
    bool tellByTone(QCause cause);
    void requestDigits();
    void followPeer();
    void tellProgress(LegState::State state);
    void tellConnected();

    // called side: IsdnEndpoint_Called.cpp
    XCode acceptOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties);
    void sendSetup(bool isComplete);
    bool startCall(pri_sr* request, bool isComplete);
    void followWire(pri_event& event);
    void takeChannel(int channel);
    void tellPeer(LegState::State state, int progressMask, pri_subcommands const* commands, char const* userUser);
    void dialOn();

    // either side: IsdnEndpoint.cpp and IsdnEndpoint_Services.cpp
    template <class Handler>
    void handle(Handler const& handler)
    {
        try
        {
            handler();
        }
        catch (std::bad_alloc const&)
        {
            clear(QCause::RESOURCE_UNAVAILABLE);
        }
    }
    void take(pri_event& event);
    void followCall(CC_Flags const& flags);
    void onDisconnect(pri_event_hangup const& hangup);
    void onReleased(pri_event_hangup const& hangup, bool isGivenUp);
    void readCommands(pri_subcommands const* commands, CC_PropertyContainer& own);
    void readUserUser(char const* text, CC_PropertyContainer& own);
    void onNotify(int indicator);
    void onHold();
    void onRetrieve(pri_event_retrieve const& retrieve);
    void onDigits(char const* digits);
    void endNumber();
    void onUserInput(CC_ServiceUserInput const& input);
    void tellCharge(CC_Flags const& flags);
    bool awaitsFinalCharge() const;
    void holdRelease(QCause cause);
    void sendHeldRelease();
    void tellHold();
    void tellTransfer();
    void addCodecs(CC_PropertyContainer& own) const;
    void openMedia();
    void onDigit(char digit, unsigned int milliseconds) override;
    void sendUserUser();
    void endWire(QCause cause);
    void lookForEnd();
    void leaveCall(QCause cause);
    void finishIfDone();
    IsdnCallState::Action advance(IsdnCallState::Event event);
    bool isPeerReleased() const;
    bool isPeerWaiting() const;
    QCause getPeerCause() const;
    LegState::State getPeerState() const;
    bool hasPeerData() const;
    int getChannel() const { return m_channelFlags | static_cast<int>(m_timeslot); }
    static void ON_TIMER(void* endpoint);
    void onTimer();
    template <class Work>
    auto ask(Work const& work);

    IsdnInterface& m_interface;
    unsigned int m_callNumber;
    bool m_isCalling = false;
    IsdnCallState::State m_state = IsdnCallState::NULL_STATE;
    q931_call* m_call = nullptr;
    unsigned int m_timeslot = IsdnChannels::NONE;
    int m_channelFlags = 0;            // of the channel that the wire asked for: how it was written
    bool m_isChannelConfirmed = false; // by the far side
    IsdnBearer m_bearer;
    IsdnParty m_called;
    IsdnParty m_toldParty; // who the other side is, as the wire has it
    std::string m_calling; // calling side: the number
    bool m_isNumberComplete = false;
    QCause m_heldRelease = QCause::NONE; // with which it is sent once the final charge is known
    QCause m_failure = QCause::NONE;     // calling side: of which a tone tells the far side first
    RouteHunt m_routes;                  // calling side
    bool m_isInCall = false;
    bool m_hadPeer = false;
    bool m_wasAnswered = false;
    bool m_isCounted = false; // as cleared or failed
    bool m_hasToldData = false;
    bool m_isPeerHeld = false;
    bool m_isOnHold = false; // by HOLD, so that it has no channel
    bool m_isFinished = false;
    std::string m_digits;   // called side: not sent yet
    std::string m_userUser; // that the wire has been told
    TYTimer m_timer;        // T302, T304, an answer; clearing
    CC_PropertyContainer m_own;
    CC_PropertyContainer m_setup; // calling side: what the SETUP said
    CC_PropertyContainer m_offer; // and of whom it is for
    std::unique_ptr<LegMedia> m_media;
    unsigned int m_mediaTimeslot = IsdnChannels::NONE;
    CC_CallAdapterE164 m_adapter; // last: silenced first
};
