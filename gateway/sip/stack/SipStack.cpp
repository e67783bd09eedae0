#include "sip/stack/SipStack.h"

#include "platform/eventloop/TYEventLoop.h"

#include <stdexcept>

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
    for (int const registration : m_registrations)
        su_root_deregister(m_root, registration);
    su_root_destroy(m_root);
    su_deinit();
}

void SipStack::watch(int descriptor, std::function<void()> onReadable)
{
    m_handlers.push_back(std::make_unique<SipDescriptorHandler>(std::move(onReadable)));
    su_wait_t wait[1] = {};
    if (su_wait_create(wait, descriptor, SU_WAIT_IN) < 0)
        throw std::runtime_error("the SIP stack's event loop takes no descriptor");
    int const registration = su_root_register(m_root, wait, ON_READABLE, m_handlers.back().get(), 0);
    if (registration < 0)
        throw std::runtime_error("the SIP stack's event loop takes no descriptor");
    m_registrations.push_back(registration);
}

void SipStack::attach(TYEventLoop& loop)
{
    watch(loop.getPollFd(), [&loop] { loop.runTurn(); });
}

void SipStack::run() { su_root_run(m_root); }

void SipStack::stop() { su_root_break(m_root); }

int SipStack::ON_READABLE(su_root_magic_t*, su_wait_t*, SipDescriptorHandler* handler)
{
    handler->onReadable();
    return 0;
}
