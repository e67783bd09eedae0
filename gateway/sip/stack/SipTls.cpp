#include "sip/stack/SipTls.h"

#include "platform/base/TYTime.h"
#include "sip/stack/StackFunction.h"

#include <openssl/err.h>
#include <openssl/ssl.h>
#include <openssl/x509v3.h>
#include <spdlog/spdlog.h>

#include <algorithm>
#include <arpa/inet.h>
#include <cerrno>
#include <netdb.h>
#include <new>
#include <sys/socket.h>
#include <sys/stat.h>
#include <unistd.h>
#include <unordered_map>
#include <utility>
#include <vector>

/// A connection of the stack, from its making to its end.
struct SipTls::Connection
{
    SipTls* owner;
    SSL* ssl;
    bool isAccepted;
    bool isMet = false; ///< the other end's address is known
    bool isUp = false;
    InternetAddress source = {};
    char address[NI_MAXHOST] = ""; ///< the same as text
    int alert = 0;                 ///< that ended it; 0: none, of an end that was wanted
    bool isAlertOurs = false;
};

namespace
{
constexpr long BETWEEN_COMPLAINTS = 60;       // seconds
constexpr std::size_t MOST_COMPLAINTS = 1000; // sources that are remembered
constexpr int SECURITY = 2;                   // RSA of 2048 bits at least, and so on
constexpr int OURS = 0;                       // place of our data at a connection: what the library keeps for its user
constexpr unsigned char NOBODY[4] = {};       // an address that no certificate is of

std::vector<SipTls*> s_all;
tls_s* s_port = nullptr; // that the stack has opened last
tport_t const* s_connecting = nullptr;
SSL_CTX* s_making = nullptr;
SSL* s_made = nullptr;

std::string REASON()
{
    char const* const reason = ERR_reason_error_string(ERR_peek_error());
    return reason != nullptr ? reason : "";
}

[[noreturn]] void FAIL(char const* key, std::string const& file, char const* what)
{
    std::string const reason = REASON();
    ERR_clear_error();
    throw SipTlsSettings::Failure(key, file + ": " + what + (reason.empty() ? "" : ": " + reason));
}

/// What the library says of a file that is not there is of little use.
void CHECK_FILE(char const* key, std::string const& file, mode_t forbidden)
{
    struct stat status = {};
    if (access(file.c_str(), R_OK) != 0 || stat(file.c_str(), &status) != 0)
        FAIL(key, file, "cannot be read");
    if (!S_ISREG(status.st_mode))
        FAIL(key, file, "is no file");
    if ((status.st_mode & forbidden) != 0)
        FAIL(key, file, "everybody may read or change it");
}

/// Nobody is there to be asked.
int NO_PASSPHRASE(char*, int, int, void*) { return -1; }

void LOAD_OWN(SSL_CTX* context, SipTlsSettings const& settings)
{
    CHECK_FILE("tls-certificate", settings.certificate, 0);
    if (SSL_CTX_use_certificate_chain_file(context, settings.certificate.c_str()) != 1)
        FAIL("tls-certificate", settings.certificate, "has no certificate that can be used");
    CHECK_FILE("tls-key", settings.key, S_IRWXO);
    SSL_CTX_set_default_passwd_cb(context, NO_PASSPHRASE);
    if (SSL_CTX_use_PrivateKey_file(context, settings.key.c_str(), SSL_FILETYPE_PEM) != 1 ||
        SSL_CTX_check_private_key(context) != 1)
        FAIL("tls-key", settings.key, "has no key for the certificate");
}

void LOAD_AUTHORITIES(SSL_CTX* context, SipTlsSettings const& settings)
{
    if (settings.authorities.empty())
        return;
    CHECK_FILE("tls-authorities", settings.authorities, 0);
    if (SSL_CTX_load_verify_file(context, settings.authorities.c_str()) != 1)
        FAIL("tls-authorities", settings.authorities, "has no certificates that can be used");
    SSL_CTX_set_client_CA_list(context, SSL_load_client_CA_file(settings.authorities.c_str()));
}

bool IS_ADDRESS(char const* host)
{
    in6_addr unused;
    return host[0] == '[' || inet_pton(AF_INET, host, &unused) == 1 || inet_pton(AF_INET6, host, &unused) == 1;
}
} // namespace

