#include "sip/access/SipPeers.h"

#include <gtest/gtest.h>

namespace
{
SipPeers::Order SORTED(std::vector<SipPeer> const& peers)
{
    SipPeers::Order order;
    for (std::size_t i = 0; i < peers.size(); ++i)
        order.push_back(i);
    SipPeers::SORT(order, [&](std::size_t i) -> SipPeer const& { return peers[i]; });
    return order;
}
SipPeer PEER(unsigned int priority, unsigned int weight) { return {{"192.0.2.1", 5060}, priority, weight}; }
} // namespace

TEST(SipPeers, TheLeastPriorityComesFirst)
{
    EXPECT_EQ(SORTED({PEER(3, 1), PEER(1, 1), PEER(2, 100)}), (SipPeers::Order{1, 2, 0}));
    EXPECT_EQ(SORTED({PEER(1, 1)}), (SipPeers::Order{0}));
    EXPECT_EQ(SORTED({}), SipPeers::Order());
}

TEST(SipPeers, OfEqualsEachIsFirstAsOftenAsItsWeightSays)
{
    constexpr int TIMES = 4000;
    int first[3] = {};
    for (int i = 0; i < TIMES; ++i)
        ++first[SORTED({PEER(1, 3), PEER(1, 1), PEER(2, 1)})[0]];
    EXPECT_NEAR(first[0], 3000, 300); // eleven times the standard deviation
    EXPECT_NEAR(first[1], 1000, 300);
    EXPECT_EQ(first[2], 0);
}

TEST(SipPeers, WithoutWeightOneIsAsGoodAsTheOther)
{
    SipPeers::Order const order = SORTED({PEER(1, 0), PEER(1, 0), PEER(0, 0)});
    EXPECT_EQ(order.front(), 2u);
    EXPECT_EQ(order.size(), 3u);
}
