#pragma once

#include "operation/http/HttpServer.h"

#include <string>

/// Gives browsers what the operators' socket answers, as JSON lines: "/control/call/7" is the command `call 7`, and
/// "/control/calls?older=60" is `calls --older 60`. GET is for commands that change nothing; those that clear a call or
/// block an interface are for POST, and for whoever knows the token.
///
///     ControlRelay relay("/run/callcontrol-gateway/control", token);
///     HttpServer server(address, loop, {.pages = pages, .files = CallPage::FILES(), .relay = &relay});
class ControlRelay : public HttpRelay
{
public:
    static constexpr char const* CONTENT_TYPE = "application/x-ndjson; charset=utf-8";

    /// `token` empty: nothing is changed.
    explicit ControlRelay(std::string const& socket, std::string const& token = {}) : m_socket(socket), m_token(token)
    {
    }

    // --- HttpRelay
    int open(HttpRequest const& request, unsigned int& refusal) override;
    std::optional<HttpAnswer> read(std::string_view come, bool isEnd) override;

    /// The line that asks the socket for it; empty: it is none of what is given out.
    static std::string LINE_OF(HttpRequest const& request);

private:
    std::string m_socket;
    std::string m_token;
};
