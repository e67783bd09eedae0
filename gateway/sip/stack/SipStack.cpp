#include "sip/stack/SipStack.h"

#include <stdexcept>

namespace
{
SipStack* s_running = nullptr;
}

/// What is told when a descriptor that the stack watches becomes readable.
class SipDescriptorHandler : public std::enable_shared_from_this<SipDescriptorHandler>
{
public:
    explicit SipDescriptorHandler(std::function<void()> onReadable) : m_onReadable(std::move(onReadable)) {}
    void onReadable()
    {
        auto const self = shared_from_this();
        m_onReadable();
    }

private:
    std::function<void()> m_onReadable;
};

SipStack::SipStack()
{
    su_init();
    su_log_set_level(nullptr, 0); // the stack's own log knows nothing of ours
    m_root = su_root_create(nullptr);
    if (m_root == nullptr)
    {
        su_deinit();
        throw std::runtime_error("the SIP stack's event loop cannot be made");
    }
    su_root_threading(m_root, 0);
}

SipStack::~SipStack()
{
    for (auto const& [descriptor, watched] : m_watched)
        su_root_deregister(m_root, watched.registration);
    su_root_destroy(m_root);
    su_deinit();
}

void SipStack::watch(int descriptor, std::function<void()> onReadable)
{
    auto const handler = std::make_shared<SipDescriptorHandler>(std::move(onReadable));
    su_wait_t wait[1] = {};
    if (su_wait_create(wait, descriptor, SU_WAIT_IN) < 0)
        throw std::runtime_error("the SIP stack's event loop takes no descriptor");
    int const registration = su_root_register(m_root, wait, ON_READABLE, handler.get(), 0);
    if (registration < 0)
        throw std::runtime_error("the SIP stack's event loop takes no descriptor");
    m_watched[descriptor] = {registration, handler};
}

void SipStack::forget(int descriptor)
{
    auto const found = m_watched.find(descriptor);
    if (found == m_watched.end())
        return;
    su_root_deregister(m_root, found->second.registration);
    m_watched.erase(found);
}

void SipStack::run()
{
    su_root_add_prepoll(m_root, BEFORE_WAIT, reinterpret_cast<su_prepoll_magic_t*>(this));
    s_running = this;
    su_root_run(m_root);
    s_running = nullptr;
    su_root_remove_prepoll(m_root);
    endBusy();
}

void SipStack::NOTE_MESSAGE()
{
    if (s_running != nullptr)
        s_running->beginBusy();
}

/// The stack's own timers run after this, so what they lead to makes a descriptor readable.
void SipStack::BEFORE_WAIT(su_prepoll_magic_t* stack, su_root_t*) { reinterpret_cast<SipStack*>(stack)->endBusy(); }

void SipStack::stop() { su_root_break(m_root); }

int SipStack::ON_READABLE(su_root_magic_t*, su_wait_t*, SipDescriptorHandler* handler)
{
    handler->onReadable();
    return 0;
}
