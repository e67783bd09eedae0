#include "testing/ModuleDriver.h"

#include "callcontrol/CallControl.h"
#include "platform/base/NameOf.h"
#include "platform/eventloop/TYEventLoop.h"
#include "testing/FailingAllocator.h"

namespace
{
constexpr unsigned int MANY_TURNS = 1000; // more are a loop that never comes to rest
constexpr int LAST_CAUSE = 127;
} // namespace

ModuleDriver::~ModuleDriver() = default;

std::string ModuleDriver::Seen::getText() const
{
    std::string const number = std::to_string(static_cast<int>(cause));
    std::string const ofCall = call != 1 ? " (call " + std::to_string(call) + ")" : "";
    switch (what)
    {
    case OFFERED:
        return "offered " + text + ofCall;
    case RINGING:
        return "ringing" + ofCall;
    case ANSWERED:
        return "answered" + ofCall;
    case CLEARED:
        return "cleared " + number + " (" + QCAUSE_NAME(cause) + ")" + ofCall;
    case DIGITS:
        return "digits " + text + ofCall;
    }
    return "(unknown)";
}

char const* ModuleDriver::whyNot(Ability) const { return nullptr; }

std::vector<QCause> ModuleDriver::ALL_CAUSES()
{
    std::vector<QCause> causes;
    for (int value = 1; value <= LAST_CAUSE; ++value)
        if (auto const cause = static_cast<QCause>(value); QCAUSE_NAME(cause) != ERROR::INVALID)
            causes.push_back(cause);
    return causes;
}

std::vector<QCause> ModuleDriver::getCausesFromWire() const { return ALL_CAUSES(); }

std::vector<QCause> ModuleDriver::getCausesToWire() const { return ALL_CAUSES(); }

void ModuleDriver::sendDigit(char) {}

bool ModuleDriver::runUntil(std::function<bool()> const& isDone)
{
    for (unsigned int turns = 0; turns < MANY_TURNS && !isDone(); ++turns)
        if (!CallControl::GET_CC_EVENT_LOOP()->runTurn())
            break;
    return isDone();
}

void ModuleDriver::settle()
{
    for (unsigned int turns = 0; turns < MANY_TURNS && CallControl::GET_CC_EVENT_LOOP()->runTurn(); ++turns)
    {
    }
}

void ModuleDriver::letTimePass() {}

void ModuleDriver::saw(Seen const& seen)
{
    {
        FailingAllocator::Pause const unseen;
        m_seen.push_back(seen);
    }
    m_onSeen(seen);
}

void ModuleDriver::saw(Seen::What what, String const& text)
{
    FailingAllocator::Pause const unseen;
    saw({.what = what, .text = std::string(text.view())});
}

void ModuleDriver::sawCleared(QCause cause) { saw({.what = Seen::CLEARED, .cause = cause}); }
