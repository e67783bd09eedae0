// Two lines of one house in a program with an event loop of its own: poll(), beside which call control's loop runs.
#include "Line.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_Factory.h"
#include "properties/CC_PropertyId.h"

#include <cstdio>
#include <poll.h>
#include <tuple>

namespace
{
class Printer : public Telephone
{
public:
    explicit Printer(char const* name) : m_name(name) {}
    void ring(String const& number, String const& name, unsigned int) override
    {
        std::printf("%s rings: %s, %s\n", m_name, number.c_str(), name.c_str());
        m_isRinging = true;
    }
    void hear(Tone tone) override { std::printf("%s hears tone %d\n", m_name, tone); }
    void show(String const& text) override { std::printf("%s shows: %s\n", m_name, text.c_str()); }
    void clear(QCause) override { std::printf("%s hears that the other side has gone\n", m_name); }
    bool m_isRinging = false;

private:
    char const* m_name;
};

char const* ROUTE(String const& number) { return number.startsWith("49") ? "bert" : "anna"; }

/// Turns both loops until nothing is to be done for call control.
void RUN(TYEventLoop& loop)
{
    pollfd waiting{loop.getPollFd(), POLLIN, 0}; // and the sockets and lines of the program's own
    while (poll(&waiting, 1, 0) > 0)
        loop.runTurn();
}
} // namespace

int main()
{
    TYEventLoop loop;
    CC_Factory factory;
    CallControl::SET_CC_EVENT_LOOP(&loop);
    if (!CallControl::ADD_PROPERTY_FACTORY(&factory).isOk() || !CallControl::CREATE_CONTEXT("SWITCH").isOk())
        return 1;
    {
        Printer annas("anna");
        Printer berts("bert");
        Line anna("anna", "4420791234", annas, ROUTE);
        Line bert("bert", "4989123", berts, ROUTE);
        if (!anna.open().isOk() || !bert.open().isOk() || !anna.call("4989123").isOk())
            return 1;
        RUN(loop);
        std::ignore = bert.answer();
        RUN(loop);
        bert.hangUp();
        RUN(loop);
    }
    CallControl::DESTROY_CONTEXT("SWITCH");
    CallControl::REMOVE_PROPERTY_FACTORY(&factory);
    std::printf("calls left: %u\n", CallControl::GET_NUMBER_OF_CALLS());
}
