#include "operation/http/HttpRequest.h"

#include <algorithm>
#include <cctype>
#include <optional>
#include <spdlog/fmt/fmt.h>

namespace
{
constexpr std::string_view END_OF_LINE = "\r\n";

/// No page is kept, loads or runs what is not ours, or is shown inside of another.
constexpr char const* FOR_BROWSERS =
    "Cache-Control: no-store\r\nX-Content-Type-Options: nosniff\r\nContent-Security-Policy: "
    "default-src 'none'; style-src 'self' 'unsafe-inline'; script-src 'self'; connect-src 'self'; base-uri 'none'; "
    "form-action 'none'; frame-ancestors 'none'\r\n";

struct HttpStatus
{
    unsigned int code;
    char const* reason;
};
constexpr HttpStatus STATUSES[] = {{200, "OK"},
                                   {400, "Bad Request"},
                                   {401, "Unauthorized"},
                                   {404, "Not Found"},
                                   {405, "Method Not Allowed"},
                                   {421, "Misdirected Request"},
                                   {431, "Request Header Fields Too Large"},
                                   {503, "Service Unavailable"},
                                   {505, "HTTP Version Not Supported"}};

char const* REASON_OF(unsigned int code)
{
    auto const* const found = std::find_if(std::begin(STATUSES), std::end(STATUSES),
                                           [&](HttpStatus const& status) { return status.code == code; });
    return found != std::end(STATUSES) ? found->reason : "";
}

/// The text up to the separator, which are both taken off; all of it where there is none.
std::string_view TAKE(std::string_view& text, std::string_view separator)
{
    std::size_t const end = text.find(separator);
    std::string_view const piece = text.substr(0, end);
    text.remove_prefix(end != std::string_view::npos ? end + separator.size() : text.size());
    return piece;
}

bool IS_METHOD(std::string_view word)
{
    return !word.empty() && std::all_of(word.begin(), word.end(),
                                        [](unsigned char c) { return std::isupper(c) != 0 || c == '-' || c == '_'; });
}

/// The value of a field by its name in small letters and a colon; nothing where there is none.
std::optional<std::string_view> FIND_FIELD(std::string_view lines, std::string_view name)
{
    for (std::string_view line = TAKE(lines, END_OF_LINE); !line.empty(); line = TAKE(lines, END_OF_LINE))
    {
        bool const isIt =
            std::equal(name.begin(), name.end(), line.begin(), line.begin() + std::min(line.size(), name.size()),
                       [](char one, unsigned char other) { return one == std::tolower(other); });
        if (!isIt)
            continue;
        line.remove_prefix(name.size());
        line.remove_prefix(std::min(line.find_first_not_of(" \t"), line.size()));
        return line.substr(0, line.find_last_not_of(" \t") + 1);
    }
    return std::nullopt;
}

/// A browser that a stranger's page has sent here under a name of the stranger's says so: it must not read us.
bool IS_LOOPBACK(std::string_view host)
{
    std::string_view const name = host.starts_with('[') ? host.substr(0, host.find(']') + 1) : TAKE(host, ":");
    return name == "localhost" || name == "[::1]" ||
           (name.starts_with("127.") && name.find_first_not_of("0123456789.") == std::string_view::npos);
}

unsigned int REFUSAL_OF(std::string_view method, std::string_view target, std::string_view version,
                        std::string_view fields)
{
    if (!IS_METHOD(method) || !target.starts_with('/') || !version.starts_with("HTTP/"))
        return 400;
    if (version != "HTTP/1.0" && version != "HTTP/1.1")
        return 505;
    std::optional<std::string_view> const host = FIND_FIELD(fields, "host:");
    if (version == "HTTP/1.1" && !host)
        return 400;
    if (host && !IS_LOOPBACK(*host))
        return 421;
    return method == "GET" || method == "HEAD" || method == "POST" ? 0 : 405;
}

std::string TOKEN_OF(std::string_view fields)
{
    constexpr std::string_view SCHEME = "Bearer ";
    std::string_view const credentials = FIND_FIELD(fields, "authorization:").value_or("");
    return credentials.starts_with(SCHEME) ? std::string(credentials.substr(SCHEME.size())) : std::string();
}

char const* MORE_OF(unsigned int status)
{
    return status == 405 ? "Allow: GET, HEAD\r\n" : status == 401 ? "WWW-Authenticate: Bearer\r\n" : "";
}
} // namespace

HttpRequest HttpRequest::PARSE(std::string_view head)
{
    std::string_view line = TAKE(head, END_OF_LINE);
    std::string_view const method = TAKE(line, " ");
    std::string_view const target = TAKE(line, " ");
    std::string_view query = target;
    std::string_view const path = TAKE(query, "?");
    return {REFUSAL_OF(method, target, line, head),
            method == "HEAD",
            method == "POST",
            std::string(path),
            std::string(query),
            TOKEN_OF(head)};
}

std::string HttpAnswer::getText(bool isHead) const
{
    return fmt::format("HTTP/1.1 {} {}\r\nContent-Type: {}\r\nContent-Length: {}\r\n{}{}Connection: close\r\n\r\n{}",
                       status, REASON_OF(status), type, content.size(), MORE_OF(status), FOR_BROWSERS,
                       isHead ? std::string() : content);
}

HttpAnswer HttpAnswer::REFUSING(unsigned int status) { return {status, fmt::format("{}\n", REASON_OF(status))}; }
