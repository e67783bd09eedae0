#include "platform/asn1/AsnTrace.h"

#include <gtest/gtest.h>
#include <string>

TEST(AsnTrace, AFailureNamesTheSteps)
{
    String error("left from before");
    AsnTrace trace("Root", error);
    EXPECT_FALSE(trace.fail("is %s", "bad"));
    EXPECT_EQ("Root: is bad", error);
    AsnTrace::Step const list(trace, "list");
    {
        AsnTrace::Step const element(trace, std::size_t{12});
        AsnTrace::Step const field(trace, "field");
        EXPECT_FALSE(trace.fail("octet %d", 3));
        EXPECT_EQ("Root.list[12].field: octet 3", error);
    }
    EXPECT_FALSE(trace.fail("again"));
    EXPECT_EQ("Root.list: again", error);
}

TEST(AsnTrace, ALongReasonIsCutAndALongPathIsNot)
{
    String error;
    AsnTrace trace("Root", error);
    std::string const name(500, 'n');
    AsnTrace::Step const step(trace, name.c_str());
    EXPECT_FALSE(trace.fail("%s", std::string(500, 'r').c_str()));
    EXPECT_EQ("Root." + name + ": " + std::string(159, 'r'), error.c_str());
}
