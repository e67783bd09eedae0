#pragma once

#include "isdn/line/IsdnWires.h"

/// A line over local sockets, to whoever listens at a path.
///
///     IsdnSocketLine line("/run/exchange.sock");
///     if (line.open())
///         line.send(frame);
class IsdnSocketLine : public IsdnLine
{
public:
    /// Closed; it connects with `open`.
    explicit IsdnSocketLine(std::string path) : m_path(std::move(path)) {}
    /// Open already, as of a listener. It cannot be opened again.
    explicit IsdnSocketLine(IsdnWires&& wires) : m_wires(std::move(wires)) {}

    bool open() override;
    void close() override;
    bool isOpen() const override { return m_wires.d.get() >= 0 && !m_isGone; }
    int getDescriptor() const override { return m_wires.d.get(); }
    std::size_t receive(std::span<unsigned char> frame) override;
    bool send(std::span<unsigned char const> frame) override;
    IsdnDescriptor openChannel(unsigned int timeslot) override;

private:
    std::string m_path;
    IsdnWires m_wires;
    bool m_isGone = false; // the other end
};
