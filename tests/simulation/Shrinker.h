#pragma once

#include "tests/simulation/Operation.h"

#include <chrono>
#include <cstddef>

namespace Simulation
{
/// Makes operations that fail fewer and simpler, as long as they go on failing (a crash stays one): first what comes
/// after the failure is cut off, then pieces are taken out, from halves down to single operations, then arguments
/// become 0 or smaller.
///
///     Operations const smallest = Shrinker(std::chrono::seconds(50)).shrink(operations);
class Shrinker
{
public:
    explicit Shrinker(std::chrono::seconds longest) : m_end(std::chrono::steady_clock::now() + longest) {}

    /// REQUIRES: the operations fail.
    Operations shrink(Operations operations);

private:
    bool stillFails(Operations const& operations);
    bool isOver() const { return std::chrono::steady_clock::now() >= m_end; }
    void cutOff(Operations& operations);
    bool removePieces(Operations& operations, std::size_t size);
    bool simplify(Operations& operations);
    bool simplifyArgument(Operations& operations, std::size_t place, std::size_t argument);

    std::chrono::steady_clock::time_point m_end;
    bool m_isCrash = false;
};
} // namespace Simulation
