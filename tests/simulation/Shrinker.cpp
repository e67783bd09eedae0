#include "tests/simulation/Shrinker.h"

#include "tests/simulation/Attempts.h"

#include <algorithm>

namespace Simulation
{
using Distance = Operations::difference_type;

bool Shrinker::stillFails(Operations const& operations)
{
    Ended const ended = ATTEMPT(operations, true);
    return ended.hasFailed && ended.isCrash == m_isCrash;
}

Operations Shrinker::shrink(Operations operations)
{
    m_isCrash = ATTEMPT(operations, true).isCrash;
    cutOff(operations);
    for (std::size_t size = operations.size() / 2; size > 0; size /= 2)
        removePieces(operations, size);
    for (bool isSmaller = true; isSmaller && !isOver();)
    {
        isSmaller = simplify(operations);
        isSmaller = removePieces(operations, 1) || isSmaller;
    }
    return operations;
}

/// The one that was under way when it failed is the last that matters, unless it fails at the end alone.
void Shrinker::cutOff(Operations& operations)
{
    if (!stillFails(operations))
        return;
    std::size_t const last = SHARED_REPORT().progress;
    for (std::size_t const kept : {last + 1, last + 6})
    {
        if (kept >= operations.size())
            return;
        Operations const shorter(operations.begin(), operations.begin() + static_cast<Distance>(kept));
        if (stillFails(shorter))
        {
            operations = shorter;
            return;
        }
    }
}

/// The first operation makes the world and stays.
bool Shrinker::removePieces(Operations& operations, std::size_t size)
{
    bool isSmaller = false;
    for (std::size_t place = 1; place < operations.size() && !isOver();)
    {
        Operations fewer(operations.begin(), operations.begin() + static_cast<Distance>(place));
        std::size_t const behind = std::min(place + size, operations.size());
        fewer.insert(fewer.end(), operations.begin() + static_cast<Distance>(behind), operations.end());
        if (stillFails(fewer))
        {
            operations = fewer;
            isSmaller = true;
        }
        else
            place += size;
    }
    return isSmaller;
}

bool Shrinker::simplify(Operations& operations)
{
    bool isSimpler = false;
    for (std::size_t place = 0; place < operations.size(); ++place)
        for (std::size_t argument = 0; argument < Operation::NUMBER_OF_ARGUMENTS; ++argument)
            isSimpler = simplifyArgument(operations, place, argument) || isSimpler;
    return isSimpler;
}

bool Shrinker::simplifyArgument(Operations& operations, std::size_t place, std::size_t argument)
{
    unsigned int const present = operations[place][argument];
    for (unsigned int const simpler : {0U, 1U, present % 16, present / 2, present - 1})
    {
        if (simpler >= present || isOver())
            continue;
        Operations attempt = operations;
        attempt[place].arguments[argument] = static_cast<std::uint8_t>(simpler);
        if (!stillFails(attempt))
            continue;
        operations = attempt;
        return true;
    }
    return false;
}
} // namespace Simulation
