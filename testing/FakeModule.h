#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "properties/CC_PropertyCallLegState.h"
#include "testing/RecordingAdapterObserver.h"
#include "testing/RecordingCallObserver.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingProvider.h"

#include <memory>
#include <string>

/// A whole signalling module with one line, driven in verbs: the other side of a call for the tests of a module, or
/// both sides. It is registered under its name in the context "SWITCH" while it lives, dials, answers what it is
/// offered as the test says, and records what it hears.
///
///     CallControlFixture callControl;
///     FakeModule anna("anna"), bert("bert");
///     std::ignore = anna.dial(bert, "4989123");
///     std::ignore = bert.become(FakeModule::State::CONNECTED);
///     callControl.settle();
///     EXPECT_EQ(anna.getPeerState(), "CONNECTED");
///     EXPECT_EQ(bert.take().front(), "bert: dial bert 4989123 (E164-Number)");
///     bert.hangUp(QCause::NORMAL_CALL_CLEARING);
///
/// Its parts are there for what the verbs do not cover; they share the module's journal. A line that has a call rejects
/// the next offer with USER_BUSY. Without the context, or when the name is taken, the program ends with a message.
class FakeModule
{
public:
    /// Short for the states that `become` takes.
    using State = CC_PropertyCallLegState;

    /// The name is that of the provider, the endpoint and the recorders, and of the network unless that is given. The
    /// filters (may be null) must outlive the module.
    explicit FakeModule(std::string const& name, String const& network = "", Journal* journal = nullptr,
                        CC_PropertyFilterContainer* inputFilters = nullptr,
                        CC_PropertyFilterContainer* outputFilters = nullptr);
    /// Drops the line and takes the provider out.
    ~FakeModule();
    FakeModule(FakeModule const&) = delete;
    FakeModule& operator=(FakeModule const&) = delete;

    /// That of the provider, the endpoint and the recorders.
    String const& getName() const { return m_endpoint.getName(); }
    /// The number with which the line accepts and dials other fakes from now on; empty: none. The dial with containers
    /// takes `own` as it is, without the number.
    void setNumber(String const& number) { m_number = number; }

    // --- what becomes of offers; they are accepted unless the test says otherwise ------------------------------------

    /// From the next offer on. @{
    void acceptOffers();
    void rejectOffers(QCause cause);
    /// @}
    /// The next offer waits for `acceptHeld` or `rejectHeld`, or until its call ends.
    void holdOffers();
    /// Whether an offer waits.
    bool isHolding() const { return m_heldCall != nullptr; }
    /// The result of the adapter's `accept`; ABSENT when no offer is held.
    XCode acceptHeld();
    /// Nothing happens when no offer is held.
    void rejectHeld(QCause cause);

    // --- what the module does; the results are the adapter's ---------------------------------------------------------

    /// Dials the number at the callee's provider. The number reaches it in the offer.
    XCode dial(FakeModule const& callee, String const& number = "4989123");
    /// The offer carries the number, too, unless it has one already.
    XCode dial(String const& providerName, String const& number, CC_PropertyContainer const& own,
               CC_PropertyContainer const& offer, CC_PropertyContainer const& call);
    /// Writes the State of the own leg.
    XCode become(State::State state);
    /// Writes a property of the own leg; a text as a CC_PropertyString. @{
    XCode say(CC_Property const& property);
    XCode say(unsigned int id, String const& text);
    /// @}
    /// The user keys digits in.
    void key(String const& digits);
    /// Drops, if there is a leg.
    void hangUp(QCause cause = QCause::NORMAL_CALL_CLEARING);
    /// A new adapter in place of the one before, which drops. After a dial or accept that memory kept from a leg there
    /// is no other way to the next call (CC_CallAdapter::dial).
    void renew();

    // --- what the module sees ----------------------------------------------------------------------------------------

    /// Null without a call.
    CC_Call* getCall() const;
    /// "CONNECTED"; "none" without a peer.
    std::string getPeerState() const;
    /// The values as texts; "absent" for what is not there. @{
    std::string getOwnValue(unsigned int id) const;
    std::string getPeerValue(unsigned int id) const;
    std::string getCallValue(unsigned int id) const;
    /// @}
    /// What was recorded since the last time.
    Lines take() { return m_observer.take(); }

private:
    Journal m_ownJournal;
    String m_number;

public:
    /// What offers come in by, what takes them, and what hears of the peer. @{
    RecordingProvider m_provider;
    RecordingEndpoint m_endpoint;
    RecordingAdapterObserver m_observer;
    /// @}
    std::unique_ptr<CC_CallAdapterE164> m_adapter; ///< null once the test has destroyed it

private:
    XCode accept(CC_Call& call);
    XCode reject(CC_Call& call, QCause cause);
    XCode hold(CC_Call& call);
    CC_PropertyContainer getOwnProperties() const;

    std::unique_ptr<RecordingCallObserver> m_heldObserver;
    CC_Call* m_heldCall = nullptr;
};
