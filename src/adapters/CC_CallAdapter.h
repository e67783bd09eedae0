#pragma once

#include "calls/CC_CallLegObserver.h"
#include "calls/CC_CallObserver.h"
#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/String.h"
#include "platform/base/TYInstances.h"
#include "platform/base/TYLifeline.h"
#include "platform/base/XCode.h"
#include "platform/signalling/QCause.h"
#include "properties/CC_PropertyView.h"

class CC_CallAdapterObserver;
class CC_Endpoint;
class CC_PropertyFilterContainer;
class CC_Provider;
class MG_IContext;

/// Drives one leg of one call for one endpoint of a signalling module.
///
/// The module owns the adapter, binds it with `setup` and dials or accepts; the adapter then has a leg of its own and,
/// while another leg is in the call, a peer: the most active of the others. What the module writes passes through its
/// endpoint's input filters; what it reads of the peer and the call has passed through the output filters. Changes of
/// peer and call reach the module once per turn of the call-control loop, services at once. Belongs to that loop's
/// thread. After `drop` it is idle and may dial or accept again.
///
/// The peer changes when another leg becomes more active than the peer was last seen, when the peer falls below that or
/// leaves, and when there is none. Last seen is the State in the view of the peer: a refresh inside the news of its
/// fall, or a State that the module itself writes there, hides the fall. Then the peer is chosen anew when the pending
/// notification is delivered, in the next turn at the latest.
///
/// When somebody takes the leg out of its call (`CC_CallPool::dropCalls`, `CallControl::RELEASE_CALL`, a transfer), the
/// adapter keeps its leg, but there is no peer and no call any more: the module is told that every peer property
/// changed and finds them absent, the State too, and no cause. What is left to do is to clear its own side and `drop`.
///
/// States of the own leg are the module's to write: DISCONNECTING says that the wire is being cleared and still counts
/// as live, so that tones and announcements reach the other side; RELEASED ends the leg's part in the call, and `drop`
/// writes it. Having written it by itself the module still drops, to give the leg up.
///
///     CC_CallAdapter adapter;
///     std::ignore = adapter.setup("line 7", endpoint, &observer);
///     CC_PropertyContainer own;
///     std::ignore = own.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, "4420791234"));
///     if (!adapter.dial("SWITCH", "isdn", "4989123", own, offer, CC_PropertyContainer::EMPTY(), nullptr).isOk())
///         ...
///     adapter.drop(QCause::NORMAL_CALL_CLEARING, 0);
class CC_EXPORT CC_CallAdapter : public CC_CallObserver, public CC_CallLegObserver
{
public:
    /// Kinds of destinations, for modules that route.
    enum DestinationType : int
    {
        NONE = 0,
        PROVIDER = 1,
        TABLE = 2
    };

    CC_CallAdapter();
    ~CC_CallAdapter() override; ///< `cleanup()`
    CC_CallAdapter(CC_CallAdapter const&) = delete;
    CC_CallAdapter& operator=(CC_CallAdapter const&) = delete;

    void onCallObservationEnded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegAdded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegRemoved(CC_Event<CC_Call> const& event) override;
    void onCallPropertyChanged(CC_Event<CC_Call> const& event) override;

    /// Binds the adapter to its endpoint and observer (may be null), which must outlive its use. An empty name becomes
    /// the adapter's address. An adapter with a leg drops it first, without a cause. OK, or FAILURE when memory is out.
    virtual XCode setup(String const& name, CC_Endpoint& endpoint, CC_CallAdapterObserver* observer);
    /// Drops the leg without a cause and forgets endpoint, name and observer: as newly made.
    virtual void cleanup();
    /// Hands the service to the adapters of all other legs of the call, at once. Nothing happens without a leg.
    virtual void invokeSynchronousService(CC_Service& service);
    /// Places a call: makes the own leg (CONNECTED), acquires a call from the context's pool and has the provider carry
    /// it to `destination`. `ownProperties` describe this side, `offerProperties` travel with the offer,
    /// `callProperties` belong to the call; `datapathContext` (null: a new one) becomes the call's Context.
    /// OK; REFUSED when the adapter is not idle or not set up, nothing has changed then; NO_ELEMENT when no call could
    /// be had; FAILURE for an unknown provider, one that refuses, and all else. After these two the own leg was dropped
    /// with cause 38. A log line of level 1 says which it was.
    ///
    /// When memory ran out so early that there is no own leg, the adapter is not idle again: from then on it refuses
    /// everything, and `drop` does nothing, until `cleanup()`; then it is set up anew.
    ///
    /// The endpoint's input filters of the beginning filter the call's and the offer's properties, whatever is set
    /// meanwhile. Whoever hears of the new call may drop or destroy this adapter: then FAILURE.
    virtual XCode dial(String const& contextName, String const& providerName, String const& destination,
                       CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                       CC_PropertyContainer const& callProperties, MG_IContext* datapathContext);
    /// Joins a call that was offered to the endpoint, with an own leg in state TRYING. OK; REFUSED as for `dial`;
    /// FAILURE otherwise, the own leg was then dropped with cause 38; without a leg as for `dial`.
    virtual XCode accept(CC_Call& call, CC_PropertyContainer const& ownProperties);
    /// Moves the other legs of the other adapter's call into this one's. With `removeOwnLeg` this adapter's leg leaves
    /// its call first (a transfer: the two peers are connected), without it stays (a conference). The other adapter's
    /// leg stays in its call; both legs stay with their adapters, who drop them.
    /// OK; REFUSED when a leg or call is absent or both are in one call; FAILURE when a leg could not be moved, those
    /// before it stay moved.
    virtual XCode transfer(CC_CallAdapter const& other, bool removeOwnLeg);
    /// Ends the own leg: writes Provides Data false, the cause with its SIP code (0: none) and State RELEASED, and lets
    /// the leg go. QCause::UNSPECIFIED with 0 writes no cause. Nothing happens on an idle adapter.
    virtual void drop(QCause cause, unsigned int causeValue);

