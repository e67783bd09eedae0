#include "platform/base/InfoContainer.h"
#include "platform/base/IpAddress.h"
#include "platform/base/TYVector.h"
#include "platform/driver/DRIVER.h"
#include "platform/eventloop/TYEventLoop.h"
#include "platform/eventloop/TYTimer.h"
#include "platform/media/VoipCodecListSet.h"
#include "platform/monitor/Monitor.h"
#include "testing/FailingAllocator.h"

#include <array>
#include <gtest/gtest.h>
#include <new>
#include <optional>
#include <string>
#include <string_view>
#include <thread>

namespace
{
/// While it lives, the program gets that many pieces of memory; the next is refused.
class MemoryLimit
{
public:
    explicit MemoryLimit(unsigned int allocations) { FailingAllocator::failNth(allocations + 1UL); }
    ~MemoryLimit() { FailingAllocator::stop(); }
    MemoryLimit(MemoryLimit const&) = delete;
    MemoryLimit& operator=(MemoryLimit const&) = delete;
};

/// Calls `operation(allocations)` with 0, 1, 2 ... until it says that it had enough; how often it had not.
template <class Operation>
unsigned int COUNT_REFUSALS(Operation operation)
{
    unsigned int refusals = 0;
    while (refusals < 100 && !operation(refusals))
        ++refusals;
    return refusals;
}

// longer than what a string holds inside its own object
char const* const s_longKey = "a key that needs memory of its own";
char const* const s_longText = "a text that needs memory of its own";
} // namespace

TEST(OutOfMemory, ADumpDropsTheEntryAndSaysThatItIsIncomplete)
{
    String const key(s_longKey);
    String const text(s_longText);
    unsigned int const refusals = COUNT_REFUSALS(
        [&](unsigned int allocations)
        {
            InfoContainer info;
            info.add(0, 0, "first", "1");
            {
                MemoryLimit const limit(allocations);
                info.add(1, 0, key, text);
            }
            std::string const dump = info.getString_TreeFormat().c_str();
            EXPECT_EQ(info.isIncomplete() ? 1U : 2U, info.getNumberOfEntries());
            EXPECT_EQ(info.isIncomplete(), dump == "first: 1\n(incomplete: memory ran out)\n");
            return !info.isIncomplete();
        });
    EXPECT_GE(refusals, 2U); // key and text at least
    EXPECT_LT(refusals, 100U);
}

TEST(OutOfMemory, ADumpWithinLimitsReportsAPrefixThatCannotBeJoined)
{
    String const prefix(s_longKey);
    InfoContainer info;
    {
        MemoryLimit const limit(0);
        info.addWithin(1, 1, 1, 1, prefix, "label", "");
    }
    EXPECT_TRUE(info.isIncomplete());
    EXPECT_EQ(0U, info.getNumberOfEntries());
}

TEST(OutOfMemory, ADriverInterfaceIsRefusedAndStaysTheCallers)
{
    class Interface : public IDriverInterface
    {
    };
    TYPtr<IDriverInterface> const interface(new Interface);
    String const name(s_longText);
    unsigned int const refusals = COUNT_REFUSALS(
        [&](unsigned int allocations)
        {
            XCode result;
            {
                MemoryLimit const limit(allocations);
                result = DRIVER::INSTANCE().addDriverInterface(interface.get(), TY::UUID::INVALID(), name);
            }
            TYVector<TYPtr<IDriverInterface>> found;
            EXPECT_TRUE(DRIVER::INSTANCE().getDriverInterfaces(found, TY::UUID::INVALID(), name).isOk());
            EXPECT_EQ(result.isOk() ? 1U : 0U, found.getSize());
            EXPECT_TRUE(result.isOk() || result == XCode::NO_ELEMENT);
            return result.isOk();
        });
    EXPECT_GE(refusals, 1U);

    TYVector<TYPtr<IDriverInterface>> found;
    XCode result;
    {
        MemoryLimit const limit(0);
        result = DRIVER::INSTANCE().getDriverInterfaces(found, TY::UUID::INVALID(), String::s_empty);
    }
    EXPECT_EQ(XCode::NO_ELEMENT, result);
    EXPECT_TRUE(found.isEmpty());
    DRIVER::INSTANCE().removeDriverInterface(interface.get());
}

TEST(OutOfMemory, ACodecListReportsItAndStaysAsItWas)
{
    VoipCodecList list;
    XCode result;
    {
        MemoryLimit const limit(0);
        result = list.append(VoipCodec(MG_Rtp::ECodec::PCMA, 20));
    }
    EXPECT_EQ(XCode::NO_ELEMENT, result);
    EXPECT_TRUE(list.isEmpty());
}

