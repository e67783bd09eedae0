#pragma once

#include "media/context/CallMedia.h"
#include "media/context/MediaLoop.h"
#include "media/context/MediaOptions.h"
#include "media/file/RecordingWriter.h"
#include "platform/media/MG_IContextRepository.h"

#include <random>
#include <unordered_map>

/// What the media layer's objects share: the loops, the ports, and which legs there are. It makes the contexts and
/// lives as long as one of them; closed, it does nothing any more. On the signalling thread.
class MediaCore : public MG_IContextRepository
{
public:
    MediaCore(MediaOptions const& options, TYEventLoop& signalling);

    XCode createContext(TYPtr<MG_IContext>& context) override;
    std::unique_ptr<LegMedia> createLeg(CallMedia& call, IpAddress const& local, MediaObserver& observer,
                                        CallMedia::Part part);
    std::unique_ptr<LegMedia> createChannelLeg(CallMedia& call, Descriptor&& channel, MediaObserver& observer,
                                               CallMedia::Part part);
    void remove(LegMedia const& leg);

    void start();
    /// Ends threads and loops. Legs that are still there are deaf and dumb from then on.
    void close();

    /// Null when nothing is recorded.
    RecordingWriter* getRecordings() const { return m_recordings.get(); }
    /// Does nothing after the end.
    void post(CallMedia const& call, MediaOrder::Any&& order);
    MediaLoop& getLoop(unsigned int index) const { return *m_loops[index]; }
    /// Null after the end.
    MediaLoop* getLoopOf(CallMedia const& call) const;

private:
    RtpTermination::Seed makeSeed();
    std::unique_ptr<RtpTermination> createTermination(unsigned long long number, RtpPorts&& ports);
    void record(CallMedia& call);
    void onNews();
    void take(MediaNews const& news);
    static void tellDigit(LegMedia& leg, MediaNews const& news);

    MediaOptions m_options;
    std::unique_ptr<Mailbox<MediaNews>> m_news; // before the loops, who post to it; null after the end
    ToneTable m_tones;
    std::unique_ptr<RecordingWriter> m_recordings;
    std::string m_recordingsPrefix; // of their paths: the folder, and when the process began
    std::vector<std::unique_ptr<MediaLoop>> m_loops;
    unsigned int m_nextLoop = 0;
    RtpPortRange m_ports;
    std::mt19937_64 m_random;
    std::unordered_map<unsigned long long, LegMedia*> m_legs;
};
