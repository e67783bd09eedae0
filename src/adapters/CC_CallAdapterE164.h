#pragma once

#include "adapters/CC_CallAdapter.h"
#include "platform/base/TYPtr.h"
#include "platform/media/MG_IContext.h"
#include "platform/signalling/QInformationTransferCapability.h"
#include "platform/signalling/QNumberingPlan.h"
#include "platform/signalling/QPresentationIndicator.h"
#include "platform/signalling/QReasonForRedirection.h"
#include "platform/signalling/QScreeningIndicator.h"
#include "platform/signalling/QTypeOfNumber.h"
#include "properties/CC_PropertyCharge.h"
#include "properties/CC_PropertyCodecNegotiating.h"
#include "properties/CC_PropertyParametrizedString.h"
#include "properties/CC_PropertyTariff.h"
#include "properties/CC_PropertyWaitForMessage.h"

class CC_QoS;
class VoipCodecAndMode;
class VoipCodecListSet;

/// The call adapter of modules whose networks number their subscribers: ISDN, SIP telephony.
///
/// It dials and accepts with numbers, indicators and names as plain arguments, reads and writes what the two sides tell
/// each other through typed accessors, and remembers its last dial. By that it bridges overlap sending: digits that
/// arrive while the destination still collects (`invokeSynchronousService` with a CC_ServiceUserInput) lengthen the
/// remembered number, and a destination that wants the number en bloc is dialled again with all digits so far. Owner,
/// thread and life are those of CC_CallAdapter.
///
///     CC_CallAdapterE164 adapter;
///     std::ignore = adapter.setup("line 7", endpoint, &observer);
///     if (!adapter.dial({.providerName = "sip", .destination = "trunk",
///                        .calling = {.number = "4420791234", .name = "Ada"}, .called = {.number = "4989"}}).isOk())
///         ...
///     CC_ServiceUserInput digit("1"); // the user keys on
///     adapter.invokeSynchronousService(digit);
///     ...
///     display(adapter.getPeerName(), adapter.getPeerE164());
class CC_EXPORT CC_CallAdapterE164 : public CC_CallAdapter
{
public:
    /// What a party tells of itself in a dial or accept that is written like a form.
    struct Party
    {
        /// The number, what Q.931 says about it, and the name for display. @{
        String number{};
        QTypeOfNumber typeOfNumber = QTypeOfNumber::UNKNOWN;
        QNumberingPlan numberingPlan = QNumberingPlan::ISDN;
        QPresentationIndicator presentation = QPresentationIndicator::ALLOWED;
        QScreeningIndicator screening = QScreeningIndicator::USER_PROVIDED_NOT_SCREENED;
        String name{};
        /// @}
    };
    /// A dial, by names. The called party's presentation and screening are not used: it has not spoken yet.
    struct DialForm
    {
        String contextName{}; ///< empty: "SWITCH"
        /// Under which the provider was added to the context.
        String providerName{};
        String destination{}; ///< in the provider's own notation
        /// Who dials, and whom. @{
        Party calling{};
        Party called{};
        /// @}
        bool sendingComplete = false; ///< no digits will follow
        /// What the bearer has to carry, as Q.931 says it.
        QInformationTransferCapability informationTransferCapability = QInformationTransferCapability::SPEECH;
        MG_IContext* datapathContext = nullptr; ///< null: the media layer is asked for a new one
        /// Merged in last, over what the form says; null: none. @{
        CC_PropertyContainer const* extraOwnProperties = nullptr;
        CC_PropertyContainer const* extraOfferProperties = nullptr;
        CC_PropertyContainer const* extraCallProperties = nullptr;
        /// @}
    };

    CC_CallAdapterE164();
    ~CC_CallAdapterE164() override; ///< `cleanup()`; also forgets the last dial, which nothing else does

