#pragma once

#include "tests/simulation/Operation.h"

#include <string>

namespace Simulation
{
/// What is recorded of a run, in one line: how many octets of records, and a number that stands for each of them, so
/// that two runs of the same operations tell whether they were the same. What the header says of the process and of the
/// time of day is left out.
std::string RECORDS_OF(Operations const& operations);

/// What happened in a run, told even of one that crashes: while it lives, call control is recorded into a file that
/// forked processes share.
class Ladder
{
public:
    /// Records into `path`, which is taken away at the end; without it there is no ladder.
    explicit Ladder(std::string path);
    ~Ladder();
    Ladder(Ladder const&) = delete;
    Ladder& operator=(Ladder const&) = delete;

    /// The ladders of all calls.
    std::string getText() const;

private:
    std::string m_path;
};
} // namespace Simulation
