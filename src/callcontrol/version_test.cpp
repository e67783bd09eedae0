#include "callcontrol.h" // and nothing else: it must bring everything

#include <gtest/gtest.h>

static_assert(CALLCONTROL_VERSION == CALLCONTROL_VERSION_NUMBER(CALLCONTROL_VERSION_MAJOR, CALLCONTROL_VERSION_MINOR,
                                                                CALLCONTROL_VERSION_PATCH));
static_assert(CALLCONTROL_VERSION_NUMBER(1, 2, 3) < CALLCONTROL_VERSION_NUMBER(1, 10, 0));
static_assert(CALLCONTROL_VERSION_NUMBER(1, 99, 99) < CALLCONTROL_VERSION_NUMBER(2, 0, 0));
#if CALLCONTROL_VERSION < CALLCONTROL_VERSION_NUMBER(1, 0, 0)
#error "the version is of use to the preprocessor"
#endif

TEST(Version, HeadersAndLibraryAgree)
{
    EXPECT_EQ(CALLCONTROL_LIBRARY_VERSION(), CALLCONTROL_VERSION);
    EXPECT_STREQ(CALLCONTROL_LIBRARY_VERSION_STRING(), CALLCONTROL_VERSION_STRING);
}

TEST(Version, TheTextIsMadeOfTheNumbers)
{
    String const text = String::stringOf(CALLCONTROL_VERSION_MAJOR) + "." +
                        String::stringOf(CALLCONTROL_VERSION_MINOR) + "." + String::stringOf(CALLCONTROL_VERSION_PATCH);
    EXPECT_EQ(text, CALLCONTROL_VERSION_STRING);
}

TEST(Version, TheUmbrellaHeaderBringsEachSubsystem)
{
    TYEventLoop loop;
    CC_CallAdapterE164 const adapter;
    CC_ServicePushBack const service(0);
    EXPECT_FALSE(loop.runTurn());
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
}