    /// These two as the base's: the last dial stays remembered. @{
    XCode setup(String const& name, CC_Endpoint& endpoint, CC_CallAdapterObserver* observer) override;
    void cleanup() override;
    /// @}
    /// As the base's, except for user input and its updates while the peer's state is TRYING, ADDRESS_INCOMPLETE,
    /// PROCEEDING or ALERTING: input is appended to the remembered called number and passed on; without memory for the
    /// longer number it is dropped.
    ///
    /// A peer in ADDRESS_INCOMPLETE that does not support overlap receiving hears neither. An update is swallowed;
    /// input ends the attempt with cause 16 and dials again, with the longer number and the same media context. If the
    /// call has none, the adapter's own `notifyPeerPropertyChange` (not the observer) is told before that the Context
    /// changed. Whether the new attempt succeeds shows in the adapter's leg and peer.
    void invokeSynchronousService(CC_Service& service) override;
    /// Remembers the dial, then dials as the base does; remembered is also what the base refuses. FAILURE as well when
    /// memory does not suffice to remember it: nothing is dialled then, and the dial before is forgotten, too.
    ///
    /// A class that overrides this one goes on with CC_CallAdapterE164::dial, not with CC_CallAdapter's: what it has
    /// changed is remembered only here.
    XCode dial(String const& contextName, String const& providerName, String const& destination,
               CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
               CC_PropertyContainer const& callProperties, MG_IContext* datapathContext) override;
    /// As the base's.
    XCode accept(CC_Call& call, CC_PropertyContainer const& ownProperties) override;

    /// Dials with the calling party's data as own properties, the called party's as offer properties, and the transfer
    /// capability and the context's hop limit as call properties. `sendingComplete`: no digits will follow (own
    /// property Supports Overlap-Sending is its negation). The extra containers (null: none) are merged in last and
    /// override; the other arguments are those of the dial above. OK, or FAILURE for whatever went wrong.
    virtual XCode dial(String const& contextName, String const& providerName, String const& destination,
                       String const& callingNumber, QTypeOfNumber callingTypeOfNumber,
                       QNumberingPlan callingNumberingPlan, QPresentationIndicator callingPresentation,
                       QScreeningIndicator callingScreening, String const& callingName, String const& calledNumber,
                       QTypeOfNumber calledTypeOfNumber, QNumberingPlan calledNumberingPlan, String const& calledName,
                       bool sendingComplete, QInformationTransferCapability informationTransferCapability,
                       MG_IContext* datapathContext, CC_PropertyContainer const* extraOwnProperties,
                       CC_PropertyContainer const* extraOfferProperties,
                       CC_PropertyContainer const* extraCallProperties);
    /// The same, with the arguments in a form. Making it needs memory, so it may throw std::bad_alloc where it stands.
    ///
    ///     XCode const result = adapter.dial({.providerName = "isdn",
    ///                                        .destination = "trunk",
    ///                                        .calling = {.number = "4420791234", .name = "Ada"},
    ///                                        .called = {.number = "4989"}});
    XCode dial(DialForm const& form);
    /// Joins an offered call, with the answering party's data as own properties. OK, or FAILURE.
    virtual XCode accept(CC_Call& call, String const& number, QTypeOfNumber typeOfNumber, QNumberingPlan numberingPlan,
                         QPresentationIndicator presentation, QScreeningIndicator screening, String const& name);
    /// The same, with the arguments in a form: `adapter.acceptAs(call, {.number = "4989123", .name = "Bob"})`. Making
    /// it may throw, too.
    XCode acceptAs(CC_Call& call, Party const& answering);

    // The called side of a call that may be dialled overlap says with `setOwnSupportsOverlapReceiving` whether it takes
    // digits one by one (true when it says nothing), and becomes ADDRESS_INCOMPLETE when it needs more of them; the
    // calling side says with Supports Overlap-Sending whether more may come, and sends them as CC_ServiceUserInput.

    /// @name Typed accessors
    /// By the ids of CC_PropertyId, in their order. `getOwn...` reads the own view, `getPeer...` the peer view; a
    /// property that is absent or of another class counts as the empty text, 0, false, nothing or null, where nothing
    /// else is said. A getter with an argument returns that instead. `existsPeer...` tells whether the peer has a
    /// property of that id, of whatever class. `setOwn...` gives the result of `setOwnProperty`, FAILURE also when
    /// memory is out. References and pointers lead into the view and hold until that changes.
    ///
    /// What is not here is left out on purpose: the second number is the network's to give and only read of the peer,
    /// alert info and quality of service are for the own leg alone.
    /// @{

