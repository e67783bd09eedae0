// Work handed to an event loop from any thread, once however often it is asked for: the call-control loop beside
// others.
#include "CallScenario.h"
#include "platform/eventloop/TYEvent.h"
#include "platform/eventloop/TYEventLoop.h"

#include <atomic>
#include <benchmark/benchmark.h>
#include <boost/asio/executor_work_guard.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/post.hpp>
#include <uv.h>

namespace
{
unsigned long s_runs = 0;

class PlatformLoop
{
public:
    PlatformLoop()
        : m_event(new TYEvent(
              m_loop, EventPrio::NORMAL, [](void*) { ++s_runs; }, nullptr))
    {
    }
    ~PlatformLoop() { m_event->destroy(); }
    PlatformLoop(PlatformLoop const&) = delete;
    PlatformLoop& operator=(PlatformLoop const&) = delete;

    void post() { MUST(m_event->setIfNotPending(), "setIfNotPending"); }
    void turn() { m_loop.runTurn(); }

protected:
    TYEventLoop m_loop;

private:
    TYEvent* m_event;
};

struct PlatformLoopInsideAnother : public PlatformLoop
{
    PlatformLoopInsideAnother() { MUST(m_loop.getPollFd() >= 0, "getPollFd"); }
};

class Libuv
{
public:
    Libuv()
    {
        MUST(uv_loop_init(&m_loop) == 0, "uv_loop_init");
        MUST(uv_async_init(&m_loop, &m_async, [](uv_async_t*) { ++s_runs; }) == 0, "uv_async_init");
    }
    ~Libuv()
    {
        uv_close(reinterpret_cast<uv_handle_t*>(&m_async), nullptr);
        turn();
        MUST(uv_loop_close(&m_loop) == 0, "uv_loop_close");
    }
    Libuv(Libuv const&) = delete;
    Libuv& operator=(Libuv const&) = delete;

    void post() { MUST(uv_async_send(&m_async) == 0, "uv_async_send"); }
    void turn() { uv_run(&m_loop, UV_RUN_NOWAIT); }

private:
    uv_loop_t m_loop;
    uv_async_t m_async;
};

class Asio
{
public:
    void post()
    {
        if (!m_isPending.exchange(true, std::memory_order_acq_rel))
            boost::asio::post(m_context, [this] { run(); });
    }
    void turn() { m_context.poll(); }

private:
    void run()
    {
        m_isPending.store(false, std::memory_order_release);
        ++s_runs;
    }

    boost::asio::io_context m_context;
    boost::asio::executor_work_guard<boost::asio::io_context::executor_type> m_work{m_context.get_executor()};
    std::atomic<bool> m_isPending{false};
};

template <class Loop, unsigned int POSTS>
void POST_AND_RUN(benchmark::State& state)
{
    Loop loop;
    s_runs = 0;
    for (auto _ : state)
    {
        for (unsigned int i = 0; i < POSTS; ++i)
            loop.post();
        loop.turn();
    }
    MUST(s_runs == static_cast<unsigned long>(state.iterations()), "running once in each turn");
}

template <class Loop>
void POST_PENDING(benchmark::State& state)
{
    Loop loop;
    s_runs = 0;
    loop.post();
    for (auto _ : state)
        loop.post();
    loop.turn();
    loop.turn();
    MUST(s_runs == 1, "running once after many posts");
}

BENCHMARK(POST_AND_RUN<PlatformLoop, 1>)->Name("Event/PostAndRun/TYEvent");
BENCHMARK(POST_AND_RUN<PlatformLoopInsideAnother, 1>)->Name("Event/PostAndRun/TYEventPollFd");
BENCHMARK(POST_AND_RUN<Libuv, 1>)->Name("Event/PostAndRun/libuv");
BENCHMARK(POST_AND_RUN<Asio, 1>)->Name("Event/PostAndRun/asio");
BENCHMARK(POST_PENDING<PlatformLoop>)->Name("Event/PostPending/TYEvent");
BENCHMARK(POST_PENDING<PlatformLoopInsideAnother>)->Name("Event/PostPending/TYEventPollFd");
BENCHMARK(POST_PENDING<Libuv>)->Name("Event/PostPending/libuv");
BENCHMARK(POST_PENDING<Asio>)->Name("Event/PostPending/asio");
BENCHMARK(POST_AND_RUN<PlatformLoop, 8>)->Name("Event/EightPostsOneRun/TYEvent");
BENCHMARK(POST_AND_RUN<PlatformLoopInsideAnother, 8>)->Name("Event/EightPostsOneRun/TYEventPollFd");
BENCHMARK(POST_AND_RUN<Libuv, 8>)->Name("Event/EightPostsOneRun/libuv");
BENCHMARK(POST_AND_RUN<Asio, 8>)->Name("Event/EightPostsOneRun/asio");
} // namespace
