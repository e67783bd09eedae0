#pragma once

#include "isdn/line/IsdnDescriptor.h"

#include <cstddef>
#include <span>

/// One end of a primary-rate line (G.704, 2,048 kbit/s): the D channel, which carries the signalling, and 30 B channels
/// of 64 kbit/s. The link layer sees nothing else of a line, so a card's driver may stand behind it as well as a
/// socket.
///
/// The line itself belongs to the signalling thread. A B channel is a descriptor of its own that any thread may read
/// and write (IsdnBlock).
class IsdnLine
{
public:
    static constexpr unsigned int D_TIMESLOT = 16;
    static constexpr unsigned int LAST_TIMESLOT = 31; ///< 0 is for the synchronisation of frames
    static constexpr std::size_t LONGEST_FRAME = 512; ///< octets; Q.921 allows 260 in an information field

    IsdnLine() = default;
    virtual ~IsdnLine() = default;
    IsdnLine(IsdnLine const&) = delete;
    IsdnLine& operator=(IsdnLine const&) = delete;

    /// Whether a B channel has that number.
    static constexpr bool IS_B_CHANNEL(unsigned int timeslot)
    {
        return timeslot >= 1 && timeslot <= LAST_TIMESLOT && timeslot != D_TIMESLOT;
    }

    /// Connects with the other end, unless it is: whether it is now. May be tried again and again.
    virtual bool open() = 0;
    virtual void close() = 0;
    /// False as well once the other end has gone, which `receive` finds out.
    virtual bool isOpen() const = 0;

    /// Readable when a frame has come, or the other end has gone. It stays the same until `close`; -1 from then on.
    virtual int getDescriptor() const = 0;
    /// The next frame of the D channel, without its check sum: its length; 0 when there is none.
    virtual std::size_t receive(std::span<unsigned char> frame) = 0;
    /// Whether the frame was taken; the link layer sends again what was not.
    virtual bool send(std::span<unsigned char const> frame) = 0;

    /// A B channel for one call; nothing that came before can be read from it. None (-1) while the line is closed, for
    /// a number that is no B channel's, and when the system has no descriptor left.
    virtual IsdnDescriptor openChannel(unsigned int timeslot) = 0;
};
