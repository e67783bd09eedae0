#pragma once

#include <functional>
#include <string>
#include <sys/types.h>

/// Tells on the standard output what the process is like at this moment, however much that is, while the process goes
/// on: a copy of the process, which the system makes without copying its memory, collects the text and writes it. The
/// copy has nothing but memory and the output, and ends after some seconds whatever happens.
///
/// `onChild` must be called upon SIGCHLD. One thread.
///
///     dump.begin([this] { return getState(); });
class StateDump
{
public:
    ~StateDump();
    /// `collect` runs in the copy, where no other thread is. While one before is still at work, it waits for its end;
    /// of several that wait the last one does.
    void begin(std::function<std::string()> collect);
    void onChild();

private:
    pid_t m_child = 0;
    std::function<std::string()> m_next; // empty: nobody asked meanwhile
};
