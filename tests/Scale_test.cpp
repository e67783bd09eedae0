// Many calls at once: what one costs does not depend on how many are up.
#include "platform/base/TYRecycled.h"
#include "testing/CallControlFixture.h"
#include "tests/support/Party.h"

#include <algorithm>
#include <ctime>
#include <gtest/gtest.h>
#include <malloc.h>
#include <memory>
#include <random>
#include <vector>

namespace
{
/// A module of many lines that keeps no record of what happens.
class Exchange : public CC_Provider, public CC_Endpoint
{
public:
    Exchange() : CC_Provider("exchange", ""), CC_Endpoint(nullptr, nullptr), m_name("exchange")
    {
        std::ignore = CallControl::ADD_PROVIDER("SWITCH", m_name, *this);
    }
    ~Exchange() override { CallControl::REMOVE_PROVIDER("SWITCH", m_name); }

    XCode dial(CC_Call& call, String const&, String const& number, CC_PropertyContainer const& offered) override
    {
        return offer(call, number, offered);
    }
    XCode handleOffer(CC_Call& call, String const&, CC_PropertyContainer const&) override
    {
        return addLine().accept(call, CC_PropertyContainer::EMPTY());
    }
    CC_CallAdapter& addLine()
    {
        m_lines.push_back(std::make_unique<CC_CallAdapter>());
        std::ignore = m_lines.back()->setup("line", *this, nullptr);
        return *m_lines.back();
    }
    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_name; }
    ProviderType getProviderType() const override { return USER_DEFINED_INTERFACE; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }

    std::vector<std::unique_ptr<CC_CallAdapter>> m_lines;

private:
    String m_name;
};

double secondsOfThisThread()
{
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + 1e-9 * static_cast<double>(now.tv_nsec);
}

/// Puts `calls` calls up and takes them down in a random order; the processor time of one call.
double secondsPerCall(CallControlFixture& fixture, unsigned int calls)
{
    Exchange exchange;
    double const begin = secondsOfThisThread();
    for (unsigned int i = 0; i < calls; ++i)
    {
        auto const& none = CC_PropertyContainer::EMPTY();
        EXPECT_EQ(exchange.addLine().dial("SWITCH", "exchange", "1", none, none, none, nullptr), XCode::OK);
        std::ignore = exchange.m_lines.back()->setOwnProperty(State(CC_PropertyId::STATE, State::CONNECTED));
        if (i % 100 == 99)
            fixture.m_loop.settle();
    }
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), calls);
    std::shuffle(exchange.m_lines.begin(), exchange.m_lines.end(), std::mt19937(1));
    for (std::size_t i = 0; i < exchange.m_lines.size(); ++i)
    {
        exchange.m_lines[i]->drop(QCause::NORMAL_CALL_CLEARING, 0);
        if (i % 100 == 99)
            fixture.m_loop.settle();
    }
    fixture.m_loop.settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u);
    return (secondsOfThisThread() - begin) / calls;
}

TEST(Scale, TenThousandCallsCostNoMoreThanFourTimesAsMuchEachAsAHundred)
{
    // Memory once had is kept, so that what is measured is calls and not the system handing out pages; and the least of
    // several runs each, since what the machine does besides only adds. A hundred calls fit into the processor's cache,
    // ten thousand do not, and if others want it too that alone doubles the time; what grew with the number of calls
    // would make it a hundred times as much. Instructions are counted elsewhere.
    mallopt(M_TRIM_THRESHOLD, 1 << 30);
    TYRecycled::KEEP_BLOCKS(TYRecycled::DEFAULT_BLOCKS); // as in a gateway
    CallControlFixture fixture;
    double few = 1;
    double many = 1;
    for (int i = 0; i < 5 || (i < 50 && many > 4 * few); ++i)
    {
        for (int j = 0; j < 10; ++j)
            few = std::min(few, secondsPerCall(fixture, 100));
        many = std::min(many, secondsPerCall(fixture, 10000));
    }
    RecordProperty("microsecondsPerCallOf100", std::to_string(few * 1e6));
    RecordProperty("microsecondsPerCallOf10000", std::to_string(many * 1e6));
    TYRecycled::KEEP_BLOCKS(0);
    EXPECT_LE(many, 4 * few) << few * 1e6 << " and " << many * 1e6 << " microseconds";
}
} // namespace
