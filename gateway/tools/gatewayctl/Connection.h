#pragma once

#include <optional>
#include <string>
#include <string_view>

/// A connection to the gateway's local socket: lines out and in.
class Connection
{
public:
    /// Throws std::runtime_error with the reason when nobody listens there, or who does must not be asked.
    explicit Connection(std::string const& path);
    ~Connection();
    Connection(Connection const&) = delete;
    Connection& operator=(Connection const&) = delete;

    /// Throws std::runtime_error.
    void send(std::string_view line);
    /// The next line; nothing when the gateway has closed, or says nothing for a while.
    std::optional<std::string> receive();

private:
    int m_descriptor;
    std::string m_waiting;
};
