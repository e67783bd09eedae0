#pragma once

#include "host/SignallingLoop.h"
#include "isdn/line/IsdnLine.h"
#include "isdn/link/IsdnTimers.h"
#include "isdn/link/IsdnWindow.h"
#include "isdn/link/LibPri.h"
#include "platform/eventloop/TYTimer.h"

class TYEventLoop;

/// What a link tells the one whose calls it carries, on the signalling thread.
class IsdnLinkObserver
{
public:
    /// Layer 2 was established, or is no more: calls that are not up have ended by then, each with an event of its own.
    virtual void onLinkChange(bool isUp) = 0;
    /// Another line has taken the place of one that was lost: no B channel of before leads anywhere, and who is at the
    /// far end may know nothing of the calls. The stack may not even have noticed.
    virtual void onNewLine() {}
    /// The far side has acknowledged all that was sent, or is gone.
    virtual void onLinkQuiet() {}
    /// What the far side said, or a timer. The event is the stack's and holds until that is asked for anything.
    virtual void onLinkEvent(pri_event& event) = 0;

protected:
    ~IsdnLinkObserver() = default;
};

/// The signalling of one primary-rate line: Q.921 and Q.931 for EuroISDN (EN 300 403), point to point, on the packaged
/// stack, whose timers run on the event loop. It opens its line, and opens it again when the far end has gone.
///
/// Belongs to the signalling thread; line, loop, watch and observer must outlive it. The stack cannot give up a D
/// channel once made, so what it has of a link stays for the process's life.
///
///     IsdnLink link(line, {.isNetwork = false}, loop, watch, observer);
///     link.open();
///     link.ask([&](pri* stack) { return pri_setup(stack, call, request); });
class IsdnLink
{
public:
    struct Options
    {
        bool isNetwork = false;
        bool isOverlap = true; ///< numbers may come and go digit by digit
        IsdnTimers timers{};
    };

    /// Throws std::bad_alloc.
    IsdnLink(IsdnLine& line, Options const& options, TYEventLoop& loop, SignallingLoop& watch,
             IsdnLinkObserver& observer);
    ~IsdnLink();
    IsdnLink(IsdnLink const&) = delete;
    IsdnLink& operator=(IsdnLink const&) = delete;

    /// Opens the line, now or as soon as it can be opened.
    void open();
    /// Whether the far side can be reached.
    bool isUp() const { return m_isUp && m_line.isOpen(); }
    /// Whether the far side has all that it was told, or cannot be told.
    bool isQuiet() const { return !isUp() || m_window.isClear(); }
    bool isNetwork() const { return m_options.isNetwork; }
    IsdnTimers const& getTimers() const { return m_options.timers; }
    IsdnLine& getLine() const { return m_line; }

    /// Asks something of the stack, which is null until the line was open once, and has its timers run: what the work
    /// returns.
    template <class Work>
    auto ask(Work const& work)
    {
        Rearm const rearm{*this};
        return work(m_stack);
    }

private:
    struct Rearm
    {
        IsdnLink& link;
        ~Rearm() { link.startTimer(); }
    };

    static int READ(pri* stack, void* buffer, int length);
    static int WRITE(pri* stack, void* buffer, int length);
    static void ON_TIMER(void* link);
    static void ON_REOPENING(void* link);
    bool makeStack();
    void setTimers();
    void onReadable();
    void closeLine();
    void runTimers();
    void startTimer();
    void take(pri_event& event);
    void tellIfQuiet();

    IsdnLine& m_line;
    Options m_options;
    SignallingLoop& m_watch;
    IsdnLinkObserver& m_observer;
    pri* m_stack = nullptr; // none before the line was open once
    bool m_isUp = false;
    bool m_isWatched = false; // the line
    bool m_hasRead = false;   // the stack says nothing of a frame that is no event
    IsdnWindow m_window;
    bool m_wasQuiet = true;
    TYTimer m_timer;
    TYTimer m_reopening;
};
