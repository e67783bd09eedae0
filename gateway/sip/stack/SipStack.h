#pragma once

#include "sip/stack/Sofia.h"

#include <functional>
#include <memory>
#include <vector>

class TYEventLoop;

/// What is told when a descriptor that the stack watches becomes readable.
class SipDescriptorHandler
{
public:
    explicit SipDescriptorHandler(std::function<void()> onReadable) : m_onReadable(std::move(onReadable)) {}
    void onReadable() { m_onReadable(); }

private:
    std::function<void()> m_onReadable;
};

/// The SIP stack's event loop, which is the process's outermost: our own loops run from it. One thread, the one that
/// made it.
///
///     SipStack stack;
///     stack.attach(callControlLoop);
///     stack.run(); // until stop()
///
/// It must outlive everything else of the SIP module.
class SipStack
{
public:
    /// Throws std::runtime_error when the system refuses.
    SipStack();
    ~SipStack();
    SipStack(SipStack const&) = delete;
    SipStack& operator=(SipStack const&) = delete;

    /// Calls `onReadable` whenever the descriptor is readable, for as long as the stack lives. Throws
    /// std::runtime_error when the system refuses.
    void watch(int descriptor, std::function<void()> onReadable);
    /// Runs a turn of `loop`, which must outlive the stack's running, whenever work is pending in it.
    void attach(TYEventLoop& loop);

    void run();
    /// Ends `run()`.
    void stop();

    su_root_t* getRoot() const { return m_root; }

private:
    static int ON_READABLE(su_root_magic_t*, su_wait_t*, SipDescriptorHandler* handler);

    su_root_t* m_root = nullptr;
    std::vector<std::unique_ptr<SipDescriptorHandler>> m_handlers;
    std::vector<int> m_registrations;
};
