#include "sip/access/SipSources.h"

#include <gtest/gtest.h>

namespace
{
InternetAddress HOST(unsigned int number)
{
    InternetAddress address = {};
    for (std::size_t i = 0; i < sizeof number; ++i)
        address[address.size() - 1 - i] = static_cast<unsigned char>(number >> (8 * i));
    return address;
}

using Numbers = SipSources<unsigned int>;
} // namespace

TEST(SipSources, AnAddressThatIsNewHasANewRecord)
{
    Numbers sources(2);
    EXPECT_EQ(sources.find(HOST(1)), nullptr);
    EXPECT_EQ(sources.use(HOST(1))++, 0u);
    EXPECT_EQ(sources.use(HOST(1)), 1u);
    EXPECT_EQ(*sources.find(HOST(1)), 1u);
}

TEST(SipSources, WhoWasUsedLeastLatelyIsForgottenWhenAnotherComes)
{
    Numbers sources(2);
    sources.use(HOST(1)) = 1;
    sources.use(HOST(2)) = 2;
    sources.use(HOST(1));
    EXPECT_EQ(*sources.find(HOST(2)), 2u); // which is no use
    sources.use(HOST(3)) = 3;
    EXPECT_EQ(sources.find(HOST(2)), nullptr);
    EXPECT_EQ(*sources.find(HOST(1)), 1u);
    EXPECT_EQ(*sources.find(HOST(3)), 3u);
    EXPECT_EQ(sources.getSize(), 2u);
}

TEST(SipSources, OneThatWasTakenOutIsNotThere)
{
    Numbers sources(2);
    sources.use(HOST(1)) = 1;
    sources.use(HOST(2)) = 2;
    sources.erase(HOST(1));
    sources.erase(HOST(7));
    EXPECT_EQ(sources.find(HOST(1)), nullptr);
    sources.use(HOST(3)) = 3;
    EXPECT_EQ(*sources.find(HOST(2)), 2u) << "there was room";
}

TEST(SipSources, AFloodOfAddressesKeepsTheLastOnesInTheirOrder)
{
    Numbers sources(4096);
    for (unsigned int i = 0; i < 100000; ++i)
        sources.use(HOST(i)) = i;
    EXPECT_EQ(sources.getSize(), 4096u);
    unsigned int next = 100000 - 4096;
    for (auto const& [address, number] : sources)
        EXPECT_EQ(number, next++);
    EXPECT_EQ(next, 100000u);
}
