#pragma once

#include "sip/registrar/SipBindings.h"

#include <atomic>
#include <condition_variable>
#include <functional>
#include <map>
#include <mutex>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

struct sqlite3;

/// The contacts of an interface's users in a file (SQLite), so that they outlive the process.
///
/// A thread of its own writes; whoever changes something only leaves it there. What a user has left replaces what he
/// left before, so nothing piles up but users. What may wait is written with what else comes in a tenth of a second,
/// since to write is dear and to write more is not. A process that is killed loses what was not written yet: some
/// milliseconds' worth of the rest, unless the disk is slow. What the disk refuses is tried again each second.
class SipBindingStore
{
public:
    /// Why the file is of no use.
    struct Failure : std::runtime_error
    {
        using std::runtime_error::runtime_error;
    };

    /// Tells `restore` of each that has not expired. Throws Failure.
    SipBindingStore(std::string const& file, std::string interface,
                    std::function<void(std::string const& user, SipBinding const&)> const& restore);
    ~SipBindingStore(); ///< once all is written that can be
    SipBindingStore(SipBindingStore const&) = delete;
    SipBindingStore& operator=(SipBindingStore const&) = delete;

    /// All that the user has from now on. `mayWait`: were it lost, he would still be where he is known to be.
    void write(std::string const& user, std::vector<SipBinding> bindings, bool mayWait = false);
    unsigned long long getNumberOfFailures() const { return m_failures; }

private:
    using Changes = std::map<std::string, std::vector<SipBinding>>;

    void load(std::function<void(std::string const&, SipBinding const&)> const& restore);
    void run();
    bool writeAll(Changes const& changes);
    bool execute(char const* statement);

    std::string m_interface;
    sqlite3* m_database = nullptr;
    std::atomic<unsigned long long> m_failures = 0;
    std::mutex m_mutex;
    std::condition_variable m_wake;
    Changes m_changes; // the mutex's, and so are the next two
    bool m_isUrgent = false;
    bool m_isEnding = false;
    std::thread m_thread;
};
