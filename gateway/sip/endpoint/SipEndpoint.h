#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "host/CallTrace.h"
#include "host/RouteHunt.h"
#include "platform/eventloop/TYTimer.h"
#include "sip/access/SipPeers.h"
#include "sip/dialog/SipDialogState.h"
#include "sip/dialog/SipOfferAnswer.h"
#include "sip/dialog/SipSession.h"
#include "sip/dialog/SipSessionTimer.h"
#include "sip/endpoint/SipRequestHandler.h"
#include "sip/message/SipCarriedHeaders.h"
#include "sip/message/SipCause.h"
#include "sip/message/SipIdentity.h"
#include "sip/message/SipIsup.h"
#include "sip/message/SipParty.h"
#include "sip/message/SipQuality.h"
#include "sip/message/SipRedirection.h"
#include "sip/message/SipWay.h"
#include "sip/registrar/SipRegistrar.h"

#include <memory>
#include <new>
#include <optional>
#include <string>
#include <utility>
#include <vector>

class CC_ServiceBlindTransfer;
class CC_ServiceUserInput;
class SipInterface;
class SipServiceDialog;

/// One side of one call: a SIP dialog on the one hand, a call leg on the other.
///
/// On the calling side it answers the INVITE that its interface received, on the called side it sends one for the call
/// that it was offered. What the peer leg does becomes a SIP message, and the other way round:
///
///     100 PROCEEDING     180 ALERTING     183 PROCEEDING with data     200 CONNECTED     the end RELEASED and a cause
///
/// How the dialog itself goes on is the table of SipDialogState; while it is up,
///
///     State HELD: our peer holds     re-INVITE and UPDATE: what its SipSession makes of them, which is a
///     SipAnchoredSession where media go through the gateway, else a SipDirectSession
///
/// Owned by its interface, which destroys it once both the dialog is over and the leg dropped. Belongs to the thread of
/// the stack's loop, which is also that of the call-control loop.
class SipEndpoint : public CC_Endpoint, public CC_CallAdapterObserver, public SipRequestHandler, private SipSessionWire
{
public:
    SipEndpoint(SipInterface& interface, unsigned int callNumber);
    ~SipEndpoint() override;

    /// The calling side: takes over a new INVITE and dials the called party on the first of the routes, on the next one
    /// when that reaches nobody; `user`: as whom the interface knows the caller. 0, or the status with which the
    /// transaction is given up at once.
    int receiveInvite(nta_incoming_t* transaction, sip_t const* request, SipIdentity const& caller,
                      RouteHunt const& routes, std::string const& user);
    /// The same for an INVITE that takes the place of another dialog, which ends (RFC 3891).
    int receiveReplacing(nta_incoming_t* transaction, sip_t const* request, SipEndpoint& replaced);
    /// Whether such an INVITE may take the place of our dialog: 0, or the status with which it is refused.
    int checkReplaces(sip_replaces_t const& replaces) const;
    bool isInCall(unsigned long long serial) const;
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
    /// An INVITE that we sent, as long as its answer may be repeated and be in need of another ACK.
    struct Invitation
    {
        nta_outgoing_t* transaction = nullptr;
        unsigned int sequence = 0;

        void forget();
    };
    /// One of those whom a proxy of the called side has asked, by the tag of its dialog.
    struct Fork
    {
        std::string tag;
        bool hasRung = false;
        unsigned int sequence = 0; ///< of its last reliable provisional response, 0: none
        nta_leg_t* leg = nullptr;  ///< with such responses
        bool isAgreed = false;     ///< one of them had the answer
    };

    /// An INVITE with fewer digits than ours has now.
    struct Attempt
    {
        Invitation invitation;
        nta_leg_t* leg;
    };

    /// A BYE that is to be answered, and why it came.
    struct HeldBye
    {
        nta_incoming_t* transaction;
        SipCause cause;
    };

