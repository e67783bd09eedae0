#include "callcontrol/CC_ObserverContainerOld.h"

#include "testing/FailingAllocator.h"

#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace
{
class Owner
{
};

/// Writes its name down, and then does what the test says.
struct Listener
{
    char letter;
    std::string& heard;
    std::function<void()> then = nullptr;
};

void NOTIFY(Listener& listener, Owner&, void*)
{
    listener.heard += listener.letter;
    if (listener.then)
        listener.then();
}

class CC_ObserverContainerOld_Test : public testing::Test
{
protected:
    using Container = CC_ObserverContainerOld<Listener, Owner>;

    void add(Listener& listener) { EXPECT_EQ(m_container->addObserver(listener), XCode::OK); }
    void remove(Listener const& listener) { m_container->removeObserver(listener); }
    /// Who is told, in order.
    std::string tell()
    {
        m_heard.clear();
        m_container->notifyObservers(NOTIFY, m_owner, nullptr);
        return m_heard;
    }
    std::string numberInDump() const
    {
        InfoContainer info;
        m_container->getInfo(info, 9, 0, 9, 0, "");
        return info.getEntry(1).text.c_str();
    }

    Owner m_owner;
    std::string m_heard;
    std::unique_ptr<Container> m_container = std::make_unique<Container>();
    Listener m_a{'a', m_heard};
    Listener m_b{'b', m_heard};
    Listener m_c{'c', m_heard};
};
} // namespace

TEST_F(CC_ObserverContainerOld_Test, NobodyIsToldByAnEmptyList) { EXPECT_EQ(tell(), ""); }

TEST_F(CC_ObserverContainerOld_Test, ObserversAreToldInTheOrderOfTheirFirstRegistration)
{
    add(m_b);
    add(m_a);
    add(m_b);
    EXPECT_EQ(tell(), "ba");
}

TEST_F(CC_ObserverContainerOld_Test, AnObserverThatIsAddedAgainKeepsItsPlace)
{
    add(m_a);
    add(m_b);
    remove(m_a);
    add(m_a);
    EXPECT_EQ(tell(), "ab");
}

TEST_F(CC_ObserverContainerOld_Test, AnObserverAddedTwiceIsToldOnceAndTakesTwoRemovals)
{
    add(m_a);
    add(m_a);
    EXPECT_EQ(tell(), "a");
    remove(m_a);
    EXPECT_EQ(tell(), "a");
    remove(m_a);
    EXPECT_EQ(tell(), "");
}

TEST_F(CC_ObserverContainerOld_Test, TheCountHasNoFloor)
{
    add(m_a);
    remove(m_a);
    remove(m_a);
    EXPECT_EQ(tell(), "a") << "-1 is not 0";
    add(m_a);
    EXPECT_EQ(tell(), "") << "and one registration only brings it back to 0";
}

TEST_F(CC_ObserverContainerOld_Test, AddRemoveRemoveAddIsSilent)
{
    add(m_a);
    remove(m_a);
    remove(m_a);
    add(m_a);
    EXPECT_EQ(tell(), "");
    add(m_a);
    EXPECT_EQ(tell(), "a");
}

TEST_F(CC_ObserverContainerOld_Test, RemovingAnObserverThatWasNeverAddedLeavesNoEntry)
{
    remove(m_a);
    EXPECT_EQ(tell(), "");
    EXPECT_EQ(numberInDump(), "0");
    add(m_a);
    EXPECT_EQ(tell(), "a");
}

TEST_F(CC_ObserverContainerOld_Test, ASilencedListTellsNobody)
{
    add(m_a);
    add(m_b);
    remove(m_b);
    remove(m_b);
    m_container->silence();
    EXPECT_EQ(tell(), "");
}

TEST_F(CC_ObserverContainerOld_Test, AnObserverAddedDuringANotificationIsToldOfIt)
{
    add(m_a);
    m_a.then = [&] { add(m_b); };
    EXPECT_EQ(tell(), "ab");
}

TEST_F(CC_ObserverContainerOld_Test, AnObserverRemovedBeforeItsTurnIsNotTold)
{
    add(m_a);
    add(m_b);
    add(m_c);
    m_a.then = [&] { remove(m_b); };
    EXPECT_EQ(tell(), "ac");
}

