#pragma once

#include <set>
#include <string>
#include <sys/types.h>

struct CallRecord;

/// Tells ladders of single calls on the standard output, as the recorder has them, when these calls are over: of those
/// that an operator has asked for by their serial numbers, and of all of a party's number. Costs a call nothing before
/// its end; a copy of the process tells it.
///
/// `onChild` must be called upon SIGCHLD. One thread.
///
///     watch.tell([&](CallRecord const& record) { tracer.onCallOver(record); });
class CallTracer
{
public:
    static constexpr std::size_t MOST = 64; ///< calls and numbers, together

    ~CallTracer();
    /// False: there are so many already. @{
    bool add(unsigned long long serial);
    bool add(std::string const& number);
    /// @}
    /// False: it was not there. @{
    bool remove(unsigned long long serial) { return m_serials.erase(serial) != 0; }
    bool remove(std::string const& number) { return m_numbers.erase(number) != 0; }
    /// @}
    std::set<unsigned long long> const& getSerials() const { return m_serials; }
    std::set<std::string> const& getNumbers() const { return m_numbers; }

    /// Throws std::bad_alloc.
    void onCallOver(CallRecord const& record);
    void onChild();

private:
    bool isFull() const { return m_serials.size() + m_numbers.size() >= MOST; }
    bool isTraced(CallRecord const& record);
    void tell();

    std::set<unsigned long long> m_serials;
    std::set<std::string> m_numbers;
    std::set<unsigned long long> m_waiting; // calls that are over
    pid_t m_copy = 0;                       // that tells
};
