#include "isdn/line/IsdnBlock.h"
#include "isdn/line/IsdnSocketLine.h"
#include "isdn/line/IsdnSocketListener.h"

#include <gtest/gtest.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>

#include <filesystem>
#include <vector>

namespace
{
using Frame = std::vector<unsigned char>;

bool IS_READABLE(int descriptor)
{
    pollfd waiting = {descriptor, POLLIN, 0};
    return poll(&waiting, 1, 0) == 1;
}

Frame NEXT(IsdnLine& line)
{
    Frame frame(IsdnLine::LONGEST_FRAME);
    frame.resize(line.receive(frame));
    return frame;
}

std::size_t OPEN_DESCRIPTORS()
{
    auto const all = std::filesystem::directory_iterator("/proc/self/fd");
    return static_cast<std::size_t>(std::distance(begin(all), end(all)));
}

struct IsdnLineTest : testing::Test
{
    IsdnLineTest()
    {
        auto ends = IsdnWires::MAKE();
        near = std::make_unique<IsdnSocketLine>(std::move(ends->first));
        far = std::make_unique<IsdnSocketLine>(std::move(ends->second));
    }

    std::unique_ptr<IsdnSocketLine> near;
    std::unique_ptr<IsdnSocketLine> far;
};

struct IsdnListenerTest : testing::Test
{
    IsdnListenerTest() { EXPECT_TRUE(listener.open(path)); }

    std::unique_ptr<IsdnSocketLine> accept()
    {
        std::optional<IsdnWires> wires = listener.accept();
        return wires ? std::make_unique<IsdnSocketLine>(std::move(*wires)) : nullptr;
    }

    std::string path = testing::TempDir() + "line" + std::to_string(getpid());
    IsdnSocketListener listener;
};
} // namespace

TEST_F(IsdnLineTest, AFrameKeepsItsBounds)
{
    EXPECT_TRUE(near->send(Frame{1, 2, 3}));
    EXPECT_TRUE(near->send(Frame{4}));
    EXPECT_TRUE(IS_READABLE(far->getDescriptor()));
    EXPECT_EQ(NEXT(*far), (Frame{1, 2, 3}));
    EXPECT_EQ(NEXT(*far), Frame{4});
    EXPECT_EQ(NEXT(*far), Frame());
    EXPECT_TRUE(far->isOpen());
}

TEST_F(IsdnLineTest, AnEndThatGoesClosesTheOther)
{
    far->close();
    EXPECT_TRUE(IS_READABLE(near->getDescriptor()));
    EXPECT_EQ(NEXT(*near), Frame());
    EXPECT_FALSE(near->isOpen());
    EXPECT_NE(near->getDescriptor(), -1) << "whoever waits for it has to be told first";
    EXPECT_FALSE(near->send(Frame{1}));
    EXPECT_EQ(near->openChannel(1).get(), -1);
    EXPECT_FALSE(near->open()) << "nobody knows where it led";
    near->close();
    EXPECT_EQ(near->getDescriptor(), -1);
}

TEST_F(IsdnLineTest, EachTimeslotIsAChannelOfItsOwn)
{
    for (unsigned int timeslot = 0; timeslot < 40; ++timeslot)
    {
        bool const isB = timeslot != 0 && timeslot != 16 && timeslot < 32;
        IsdnDescriptor const from = near->openChannel(timeslot);
        IsdnDescriptor const to = far->openChannel(timeslot);
        ASSERT_EQ(from.get() >= 0, isB) << timeslot;
        if (!isB)
            continue;
        IsdnBlock sent{0xfffefdfc + timeslot, {}};
        sent.speech.fill(static_cast<unsigned char>(timeslot));
        EXPECT_TRUE(sent.send(from.get()));
        IsdnBlock got;
        ASSERT_TRUE(got.receive(to.get())) << timeslot;
        EXPECT_EQ(got.timestamp, sent.timestamp);
        EXPECT_EQ(got.speech, sent.speech);
        EXPECT_FALSE(got.receive(to.get()));
    }
}

