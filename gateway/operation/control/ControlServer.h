#pragma once

#include "host/SignallingLoop.h"
#include "operation/control/ControlAnswer.h"
#include "operation/control/ControlRequest.h"
#include "operation/control/ControlSocket.h"
#include "platform/eventloop/TYTimer.h"

#include <list>
#include <string>
#include <string_view>
#include <sys/types.h>

/// Who answers what operators ask.
class ControlHandler
{
public:
    virtual ~ControlHandler() = default;

    /// Whether the answer may be long, or takes long to be made: then it is made in a copy of the process, which can
    /// change nothing here.
    virtual bool isLong(ControlRequest const& request) const = 0;
    virtual ControlAnswer answer(ControlRequest const& request, std::string const& user) = 0;
};

/// Serves operators' tools on a local socket: one request a line, one answer after the other.
///
/// Costs the loop nothing but the making of short answers. Whatever a client does, it holds at most one line of it, and
/// what it does not read lies in the system's buffer or in the copy that tells it: a client whose buffer is full
/// when a short answer comes is closed, and so is one that has asked nothing for some time. If all places are taken,
/// the client that has been silent for longest gives way. On the loop's thread; `onChild` must be called upon SIGCHLD.
class ControlServer
{
public:
    static constexpr std::size_t LONGEST_LINE = 1024; ///< octets
    static constexpr unsigned int MOST_COPIES = 4;    ///< at work at once; more requests are refused

    /// Throws std::runtime_error when the socket cannot be had. `timers`: a loop of the same thread.
    ControlServer(ControlOptions const& options, SignallingLoop& loop, TYEventLoop& timers, ControlHandler& handler);
    ~ControlServer();
    ControlServer(ControlServer const&) = delete;
    ControlServer& operator=(ControlServer const&) = delete;

    void onChild();

private:
    struct Client
    {
        Client(int client, TYEventLoop& timers, ControlServer& owner);
        ~Client();
        Client(Client const&) = delete;
        Client& operator=(Client const&) = delete;

        int descriptor;
        ControlServer& server;
        TYTimer idle;
        std::string input;
        pid_t copy = 0; // that tells it an answer
        bool isOver = false;
    };
    using Clients = std::list<Client>;

    void onConnection();
    void makeRoom();
    void onReadable(Client& client);
    void serve(Client& client, std::string_view more);
    void serveLines(Client& client);
    void serveLine(Client& client, std::string const& line);
    void answerLater(Client& client, ControlRequest const& request, std::string const& user);
    void send(Client& client, std::string const& text);
    void listenTo(Client& client);
    void close(Client& client);
    unsigned int countCopies() const;
    static void ON_IDLE(void* client);

    ControlOptions m_options;
    SignallingLoop& m_loop;
    TYEventLoop& m_timers;
    ControlHandler& m_handler;
    ControlSocket m_socket;
    Clients m_clients; // who has been silent for longest first
};
