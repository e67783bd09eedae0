#pragma once

#include "configuration/AddressRange.h"
#include "sip/stack/SipTlsSettings.h"
#include "sip/stack/Sofia.h"

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <unordered_map>

struct ssl_ctx_st;
struct ssl_st;
struct tls_s;

/// TLS of one interface: its certificate, whose it takes, and what became of those who were not taken.
///
///     SipTls tls(name, settings); // throws SipTlsSettings::Failure
///     tls.attach([&] { return nta_agent_add_tport(...); });
///     tls.reload();               // for connections that come from now on
///
/// The stack has TLS, but takes the certificate under one name in one folder, knows TLS 1.0 and anonymous ciphers,
/// tells nobody why a connection ended, and never gives a connection's state back. So it is handed connections of a
/// context of ours: this module defines some of the functions that it calls, as SipGuard does. Owned by its interface,
/// which ends the agent first; belongs to the thread of the stack's loop.
class SipTls
{
public:
    struct Counters
    {
        unsigned long long established = 0; ///< connections, either way
        unsigned long long refused = 0;     ///< by us or by the other end: certificate, version, no TLS at all
    };

    /// Whether the files can be used: throws SipTlsSettings::Failure.
    static void CHECK(SipTlsSettings const& settings);

    SipTls(std::string name, SipTlsSettings settings);
    ~SipTls();
    SipTls(SipTls const&) = delete;
    SipTls& operator=(SipTls const&) = delete;

    /// The port that `open` has the stack open is ours from then on. What `open` returned; throws std::runtime_error if
    /// the stack did not ask us.
    int attach(std::function<int()> const& open);
    /// Reads the files again. What is wrong with them is told in the log, and all stays as it was.
    void reload();
    Counters const& getCounters() const { return m_counters; }

    // --- what the stack calls
    static tls_s* MAKE(tls_s* port, int descriptor, int isAccepted);
    static ssl_st* NEW_CONNECTION(ssl_ctx_st* context);
    static int CONNECT(su_root_magic_t* magic, su_wait_t* wait, tport_t* connection);
    static int GET_ERROR(tport_t const* connection, int error);
    static void FREE(tls_s* connection);

private:
    struct ContextDeleter
    {
        void operator()(ssl_ctx_st* context) const;
    };
    using Context = std::unique_ptr<ssl_ctx_st, ContextDeleter>;
    struct Connection;
    using Connections = std::unordered_map<int, Connection>; // by descriptor

    static Connections& CONNECTIONS();
    static Context LOAD(SipTlsSettings const& settings);
    static void ON_STATE(ssl_st const* connection, int where, int value);
    static SipTls* FIND(tls_s const* port);
    SipTlsSettings::Check getCheck(bool isAccepted) const;
    bool demand(Connection const& connection) const;
    void meet(Connection& connection, int descriptor, char const* host) const;
    static void RELEASE(tls_s* connection, ssl_st* ssl);
    void onEnd(Connection const& connection);
    void complain(Connection const& connection, std::string const& reason);

    std::string m_name;
    SipTlsSettings m_settings;
    Context m_context;
    tls_s* m_port = nullptr; // the stack's
    Counters m_counters;
    std::map<InternetAddress, long> m_complaints; // seconds: when each source was told of
};
