#pragma once

#include "media/context/Bridge.h"
#include "media/context/Mailbox.h"
#include "media/context/MediaValues.h"
#include "media/rtp/DatagramBatch.h"
#include "media/rtp/RtpTermination.h"
#include "media/tone/ToneTable.h"
#include "platform/eventloop/TYTimer.h"

#include <thread>
#include <unordered_map>

/// What a datapath loop did, since it was made.
struct MediaLoopCounters
{
    unsigned long long turns = 0;        ///< that had anything to do
    unsigned long long skippedTicks = 0; ///< of 20 ms that came too late to be made up for
    unsigned long long failures = 0;     ///< orders and ticks that found no memory
};

/// One thread of the datapath: the sockets and the 20 ms clock of the calls that belong to it. Nothing on a packet's
/// way takes a lock or memory.
///
/// Made and ended on the signalling thread, between `start()` and `stop()` at work on its own; a loop that was not
/// started is turned by hand.
class MediaLoop final : private RtpTerminationObserver
{
public:
    /// `news`: where what the legs have to tell is posted. It and the tones must outlive the loop. Throws
    /// std::runtime_error when the system refuses.
    MediaLoop(Mailbox<MediaNews>& news, ToneTable const& tones);
    ~MediaLoop();
    MediaLoop(MediaLoop const&) = delete;
    MediaLoop& operator=(MediaLoop const&) = delete;

    void start();
    void stop();

    /// From any thread. Whether there was memory for it.
    bool post(MediaOrder::Any&& order);
    /// For call control; it turns with this one.
    TYEventLoop& getEvents() { return m_events; }

    /// Waits for at most so many milliseconds (-1: as long as it takes) and does what is to do: whether there was
    /// anything.
    bool turn(int milliseconds);

    MediaLoopCounters const& getCounters() const { return m_counters; }
    std::size_t getNumberOfLegs() const { return m_legs.size(); }

    static constexpr unsigned int TICK = 20; ///< milliseconds
    static constexpr unsigned int MOST_LATE_TICKS = 3;

private:
    struct Socket
    {
        RtpTermination* leg; // null: the events'
        bool isRtcp;
    };
    struct Leg
    {
        std::unique_ptr<RtpTermination> termination;
        Bridge* bridge = nullptr;
        unsigned long long call = 0;
        Socket sockets[2];
    };

    void run();
    bool watch(int descriptor, Socket& socket);
    void onReadable(Socket const& socket);
    void takeOrders();
    void take(MediaOrder::Any& order);
    void obey(MediaOrder::Make& order);
    void obey(MediaOrder::Describe& order);
    void obey(MediaOrder::Connect& order);
    void obey(MediaOrder::Expect& order);
    void obey(MediaOrder::HandOver& order);
    void obey(MediaOrder::Tone& order);
    void obey(MediaOrder::Play& order);
    void obey(MediaOrder::Detect& order);
    void obey(MediaOrder::Digit& order);
    void obey(MediaOrder::Aside& order);
    void obey(MediaOrder::Ask& order);
    void obey(MediaOrder::End& order);
    void obey(MediaOrder::Record& order);
    void obey(MediaOrder::Stop& order);
    Leg* find(unsigned long long leg);
    void join(Leg& leg, unsigned long long call);
    void leave(Leg& leg);
    std::unique_ptr<RtpTermination> remove(unsigned long long leg);
    void startClock();
    void onClock();
    void tick();
    void tick(Bridge& bridge);
    void attend();
    void readTime();

    void onDigit(RtpTermination const& leg, HeardDigit const& heard) override;
    void onSilence(RtpTermination const& leg, unsigned int seconds) override;
    void onSpeech(RtpTermination const& leg) override;
    void onQuality(RtpTermination& leg) override;
    void onReport(RtpTermination const& leg, MediaReport const& report) override;
    void tell(MediaNews const& news);

    Mailbox<MediaNews>& m_news;
    ToneTable const& m_tones;
    TYEventLoop m_events;
    Mailbox<MediaOrder::Any> m_orders;
    TYTimer m_clock;
    Descriptor m_epoll;
    Socket m_eventsSocket{nullptr, false};
    long long m_now = 0;
    long long m_nextTick = 0;
    unsigned long long m_ticks = 0;
    bool m_isStopping = false;
    bool m_isClosed = false; // orders are passed over
    std::unordered_map<unsigned long long, Leg> m_legs;
    std::unordered_map<unsigned long long, std::vector<MediaOrder::Any>> m_expected;     // with what waits for each
    std::unordered_map<unsigned long long, std::shared_ptr<CallRecording>> m_recordings; // by their calls
    std::unordered_map<unsigned long long, Bridge> m_bridges;                            // the same
    MediaLoopCounters m_counters;
    DatagramBatch m_batch;
    std::thread m_thread;
};
