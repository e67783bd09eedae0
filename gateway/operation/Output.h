#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <deque>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>

/// A stream of text out of the process that never holds up who writes to it, whoever does not read at its other end.
///
/// As long as the other end takes it, a text is out when `write` returns: what the process said last before it died is
/// what somebody needs. What is not taken at once waits in memory, up to a bound, for a thread that writes it later;
/// beyond the bound a text is dropped, and a line says how many were, as soon as one gets through. Any thread may
/// write.
///
///     Output output(STDERR_FILENO);
///     output.write("a line\n");
class Output
{
public:
    static constexpr std::size_t BOUND = 1 << 20; ///< octets

    explicit Output(int descriptor, std::size_t bound = BOUND);
    /// Gives what waits a moment, as below, and the rest up.
    ~Output();
    Output(Output const&) = delete;
    Output& operator=(Output const&) = delete;

    /// The text as a whole, or nothing of it.
    void write(std::string_view text);
    /// Texts dropped so far.
    unsigned long long getDropped() const;
    /// Waits until everything is out, or for so long.
    void flush(std::chrono::milliseconds patience = std::chrono::milliseconds(500));
    /// Goes on with this file, appended to and made if need be; false: it cannot be opened, and nothing changes.
    bool open(char const* file);

    /// A stream of the C library that leads here and writes when it is flushed, or at its buffer's end.
    std::FILE* makeStream();

private:
    void setDescriptor(int descriptor);
    long tryToWrite(std::string_view text);
    void enqueue(std::string_view text);
    void drain();
    void tellDropped();

    mutable std::mutex m_mutex;
    std::condition_variable m_changed;
    std::thread m_thread; // once something had to wait
    std::deque<std::string> m_waiting;
    std::size_t m_bound;
    std::size_t m_octets = 0; // of what waits
    unsigned long long m_dropped = 0;
    unsigned long long m_told = 0; // of the dropped ones
    int m_descriptor = -1;
    bool m_isOwn = false; // the descriptor
    bool m_isSocket = false;
    bool m_isFile = false; // which takes all at once
    bool m_isEnding = false;
};