TEST(OutOfMemory, CopyingCodecsThrowsAndLeaksNothing)
{
    VoipCodecListSet set;
    for (unsigned int i = 0; i < VoipCodecListSet::NUMBER_OF_LISTS; ++i)
        ASSERT_TRUE(set.getList(static_cast<VoipCodecListSet::Direction>(i))
                        .append(VoipCodec(MG_Rtp::ECodec::PCMA, 20))
                        .isOk());
    EXPECT_EQ(3U, COUNT_REFUSALS( // one for each list
                      [&](unsigned int allocations)
                      {
                          MemoryLimit const limit(allocations);
                          try
                          {
                              VoipCodecListSet const copy(set);
                              return copy == set;
                          }
                          catch (std::bad_alloc const&)
                          {
                              return false;
                          }
                      }));
}

TEST(OutOfMemory, PostingAndRunningEventsNeedsNone)
{
    TYEventLoop loop;
    ASSERT_GE(loop.getPollFd(), 0);
    unsigned int runs = 0;
    auto* const event = new TYEvent(
        loop, EventPrio::HIGH, [](void* argument) { ++*static_cast<unsigned int*>(argument); }, &runs);
    MemoryLimit const limit(0);
    bool const isFirstPosted = event->setIfNotPending().isOk();
    bool const hadWork = loop.runTurn();
    bool const isSecondPosted = event->setIfNotPending().isOk();
    event->destroy();
    EXPECT_EQ(0UL, FailingAllocator::count());
    EXPECT_TRUE(isFirstPosted && hadWork && isSecondPosted);
    EXPECT_EQ(1U, runs);
}

TEST(OutOfMemory, StartingStoppingAndRunningTimersNeedsNone)
{
    TYEventLoop loop;
    ASSERT_GE(loop.getPollFd(), 0);
    unsigned int runs = 0;
    bool isPeriodicTaken = false;
    {
        MemoryLimit const limit(0);
        std::array<std::optional<TYTimer>, 100> timers;
        for (std::optional<TYTimer>& timer : timers)
            timer
                .emplace(
                    loop, EventPrio::HIGH, [](void* argument) { ++*static_cast<unsigned int*>(argument); }, &runs)
                .start(0);
        timers[10]->start(1000000);
        timers[20]->stop();
        isPeriodicTaken = timers[30]->startPeriodic(1000000).isOk();
        loop.runTurn();
        timers[40]->start(2000000);
        EXPECT_EQ(0UL, FailingAllocator::count());
    }
    EXPECT_TRUE(isPeriodicTaken);
    EXPECT_EQ(97U, runs);
}

TEST(OutOfMemory, ASynchronisationEventReportsItAndNeverRunsTheFunction)
{
    TYEventLoop loop;
    bool hasRun = false;
    XCode result;
    std::thread(
        [&]
        {
            MemoryLimit const limit(0);
            result = loop.getSyncEvent(EventPrio::HIGH).execute([&] { hasRun = true; });
        })
        .join();
    EXPECT_EQ(XCode::NO_ELEMENT, result);
    EXPECT_FALSE(loop.runTurn());
    EXPECT_FALSE(hasRun);
}

TEST(OutOfMemory, ALogLineTooLongForTheStackIsWrittenAsItsFormat)
{
    class Writer : public RTD::Writer
    {
    public:
        void write(unsigned int, unsigned int, char const* text) override
        {
            m_isFormat = std::string_view(text) == "[Call %s]";
        }
        bool m_isFormat = false;
    };
    Writer writer;
    RTD::REPOSITORY::SET_WRITER(&writer);
    RTD::REPOSITORY::ENABLE(41, RTD::LEVEL_FLOW);
    RTD::Monitor const* const monitor = RTD::REPOSITORY::GET_MONITOR_IF_ENABLED_FOR_LOGGING(41, RTD::LEVEL_FLOW);
    ASSERT_NE(nullptr, monitor);
    std::string const name(1000, 'x');
    {
        MemoryLimit const limit(0);
        monitor->debug("[Call %s]", name.c_str());
    }
    RTD::REPOSITORY::ENABLE(41, RTD::LEVEL_OFF);
    RTD::REPOSITORY::SET_WRITER(nullptr);
    EXPECT_TRUE(writer.m_isFormat);
}

TEST(OutOfMemory, ReadingAnAddressNeedsNone)
{
    String const text("2001:0db8:0000:0000:0000:0000:0000:0000/32");
    IpAddress address;
    XCode result = XCode::FAILURE;
    {
        MemoryLimit const limit(0);
        result = address.setIpAddrAsString(text);
        EXPECT_EQ(0UL, FailingAllocator::count());
    }
    EXPECT_TRUE(result.isOk());
    EXPECT_TRUE(address.isNetType());
}

TEST(OutOfMemory, AStringThatCannotBeAssignedStaysAsItWas)
{
    String text("before");
    XCode refused;
    XCode taken = XCode::FAILURE;
    {
        MemoryLimit const limit(0);
        refused = text.assign(s_longText);
        EXPECT_EQ("before", text);
        taken = text.assign("fits inside");
    }
    EXPECT_EQ(XCode::NO_ELEMENT, refused);
    EXPECT_EQ(XCode::OK, taken);
    EXPECT_EQ("fits inside", text);
}
