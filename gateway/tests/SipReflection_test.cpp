#include "sip/access/SipReflection.h"

#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

namespace
{
InternetAddress NEIGHBOUR(unsigned char last) { return {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xff, 0xff, 192, 0, 2, last}; }

/// Octets of answers of 700 that so many requests of 400 get.
std::size_t ANSWERS(SipReflection& reflection, unsigned int requests, InternetAddress const& source = NEIGHBOUR(1))
{
    std::size_t sent = 0;
    for (unsigned int i = 0; i < requests; ++i)
        sent += reflection.admit(source, 400, 700) ? 700 : 0;
    return sent;
}
} // namespace

TEST(SipReflection, AFewOctetsAreForEverybody)
{
    DrivenClock clock;
    SipReflection reflection;
    EXPECT_EQ(ANSWERS(reflection, 5), 3500u);
    EXPECT_EQ(ANSWERS(reflection, 5, NEIGHBOUR(2)), 3500u);
    EXPECT_EQ(reflection.getNumberOfHeldBack(), 0u);
}

TEST(SipReflection, WhoseAddressMayBeMadeUpGetsNoMoreThanItSent)
{
    DrivenClock clock;
    SipReflection reflection;
    std::size_t const sent = ANSWERS(reflection, 1000);
    EXPECT_LE(sent, 400u * 1000u);
    EXPECT_GT(sent, 398000u);
    EXPECT_GT(reflection.getNumberOfHeldBack(), 400u);
}

TEST(SipReflection, WhomAnswersReachGetsThemForAnHour)
{
    DrivenClock clock;
    SipReflection reflection;
    reflection.noteReached(NEIGHBOUR(1));
    EXPECT_EQ(ANSWERS(reflection, 1000), 700u * 1000u);
    EXPECT_LE(ANSWERS(reflection, 100, NEIGHBOUR(2)), 400u * 100u) << "another one";
    clock.advance(1000 * SipReflection::MEMORY);
    EXPECT_LT(ANSWERS(reflection, 1000), 700u * 1000u);
}

TEST(SipReflection, ABoundedNumberOfSourcesIsKept)
{
    DrivenClock clock;
    SipReflection reflection(2);
    reflection.noteReached(NEIGHBOUR(1));
    clock.advance(1000);
    ANSWERS(reflection, 1, NEIGHBOUR(2));
    clock.advance(1000);
    ANSWERS(reflection, 1, NEIGHBOUR(3)); // the first one is forgotten
    EXPECT_LT(ANSWERS(reflection, 20, NEIGHBOUR(1)), 700u * 20u);
}
