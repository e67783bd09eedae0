#pragma once

#include <string>
#include <string_view>

/// What a client of HTTP/1.1 (RFC 9112) asks for, as far as one looks at it who gives out a few pages.
struct HttpRequest
{
    unsigned int refusal = 0; ///< the status of the answer to what is no request, or none for us; 0: all right
    bool isHead = false;      ///< the answer without its contents
    bool isPost = false;      ///< something is to be changed
    std::string path;         ///< without what follows a "?"
    std::string query;        ///< that
    std::string token;        ///< which is to prove that he may (RFC 6750, 2.1)

    /// Of everything up to and with the empty line.
    static HttpRequest PARSE(std::string_view head);
};

/// An answer after which the connection ends.
struct HttpAnswer
{
    static constexpr char const* TEXT = "text/plain; charset=utf-8";

    unsigned int status = 200;
    std::string content;
    char const* type = TEXT;

    std::string getText(bool isHead) const;
    static HttpAnswer REFUSING(unsigned int status);
};