    // calling side: SipEndpoint_Calling.cpp, its answers: SipEndpoint_Answers.cpp
    int takeInvite(nta_incoming_t* transaction, sip_t const* request);
    int refuseSession(nta_incoming_t* transaction);
    bool makeServerDialog(nta_incoming_t* transaction, sip_t const* request);
    XCode dial(sip_t const* request, MG_IContext* datapathContext);
    bool tryNextRoute(SipCause const& cause);
    bool tellByTone(SipCause const& cause);
    void endByTone();
    void startExpiry(sip_t const* request);
    void failDialLater(QCause cause);
    void onCallingTimer();
    static int HANDLE_ACK_OR_CANCEL(SipEndpoint* endpoint, nta_incoming_t* transaction, sip_t const* request);
    void onAck(sip_t const* request);
    void takeAnswerOfAck(sip_t const* request);
    void onAckMissing();
    void onCancel(sip_t const* request);
    void followPeer();
    void answer();
    void answerWith(std::string const& session);
    bool isToRingBack() const;
    void answerProvisionally(int status, char const* phrase);
    void repeatProvisional();
    bool answerReliably(int status, char const* phrase, std::string const& session);
    static int HANDLE_PRACK(SipEndpoint* endpoint, nta_reliable_t* reliable, nta_incoming_t* transaction,
                            sip_t const* request);
    int onPrack(nta_incoming_t* transaction, sip_t const* request);
    void useFork(unsigned int fork);
    nta_leg_t* makeFork();
    void answerFromPeer(int status, char const* phrase, std::string const& session);
    void answerFinally(unsigned int status, std::string const& reasonHeader);
    void forgetTransaction();

    // numbers that come digit by digit: SipEndpoint_Overlap.cpp
    bool isOverlapping() const;
    int onMoreDigits(nta_incoming_t* transaction, sip_t const* request);
    int joinDigits(nta_incoming_t* transaction, sip_t const* request, std::string const& digits);
    void awaitDigits();
    void onDialledOn();
    bool isPeerDialling() const;
    bool beginNumber();
    bool takeDigits(CC_ServiceUserInput const& input);
    bool inviteAgain();
    nta_leg_t* makeClientLeg(std::string const& from, std::string const& to);
    bool awaitMoreDigits(unsigned int status);
    void endNumber();
    bool isOfAttempt(nta_outgoing_t* transaction, int status);
    void endAttempts();

