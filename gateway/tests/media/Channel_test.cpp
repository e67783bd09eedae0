#include "MediaFixture.h"

#include <sys/socket.h>
#include <unistd.h>

namespace
{
/// A leg on a channel of a line, whose other end the test has.
class Channel : public MediaFixture
{
protected:
    Channel()
    {
        EXPECT_EQ(socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK | SOCK_CLOEXEC, 0, ends), 0);
        side.leg = call->addChannel(ends[0], side);
        turn();
    }

    int ends[2] = {-1, -1};
    Side side;
    TYPtr<CallMedia> call = makeCallOfTheSameLoop();
};
} // namespace

TEST_F(Channel, WakesNobodyAnyMoreWhenItsOtherEndHasGone)
{
    ASSERT_NE(side.leg, nullptr);
    int const another = dup(ends[0]); // what is open elsewhere, too, must not keep the loop awake either
    close(ends[1]);
    EXPECT_TRUE(layer->getLoop(0).turn(0));
    EXPECT_FALSE(layer->getLoop(0).turn(0));
    side.leg.reset();
    turn();
    EXPECT_FALSE(layer->getLoop(0).turn(0));
    close(another);
}
