#pragma once

#include "Capture.h"
#include "Plan.h"
#include "Speech.h"
#include "isdn/line/IsdnSocketLine.h"

#include <sys/time.h>

extern "C"
{
#include <libpri.h>
}

#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <random>
#include <string>
#include <vector>

/// What became of the calls of an exchange.
struct Report
{
    unsigned int received = 0;
    unsigned int answered = 0;
    unsigned int placed = 0;
    unsigned int placedAnswered = 0;
    unsigned int over = 0; ///< of those placed
    unsigned int units = 0;
    unsigned long blocks = 0;           ///< of speech that were heard in calls that are over
    std::map<int, unsigned int> causes; ///< with which calls were cleared by the far side
    std::map<std::string, unsigned int> keyed;
};

/// The far side of one line, the network's or the user's: answers calls by its plan, and places its own.
///
///     Exchange exchange(std::move(wires), plan, capture, report);
///     // whenever its descriptor is readable, and every few milliseconds:
///     exchange.run(now);
class Exchange
{
public:
    Exchange(IsdnWires&& wires, Plan const& plan, Capture& capture, Report& report);
    ~Exchange();
    Exchange(Exchange const&) = delete;
    Exchange& operator=(Exchange const&) = delete;

    int getDescriptor() const { return m_line.getDescriptor(); }
    /// Takes what came and does what is due; `now` in milliseconds.
    void run(long long now);
    bool isGone() const { return !m_line.isOpen(); }

private:
    struct Call
    {
        q931_call* handle = nullptr;
        int channel = 0;
        std::string number; // that was called
        std::size_t dialled = 0;
        Plan::Subscriber const* subscriber = nullptr;
        Plan::Call const* own = nullptr;
        std::shared_ptr<Call> held{}; // that it is to be connected with
        bool isUp = false;
        bool isHeld = false;
        bool isAcknowledged = false;
        unsigned int units = 0;
        std::unique_ptr<Speech> speech;
    };
    using CallHandle = std::shared_ptr<Call>;

    static int READ(pri* stack, void* buffer, int length);
    static int WRITE(pri* stack, void* buffer, int length);
    std::vector<unsigned char> spoil(std::span<unsigned char const> frame) const;
    bool isHit(unsigned int perCent);
    void after(unsigned int milliseconds, CallHandle const& call, std::function<void(CallHandle const&)> const& work);
    void takeEvent(pri_event& event);
    CallHandle find(q931_call* handle) const;
    void onRing(pri_event_ring const& ring);
    void onAnswer(pri_event_answer const& answer);
    void onHangUp(pri_event& event);
    void consider(CallHandle const& call, bool isComplete);
    void begin(CallHandle const& call);
    void answer(CallHandle const& call);
    void speak(CallHandle const& call, std::string const& what, std::string const& file, std::string const& record);
    void hold(CallHandle const& call);
    void handOver(Call const& call);
    void park(CallHandle const& call, unsigned int milliseconds);
    void takeBack(CallHandle const& call, int channel);
    void tellTariff(Call const& call);
    void charge(CallHandle const& call);
    void chargeFinally(Call& call);
    void countSpeech(Call const& call);
    void placeWaiting();
    CallHandle place(Plan::Call const& own);
    void onHeld(CallHandle const& call);
    void dialOn(CallHandle const& call);
    int hunt() const;
    void release(CallHandle const& call, int cause);

    IsdnSocketLine m_line;
    Plan const& m_plan;
    Capture& m_capture;
    Report& m_report;
    pri* m_stack = nullptr;
    bool m_hasRead = false;
    bool m_isUp = false;
    long long m_now = 0;
    long long m_nextTick = 0;
    std::multimap<long long, std::function<void()>> m_timers;
    std::deque<Plan::Call const*> m_waiting; // that are due
    std::deque<Plan::Call> m_consultations;
    std::map<q931_call*, CallHandle> m_calls;
    std::minstd_rand m_random; // the same in each run
};
