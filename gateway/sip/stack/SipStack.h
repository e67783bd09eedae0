#pragma once

#include "host/SignallingLoop.h"
#include "sip/stack/Sofia.h"

#include <functional>
#include <map>
#include <memory>

/// The SIP stack's event loop, which is the process's outermost: it cannot run within another. It must outlive
/// everything else of the SIP module.
class SipStack : public SignallingLoop
{
public:
    /// Throws std::runtime_error when the system refuses.
    SipStack();
    ~SipStack() override;
    SipStack(SipStack const&) = delete;
    SipStack& operator=(SipStack const&) = delete;

    // --- SignallingLoop
    void watch(int descriptor, std::function<void()> onReadable) override;
    void forget(int descriptor) override;
    void run() override;
    void stop() override;

    su_root_t* getRoot() const { return m_root; }

    /// A message has come: what it leads to runs before the stack waits for others.
    static void NOTE_MESSAGE();

private:
    struct Watched
    {
        int registration;
        std::shared_ptr<SipDescriptorHandler> handler; // shared: one may forget itself
    };
    static void BEFORE_WAIT(su_prepoll_magic_t* stack, su_root_t*);
    static int ON_READABLE(su_root_magic_t*, su_wait_t*, SipDescriptorHandler* handler);

    su_root_t* m_root = nullptr;
    std::map<int, Watched> m_watched; // by descriptor
};