    // called side: SipEndpoint_Called.cpp, whom it asks: SipEndpoint_Hunt.cpp, who answers: SipEndpoint_Forks.cpp
    XCode acceptOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties);
    bool sendInvite(SipParty const& called, CC_PropertyContainer const& offerProperties);
    bool inviteNumber();
    bool findContacts(std::string const& user);
    bool findWay(CC_PropertyContainer const& offerProperties);
    bool findPeer();
    bool tryAnother(unsigned int status, sip_t const* response);
    bool tryNextContact(unsigned int status);
    bool tryNextPeer();
    void noteHeard();
    SocketAddress const& getPeerAddress() const;
    std::string makePeerUri(std::string_view user) const;
    bool startInvite();
    static int HANDLE_INVITE_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response);
    void onProvisional(unsigned int status, sip_t const* response);
    void onAnswer(sip_t const* response);
    void takeAnswer(sip_t const* response);
    void addTone(CC_PropertyContainer& own, bool isRinging);
    void addSession(CC_PropertyContainer& own, std::string const& session, bool isBinding);
    void onRejected(unsigned int status, sip_t const* response);
    void onCalledTimer();
    void onAnswerTimeout();
    void confirmDialog(sip_t const* response);
    Fork* findFork(sip_t const* response);
    bool acceptReliably(Fork& fork, sip_t const* response);
    void forgetForks();
    void addFork(CC_PropertyContainer& own, Fork const* fork);
    void acknowledge(Invitation& invitation, std::string const& sessionDescription);
    void cancel(SipCause const& cause);

    // while the dialog is up: SipEndpoint_Session.cpp
    void sendOffer(std::string const& description, bool isQuick) override;
    void sendAnswer(std::string const& description) override;
    void sendRefusal(unsigned int status) override;
    int onOffer(nta_incoming_t* transaction, sip_t const* request);
    int checkOffer(nta_incoming_t* transaction, sip_t const* request);
    unsigned int getOfferRefusal() const;
    int takeOffer(nta_incoming_t* transaction, std::string const& description, bool isUpdate);
    static int HANDLE_ACK_OR_CANCEL_OF_OFFER(SipEndpoint* endpoint, nta_incoming_t* transaction, sip_t const* request);
    void onOfferAcknowledged(sip_t const* request);
    void onOfferCancelled();
    void refuseOffer(unsigned int status);
    bool isAwaitingAck() const;
    void sendWaitingOffer();
    nta_leg_t* getOfferLeg() const;
    void startOffer(std::string const& description, bool isQuick);
    static int HANDLE_OFFER_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response);
    void onOfferResponse(unsigned int status, sip_t const* response);
    void onOfferAccepted(sip_t const* response);
    void onOfferRefused(unsigned int status);
    void tryAgainLater();
    static void ON_OFFER_TIMER(void* endpoint);
    void followHold();
    void giveUp() override;
    void onSilence(unsigned int seconds) override;
    void onDigit(char digit, unsigned int milliseconds) override;
    void onQuality() override;
    void onReport(MediaReport const& report) override;
    void noteSession(SipOfferAnswer::Direction direction, SipOfferAnswer::Carrier carrier, std::string const& session);
    void forgetOffer();
    void endOffers();
    void noteAllow(sip_t const* message);
    bool isAgreedEarly() const;

    // SipEndpoint_Transfer.cpp
    int onRefer(nta_incoming_t* transaction, sip_t const* request);
    void joinCallOf(SipEndpoint& other);
    void callIn(std::string const& number);
    void askPeerToTransfer(std::string const& number, std::string const& headers);
    void notifyReferrer(unsigned int status, char const* phrase);
    void endReferral(QCause cause);
    void onUpTimer();
    void onReferralTimeout();
    void tellTransferStatus(QCause cause);
    void onBlindTransfer(CC_ServiceBlindTransfer const& transfer);
    void transferTo(std::string const& number);
    void dialTarget(std::string const& number);
    void followTarget();
    void joinTarget();
    void endTransfer(QCause cause);
    void refer(std::string const& number);
    static int HANDLE_REFER_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response);
    int onNotify(sip_t const* request);
    XCode takePlaceOf(SipEndpoint& replaced, sip_t const* request);

    // SipEndpoint_PushBack.cpp
    void onPushBack();
    void stepBack();
    void tellDialog(SipServiceDialog& service);

    // SipEndpoint_Timer.cpp
    int takeTimer(nta_incoming_t* transaction, sip_t const* request);
    void takeTimerOfAnswer(sip_t const* response);
    bool raiseTimer(sip_t const* response);
    void startSessionTimer();
    static void ON_REFRESH_TIMER(void* endpoint);
    void onRefreshTimer();
    void refresh();
    void onRefreshed(unsigned int status, sip_t const* response);
    static void ON_LENGTH_TIMER(void* endpoint);

    // SipEndpoint_Input.cpp
    int onInfo(nta_incoming_t* transaction, sip_t const* request);
    void onUserInput(CC_ServiceUserInput const& input);
    void sendInfo();
    void sendDigit();
    static int HANDLE_INFO_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response);

    // SipEndpoint_Charge.cpp
    void noteAccept(sip_t const* request);
    bool takeCharge(sip_t const* request);
    bool takeAdvice(std::string const& body);
    void addTariff(CC_PropertyContainer& own, sip_t const* response);
    std::string getTariff() const;
    std::string getTariffForAnswer();
    void tellTariff();
    int onChargeInfo(nta_incoming_t* transaction, sip_t const* request);
    bool tellsCharges() const;
    void followCharge(CC_Flags const& flags);
    std::string getFinalCharge() const;
    void sendCharge();
    bool awaitsFinalCharge() const;
    int holdBye(nta_incoming_t* transaction, SipCause const& cause);
    void answerHeldBye();
    bool awaitsBill() const;
    void takeBill(sip_t const* response);

    // a call that goes elsewhere: SipEndpoint_Redirection.cpp
    void tellRedirection(sip_t const* response);
    bool goElsewhere(SipCause const& cause);
    void follow(SipRedirection const& redirection, SipCause const& cause);
    void handOn(SipRedirection const& redirection, SipCause const& cause);
    void answerMoved(SipRedirection const& redirection, SipCause const& cause);
    void dialAgain(SipCause const& cause, char const* why);

    // headers that cross: SipEndpoint_Carried.cpp
    void addCarried(CC_PropertyContainer& own, sip_t const* message);
    void addIsup(CC_PropertyContainer& own, sip_t const* message);
    SipIsup getIsup();
    SipIsup getNewIsup();
    void addUserToUser(CC_PropertyContainer& own, sip_t const* message);
    void takeCarried(sip_t const* message);
    std::string getCarried(SipCarriedHeaders::Message message);
    std::string getUserToUser();
    std::string getLastUserToUser();

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
    void takeService(CC_Service& service);
    bool sayWhy(SipCause const& cause);
    static void ON_TIMER(void* endpoint);
    int onBye(nta_incoming_t* transaction, sip_t const* request);
    void sendBye(SipCause const& cause);
    static int HANDLE_BYE_RESPONSE(SipEndpoint* endpoint, nta_outgoing_t* transaction, sip_t const* response);
    void endDialog(SipCause const& cause);
    bool authenticate(nta_outgoing_t*& request, sip_t const* response, nta_leg_t* leg, nta_response_f* onResponse);
    SipDialogState::Action advance(SipDialogState::Event event);
    void forgetSetUp();
    void leaveCall(SipCause const& cause);
    void recordQuality();
    std::string getCallId() const;
    void addCallId(CC_PropertyContainer& own) const;
    void onPeerReleased();
    void finishIfDone();
    XCode writeOwn(CC_PropertyContainer const& properties);
    static std::string REASON_OF(sip_t const* message);
    char const* getContact() const; // of the dialog
    void routeAsServer(nta_leg_t* leg, nta_incoming_t* transaction, sip_t const* request) const;
    void routeAsClient(nta_leg_t* leg, nta_outgoing_t* transaction, sip_t const* response) const;
    bool isInConference() const;
    static std::string SESSION_OF(sip_t const* message);
    template <class Property>
    Property const* getPeer(unsigned int id) const
    {
        return dynamic_cast<Property const*>(m_adapter.getPeerProperty(id));
    }
    bool isPeerReleased() const;
    bool isPeerWaiting() const;

    bool isTraced() const { return m_ladder != nullptr; }
    void trace(std::string text) const;
    void traceFlags(CC_Flags const& flags) const;
    static std::string TEXT_OF(CC_Property const& property);
    static std::string TEXT_OF(CC_PropertyContainer const& properties);

    SipInterface& m_interface;
    unsigned int m_callNumber;
    std::shared_ptr<CallTrace::Ladder> m_ladder;
    bool m_isCalling = false;
    SipDialogState::State m_dialog = SipDialogState::NONE;
    nta_leg_t* m_leg = nullptr;
    nta_incoming_t* m_transaction = nullptr; // the INVITE received
    Invitation m_invite;
    nta_outgoing_t* m_bye = nullptr;
    TYTimer m_timer; // calling side: a dial failed, the INVITE expires; called side: its answer or its end is awaited
    std::optional<SipCause> m_byeAfterAck; // the call ended while the ACK was outstanding
    bool m_hasOffer = false;               // the INVITE carried a session description
    SipWay::Way m_way = SipWay::UDP;       // the dialog: where its Contact points
    unsigned char m_challenges = 0;        // of our peer in a row, to the request that goes out
    SipIdentity m_caller;                  // calling side
    RouteHunt m_routes;
    RouteHunt m_targetRoutes;                   // of a transfer
    std::vector<SipRedirection> m_redirections; // calling side: that we have followed
    std::string m_user; // calling side: as whom the interface knows our peer; empty: it asks nobody
    QCause m_dialFailure = QCause::NONE;
    std::optional<SipCause> m_failure; // calling side: of which a tone tells our peer first
    bool m_hasRung = false;
    bool m_hasEarlyMedia = false;
    bool m_asksForTone = false;    // called side
    bool m_allowsReliable = false; // calling side: our peer
    bool m_wantsReliable = false;
    unsigned int m_unacknowledged = 0; // reliable responses without their PRACK
    int m_provisional = 0;             // the status that we sent last
    std::string m_earlySession;        // with it, or with one before
    unsigned int m_fork = 0;
    std::vector<nta_leg_t*> m_otherLegs; // calling side: of forks; the number of our leg is m_fork
    std::vector<Fork> m_forks;           // called side: who was heard of, first come first
    bool m_wasAnswered = false;
    bool m_hadPeer = false;
    bool m_isInCall = false;
    bool m_isFinished = false;
    std::string m_transferAfterAnswer; // the number
    SipQuality m_quality;
    unsigned int m_qualitiesTold = 0;
    SipOfferAnswer m_negotiation;
    std::unique_ptr<SipSession> const m_sessionOfKind; // where media are relayed or where they are not
    SipSession& m_session;
    nta_incoming_t* m_offerReceived = nullptr; // a re-INVITE or UPDATE that is not done
    bool m_isOfferAnswered = false;            // that re-INVITE: its ACK is outstanding
    Invitation m_reinvite;                     // or UPDATE
    bool m_isOffering = false;                 // ours is not answered, or is to be sent again
    bool m_isOfferQuick = false;
    bool m_isOfferWaiting = false; // until an ACK has come
    std::string m_offer;           // ours
    std::string m_offerOfPeer;
    unsigned int m_refusals = 0;     // 491 to ours
    Invitation* m_lateAck = nullptr; // whose ACK must carry an answer that is not here yet
    bool m_allowsUpdate = false;     // our peer
    SipSessionTimer m_sessionTimer;
    TYTimer m_refreshTimer;
    TYTimer m_lengthTimer;
    std::string m_ownSession;           // what our peer has of us
    bool m_isRefresh = false;           // ours
    std::vector<SipContact> m_contacts; // of a registered user: the one that is being tried, and those after it
    SipPeers::Order m_peers;  // without contacts: whom the call is offered to, the one that is being tried first
    bool m_isUnheard = false; // that one has said nothing yet
    std::string m_inviteUri;  // for an INVITE that is to be sent again
    std::string m_inviteHeaders;
    std::string m_inviteRoute;
    std::string m_headersForTarget;
    std::string m_carried;                        // what our peer's last message had for the other side
    unsigned int m_userToUsers = 0;               // that our peer has sent
    std::optional<unsigned int> m_userToUserTold; // to our peer: its counter
    unsigned int m_isups = 0;                     // likewise
    std::optional<unsigned int> m_isupTold;
    SipParty m_called;                    // as far as its number has come
    std::string m_firstOffer;             // calling side: of the first INVITE, if others may follow
    std::vector<nta_leg_t*> m_formerLegs; // calling side: of INVITEs with fewer digits
    std::vector<Attempt> m_attempts;      // called side
    bool m_isNumberOpen = false;          // called side: digits may follow
    unsigned int m_maxForwards = 0;
    bool m_isReferring = false;    // our peer has asked for a transfer that is not done
    bool m_isTransferring = false; // the other side's has
    bool m_hasTarget = false;      // its leg was seen
    bool m_isPushedBack = false;   // call control has seen both sides on one interface
    bool m_hasSteppedBack = false; // our peer has been told to call the other side's
    bool m_isReplacing = false;    // our INVITE takes a dialog's place
    nta_outgoing_t* m_refer = nullptr;
    std::vector<std::pair<char, unsigned int>> m_digits; // to be sent, each with its duration
    std::string m_charge;                                // to be told
    std::string m_tariff;                                // that was told
    bool m_takesTariff = false;                          // in the answers to its INVITE
    std::unique_ptr<HeldBye> m_heldBye;                  // whose answer waits for the final charge
    nta_outgoing_t* m_info = nullptr;
    bool m_isHeldByOffer = false;
    bool m_isHeld = false;
    TYTimer m_offerTimer;                         // an offer is to be repeated; or an answer does not come
    std::unique_ptr<CC_CallAdapterE164> m_target; // of a transfer
    CC_CallAdapterE164 m_adapter;                 // last: silenced first
};
