#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "host/CallTrace.h"
#include "platform/eventloop/TYTimer.h"
#include "sip/endpoint/SipRequestHandler.h"
#include "sip/message/SipCause.h"
#include "sip/message/SipParty.h"
#include "sip/message/SipQuality.h"

#include <spdlog/fmt/fmt.h>

#include <memory>
#include <new>
#include <optional>
#include <string>

class SipInterface;

/// One side of one call: a SIP dialog on the one hand, a call leg on the other.
///
/// On the calling side it answers the INVITE that its interface received, on the called side it sends one for the call
/// that it was offered. What the peer leg does becomes a SIP message, and the other way round:
///
///     100 PROCEEDING     180 ALERTING     183 PROCEEDING with data     200 CONNECTED     the end RELEASED and a cause
///
/// Owned by its interface, which destroys it once both the dialog is over and the leg dropped. Belongs to the thread of
/// the stack's loop, which is also that of the call-control loop.
class SipEndpoint : public CC_Endpoint, public CC_CallAdapterObserver, public SipRequestHandler
{
public:
    SipEndpoint(SipInterface& interface, unsigned int callNumber);
    ~SipEndpoint() override;

    /// The calling side: takes over a new INVITE and dials the called party on the provider. 0, or the status with
    /// which the transaction is given up at once.
    int receiveInvite(nta_incoming_t* transaction, sip_t const* request, std::string const& provider,
                      SipParty const& called);
    /// Clears the call for a reason of the gateway's own. Without memory it still ends, in fewer words.
    void clear(SipCause const& cause);

    // --- CC_Endpoint
    String const& getName() const override;
    String const& getNetwork() const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;
    /// The called side: accepts the call and sends an INVITE.
    XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties) override;

    // --- CC_CallAdapterObserver
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;

    /// Requests inside the dialog.
    int handleRequest(nta_leg_t* leg, nta_incoming_t* transaction, sip_t const* request) override;

private:
    enum class Dialog
    {
        NONE,
        INVITE_RECEIVED, ///< not answered finally
        ANSWERED,        ///< 200 sent, the ACK is outstanding
        INVITE_SENT,
        CANCELLED, ///< CANCEL sent, the INVITE's final answer is outstanding
        UP,
        BYE_SENT,
        OVER
    };
    static char const* DIALOG_NAME(Dialog dialog);

    // calling side: SipEndpoint_Calling.cpp
    int takeInvite(nta_incoming_t* transaction, sip_t const* request, std::string const& provider,
                   SipParty const& called);
    bool makeServerDialog(nta_incoming_t* transaction, sip_t const* request);
    XCode dial(sip_t const* request, std::string const& provider, SipParty const& called);
    void startExpiry(sip_t const* request);
    void failDialLater();
    void onCallingTimer();
    static int HANDLE_ACK_OR_CANCEL(SipEndpoint* endpoint, nta_incoming_t* transaction, sip_t const* request);
    void onAck(sip_t const* request);
    void onAckMissing();
    void onCancel(sip_t const* request);
    void followPeer();
    void answer();
    void answerProvisionally(int status, char const* phrase, bool hasData);
    void answerFromPeer(int status, char const* phrase, std::string const& session);
    void answerFinally(unsigned int status, std::string const& reasonHeader);
    void forgetTransaction();

    // called side: SipEndpoint_Called.cpp
    XCode acceptOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties);
    bool sendInvite(SipParty const& called, CC_PropertyContainer const& offerProperties);
    bool startInvite(std::string const& uri, std::string const& identityHeaders, unsigned int maxForwards);
    static int HANDLE_INVITE_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response);
    void onProvisional(unsigned int status, sip_t const* response);
    void onAnswer(sip_t const* response);
    void onRejected(unsigned int status, sip_t const* response);
    void onAnswerTimeout();
    void confirmDialog(sip_t const* response);
    void acknowledge(std::string const& sessionDescription);
    void acknowledgeLate();
    void cancel(SipCause const& cause);
    void forgetInvite();

    // either side: SipEndpoint.cpp and SipEndpoint_Dialog.cpp

    /// Runs what something that happened asks for. When memory is out in the middle of it the call is cleared, since
    /// the other side would not hear of it; nothing is thrown to whoever called us.
    template <class Handler>
    void handle(Handler const& handler)
    {
        try
        {
            handler();
        }
        catch (std::bad_alloc const&)
        {
            clear({QCause::RESOURCE_UNAVAILABLE, 503, {}});
        }
    }
    void endWithoutWords();
    int onRequest(nta_incoming_t* transaction, sip_t const* request);
    void followCall(CC_Flags const& flags);
    bool sayWhy(SipCause const& cause);
    static void ON_TIMER(void* endpoint);
    int onBye(sip_t const* request);
    void sendBye(SipCause const& cause);
    static int HANDLE_BYE_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response);
    void endDialog(SipCause const& cause);
    void setDialog(Dialog dialog);
    void leaveCall(SipCause const& cause);
    void recordQuality();
    void onPeerReleased();
    void finishIfDone();
    XCode writeOwn(CC_PropertyContainer const& properties);
    static std::string REASON_OF(sip_t const* message);
    static std::string SESSION_OF(sip_t const* message);
    template <class Property>
    Property const* getPeer(unsigned int id) const
    {
        return dynamic_cast<Property const*>(m_adapter.getPeerProperty(id));
    }
    std::string getPeerText(unsigned int id) const;
    bool isPeerReleased() const;

    bool isTraced() const { return m_ladder != nullptr; }
    void trace(std::string text) const;
    void traceFlags(CC_Flags const& flags) const;
    static std::string TEXT_OF(CC_Property const& property);
    static std::string TEXT_OF(CC_PropertyContainer const& properties);

    SipInterface& m_interface;
    unsigned int m_callNumber;
    std::shared_ptr<CallTrace::Ladder> m_ladder;
    bool m_isCalling = false;
    Dialog m_dialog = Dialog::NONE;
    nta_leg_t* m_leg = nullptr;
    nta_incoming_t* m_transaction = nullptr; // the INVITE received
    nta_outgoing_t* m_invite = nullptr;      // the INVITE sent; kept for answers that are repeated

    nta_outgoing_t* m_bye = nullptr;
    unsigned int m_inviteSequence = 0;
    TYTimer m_timer; // calling side: a dial failed, the INVITE expires; called side: its answer or its end is awaited
    std::optional<SipCause> m_byeAfterAck; // the call ended while the ACK was outstanding
    bool m_hasOffer = false;               // the INVITE carried a session description
    bool m_isAckLate = false;              // the ACK is still to be sent: it must carry an answer that is not here yet
    bool m_isOverTcp = false;              // the INVITE received
    bool m_hasDialFailed = false;
    bool m_hasRung = false;
    bool m_hasEarlyMedia = false;
    bool m_wasAnswered = false;
    bool m_hadPeer = false;
    bool m_isInCall = false;
    bool m_isFinished = false;
    SipQuality m_quality;
    CC_CallAdapterE164 m_adapter; // last: silenced first
};
