#include "operation/record/PostgresqlStore.h"

#include "operation/record/Libpq.h"

#include <array>
#include <cerrno>
#include <poll.h>
#include <stdexcept>
#include <string_view>

namespace
{
constexpr int ANSWER_PATIENCE = 5000; // milliseconds

/// REQUIRES: it is there, which the constructor has asked.
Libpq const& PQ() { return *Libpq::GET(); }

/// Of an error of connecting, what comes behind the server's address.
std::string REASON_OF(pg_conn* connection)
{
    std::string const text = PQ().errorMessage(connection);
    std::string const first = text.substr(0, text.find('\n'));
    auto const found = first.rfind("failed: ");
    return found == std::string::npos ? "no connection" : first.substr(found + std::string_view("failed: ").size());
}

/// Data that the server can never take, and nothing that somebody may mend there.
bool IS_OF_DATA(std::string_view state) { return state.starts_with("22") || state.starts_with("23"); }

std::string ARRAY_OF(RecordLines const& lines)
{
    std::string text = "[";
    for (std::string_view const line : lines)
        (text += text.size() > 1 ? "," : "") += line;
    return text + ']';
}
} // namespace

void PostgresqlStore::Closer::operator()(pg_conn* connection) const { PQ().finish(connection); }
void PostgresqlStore::Closer::operator()(pg_result* result) const { PQ().clear(result); }

PostgresqlStore::PostgresqlStore(std::string connection) : m_options(std::move(connection))
{
    if (Libpq::GET() == nullptr)
        throw std::runtime_error("libpq.so.5 is not installed");
}

PostgresqlStore::~PostgresqlStore() = default;

RecordStore::Result PostgresqlStore::store(RecordLines const& lines)
{
    if (m_connection == nullptr && !connect())
        return Result::AWAY;
    Answer const answer = ask("INSERT INTO call_record SELECT line->>'process', (line->>'call')::bigint, line "
                              "FROM jsonb_array_elements($1::jsonb) AS line ON CONFLICT DO NOTHING",
                              ARRAY_OF(lines).c_str());
    return isDone(answer) ? Result::STORED : fail(answer);
}

/// Nothing here may wait for ever for a server that has vanished without a word.
bool PostgresqlStore::connect()
{
    std::array<char const*, 6> const keys{"connect_timeout", "tcp_user_timeout", "application_name",
                                          "dbname",          "client_encoding",  nullptr};
    std::array<char const*, 6> const values{"5", "5000", "callcontrol-gateway", m_options.c_str(), "UTF8", nullptr};
    m_connection.reset(PQ().connectdbParams(keys.data(), values.data(), 1)); // the later ones win
    if (PQ().setnonblocking(m_connection.get(), 1) == 0 && makeTable())
        return true;
    if (PQ().status(m_connection.get()) != CONNECTION_OK || m_reason.empty())
        m_reason = REASON_OF(m_connection.get());
    m_connection.reset();
    return false;
}

/// Where it is there it takes no right to make one.
bool PostgresqlStore::makeTable()
{
    Answer const found = ask("SELECT to_regclass('call_record') IS NOT NULL");
    if (!isDone(found))
        return false;
    return std::string_view(PQ().getvalue(found.get(), 0, 0)) == "t" ||
           isDone(ask("CREATE TABLE call_record (process text NOT NULL, call bigint NOT NULL, record jsonb NOT NULL, "
                      "PRIMARY KEY (process, call))"));
}

PostgresqlStore::Answer PostgresqlStore::ask(char const* statement, char const* parameter)
{
    if (PQ().sendQueryParams(m_connection.get(), statement, parameter != nullptr ? 1 : 0, nullptr, &parameter, nullptr,
                             nullptr, 0) == 0 ||
        !awaitSent() || !awaitAnswer())
        return nullptr;
    Answer answer(PQ().getResult(m_connection.get()));
    while (Answer const rest{PQ().getResult(m_connection.get())})
    {
    }
    return answer;
}

bool PostgresqlStore::awaitSent()
{
    int left = 0;
    while ((left = PQ().flush(m_connection.get())) > 0)
        if (!await(POLLIN | POLLOUT))
            return false;
    return left == 0;
}

bool PostgresqlStore::awaitAnswer()
{
    while (PQ().isBusy(m_connection.get()) != 0)
        if (!await(POLLIN))
            return false;
    return true;
}

bool PostgresqlStore::await(short events)
{
    pollfd socket{PQ().socket(m_connection.get()), events, 0};
    int const ready = poll(&socket, 1, ANSWER_PATIENCE);
    if (ready <= 0)
        return ready < 0 && errno == EINTR;
    return socket.revents == POLLOUT || PQ().consumeInput(m_connection.get()) != 0;
}

bool PostgresqlStore::isDone(Answer const& answer)
{
    ExecStatusType const status = PQ().resultStatus(answer.get());
    if (status == PGRES_COMMAND_OK || status == PGRES_TUPLES_OK)
        return true;
    char const* const message =
        answer != nullptr ? PQ().resultErrorField(answer.get(), PG_DIAG_MESSAGE_PRIMARY) : nullptr;
    m_reason = message != nullptr ? message : "the connection is lost";
    return false;
}

/// After any other fault it begins with a new connection.
RecordStore::Result PostgresqlStore::fail(Answer const& answer)
{
    char const* const state = answer != nullptr ? PQ().resultErrorField(answer.get(), PG_DIAG_SQLSTATE) : nullptr;
    if (state != nullptr && IS_OF_DATA(state))
        return Result::REFUSED;
    m_connection.reset();
    return Result::AWAY;
}