// --- the context -----------------------------------------------------------------------------------------------------

void SipTls::ContextDeleter::operator()(ssl_ctx_st* context) const { SSL_CTX_free(context); }

/// Without tickets and sessions that are taken up again: who was taken once is looked at again each time.
SipTls::Context SipTls::LOAD(SipTlsSettings const& settings)
{
    Context context(SSL_CTX_new(TLS_method()));
    if (context == nullptr)
        throw std::bad_alloc();
    SSL_CTX* const c = context.get();
    SSL_CTX_set_security_level(c, SECURITY);
    SSL_CTX_set_min_proto_version(c, settings.isLeast13 ? TLS1_3_VERSION : TLS1_2_VERSION);
    SSL_CTX_set_max_proto_version(c, 0);
    SSL_CTX_set_options(c, SSL_OP_NO_RENEGOTIATION | SSL_OP_NO_TICKET | SSL_OP_NO_COMPRESSION);
    SSL_CTX_set_session_cache_mode(c, SSL_SESS_CACHE_OFF);
    SSL_CTX_set_num_tickets(c, 0);
    SSL_CTX_set_mode(c, SSL_MODE_RELEASE_BUFFERS);
    SSL_CTX_set_info_callback(c, ON_STATE);
    LOAD_OWN(c, settings);
    LOAD_AUTHORITIES(c, settings);
    return context;
}

void SipTls::CHECK(SipTlsSettings const& settings) { LOAD(settings); }

SipTls::SipTls(std::string name, SipTlsSettings settings)
    : m_name(std::move(name)), m_settings(std::move(settings)), m_context(LOAD(m_settings))
{
    s_all.push_back(this);
}

SipTls::~SipTls() { std::erase(s_all, this); }

int SipTls::attach(std::function<int()> const& open)
{
    s_port = nullptr;
    int const result = open();
    m_port = std::exchange(s_port, nullptr);
    if (result >= 0 && m_port == nullptr)
        throw std::runtime_error("the SIP stack does not ask for a context of TLS");
    return result;
}

void SipTls::reload()
try
{
    m_context = LOAD(m_settings);
    spdlog::info("interface {}: the certificate of {} is read again", m_name, m_settings.certificate);
}
catch (SipTlsSettings::Failure const& error)
{
    spdlog::error("interface {}: the certificate stays as it was: {}: {}", m_name, error.key, error.what());
}
catch (std::bad_alloc const&)
{
    spdlog::error("interface {}: the certificate stays as it was: no memory", m_name);
}

SipTls* SipTls::FIND(tls_s const* port)
{
    auto const found = std::find_if(s_all.begin(), s_all.end(), [&](SipTls* tls) { return tls->m_port == port; });
    return found != s_all.end() ? *found : nullptr;
}

// --- a connection ----------------------------------------------------------------------------------------------------

SipTls::Connections& SipTls::CONNECTIONS()
{
    static Connections s_connections;
    return s_connections;
}

SipTlsSettings::Check SipTls::getCheck(bool isAccepted) const
{
    return isAccepted ? m_settings.ofClients : m_settings.ofServers;
}

/// As long as the other end's address is not known no certificate is of it.
bool SipTls::demand(Connection const& connection) const
{
    SipTlsSettings::Check const check = getCheck(connection.isAccepted);
    bool const isOff = check == SipTlsSettings::OFF;
    SSL_set_verify(connection.ssl, isOff ? SSL_VERIFY_NONE : SSL_VERIFY_PEER | SSL_VERIFY_FAIL_IF_NO_PEER_CERT,
                   nullptr);
    if (check != SipTlsSettings::NAME)
        return true;
    X509_VERIFY_PARAM* const demands = SSL_get0_param(connection.ssl);
    X509_VERIFY_PARAM_set_hostflags(demands, X509_CHECK_FLAG_NO_PARTIAL_WILDCARDS);
    for (std::string const& name : m_settings.names)
        if (X509_VERIFY_PARAM_add1_host(demands, name.c_str(), name.size()) != 1)
            return false;
    return !m_settings.names.empty() || X509_VERIFY_PARAM_set1_ip(demands, NOBODY, sizeof NOBODY) == 1;
}

