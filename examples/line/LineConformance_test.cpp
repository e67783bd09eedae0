#include "Line.h"

#include "testing/DrivenClock.h"
#include "testing/ModuleConformanceTests.h"

#include <tuple>
#include <utility>

namespace
{
/// A line, and the user at its telephone, who is the far side of its wire.
class LineDriver : public ModuleDriver
{
public:
    LineDriver() { std::ignore = m_line.open(); } // the first case says what fails here

    String getProviderName() const override { return "line"; }
    String getNumber() const override { return "4989123"; }
    char const* whyNot(Ability ability) const override
    {
        return ability == DIGITS_TO_WIRE ? "a telephone is told no digits" : nullptr;
    }
    std::vector<QCause> getCausesFromWire() const override { return {QCause::NORMAL_CALL_CLEARING}; } // users know one

    void placeCall(String const& number) override
    {
        m_telephone.isUp = false;
        std::ignore = m_line.call(number); // what fails the telephone is told
    }
    void ring() override {} // it does so by itself
    void answer() override { std::ignore = m_line.answer(); }
    void clear(QCause) override { m_line.hangUp(); }
    void sendDigit(char digit) override { m_line.key(String(&digit, 1)); }
    void goSilent() override {} // a user who does nothing
    void letTimePass() override { m_clock.advance(Line::RINGING_TIME); }

private:
    /// What the line does to the telephone the wire has seen.
    struct ToldTelephone : Telephone
    {
        explicit ToldTelephone(LineDriver& told) : driver(told) {}
        void ring(String const&, String const&, unsigned int) override { driver.saw(Seen::OFFERED, "4989123"); }
        void hear(Tone tone) override
        {
            if (tone == MG_Tones::ECallProgressTone::RINGING)
                driver.saw(Seen::RINGING);
            else if (tone == MG_Tones::ECallProgressTone::CONGESTION)
                driver.sawCleared(QCause::RESOURCE_UNAVAILABLE);
            else if (tone == MG_Tones::ECallProgressTone::NONE && !std::exchange(isUp, true)) // else: held no more
                driver.saw(Seen::ANSWERED);
        }
        void show(String const&) override {}
        void clear(QCause cause) override { driver.sawCleared(cause); }

        LineDriver& driver;
        bool isUp = false;
    };
    static char const* ROUTE(String const&) { return PEER; }

    DrivenClock m_clock;
    ToldTelephone m_telephone{*this};
    Line m_line{"line", "4989123", m_telephone, ROUTE};
};
} // namespace

CALLCONTROL_MODULE_CONFORMANCE(LineConformance, LineDriver);