    /// Diagnostic dump; returns `info`.
    virtual InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                   unsigned int maxDetail, unsigned int detail, String const& prefix) const;

    /// Told instead of the observer when there is none; a subclass may override them. They do nothing. @{
    virtual void notifyPeerPropertyChange(CC_Flags const& flags);
    virtual void notifyPeerSynchronousService(CC_Service& service);
    /// @}

    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event) override;

    /// `drop` without its log line.
    void dropOwnCallLeg(QCause cause, unsigned int causeValue);

    /// Empty until `setup`.
    String const& getName() const { return m_name; }
    /// Also renames the leg. An empty name becomes the adapter's address. Without memory the old name stays.
    void setName(String const& name);
    /// Null until `setup`; the observer may stay so. @{
    CC_Endpoint* getEndpoint() const { return m_endpoint; }
    CC_CallAdapterObserver* getObserver() const { return m_observer; }
    /// @}
    /// The leg that the adapter drives, and the one of the others that it takes for its peer; null without. They are
    /// the adapter's as long as it says so: keep one longer through a CC_CallLeg::Reference. @{
    CC_CallLeg const* getOwnCallLeg() const { return m_ownCallLeg; }
    CC_CallLeg const* getPeerCallLeg() const { return m_peerCallLeg; }
    /// @}
    /// Empty without an own leg.
    String const& getCallLegName() const;
    /// The own leg's call; null without.
    CC_Call* getCall() const;

    /// @name Properties
    /// Of own leg, peer leg and call. Filtered: the endpoint's view; getters read a copy that is kept up to date,
    /// setters write it and then the leg or call through the input filters (the whole copy, since a filter may derive
    /// one property from several). Unfiltered: the leg or call itself.
    ///
    /// Getters of one property: null when it, the leg or the call is absent. Getters of several copy those whose id has
    /// a bit in common with `mask` (its group: 0x100, 0x200, 0x400, 0x800, 0x1000): OK, or the first failure, the
    /// others are copied all the same. Those of a view are OK also on an idle adapter, whose views are empty; the
    /// unfiltered ones are ABSENT without the leg or call. Setters: OK; ABSENT without the leg or call, nothing has
    /// changed then; FAILURE for anything else, also when a filter drops or destroys the adapter meanwhile: nothing is
    /// written then.
    ///
    /// Where the calling number is before `accept`: among the properties that the endpoint was offered the call with
    /// are the called party's alone; the caller's are those of the call's first leg,
    /// `call.getCallLeg(0)->getProperties()`, and from `accept` on those of the peer.
    /// @{

    /// Getter or setter, of one property or several, filtered or not: as told above.
    CC_Property const* getOwnProperty(unsigned int id) const;
    CC_Property const* getOwnPropertyUnfiltered(unsigned int id) const;
    XCode getOwnProperties(CC_PropertyContainer& properties, unsigned int mask) const;
    XCode getOwnPropertiesUnfiltered(CC_PropertyContainer& properties, unsigned int mask) const;
    XCode setOwnProperty(CC_Property const& property);
    XCode setOwnProperties(CC_PropertyContainer const& properties);
    XCode setOwnPropertyUnfiltered(CC_Property const& property);
    XCode setOwnPropertiesUnfiltered(CC_PropertyContainer const& properties);

    CC_Property const* getPeerProperty(unsigned int id) const;
    CC_Property const* getPeerPropertyUnfiltered(unsigned int id) const;
    XCode getPeerProperties(CC_PropertyContainer& properties, unsigned int mask) const;
    XCode getPeerPropertiesUnfiltered(CC_PropertyContainer& properties, unsigned int mask) const;
    XCode setPeerProperty(CC_Property const& property);
    XCode setPeerProperties(CC_PropertyContainer const& properties);
    XCode setPeerPropertyUnfiltered(CC_Property const& property);
    XCode setPeerPropertiesUnfiltered(CC_PropertyContainer const& properties);

    CC_Property const* getCallProperty(unsigned int id) const;
    CC_Property const* getCallPropertyUnfiltered(unsigned int id) const;
    XCode getCallProperties(CC_PropertyContainer& properties, unsigned int mask) const;
    XCode getCallPropertiesUnfiltered(CC_PropertyContainer& properties, unsigned int mask) const;
    XCode setCallProperty(CC_Property const& property);
    XCode setCallProperties(CC_PropertyContainer const& properties);
    XCode setCallPropertyUnfiltered(CC_Property const& property);
    XCode setCallPropertiesUnfiltered(CC_PropertyContainer const& properties);
    /// @}

    /// The same by typed keys (CC_PropertyKeys.h), filtered. Getters: the property as one of the key's class, or a copy
    /// of its value with a fallback. Setters: with a property made from the values. @{
    template <class Property>
    CC_FoundProperty<Property> getOwn(CC_PropertyKey<Property> key) const
    {
        return key.in(getOwnProperty(key.getId()));
    }
    template <class Property, class Fallback>
    auto getOwn(CC_PropertyKey<Property> key, Fallback const& fallback) const
    {
        return getOwn(key).getValueOr(fallback);
    }
    template <class Property, class... Values>
    requires(CC_PropertyKey<Property>::template TAKES<Values...>) XCode
        setOwn(CC_PropertyKey<Property> key, Values&&... values)
    {
        return key.store([this](Property const& made) { return setOwnProperty(made); }, XCode::FAILURE,
                         std::forward<Values>(values)...);
    }
    template <class Property>
    CC_FoundProperty<Property> getPeer(CC_PropertyKey<Property> key) const
    {
        return key.in(getPeerProperty(key.getId()));
    }
    template <class Property, class Fallback>
    auto getPeer(CC_PropertyKey<Property> key, Fallback const& fallback) const
    {
        return getPeer(key).getValueOr(fallback);
    }
    template <class Property, class... Values>
    requires(CC_PropertyKey<Property>::template TAKES<Values...>) XCode
        setPeer(CC_PropertyKey<Property> key, Values&&... values)
    {
        return key.store([this](Property const& made) { return setPeerProperty(made); }, XCode::FAILURE,
                         std::forward<Values>(values)...);
    }
    template <class Property>
    CC_FoundProperty<Property> getCall(CC_PropertyKey<Property> key) const
    {
        return key.in(getCallProperty(key.getId()));
    }
    template <class Property, class Fallback>
    auto getCall(CC_PropertyKey<Property> key, Fallback const& fallback) const
    {
        return getCall(key).getValueOr(fallback);
    }
    template <class Property, class... Values>
    requires(CC_PropertyKey<Property>::template TAKES<Values...>) XCode
        setCall(CC_PropertyKey<Property> key, Values&&... values)
    {
        return key.store([this](Property const& made) { return setCallProperty(made); }, XCode::FAILURE,
                         std::forward<Values>(values)...);
    }
    /// @}

    /// The media context of the call (its property 0x400400). Setting goes through the input filters and reports
    /// nothing; null is returned without a leg, a call or such a property. @{
    void setDatapathContext(MG_IContext* context);
    MG_IContext* getDatapathContext();
    MG_IContext const* getDatapathContext() const;
    /// @}

    /// ERROR::INVALID for other values.
    static char const* DESTINATION_TYPE_NAME(DestinationType type);

    /// The number of adapters alive.
    static unsigned int s_numberOfInstances;

