#pragma once

#include "configuration/SocketAddress.h"
#include "operation/http/HttpRequest.h"

#include <atomic>
#include <chrono>
#include <functional>
#include <list>
#include <map>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <thread>

class SignallingLoop;

/// Where contents come from that neither lie ready nor are made on the loop. On the server's thread.
class HttpRelay
{
public:
    virtual ~HttpRelay() = default;
    /// A descriptor of the server's from then on, not blocking, from which the contents come; below 0: `refusal` is the
    /// status of the answer.
    virtual int open(HttpRequest const& request, unsigned int& refusal) = 0;
    /// The answer, once all of it has come; `isEnd`: no more comes.
    virtual std::optional<HttpAnswer> read(std::string_view come, bool isEnd) = 0;
};

/// What a server has.
struct HttpContents
{
    std::map<std::string, std::function<HttpAnswer()>> pages; ///< by path; made on the loop's thread
    std::map<std::string, HttpAnswer> files = {};             ///< by path; as they are
    HttpRelay* relay = nullptr;                               ///< of all other paths; outlives the server; null: none
};

/// Gives out pages by HTTP/1.1, each connection one.
///
/// A thread of its own has the connections, so whatever a client does costs the loop nothing; only what is on a page is
/// made on the loop's thread, at most ten times a second, however many ask. A client has so long for its request, and
/// so long to take the answer. If all places are taken, who has not asked yet for longest gives way. If the loop does
/// not turn, the answer is 503.
///
///     HttpServer server(address, loop, {{{"/metrics", [this] { return HttpAnswer{200, getText()}; }}}});
class HttpServer
{
public:
    using Milliseconds = std::chrono::milliseconds;

    static constexpr std::size_t MOST_CLIENTS = 32;
    static constexpr std::size_t LONGEST_REQUEST = 8192; ///< octets
    static constexpr std::size_t LONGEST_RELAYED = 1 << 24;
    static constexpr Milliseconds PATIENCE{5000};
    static constexpr Milliseconds FRESHNESS{100}; ///< for so long what is on a page is not made again

    /// Throws std::runtime_error with the reason when the address cannot be had. The loop outlives this; both are of
    /// the calling thread.
    HttpServer(SocketAddress const& listen, SignallingLoop& loop, HttpContents contents,
               Milliseconds patience = PATIENCE);
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
        WAITING,    ///< for the loop
        COLLECTING, ///< what is relayed
        WRITING,
        CLOSING, ///< until it has heard all: an end of ours before it has told all would take the answer away
        OVER
    };

    struct Client
    {
        Client(int client, Clock::time_point until) : descriptor(client), deadline(until) {}

        Descriptor descriptor;
        std::optional<Descriptor> source{}; // of what is relayed
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
    void collect(Client& client);
    void answer(Client& client, HttpAnswer const& answer);
    void send(Client& client);
    void expire(Client& client);
    int getTimeout() const;

    HttpContents m_contents;
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
