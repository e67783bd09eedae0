#include "platform/driver/DRIVER.h"

#include "platform/driver/IRebootMgmt.h"

#include <gtest/gtest.h>

namespace
{
class RebootMgmt : public IRebootMgmt
{
public:
    explicit RebootMgmt(unsigned int& alive) : m_alive(alive) { ++m_alive; }
    XCode addGracefulLock(String const& owner, String const&, int) override
    {
        m_owner = owner;
        return XCode::OK;
    }
    XCode releaseGracefulLock(String const& owner) override { return m_owner == owner ? XCode::OK : XCode::FAILURE; }

protected:
    ~RebootMgmt() override { --m_alive; }

private:
    unsigned int& m_alive;
    String m_owner;
};

class OtherInterface : public IDriverInterface
{
};

TY::UUID IDENTITY(unsigned char last)
{
    TY::UUID::Octets octets{};
    octets[15] = last;
    return TY::UUID(octets);
}

/// Takes what it registered out again.
class DRIVERTest : public testing::Test
{
protected:
    void TearDown() override
    {
        for (IDriverInterface const* const interface : m_registered)
            DRIVER::INSTANCE().removeDriverInterface(interface);
        EXPECT_EQ(0U, m_alive);
    }
    template <class T>
    T* add(T* interface, TY::UUID const& identity, String const& name)
    {
        EXPECT_TRUE(DRIVER::INSTANCE().addDriverInterface(interface, identity, name).isOk());
        EXPECT_TRUE(m_registered.append(interface).isOk());
        return interface;
    }
    IRebootMgmt* addRebootMgmt(unsigned char identity, String const& name)
    {
        return add(new RebootMgmt(m_alive), IDENTITY(identity), name);
    }
    static TYVector<TYPtr<IRebootMgmt>> FOUND(TY::UUID const& identity, String const& name)
    {
        TYVector<TYPtr<IRebootMgmt>> found;
        EXPECT_TRUE(DRIVER::INSTANCE().getDriverInterfaces(found, identity, name).isOk());
        return found;
    }

    unsigned int m_alive = 0;
    TYVector<IDriverInterface const*> m_registered;
};
} // namespace

TEST_F(DRIVERTest, ThereIsOneRepositoryAndItIsEmptyAtFirst)
{
    EXPECT_EQ(&DRIVER::INSTANCE(), &DRIVER::INSTANCE());
    EXPECT_TRUE(FOUND(TY::UUID::INVALID(), String::s_empty).isEmpty());
}

TEST_F(DRIVERTest, InterfacesOfTheClassAreFoundInTheOrderOfRegistration)
{
    IRebootMgmt* const first = addRebootMgmt(1, "first");
    add(new OtherInterface, IDENTITY(1), "first");
    IRebootMgmt* const second = addRebootMgmt(2, "second");
    auto const found = FOUND(TY::UUID::INVALID(), String::s_empty);
    ASSERT_EQ(2U, found.getSize());
    EXPECT_EQ(first, found[0].get());
    EXPECT_EQ(second, found[1].get());
}

TEST_F(DRIVERTest, IdentityAndNameNarrowTheChoice)
{
    addRebootMgmt(1, "a");
    IRebootMgmt* const wanted = addRebootMgmt(1, "b");
    addRebootMgmt(2, "b");
    EXPECT_EQ(2U, FOUND(IDENTITY(1), String::s_empty).getSize());
    EXPECT_EQ(2U, FOUND(TY::UUID::INVALID(), "b").getSize());
    auto const found = FOUND(IDENTITY(1), "b");
    ASSERT_EQ(1U, found.getSize());
    EXPECT_EQ(wanted, found[0].get());
    EXPECT_TRUE(FOUND(IDENTITY(3), String::s_empty).isEmpty());
    EXPECT_TRUE(FOUND(TY::UUID::INVALID(), "B").isEmpty());
}

TEST_F(DRIVERTest, FoundInterfacesAreAppendedToWhatIsThere)
{
    addRebootMgmt(1, "a");
    auto found = FOUND(TY::UUID::INVALID(), String::s_empty);
    EXPECT_TRUE(DRIVER::INSTANCE().getDriverInterfaces(found, IDENTITY(1), "a").isOk());
    ASSERT_EQ(2U, found.getSize());
    EXPECT_EQ(found[0], found[1]);
}

TEST_F(DRIVERTest, TheRepositoryHoldsAReferenceUntilTheInterfaceIsRemoved)
{
    IRebootMgmt* const interface = addRebootMgmt(1, "a");
    {
        auto const found = FOUND(TY::UUID::INVALID(), String::s_empty);
        DRIVER::INSTANCE().removeDriverInterface(interface);
        EXPECT_TRUE(FOUND(TY::UUID::INVALID(), String::s_empty).isEmpty());
        ASSERT_EQ(1U, m_alive); // by who found it
        EXPECT_TRUE(found[0]->addGracefulLock("owner", "reason", 0).isOk());
        EXPECT_TRUE(found[0]->releaseGracefulLock("owner").isOk());
    }
    EXPECT_EQ(0U, m_alive);
}

TEST_F(DRIVERTest, AnInterfaceRegisteredTwiceIsRemovedWholly)
{
    IRebootMgmt* const interface = addRebootMgmt(1, "a");
    add(interface, IDENTITY(2), "b");
    EXPECT_EQ(2U, FOUND(TY::UUID::INVALID(), String::s_empty).getSize());
    DRIVER::INSTANCE().removeDriverInterface(interface);
    EXPECT_TRUE(FOUND(TY::UUID::INVALID(), String::s_empty).isEmpty());
    EXPECT_EQ(0U, m_alive);
}

TEST_F(DRIVERTest, NullIsRefusedAndAnUnknownInterfaceIgnored)
{
    EXPECT_EQ(XCode::REFUSED, DRIVER::INSTANCE().addDriverInterface(nullptr, TY::UUID::INVALID(), "null"));
    addRebootMgmt(1, "a");
    TYPtr<OtherInterface> const unknown(new OtherInterface);
    DRIVER::INSTANCE().removeDriverInterface(unknown.get());
    DRIVER::INSTANCE().removeDriverInterface(nullptr);
    EXPECT_EQ(1U, FOUND(TY::UUID::INVALID(), String::s_empty).getSize());
}

TEST_F(DRIVERTest, AnInterfaceMayAskTheRepositoryAsItEnds)
{
    class Asking : public IDriverInterface
    {
    public:
        explicit Asking(std::size_t& found) : m_found(found) {}

    protected:
        ~Asking() override { m_found = FOUND(TY::UUID::INVALID(), String::s_empty).getSize(); }

    private:
        std::size_t& m_found;
    };
    std::size_t found = 0;
    IDriverInterface* const asking = add(new Asking(found), IDENTITY(1), "asking");
    addRebootMgmt(1, "a");
    addRebootMgmt(2, "b");
    DRIVER::INSTANCE().removeDriverInterface(asking);
    EXPECT_EQ(2U, found);
}