TEST_F(CC_ObserverContainerOld_Test, AnObserverMayRemoveItself)
{
    add(m_a);
    add(m_b);
    m_a.then = [&] { remove(m_a); };
    EXPECT_EQ(tell(), "ab");
    EXPECT_EQ(tell(), "b");
}

TEST_F(CC_ObserverContainerOld_Test, AnotherNotificationMayRunInsideOne)
{
    add(m_a);
    add(m_b);
    m_a.then = [&]
    {
        m_a.then = nullptr;
        m_container->notifyObservers(NOTIFY, m_owner, nullptr);
    };
    EXPECT_EQ(tell(), "aabb");
}

TEST_F(CC_ObserverContainerOld_Test, TheListMayEndInsideItsOwnNotification)
{
    add(m_a);
    add(m_b);
    Listener& first = m_a;
    first.then = [&] { m_container.reset(); };
    m_container->notifyObservers(NOTIFY, m_owner, nullptr);
    EXPECT_EQ(m_heard, "a") << "the walk ends with its list";
}

TEST_F(CC_ObserverContainerOld_Test, TheListMayEndInsideANestedNotification)
{
    add(m_a);
    add(m_b);
    Listener& first = m_a;
    int depth = 0;
    first.then = [&]
    {
        if (++depth == 2)
            m_container.reset();
        else
            m_container->notifyObservers(NOTIFY, m_owner, nullptr);
    };
    m_container->notifyObservers(NOTIFY, m_owner, nullptr);
    EXPECT_EQ(m_heard, "aa") << "both walks end with it";
}

TEST_F(CC_ObserverContainerOld_Test, TheDatumReachesTheTrampoline)
{
    struct Probe
    {
        static void NOTIFY_WITH(Listener& listener, Owner&, void* data) { listener.heard += static_cast<char*>(data); }
    };
    add(m_a);
    char text[] = "datum";
    m_container->notifyObservers(Probe::NOTIFY_WITH, m_owner, text);
    EXPECT_EQ(m_heard, "datum");
}

TEST_F(CC_ObserverContainerOld_Test, WithoutMemoryANewObserverIsRefusedAndAKnownOneIsNot)
{
    add(m_a);
    add(m_b); // the first two need no memory
    FailingAllocator::failNth(1);
    XCode const refused = m_container->addObserver(m_c);
    FailingAllocator::stop();
    EXPECT_EQ(refused, XCode::NO_ELEMENT);
    EXPECT_EQ(tell(), "ab");
    EXPECT_EQ(numberInDump(), "2");

    FailingAllocator::failNth(1);
    XCode const counted = m_container->addObserver(m_a);
    FailingAllocator::stop();
    EXPECT_EQ(counted, XCode::OK);
}

TEST_F(CC_ObserverContainerOld_Test, TheDumpNumbersTheEntriesEvenThoseWithoutRegistrations)
{
    add(m_a);
    add(m_b);
    remove(m_b);
    InfoContainer info;
    EXPECT_EQ(&m_container->getInfo(info, 9, 2, 9, 4, "Context "), &info);
    ASSERT_EQ(info.getNumberOfEntries(), 2u);
    EXPECT_EQ(info.getEntry(0).level, 2u);
    EXPECT_EQ(info.getEntry(0).detail, 4u);
    EXPECT_EQ(info.getEntry(0).key, "Context Observer Container");
    EXPECT_EQ(info.getEntry(0).text, "");
    EXPECT_EQ(info.getEntry(1).level, 3u);
    EXPECT_EQ(info.getEntry(1).detail, 4u);
    EXPECT_EQ(info.getEntry(1).key, "Number Of Observers");
    EXPECT_EQ(info.getEntry(1).text, "2");
}

TEST_F(CC_ObserverContainerOld_Test, TheDumpKeepsToItsLimits)
{
    struct Case
    {
        unsigned int maxLevel;
        unsigned int maxDetail;
        unsigned int entries;
    };
    for (Case const& row : {Case{3, 4, 2}, Case{2, 4, 1}, Case{1, 4, 0}, Case{3, 3, 0}})
    {
        InfoContainer info;
        m_container->getInfo(info, row.maxLevel, 2, row.maxDetail, 4, "");
        EXPECT_EQ(info.getNumberOfEntries(), row.entries) << row.maxLevel << " " << row.maxDetail;
    }
}