TEST_F(IsdnLineTest, ACallDoesNotHearTheOneBefore)
{
    IsdnDescriptor const from = near->openChannel(7);
    for (unsigned int i = 0; i < 100; ++i)
        IsdnBlock{i, {}}.send(from.get());
    IsdnDescriptor const to = far->openChannel(7);
    IsdnBlock block;
    EXPECT_FALSE(block.receive(to.get()));
    EXPECT_TRUE(IsdnBlock({100, {}}).send(from.get()));
    ASSERT_TRUE(block.receive(to.get()));
    EXPECT_EQ(block.timestamp, 100u);
}

TEST_F(IsdnLineTest, WhatIsNoBlockIsPassedOver)
{
    IsdnDescriptor const from = near->openChannel(1);
    IsdnDescriptor const to = far->openChannel(1);
    for (std::size_t const length : {1u, 163u, 165u, 4096u})
        ASSERT_EQ(send(from.get(), Frame(length).data(), length, 0), static_cast<ssize_t>(length));
    IsdnBlock block;
    EXPECT_FALSE(block.receive(to.get()));
    IsdnBlock{5, {}}.send(from.get());
    ASSERT_TRUE(block.receive(to.get()));
    EXPECT_EQ(block.timestamp, 5u);
}

TEST_F(IsdnLineTest, ABlockThatNobodyTakesIsLostInTheEnd)
{
    IsdnDescriptor const from = near->openChannel(1);
    unsigned int taken = 0;
    while (IsdnBlock{taken, {}}.send(from.get()) && taken < 100000)
        ++taken;
    EXPECT_LT(taken, 100000u);
}

TEST_F(IsdnListenerTest, BothEndsHaveTheWholeLine)
{
    IsdnSocketLine near(path);
    EXPECT_FALSE(near.isOpen());
    ASSERT_TRUE(near.open());
    EXPECT_TRUE(near.open()) << "it is already";
    EXPECT_TRUE(IS_READABLE(listener.getDescriptor()));
    auto const far = accept();
    ASSERT_NE(far, nullptr);
    near.send(Frame{9});
    EXPECT_EQ(NEXT(*far), Frame{9});
    IsdnDescriptor const to = near.openChannel(31);
    IsdnBlock{77, {}}.send(far->openChannel(31).get());
    IsdnBlock block;
    ASSERT_TRUE(block.receive(to.get()));
    EXPECT_EQ(block.timestamp, 77u);
    EXPECT_EQ(accept(), nullptr);
}

TEST_F(IsdnListenerTest, ALineOpensAgainWhenSomebodyListensAgain)
{
    IsdnSocketLine near(path);
    {
        IsdnSocketLine other(path + ".other");
        EXPECT_FALSE(other.open()) << "nobody listens there";
    }
    ASSERT_TRUE(near.open());
    accept();
    EXPECT_EQ(NEXT(near), Frame()) << "the far end has gone at once";
    EXPECT_FALSE(near.isOpen());
    ASSERT_TRUE(near.open());
    EXPECT_NE(accept(), nullptr);
}

TEST_F(IsdnListenerTest, AStrangerLeavesNothingBehind)
{
    std::size_t const before = OPEN_DESCRIPTORS();
    {
        IsdnDescriptor const stranger(socket(AF_UNIX, SOCK_SEQPACKET, 0));
        sockaddr_un address = {};
        address.sun_family = AF_UNIX;
        path.copy(address.sun_path, path.size());
        ASSERT_EQ(connect(stranger.get(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
        EXPECT_EQ(accept(), nullptr) << "it has said nothing yet";
        send(stranger.get(), "hello", 5, 0);
        EXPECT_EQ(accept(), nullptr);
    }
    EXPECT_EQ(accept(), nullptr);
    EXPECT_EQ(OPEN_DESCRIPTORS(), before);
}
