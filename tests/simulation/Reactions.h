#pragma once

#include "tests/simulation/CallOut.h"

#include <cstddef>
#include <vector>

namespace Simulation
{
/// What is to be done inside coming call-outs.
class Reactions
{
public:
    struct Reaction
    {
        CallOut kind;
        unsigned int others; // so many come before
        std::size_t begin;   // the operations
        std::size_t end;
    };

    void add(Reaction const& reaction);
    bool isEmpty() const { return m_reactions.empty(); }
    bool isAwaited(CallOut kind) const { return (m_awaited >> static_cast<unsigned int>(kind) & 1) != 0; }
    /// Whether one was due at this call-out; it is taken out then.
    bool take(CallOut kind, Reaction& due);
    void clear();

private:
    void findAwaited();

    std::vector<Reaction> m_reactions;
    unsigned long long m_awaited = 0;
};
} // namespace Simulation
