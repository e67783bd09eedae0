#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/base/XCode.h"

#include <cstddef>
#include <span>

/// The flight recorder of call control: a ring of fixed size that keeps the last events of the whole process.
///
/// Calls and legs coming and going, every change of a property with who wrote it, dials, offers, transfers, drops,
/// services, what modules were told, clean-ups, the reload lock. Every event bears the turn of the call-control loop, a
/// time, and the never-reused serial numbers of its call and leg. All memory is taken at the start; recording an event
/// allocates nothing, makes no system call and costs some ten nanoseconds. While it is off, each place where something
/// would be recorded costs a comparison.
///
/// In a file the ring is a black box: whatever ends the process, the file holds the events up to that. The program
/// `recorder` and the library `callcontrol-diagnosis` (CC_Recording.h) read files and images.
///
/// Numbers and names are kept as they are, restricted ones too: who may read the file may read them. Readers mask them
/// unless they are told not to. Belongs to the call-control loop's thread.
///
///     if (!CC_Recorder::OPEN("/var/lib/gateway/calls.ring").isOk())
///         std::ignore = CC_Recorder::START(); // no disk: at least for as long as the process lives
class CC_EXPORT CC_Recorder
{
public:
    static constexpr std::size_t DEFAULT_SIZE = 4 * 1024 * 1024; ///< octets: the last few hundred calls
    static constexpr std::size_t LEAST_SIZE = 4096;              ///< octets

    /// Records in memory, about `octets` of it. OK; REFUSED when it is on, or for less than LEAST_SIZE; NO_ELEMENT when
    /// memory is out.
    static XCode START(std::size_t octets = DEFAULT_SIZE);
    /// Records in the file, which is made anew; one that is there is kept beside it, with ".previous" behind its name,
    /// in place of an earlier one: so a process that starts again leaves what it left when it ended. OK; REFUSED as
    /// above; NO_ELEMENT when the disk is full; FAILURE when the file cannot be made.
    static XCode OPEN(String const& path, std::size_t octets = DEFAULT_SIZE);
    /// Ends the recording. A file stays, what was in memory is lost. Nothing happens when it is off.
    static void CLOSE();

    /// Whether events are recorded.
    static bool IS_ON();
    /// The recording as it is now, as a file would hold it, for readers inside the process; empty when it is off. It
    /// holds until the next event is recorded.
    static std::span<std::byte const> GET_IMAGE();
};