    /// Reads, looks for or writes the property of that name: as told above.
    String const& getOwnNetwork() const;
    String const& getPeerNetwork() const;
    XCode setOwnNetwork(String const& network);

    unsigned long long getOwnCallLegId() const;
    unsigned long long getPeerCallLegId() const;
    XCode setOwnCallLegId(unsigned long long id);

    String const& getOwnE164() const;
    String const& getPeerE164() const;
    XCode setOwnE164(String const& number);

    QTypeOfNumber getOwnTypeOfNumber() const;
    QTypeOfNumber getPeerTypeOfNumber() const;
    XCode setOwnTypeOfNumber(QTypeOfNumber type);

    QNumberingPlan getOwnNumberingPlan() const;
    QNumberingPlan getPeerNumberingPlan() const;
    XCode setOwnNumberingPlan(QNumberingPlan plan);

    QPresentationIndicator getOwnPresentationIndicator() const;
    QPresentationIndicator getPeerPresentationIndicator(QPresentationIndicator absent) const;
    bool existsPeerPresentationIndicator() const;
    XCode setOwnPresentationIndicator(QPresentationIndicator indicator);

    QScreeningIndicator getOwnScreeningIndicator() const;
    QScreeningIndicator getPeerScreeningIndicator(QScreeningIndicator absent) const;
    bool existsPeerScreeningIndicator() const;
    XCode setOwnScreeningIndicator(QScreeningIndicator indicator);

    QPresentationIndicator getOwnDiversionPresentationIndicator() const;
    QPresentationIndicator getPeerDiversionPresentationIndicator() const;
    XCode setOwnDiversionPresentationIndicator(QPresentationIndicator indicator);

    QScreeningIndicator getOwnDiversionScreeningIndicator() const;
    QScreeningIndicator getPeerDiversionScreeningIndicator() const;
    XCode setOwnDiversionScreeningIndicator(QScreeningIndicator indicator);

    String const& getPeerSecondE164() const;

    QTypeOfNumber getPeerSecondTypeOfNumber() const;

    QNumberingPlan getPeerSecondNumberingPlan() const;

    /// Intended: ALLOWED (0) when it is absent; the argument is ignored, unlike that of its three siblings.
    QPresentationIndicator getPeerSecondPresentationIndicator(QPresentationIndicator absent) const;
    bool existsPeerSecondPresentationIndicator() const;

    QScreeningIndicator getPeerSecondScreeningIndicator(QScreeningIndicator absent) const;
    bool existsPeerSecondScreeningIndicator() const;

    /// The call's, not a party's.
    QInformationTransferCapability getInformationTransferCapability() const;

    String const& getOwnPrecallService() const;
    String const& getPeerPrecallService() const;
    XCode setOwnPrecallService(String const& service);

    String const& getOwnName() const;
    String const& getPeerName() const;
    XCode setOwnName(String const& name);

    String const& getOwnRedirectingE164() const;
    String const& getPeerRedirectingE164() const;
    XCode setOwnRedirectingE164(String const& number);

    String const& getOwnRedirectingName() const;
    String const& getPeerRedirectingName() const;
    XCode setOwnRedirectingName(String const& name);

    QReasonForRedirection getOwnRedirectingReason() const;
    QReasonForRedirection getPeerRedirectingReason() const;
    XCode setOwnRedirectingReason(QReasonForRedirection reason);

    bool getOwnIsIsdn() const;
    bool getPeerIsIsdn() const;
    XCode setOwnIsIsdn(bool isIsdn);

    String const& getOwnRedirectingFirstE164() const;
    String const& getPeerRedirectingFirstE164() const;
    XCode setOwnRedirectingFirstE164(String const& number);

    String const& getOwnRedirectingFirstName() const;
    String const& getPeerRedirectingFirstName() const;
    XCode setOwnRedirectingFirstName(String const& name);

    QReasonForRedirection getOwnRedirectingFirstReason() const;
    QReasonForRedirection getPeerRedirectingFirstReason() const;
    XCode setOwnRedirectingFirstReason(QReasonForRedirection reason);

    unsigned long long getOwnRedirectingCounter() const;
    unsigned long long getPeerRedirectingCounter() const;
    XCode setOwnRedirectingCounter(unsigned long long counter);

