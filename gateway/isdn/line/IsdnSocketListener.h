#pragma once

#include "isdn/line/IsdnWires.h"

#include <vector>

/// Where lines over local sockets come in: the exchange's side.
///
///     IsdnSocketListener listener;
///     if (!listener.open("/run/exchange.sock"))
///         ...
///     // when its descriptor is readable:
///     while (std::optional<IsdnWires> wires = listener.accept())
///         lines.push_back(std::make_unique<IsdnSocketLine>(std::move(*wires)));
class IsdnSocketListener
{
public:
    ~IsdnSocketListener(); ///< takes the path away

    /// Whether it listens there; a socket that was left there by another process is replaced.
    bool open(std::string const& path);
    /// Readable when there may be something to accept; -1 before `open`.
    int getDescriptor() const { return m_epoll.get(); }
    /// The next line that is there whole.
    std::optional<IsdnWires> accept();

private:
    void takeConnections();

    std::string m_path;
    IsdnDescriptor m_epoll;
    IsdnDescriptor m_socket;
    std::vector<IsdnDescriptor> m_early; // connected, but nothing handed over yet
};
