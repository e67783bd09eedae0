#include "callcontrol/CallControl.h"
#include "testing/RecordingRegistryObserver.h"

#include <gtest/gtest.h>

namespace
{
/// Three observers with one journal; each walk is that of a context that does not exist.
class CallControl_ContextObservers_Test : public testing::Test
{
protected:
    void add(RecordingRegistryObserver& observer) { m_control.registerContextObserver(observer); }
    void remove(RecordingRegistryObserver& observer) { m_control.unregisterContextObserver(observer); }
    /// The names of those who are told, in order.
    std::string tell()
    {
        m_control.destroyContext("");
        return told();
    }
    std::string told()
    {
        std::string names;
        for (std::string const& line : m_journal.take())
            names += line.front();
        return names;
    }

    CallControl m_control;
    Journal m_journal;
    RecordingRegistryObserver m_a{"a", &m_journal};
    RecordingRegistryObserver m_b{"b", &m_journal};
    RecordingRegistryObserver m_c{"c", &m_journal};
};
} // namespace

TEST_F(CallControl_ContextObservers_Test, TheyAreToldInTheOrderOfTheirRegistration)
{
    add(m_c);
    add(m_a);
    add(m_b);
    EXPECT_EQ(tell(), "cab");
    EXPECT_EQ(m_control.createContext("lab"), XCode::OK);
    EXPECT_EQ(told(), "cab");
}

TEST_F(CallControl_ContextObservers_Test, OneThatIsRegisteredTwiceIsThereOnce)
{
    add(m_a);
    add(m_a);
    EXPECT_EQ(tell(), "a");
    remove(m_a);
    EXPECT_EQ(tell(), "") << "these registrations are not counted";
}

TEST_F(CallControl_ContextObservers_Test, AnUnknownOneIsIgnored)
{
    add(m_a);
    remove(m_b);
    EXPECT_EQ(tell(), "a");
}

TEST_F(CallControl_ContextObservers_Test, OneThatComesBackGoesToTheEnd)
{
    add(m_a);
    add(m_b);
    remove(m_a);
    add(m_a);
    EXPECT_EQ(tell(), "ba");
}

TEST_F(CallControl_ContextObservers_Test, OneMayUnregisterItselfInsideANotification)
{
    add(m_a);
    add(m_b);
    m_a.m_onDestroyed = [this](String const&) { remove(m_a); };
    EXPECT_EQ(tell(), "ab");
    EXPECT_EQ(tell(), "b");
}

TEST_F(CallControl_ContextObservers_Test, OneThatIsUnregisteredBeforeItsTurnIsNotTold)
{
    add(m_a);
    add(m_b);
    add(m_c);
    m_a.m_onDestroyed = [this](String const&) { remove(m_b); };
    EXPECT_EQ(tell(), "ac");
    EXPECT_EQ(tell(), "ac");
}

TEST_F(CallControl_ContextObservers_Test, OneThatIsRegisteredInsideANotificationIsToldOfIt)
{
    add(m_a);
    m_a.m_onDestroyed = [this](String const&) { add(m_b); };
    EXPECT_EQ(tell(), "ab");
}

TEST_F(CallControl_ContextObservers_Test, OneThatIsUnregisteredAndRegisteredInsideANotificationGoesToTheEnd)
{
    add(m_a);
    add(m_b);
    add(m_c);
    m_a.m_onDestroyed = [this](String const&)
    {
        m_a.m_onDestroyed = nullptr;
        remove(m_b);
        add(m_b);
    };
    EXPECT_EQ(tell(), "acb");
    EXPECT_EQ(tell(), "acb");
}

TEST_F(CallControl_ContextObservers_Test, AWalkInsideAWalkLeavesTheOuterOneWhole)
{
    add(m_a);
    add(m_b);
    m_a.m_onDestroyed = [this](String const&)
    {
        m_a.m_onDestroyed = nullptr;
        remove(m_a);
        m_control.destroyContext("other");
    };
    EXPECT_EQ(tell(), "abb");
    EXPECT_EQ(tell(), "b");
}

TEST_F(CallControl_ContextObservers_Test, AContextDestroyedInsideItsOwnEndIsDestroyedOnce)
{
    ASSERT_TRUE(m_control.createContext("lab").isOk());
    add(m_a);
    m_a.m_onDestroyed = [this](String const& name)
    {
        m_a.m_onDestroyed = nullptr;
        m_control.destroyContext(name);
    };
    m_control.destroyContext("lab");
    EXPECT_EQ(told(), "aa");
    EXPECT_EQ(m_control.getContext("lab"), nullptr);
}

TEST_F(CallControl_ContextObservers_Test, AContextDestroyedByWhoHearsOfItsBeginningIsGone)
{
    add(m_a);
    m_a.m_onAdded = [this](String const& name) { m_control.destroyContext(name); };
    EXPECT_EQ(m_control.createContext("lab"), XCode::OK) << "it was created";
    EXPECT_EQ(m_control.getContext("lab"), nullptr);
}
