#pragma once

#include <string>

namespace Simulation
{
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
