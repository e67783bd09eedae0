#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// A connection to the gateway's local socket: lines out and in.
class Connection
{
public:
    struct Answer
    {
        bool isOk = false;
        std::string status; ///< the line that says so
        std::vector<std::string> lines;
    };

    /// Throws std::runtime_error with the reason when nobody listens there, or who does must not be asked.
    explicit Connection(std::string const& path);
    ~Connection();
    Connection(Connection const&) = delete;
    Connection& operator=(Connection const&) = delete;

    /// Sends the line and reads the whole answer. Throws std::runtime_error when there is none, or not all of it.
    Answer ask(std::string_view line);

    /// Throws std::runtime_error.
    void send(std::string_view line);
    /// The next line; nothing when the gateway has closed, or says nothing for a while.
    std::optional<std::string> receive();
    static bool IS_OK(std::string_view status);

private:
    int m_descriptor;
    std::string m_waiting;
};
