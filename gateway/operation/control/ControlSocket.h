#pragma once

#include "configuration/ControlOptions.h"

#include <string>

/// A local stream socket that listens under a name in the file system, for those whom its mode and group let in.
class ControlSocket
{
public:
    /// Takes the place of a socket that nobody listens on any more. Throws std::runtime_error with the reason: another
    /// process listens there, something else has the name, there is no such group, the system refuses.
    explicit ControlSocket(ControlOptions const& options);
    ~ControlSocket(); ///< takes the name away
    ControlSocket(ControlSocket const&) = delete;
    ControlSocket& operator=(ControlSocket const&) = delete;

    int get() const { return m_descriptor; }
    /// The next connection, not blocking; below 0: none now.
    int accept() const;

private:
    std::string m_path;
    int m_descriptor;
};