tls_s* SipTls::MAKE(tls_s* port, int descriptor, int isAccepted)
{
    static auto* const s_original = STACK_FUNCTION<tls_s*(tls_s*, int, int)>("tls_init_secondary");
    SipTls* const owner = FIND(port);
    s_making = owner != nullptr ? owner->m_context.get() : nullptr;
    s_made = nullptr;
    tls_s* const made = s_original(port, descriptor, isAccepted);
    s_making = nullptr;
    SSL* const ssl = std::exchange(s_made, nullptr);
    if (made == nullptr || owner == nullptr || ssl == nullptr)
        return made;
    try
    {
        Connection& connection = CONNECTIONS()[descriptor] = Connection{owner, ssl, isAccepted != 0};
        SSL_set_ex_data(ssl, OURS, &connection);
        if (owner->demand(connection))
            return made;
    }
    catch (std::bad_alloc const&)
    {
        SSL_set_ex_data(ssl, OURS, nullptr);
    }
    CONNECTIONS().erase(descriptor);
    RELEASE(made, ssl);
    return nullptr;
}

/// With each of its connections the stack gives back its context, too, as if it had been the connection's own.
SSL* SipTls::NEW_CONNECTION(SSL_CTX* context)
{
    static auto* const s_original = STACK_FUNCTION<SSL*(SSL_CTX*)>("SSL_new");
    if (s_making == nullptr)
        return s_original(context);
    s_made = s_original(s_making);
    if (s_made != nullptr)
        SSL_CTX_up_ref(context);
    return s_made;
}

/// The stack leaves behind what a connection has failed with, and the library would then take it for the failure of
/// another one.
int SipTls::CONNECT(su_root_magic_t* magic, su_wait_t* wait, tport_t* connection)
{
    static auto* const s_original = STACK_FUNCTION<int(su_root_magic_t*, su_wait_t*, tport_t*)>("tls_connect");
    ERR_clear_error();
    auto const found = CONNECTIONS().find(wait->fd);
    if (found != CONNECTIONS().end() && !found->second.isMet)
        found->second.owner->meet(found->second, wait->fd, tport_name(connection)->tpn_canon);
    s_connecting = connection;
    int const result = s_original(magic, wait, connection);
    s_connecting = nullptr;
    ERR_clear_error();
    return result;
}

/// Requests that wait for a connection would wait for half a minute more when it ends before it is up.
int SipTls::GET_ERROR(tport_t const* connection, int error)
{
    return error < 0 && connection == s_connecting ? EPROTO : error;
}

/// Now it is known who the other end is.
void SipTls::meet(Connection& connection, int descriptor, char const* host) const
{
    sockaddr_storage storage = {};
    socklen_t length = sizeof storage;
    auto* const address = reinterpret_cast<sockaddr*>(&storage);
    char* const text = connection.address;
    if (getpeername(descriptor, address, &length) != 0 ||
        getnameinfo(address, length, text, sizeof connection.address, nullptr, 0, NI_NUMERICHOST) != 0)
        return; // there is none yet
    connection.isMet = true;
    connection.source = AddressRange::ADDRESS_OF(*address);
    if (!connection.isAccepted && host != nullptr && !IS_ADDRESS(host))
        SSL_ctrl(connection.ssl, SSL_CTRL_SET_TLSEXT_HOSTNAME, TLSEXT_NAMETYPE_host_name, const_cast<char*>(host));
    if (getCheck(connection.isAccepted) == SipTlsSettings::NAME && m_settings.names.empty())
        X509_VERIFY_PARAM_set1_ip_asc(SSL_get0_param(connection.ssl), text);
}

void SipTls::FREE(tls_s* connection)
{
    static auto* const s_socketOf = STACK_FUNCTION<int(tls_s*)>("tls_get_socket");
    static auto* const s_original = STACK_FUNCTION<void(tls_s*)>("tls_free");
    auto const found = connection != nullptr ? CONNECTIONS().find(s_socketOf(connection)) : CONNECTIONS().end();
    if (found == CONNECTIONS().end())
    {
        s_original(connection);
        return;
    }
    found->second.owner->onEnd(found->second);
    SSL* const ssl = found->second.ssl;
    SSL_set_ex_data(ssl, OURS, nullptr);
    CONNECTIONS().erase(found);
    RELEASE(connection, ssl);
}