    String const& getOwnAlertInfo() const;
    XCode setOwnAlertInfo(String const& info);

    bool getOwnConnectedNrUpdate() const;
    bool getPeerConnectedNrUpdate() const;
    XCode setOwnConnectedNrUpdate(bool isUpdate);

    String const& getOwnXOrgConnID() const;
    String const& getPeerXOrgConnID() const;
    XCode setOwnXOrgConnID(String const& id);

    /// A copy; empty also when memory is out.
    CC_PropertyParametrizedString::ParametrizedString getOwnUserToUser() const;
    /// A copy; empty also when memory is out.
    CC_PropertyParametrizedString::ParametrizedString getPeerUserToUser() const;
    /// Gives the property the next update counter, so that the peer can tell a message repeated from the one before.
    XCode setOwnUserToUser(CC_PropertyParametrizedString::ParametrizedString const& content);

    String const& getOwnDisplay() const;
    String const& getPeerDisplay() const;
    XCode setOwnDisplay(String const& text);

    VoipCodecListSet const& getOwnSupportedCodecs() const;
    VoipCodecListSet const& getPeerSupportedCodecs() const;
    bool existsPeerSupportedCodecs() const;
    XCode setOwnSupportedCodecs(VoipCodecListSet const& codecs);

    VoipCodecAndMode const& getOwnCodec() const;
    VoipCodecAndMode const& getPeerCodec() const;
    bool existsPeerCodec() const;
    XCode setOwnCodec(VoipCodecAndMode const& codec);

    /// State and code (the value agreed on) are one property; a state set alone has code 0.
    CC_PropertyCodecNegotiating::State getOwnCodecNegotiatingState() const;
    CC_PropertyCodecNegotiating::State getPeerCodecNegotiatingState() const;
    XCode setOwnCodecNegotiatingState(CC_PropertyCodecNegotiating::State state, unsigned int code);
    XCode setOwnCodecNegotiatingState(CC_PropertyCodecNegotiating::State state);

    unsigned int getOwnCodecNegotiatingCode() const;
    unsigned int getPeerCodecNegotiatingCode() const;

    /// State and message type are one property; a state set alone has type UNDEFINED.
    CC_PropertyWaitForMessage::State getOwnWaitForMessageState() const;
    CC_PropertyWaitForMessage::State getPeerWaitForMessageState() const;
    XCode setOwnWaitForMessageState(CC_PropertyWaitForMessage::State state,
                                    CC_PropertyWaitForMessage::MessageType type);
    XCode setOwnWaitForMessageState(CC_PropertyWaitForMessage::State state);

    CC_PropertyWaitForMessage::MessageType getOwnWaitForMessageType() const;
    CC_PropertyWaitForMessage::MessageType getPeerWaitForMessageType() const;

    /// True when absent, as the next three: an endpoint can do both unless it says otherwise.
    bool getOwnSupportsOverlapReceiving() const;
    /// True when absent.
    bool getPeerSupportsOverlapReceiving() const;
    XCode setOwnSupportsOverlapReceiving(bool supports);

    /// True when absent.
    bool getOwnSupportsOverlapSending() const;
    /// True when absent.
    bool getPeerSupportsOverlapSending() const;
    XCode setOwnSupportsOverlapSending(bool supports);

    CC_PropertyTariff::Tariff const* getOwnTariff() const;
    CC_PropertyTariff::Tariff const* getPeerTariff() const;
    XCode setOwnTariff(CC_PropertyTariff::Tariff const& tariff);

    CC_PropertyCharge::Charge const* getOwnCharge() const;
    CC_PropertyCharge::Charge const* getPeerCharge() const;
    XCode setOwnCharge(CC_PropertyCharge::Charge const& charge);

    /// The property itself, of whatever class.
    CC_Property const* getPeerCauseProperty() const;

    CC_QoS const* getOwnQoS() const;
    XCode setOwnQoS(CC_QoS const& qos);
    /// @}

private:
    struct LastDial;
    class NewProperties;

    TYPtr<LastDial> lastDialToChange();
    XCode forgetLastDial();
    XCode collect(String const& digits);
    void redial();

    TYPtr<LastDial> m_lastDial; // null: none, or forgotten
};
