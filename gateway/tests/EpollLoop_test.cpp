#include "host/EpollLoop.h"

#include <gtest/gtest.h>

#include <array>
#include <stdexcept>
#include <unistd.h>

namespace
{
class EpollLoopTest : public testing::Test
{
protected:
    EpollLoopTest()
    {
        for (auto& pipe : m_pipes)
            EXPECT_EQ(::pipe(pipe.data()), 0);
    }
    ~EpollLoopTest() override
    {
        for (auto const& pipe : m_pipes)
            for (int const descriptor : pipe)
                close(descriptor);
    }
    int reader(std::size_t pipe) const { return m_pipes[pipe][0]; }
    void write(std::size_t pipe) const { EXPECT_EQ(::write(m_pipes[pipe][1], "x", 1), 1); }

    EpollLoop loop;

private:
    std::array<std::array<int, 2>, 2> m_pipes{};
};
} // namespace

TEST_F(EpollLoopTest, WhoIsReadableIsCalledUntilTheLoopIsStopped)
{
    unsigned int calls = 0;
    loop.watch(reader(0),
               [&]
               {
                   if (++calls == 3) // nobody has read
                       loop.stop();
               });
    loop.watch(reader(1), [] { FAIL() << "nothing came"; });
    write(0);
    loop.run();
    EXPECT_EQ(calls, 3u);
}

TEST_F(EpollLoopTest, OneThatForgetsItselfOrAnotherIsNotCalledAgain)
{
    unsigned int calls = 0;
    auto const forgetBoth = [&]
    {
        ++calls;
        loop.forget(reader(0));
        loop.forget(reader(1));
        loop.stop();
    };
    loop.watch(reader(0), forgetBoth);
    loop.watch(reader(1), forgetBoth);
    write(0);
    write(1);
    loop.run();
    EXPECT_EQ(calls, 1u) << "the other was due in the same turn";
    loop.forget(reader(0)); // of which it knows nothing
}

TEST_F(EpollLoopTest, WhatIsWatchedAgainIsToldToTheLaterOne)
{
    loop.watch(reader(0), [] { FAIL() << "another has taken its place"; });
    loop.watch(reader(0), [&] { loop.stop(); });
    write(0);
    loop.run();
}

TEST_F(EpollLoopTest, WhatIsNoDescriptorIsRefused)
{
    EXPECT_THROW(loop.watch(-1, [] {}), std::runtime_error);
}
