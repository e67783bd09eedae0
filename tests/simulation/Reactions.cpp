#include "tests/simulation/Reactions.h"

#include <iterator>

namespace Simulation
{
static_assert(static_cast<unsigned int>(CallOut::NUMBER_OF_CALL_OUTS) <= 64);

void Reactions::add(Reaction const& reaction)
{
    m_reactions.push_back(reaction);
    findAwaited();
}

bool Reactions::take(CallOut kind, Reaction& due)
{
    for (auto reaction = m_reactions.begin(); reaction != m_reactions.end(); ++reaction)
    {
        if (reaction->kind != kind || reaction->others-- != 0)
            continue;
        due = *reaction;
        m_reactions.erase(reaction);
        findAwaited();
        return true;
    }
    return false;
}

void Reactions::clear()
{
    m_reactions.clear();
    m_awaited = 0;
}

void Reactions::findAwaited()
{
    m_awaited = 0;
    for (Reaction const& reaction : m_reactions)
        m_awaited |= 1ULL << static_cast<unsigned int>(reaction.kind);
}
} // namespace Simulation
