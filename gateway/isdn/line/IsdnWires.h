#pragma once

#include "isdn/line/IsdnLine.h"

#include <array>
#include <optional>
#include <string>

/// One end of a line over local sockets of type SOCK_SEQPACKET, which keep the bounds of frames: one for the D channel
/// and one for each B channel.
///
/// Who connects makes them all and hands the other end's over in the first message of the connection, which then is the
/// D channel. So both ends have the whole line from the beginning, and no B channel has to be matched with a call.
struct IsdnWires
{
    IsdnDescriptor d;
    std::array<IsdnDescriptor, IsdnLine::LAST_TIMESLOT + 1> b; ///< by timeslot; 0 and 16 stay empty

    /// Both ends, as for a test; nothing when the system has no descriptors left.
    static std::optional<std::pair<IsdnWires, IsdnWires>> MAKE();
    /// This end of a line to whoever listens at the path; nothing when nobody does, or the system refuses.
    static std::optional<IsdnWires> CONNECT(std::string const& path);
    /// The end that the connection's first message hands over; nothing when it does not. `isEarly`: it has not come
    /// yet.
    static std::optional<IsdnWires> TAKE(IsdnDescriptor& connection, bool& isEarly);
};
