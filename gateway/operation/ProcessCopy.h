#pragma once

#include <functional>
#include <string>
#include <sys/types.h>

/// A copy of the process that tells what the process is like at this moment, however much that is, while the process
/// goes on. The system makes it without copying the memory. It has nothing but that and one descriptor, and ends after
/// some seconds whatever happens.
///
/// Its end is told by SIGCHLD, upon which `HAS_ENDED` must be asked once it has; else it stays in the process table.
namespace ProcessCopy
{
/// `collect` runs in the copy, where no other thread is; what it returns is written to the descriptor. The copy's id;
/// below 0: the system gives no process.
pid_t START(int descriptor, std::function<std::string()> const& collect);
bool HAS_ENDED(pid_t copy);
} // namespace ProcessCopy
