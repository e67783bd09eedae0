#pragma once

#include "configuration/SocketAddress.h"
#include "operation/http/HttpRequest.h"

#include <atomic>
#include <chrono>
#include <functional>
#include <list>
#include <map>
#include <mutex>
#include <set>
#include <string>
#include <thread>

class SignallingLoop;

/// Gives out a few pages by HTTP/1.1, each connection one.
///
/// A thread of its own has the connections, so whatever a client does costs the loop nothing; only what is on a page is
/// made on the loop's thread, at most ten times a second, however many ask. A client has so long for its request, and
/// so long to take the answer. If all places are taken, who has not asked yet for longest gives way. If the loop does
/// not turn, the answer is 503.
///
///     HttpServer server(address, loop, {{"/metrics", [this] { return HttpAnswer{200, getText()}; }}});
class HttpServer
{
public:
    using Pages = std::map<std::string, std::function<HttpAnswer()>>; ///< by path
    using Milliseconds = std::chrono::milliseconds;

    static constexpr std::size_t MOST_CLIENTS = 32;
    static constexpr std::size_t LONGEST_REQUEST = 8192; ///< octets
    static constexpr Milliseconds PATIENCE{5000};
    static constexpr Milliseconds FRESHNESS{100}; ///< for so long what is on a page is not made again

    /// Throws std::runtime_error with the reason when the address cannot be had. The loop outlives this; both are of
    /// the calling thread.
    HttpServer(SocketAddress const& listen, SignallingLoop& loop, Pages pages, Milliseconds patience = PATIENCE);
    ~HttpServer();
    HttpServer(HttpServer const&) = delete;
    HttpServer& operator=(HttpServer const&) = delete;

private:
    using Clock = std::chrono::steady_clock;

    /// A descriptor of ours; throws std::runtime_error for none.
    class Descriptor
    {
    public:
        explicit Descriptor(int descriptor);
        ~Descriptor();
        Descriptor(Descriptor const&) = delete;
        Descriptor& operator=(Descriptor const&) = delete;
        int get() const { return m_descriptor; }

    private:
        int m_descriptor;
    };

    enum class State
    {
        READING,
        WAITING, ///< for the loop
        WRITING,
        CLOSING, ///< until it has heard all: an end of ours before it has told all would take the answer away
        OVER
    };

    struct Client
    {
        Client(int client, Clock::time_point until) : descriptor(client), deadline(until) {}

        Descriptor descriptor;
        Clock::time_point deadline;
        State state = State::READING;
        std::string text; ///< of the request, then of the answer as far as it is not sent
        HttpRequest request{};
        Clock::time_point asked{};
    };

    struct Made
    {
        HttpAnswer answer;
        Clock::time_point time{};
    };

    // --- on the loop's thread
    void onAsked();
    // --- on the other one
    void run();
    void runTurn();
    void accept();
    void makeRoom();
    void onEvent(Client& client);
    void receive(Client& client);
    void begin(Client& client);
    void ask(Client& client);
    void answer(Client& client, HttpAnswer const& answer);
    void send(Client& client);
    void expire(Client& client);
    int getTimeout() const;

    Pages m_pages;
    SignallingLoop& m_loop;
    Milliseconds m_patience;
    Descriptor m_listening;
    Descriptor m_asked; // wakes the loop
    Descriptor m_wake;  // wakes the thread
    std::mutex m_mutex;
    std::set<std::string> m_wanted;     // pages that the loop is to make; the mutex's
    std::map<std::string, Made> m_made; // the mutex's
    std::list<Client> m_clients;        // the latest last
    Clock::time_point m_restingUntil{}; // no connection is taken before
    std::atomic<bool> m_isEnding = false;
    std::thread m_thread;
};
