#pragma once

#include "configuration/SocketAddress.h"

#include <functional>
#include <string>
#include <string_view>
#include <vector>

/// A small SIP user agent for tests, plain text over a UDP socket of the loopback: calls, is called, rings, answers,
/// clears, in one thread with what it talks to. It knows as much of SIP as a gateway on the same machine needs: no
/// retransmissions of its own, no routes, no authentication, no session descriptions, digits by INFO alone.
///
///     SipUserAgent agent;
///     agent.setPeer({"127.0.0.1", 5060});
///     agent.onEvent = [](SipUserAgent::Event const& event) { ... };
///     agent.call("4989123");
///     ... // whenever getDescriptor() is readable: agent.receive()
class SipUserAgent
{
public:
    struct Event
    {
        enum Kind
        {
            CALLED,  ///< an INVITE to `number`
            RINGING, ///< 180 to ours
            ANSWERED,
            DIGITS, ///< an INFO with the digit that is the `number`
            CLEARED ///< BYE, CANCEL or a final answer of 300 and above, with the cause of its Reason header; 0: none
        };
        Kind kind;
        unsigned int call; ///< 1, 2, 3 as they came up
        std::string number{};
        unsigned int cause = 0;
    };

    /// Throws std::runtime_error without a socket.
    SipUserAgent();
    ~SipUserAgent();
    SipUserAgent(SipUserAgent const&) = delete;
    SipUserAgent& operator=(SipUserAgent const&) = delete;

    /// To whom it calls, and whom alone it hears.
    void setPeer(SocketAddress const& peer) { m_peer = peer; }
    SocketAddress const& getAddress() const { return m_address; }
    int getDescriptor() const { return m_socket; }
    /// Takes what has come.
    void receive();

    void call(std::string const& number);
    // of the first call that is not over
    void ring();
    void answer();
    void clear(unsigned int cause);
    void sendDigit(char digit);

    /// From now on nothing is answered, and nothing but pongs heard.
    void goSilent() { m_isSilent = true; }
    /// Asks the peer with OPTIONS whether it is there: what it had received before it has then worked off.
    void ping();
    unsigned int getNumberOfPongs() const { return m_pongs; }
    /// Other than pongs.
    unsigned long getNumberOfMessages() const { return m_messages; }

    std::function<void(Event const&)> onEvent;

private:
    struct Call
    {
        unsigned int number;
        std::string id;
        std::string local;  // our From or To, with its tag
        std::string remote; // theirs
        std::string target; // their Contact
        std::string invite; // theirs: what our answers are made of; ours: its Via
        std::string uri;    // ours: whom we have called
        unsigned int sequence = 1;
        std::string lastAnswer{}; // to their INVITE
        bool isOurs = false;
        bool isAnswered = false;
        bool isOver = false;
    };

    void send(std::string const& text, std::string const& body = {});
    void take(std::string_view message);
    void takeRequest(std::string_view message);
    void takeInvite(std::string_view message);
    void takeCancel(std::string_view message, Call& call);
    void takeBye(std::string_view message, Call& call);
    void takeResponse(std::string_view message);
    void takeInviteResponse(std::string_view message, unsigned int status, Call& call);
    void answerInvite(Call& call, char const* status, std::string const& more = {});
    void end(Call& call, unsigned int cause);
    void request(Call const& call, char const* method, std::string const& via, unsigned int sequence,
                 std::string const& more, std::string const& body = {});
    std::string makeVia();
    Call* find(std::string_view id);
    Call* findFirst();
    void tell(Event const& event) const;

    int m_socket;
    SocketAddress m_address;
    SocketAddress m_peer;
    std::vector<Call> m_calls;
    unsigned int m_branches = 0;
    unsigned int m_pongs = 0;
    unsigned long m_messages = 0;
    bool m_isSilent = false;
};
