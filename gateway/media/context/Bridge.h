#pragma once

#include "media/mixer/Conference.h"

#include <memory>
#include <vector>

class CallRecording;
class RtpTermination;

/// A call in the datapath: the terminations of its legs, and who hears whom. Two that understand each other are
/// relayed; two that do not are transcoded, more are mixed. On the thread of its datapath loop.
class Bridge
{
public:
    Bridge();
    ~Bridge();

    /// For one more leg. Throws std::bad_alloc.
    void makeRoom() { m_legs.reserve(m_legs.size() + 1); }
    /// REQUIRES: there is room.
    void add(RtpTermination& leg);
    void remove(RtpTermination& leg);
    /// To be called when one of the legs was described anew.
    void connect();
    bool isEmpty() const { return m_legs.empty(); }
    /// From now on what is said goes there; null: nowhere. It must outlive this, or the next call.
    void setRecording(CallRecording* recording);

    /// Every 20 ms.
    void tick(long long now);

private:
    bool needsConference() const;
    void openConference();
    void openEar(RtpTermination& leg) const;
    void record();

    std::vector<RtpTermination*> m_legs;
    std::unique_ptr<Conference> m_conference; // null: all are relayed
    CallRecording* m_recording = nullptr;
};
