#include "testing/FakeRebootMgmt.h"

#include "platform/driver/DRIVER.h"
#include "platform/driver/IRebootMgmt.h"
#include "testing/FailingAllocator.h"

#include <tuple>
#include <utility>

/// What the others hold, by reference count; it may outlive the fake.
class FakeRebootMgmt::Interface : public IRebootMgmt
{
public:
    explicit Interface(FakeRebootMgmt& fake) : m_fake(&fake) {}
    ~Interface() override = default;

    XCode addGracefulLock(String const& owner, String const& reason, int flags) override
    {
        if (m_fake == nullptr)
            return XCode::FAILURE;
        FakeRebootMgmt& fake = *m_fake;
        ++fake.m_locks;
        {
            FailingAllocator::Pause const unseen;
            fake.record(std::string("add ") + owner.c_str() + " (" + reason.c_str() + ", " + std::to_string(flags) +
                        ")");
        }
        XCode const result = fake.m_result;
        fake.m_onAdd();
        return result;
    }

    XCode releaseGracefulLock(String const& owner) override
    {
        if (m_fake == nullptr)
            return XCode::FAILURE;
        FakeRebootMgmt& fake = *m_fake;
        --fake.m_locks;
        {
            FailingAllocator::Pause const unseen;
            fake.record(std::string("release ") + owner.c_str());
        }
        XCode const result = fake.m_result;
        fake.m_onRelease();
        return result;
    }

    FakeRebootMgmt* m_fake;
};

FakeRebootMgmt::FakeRebootMgmt(std::string name, Journal* journal)
    : Recorder(std::move(name), journal), m_interface(new Interface(*this))
{
    m_interface->addReference();
    // refused only when memory is out: the fake is then not found
    std::ignore = DRIVER::INSTANCE().addDriverInterface(m_interface, TY::UUID::INVALID(), getRecorderName().c_str());
}

FakeRebootMgmt::~FakeRebootMgmt()
{
    {
        FailingAllocator::Pause const unseen;
        record(m_locks == 0 ? "ended" : "ended (locks held: " + std::to_string(m_locks) + ")");
    }
    m_interface->m_fake = nullptr;
    DRIVER::INSTANCE().removeDriverInterface(m_interface);
    m_interface->removeReference();
}
