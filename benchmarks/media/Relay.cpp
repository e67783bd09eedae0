// The media layer as a relay, for comparison.
//
// Reads lines "far-port-a far-port-b", writes for each "own-port-a own-port-b", then "ready"; relays A-law between the
// two. All on 127.0.0.1. SIGTERM: writes "allocations N packets N news N" of the time since "ready", and ends. News,
// which are what signalling is told (quality every five seconds and leg), take memory; packets do not.
#include "media/context/CallMedia.h"
#include "media/context/MediaLayer.h"
#include "platform/eventloop/TYEventLoop.h"

#include <atomic>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <new>
#include <poll.h>
#include <sys/signalfd.h>
#include <vector>

namespace
{
std::atomic<unsigned long long> s_allocations{0};

struct Side : MediaObserver
{
    void onQuality(MediaQuality const&) override { ++s_news; }

    std::unique_ptr<LegMedia> leg;
    static unsigned long long s_news;
};
unsigned long long Side::s_news = 0;

MediaDescription DESCRIBE(unsigned int port)
{
    MediaDescription description;
    description.rtp = MediaAddress::OF("127.0.0.1", static_cast<unsigned short>(port));
    description.formats.add({VoipCodec(MG_Rtp::ECodec::PCMA, 20), {8, 8}});
    return description;
}

void CONNECT(CallMedia& call, Side& side, unsigned int port)
{
    side.leg = call.addLeg(MediaAddress::OF("127.0.0.1", 1).host, side);
    if (side.leg == nullptr)
        std::abort();
    side.leg->describe(DESCRIBE(port));
}

/// Runs the loop until SIGTERM.
void RUN(TYEventLoop& loop, int signals)
{
    pollfd descriptors[2] = {{loop.getPollFd(), POLLIN, 0}, {signals, POLLIN, 0}};
    while (poll(descriptors, 2, -1) < 0 || (descriptors[1].revents & POLLIN) == 0)
        loop.runTurn();
}
} // namespace

void* operator new(std::size_t size)
{
    s_allocations.fetch_add(1, std::memory_order_relaxed);
    if (void* const memory = std::malloc(size))
        return memory;
    throw std::bad_alloc();
}
void* operator new(std::size_t size, std::nothrow_t const&) noexcept
{
    s_allocations.fetch_add(1, std::memory_order_relaxed);
    return std::malloc(size);
}
void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }

int main()
{
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGTERM);
    sigprocmask(SIG_BLOCK, &signals, nullptr);

    TYEventLoop signalling;
    MediaOptions options;
    options.firstPort = 20000;
    options.lastPort = 29999;
    MediaLayer layer(options, signalling);
    layer.start();
    std::vector<std::unique_ptr<Side>> sides;
    unsigned int a = 0;
    unsigned int b = 0;
    while (std::scanf("%u %u", &a, &b) == 2)
    {
        TYPtr<MG_IContext> context;
        std::ignore = layer.getContexts()->createContext(context); // without one the next line ends the program
        for (unsigned int const port : {a, b})
        {
            sides.push_back(std::make_unique<Side>());
            CONNECT(*CallMedia::OF(context.get()), *sides.back(), port);
        }
        std::printf("%u %u\n", sides[sides.size() - 2]->leg->getLocalRtp().port, sides.back()->leg->getLocalRtp().port);
    }
    std::puts("ready");
    std::fflush(stdout);
    unsigned long long const before = s_allocations;
    RUN(signalling, signalfd(-1, &signals, 0));
    unsigned long long const allocations = s_allocations - before;
    unsigned long long packets = 0;
    for (std::unique_ptr<Side> const& side : sides)
        packets += side->leg->getQuality().receivedPackets;
    std::printf("allocations %llu packets %llu news %llu\n", allocations, packets, Side::s_news);
    sides.clear();
}
