#include "testing/Recorder.h"

#include "calls/CC_CallLeg.h"
#include "testing/FailingAllocator.h"

#include <utility>

Recorder::Recorder(std::string name, Journal* journal)
    : m_recorderName(std::move(name)), m_journal(journal != nullptr ? journal : &m_ownJournal)
{
}

void Recorder::record(std::string const& what)
{
    FailingAllocator::Pause const unseen;
    m_journal->add(m_recorderName + ": " + what);
}

std::string Recorder::textOf(CC_Call const* call) const { return m_journal->nameOf(call, "call"); }

std::string Recorder::textOf(CC_CallLeg const* leg) const
{
    std::string const own = leg != nullptr && !leg->getName().isEmpty() ? leg->getName().c_str() : "leg";
    return m_journal->nameOf(leg, own);
}
