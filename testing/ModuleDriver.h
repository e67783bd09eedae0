#pragma once

#include "platform/base/String.h"
#include "platform/signalling/QCause.h"
#include "testing/Hook.h"

#include <functional>
#include <string>
#include <vector>

/// What a signalling module lets the conformance suite do with it: the module, and the far side of its wire.
///
/// A module author derives from this once (ModuleConformance shows how the suite is started). The constructor makes the
/// module in the call control that is set up then: the loop of CallControl::GET_CC_EVENT_LOOP(), the context "SWITCH".
/// The destructor takes it back, in whatever state it is. The verbs play the far side: they say what the wire says to
/// the module, and nothing about what the module makes of it; what the module says to the wire is reported with `saw`.
/// They mean the first call on the wire that is not cleared. With none they do nothing.
///
///     class LineDriver : public ModuleDriver
///     {
///     public:
///         LineDriver() { std::ignore = m_line.open(); }
///         String getProviderName() const override { return "line"; }
///         String getNumber() const override { return "4989123"; }
///         void placeCall(String const& number) override { std::ignore = m_line.call(number); }
///         void answer() override { std::ignore = m_line.answer(); }
///         ...
///     private:
///         struct ToldTelephone : Telephone
///         {
///             void clear(QCause cause) override { driver.sawCleared(cause); }
///             ...
///         };
///         ToldTelephone m_telephone{*this};
///         Line m_line{"line", "4989123", m_telephone, ROUTE};
///     };
///
/// The defaults of `runUntil`, `settle` and `letTimePass` are for a wire that is in memory and says everything at once.
/// A driver with sockets overrides `runUntil`, with a bound on time, and `settle`.
class ModuleDriver
{
public:
    /// The provider that stands for the other side of call control: the module routes PEER_NUMBER to it.
    static constexpr char const* PEER = "peer";
    /// The number at which the other side is called.
    static constexpr char const* PEER_NUMBER = "4930123456";

    /// What the far side saw the module do.
    struct Seen
    {
        /// What it was.
        enum What
        {
            OFFERED,  ///< a call to `text`, the whole number
            RINGING,  ///< the call from the wire rings
            ANSWERED, ///< the call from the wire is answered
            CLEARED,  ///< the call was refused, given up or ended, with `cause`; not what merely confirms our own
                      ///< clearing
            DIGITS    ///< `text` was keyed in at the other side
        };
        What what;                   ///< what it was
        std::string text{};          ///< the number or the digits
        QCause cause = QCause::NONE; ///< of CLEARED
        unsigned int call = 1;       ///< which call on the wire, for a wire that has several at a time

        /// "cleared 17 (User busy)"
        std::string getText() const;
    };

    /// What not every module can do, so that the suite leaves it out when it has to.
    enum Ability
    {
        CALLS_FROM_WIRE,    ///< `placeCall`
        CALLS_TO_WIRE,      ///< takes offers
        DIGITS_FROM_WIRE,   ///< `sendDigit` becomes user input for the peer
        DIGITS_TO_WIRE,     ///< user input from the peer is told to the wire
        LATE_DIGITS,        ///< an offer with the first digits of the number is completed by user input
        GIVING_UP,          ///< a wire that answers nothing to an offer is given up
        FAILING_ALLOCATIONS ///< lives with memory that runs out
    };

    virtual ~ModuleDriver();
    ModuleDriver(ModuleDriver const&) = delete;
    ModuleDriver& operator=(ModuleDriver const&) = delete;

    // --- what the module is ------------------------------------------------------------------------------------------

    /// The name under which the module is registered in the context "SWITCH".
    virtual String getProviderName() const = 0;
    /// A number that the far side answers, at least four digits.
    virtual String getNumber() const = 0;
    /// Why the module cannot do that, as the skipped test says it; null: it can.
    virtual char const* whyNot(Ability ability) const;
    /// The causes with which the wire can clear, and those that it can be told; ALL_CAUSES() unless it has no more.
    virtual std::vector<QCause> getCausesFromWire() const;
    virtual std::vector<QCause> getCausesToWire() const; ///< see above
    /// The causes from 1 to 127 that Q.850 names.
    static std::vector<QCause> ALL_CAUSES();

    // --- what the far side does --------------------------------------------------------------------------------------

    /// Calls the number from the wire, complete at once.
    virtual void placeCall(String const& number) = 0;
    /// The call that was offered rings; nothing to do for a wire where it does so by itself.
    virtual void ring() = 0;
    /// The call that was offered is answered.
    virtual void answer() = 0;
    /// Refuses, gives up or ends the call, whatever its state. Not reported as CLEARED.
    virtual void clear(QCause cause) = 0;
    /// Sends the digit in a call that is up.
    virtual void sendDigit(char digit);
    /// From now on the far side answers nothing and says nothing, as if its cable had been cut; what the module says is
    /// still reported if it is seen at all.
    virtual void goSilent() = 0;

    // --- letting things happen ---------------------------------------------------------------------------------------

    /// Lets things happen until `isDone`, or until nothing more will happen: whether it is done.
    virtual bool runUntil(std::function<bool()> const& isDone);
    /// Lets everything happen that both sides have under way.
    virtual void settle();
    /// Moves the time on by as much as the module waits for a wire that says nothing. Where time passes by itself, in
    /// `runUntil`, there is nothing to do.
    virtual void letTimePass();

    // --- for the suite -----------------------------------------------------------------------------------------------

    /// All that the far side saw, in order.
    std::vector<Seen> const& getSeen() const { return m_seen; }
    /// Runs inside `saw`.
    Hook<void(Seen const&)> m_onSeen;

protected:
    ModuleDriver() = default;

    /// The far side saw the module do this. May be called at any time, with memory that is to fail too.
    void saw(Seen const& seen);
    /// The same, of call 1, without a thought for memory.
    void saw(Seen::What what, String const& text = String::s_empty);
    /// The same of CLEARED.
    void sawCleared(QCause cause);

private:
    std::vector<Seen> m_seen;
};