protected:
    /// For an operation of a subclass that calls out and then goes on: a watch on it tells whether the adapter lives.
    TYLifeline const& getLifeline() const { return m_lifeline; }
    /// Whether the adapter is set up and idle, so that `dial` and `accept` are not refused.
    bool isReady() const;

private:
    friend class CC_Inside;
    friend class TYInstances<CC_CallAdapter>;
    class Event;
    class Attempt;
    class Log;
    class Copy;
    class OnDifference;
    struct Kept;

    char const* getEndpointName() const;
    void logDrop() const;
    unsigned long long getLegSerial() const;
    unsigned long long getCallSerial() const;
    String nameOrAddress(String const& name) const;
    String makeCallLegName() const;
    CC_PropertyFilterContainer* getInputFilters() const;
    CC_PropertyFilterContainer* getOutputFilters() const;

    XCode tryDial(String const& contextName, String const& providerName, String const& destination,
                  CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                  CC_PropertyContainer const& callProperties, MG_IContext* datapathContext);
    XCode joinAndOffer(CC_Provider& provider, CC_Call& call, String const& contextName, String const& providerName,
                       String const& destination, CC_PropertyContainer const& offerProperties,
                       CC_PropertyContainer const& callProperties, CC_PropertyFilterContainer const* filters);
    XCode joinNewCall(CC_Call& call, CC_PropertyContainer const& properties, CC_PropertyFilterContainer const* filters);
    XCode tryAccept(CC_Call& call, CC_PropertyContainer const& ownProperties);
    XCode createEvents();
    static XCode setInitialProperties(CC_PropertyContainer& properties, int state);
    XCode createOwnCallLeg();
    XCode startOwnCallLeg(CC_PropertyContainer& properties);
    XCode writeFirstProperties(CC_PropertyContainer& properties);
    void writeFinalProperties(QCause cause, unsigned int causeValue);
    void letGoOfTheRest();
    XCode tryTransfer(CC_CallAdapter const& other, bool removeOwnLeg);
    char const* whyNotReady() const;

    static CC_PropertyContainer const* FILTER_INPUT(CC_PropertyFilterContainer const* filters,
                                                    CC_PropertyContainer const& properties,
                                                    CC_PropertyContainer& filtered);
    template <class Target, class Written>
    XCode writeFiltered(CC_PropertyView& view, Target* target, Written const& written);
    template <class Target>
    XCode writeCopy(Attempt const& attempt, CC_PropertyView& view, Target& target,
                    CC_PropertyFilterContainer const& filters);
    template <class Target, class Written>
    XCode writeUnfiltered(CC_PropertyView& view, Target* target, Written const& written);
    XCode setOwnPropertyPlainly(CC_Property const& property);
    XCode setOwnPropertyRecorded(CC_Property const& property);
    template <class Written>
    XCode writeOwn(Written const& written, bool isFiltered);
    template <class Written>
    XCode writePeer(Written const& written, bool isFiltered);
    template <class Written>
    XCode writeCall(Written const& written, bool isFiltered);

    static void GIVE_UP(CC_CallLeg& leg);
    static void GIVE_UP_RELEASED(CC_CallLeg& leg);
    void observeCall(CC_Call& call);
    void unobserveCall();
    void updateOwnCallLeg(CC_Flags const& changed);
    void filterOwnCallLeg(CC_Flags const& changed, CC_PropertyFilterContainer const& filters);
    void updatePeerCallLeg(CC_Flags const* changed);
    void updateCall();
    void updateView(CC_PropertyView& view, CC_PropertyContainer const& source, unsigned long long serial,
                    CC_PropertyView::Told const& told, OnDifference const& onDifference);
    void filterView(CC_PropertyView& view, CC_PropertyContainer const& source, unsigned long long serial,
                    CC_PropertyView::Told const& told, OnDifference const& onDifference,
                    CC_PropertyFilterContainer const& filters);
    void mark(unsigned int id);
    bool linkPeerCallLeg();
    void unlinkPeerCallLeg();
    void catchUp();
    bool hasToCatchUp() const;
    void onPeerPropertyChanged(CC_Flags const& flags);
    void onOtherRelinked(CC_CallLeg const& leg);
    void onOtherPropertyChanged(CC_CallLeg const& leg, CC_Flags const& flags);

    static TYInstances<CC_CallAdapter> s_instances;

    CC_CallAdapterObserver* m_observer = nullptr;
    String m_name;
    CC_Endpoint* m_endpoint = nullptr;
    CC_CallLeg* m_ownCallLeg = nullptr;
    CC_PropertyView m_ownView;
    Event* m_peerChangeEvent = nullptr;
    Event* m_secondEvent = nullptr; // made and destroyed with the first; nothing posts it
    CC_CallLeg* m_peerCallLeg = nullptr;
    CC_PropertyView m_peerView;
    CC_PropertyView m_callView;
    CC_Call* m_observedCall = nullptr; // the call with which we are registered
    bool m_isCallObserver = false;     // of m_observedCall: which of the two registrations it took
    bool m_isCallLegObserver = false;  // of all its legs
    bool m_observesOwnCallLeg = false;
    unsigned int m_attempt = 0;      // counts the legs we have let go, to tell one attempt from the next
    bool m_isResetting = false;      // in setup or cleanup: who is told of the ending leg cannot begin another
    bool m_isWritingOwn = false;     // without filters, and the leg has not told us of it yet
    bool m_isPeerToBeChosen = false; // its fall did not show: choose anew before the module is told
    unsigned int m_refreshes = 0;    // of views through filters, to tell whether one came inside another
    TYLifeline m_lifeline;
    TYInstances<CC_CallAdapter>::Links m_links;
};
