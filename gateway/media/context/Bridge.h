#pragma once

#include <cstddef>
#include <vector>

class RtpTermination;

/// A call in the datapath: the terminations of its legs, and who hears whom. On the thread of its datapath loop.
class Bridge
{
public:
    void add(RtpTermination& leg);
    void remove(RtpTermination& leg);
    bool isEmpty() const { return m_legs.empty(); }

    /// Every 20 ms.
    void tick(long long now);

private:
    void connect();

    std::vector<RtpTermination*> m_legs;
};