/// The stack gives back what the connection reads from, and neither the connection nor what it has of that.
void SipTls::RELEASE(tls_s* connection, SSL* ssl)
{
    static auto* const s_original = STACK_FUNCTION<void(tls_s*)>("tls_free");
    BIO_up_ref(SSL_get_rbio(ssl));
    s_original(connection);
    SSL_free(ssl);
    ERR_clear_error();
}

// --- what becomes of it ----------------------------------------------------------------------------------------------

void SipTls::ON_STATE(SSL const* ssl, int where, int value)
{
    auto* const connection = static_cast<Connection*>(SSL_get_ex_data(ssl, OURS));
    if (connection == nullptr)
        return;
    if ((where & SSL_CB_HANDSHAKE_DONE) != 0 && !std::exchange(connection->isUp, true))
        ++connection->owner->m_counters.established;
    if ((where & SSL_CB_ALERT) == 0 || (value >> 8) != SSL3_AL_FATAL)
        return;
    connection->alert = value & 0xff;
    connection->isAlertOurs = (where & SSL_CB_WRITE) != 0;
}

/// With TLS 1.3 our certificate may be refused when the connection is up for us.
void SipTls::onEnd(Connection const& connection)
try
{
    if (!connection.isMet || (connection.isUp && connection.alert == 0))
        return;
    ++m_counters.refused;
    long const verified = SSL_get_verify_result(connection.ssl);
    if (connection.alert != 0 && !connection.isAlertOurs)
        complain(connection, fmt::format("it says '{}'", SSL_alert_desc_string_long(connection.alert)));
    else if (verified != X509_V_OK && getCheck(connection.isAccepted) != SipTlsSettings::OFF)
        complain(connection, fmt::format("its certificate: {}", X509_verify_cert_error_string(verified)));
    else if (std::string const reason = REASON(); !reason.empty())
        complain(connection, reason);
    else
        complain(connection, "it ended before it was up");
}
catch (std::bad_alloc const&)
{
}

/// Once a minute at most for each source.
void SipTls::complain(Connection const& connection, std::string const& reason)
{
    long const now = TY::Time::NOW(TY::Time::MONOTONIC).seconds;
    if (m_complaints.size() >= MOST_COMPLAINTS)
        std::erase_if(m_complaints, [&](auto const& told) { return now - told.second >= BETWEEN_COMPLAINTS; });
    auto const told = m_complaints.find(connection.source);
    if (m_complaints.size() >= MOST_COMPLAINTS ||
        (told != m_complaints.end() && now - told->second < BETWEEN_COMPLAINTS))
        return;
    m_complaints[connection.source] = now;
    spdlog::warn("interface {}: no TLS with {}: {}", m_name, connection.address, reason);
}

// --- in place of the stack's and the library's own -------------------------------------------------------------------

#define IN_PLACE extern "C" __attribute__((visibility("default")))

IN_PLACE tls_s* tls_init_master(void* issues)
{
    static auto* const s_original = STACK_FUNCTION<tls_s*(void*)>("tls_init_master");
    return s_port = s_original(issues);
}

IN_PLACE tls_s* tls_init_secondary(tls_s* port, int descriptor, int isAccepted)
{
    return SipTls::MAKE(port, descriptor, isAccepted);
}

IN_PLACE int tls_connect(su_root_magic_t* magic, su_wait_t* wait, tport_t* connection)
{
    return SipTls::CONNECT(magic, wait, connection);
}

IN_PLACE void tport_error_report(tport_t* connection, int error, su_sockaddr_t const* address)
{
    static auto* const s_original = STACK_FUNCTION<void(tport_t*, int, su_sockaddr_t const*)>("tport_error_report");
    s_original(connection, SipTls::GET_ERROR(connection, error), address);
}

IN_PLACE void tls_free(tls_s* connection) { SipTls::FREE(connection); }

IN_PLACE SSL* SSL_new(SSL_CTX* context) { return SipTls::NEW_CONNECTION(context); }

/// The stack would read names in it, which it never gives back and nobody asks for: the library has looked at it.
IN_PLACE X509* SSL_get1_peer_certificate(SSL const*) { return nullptr; }
