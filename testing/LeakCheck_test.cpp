#include "testing/LeakCheck.h"

#include "calls/CC_CallLeg.h"
#include "platform/base/TYPtr.h"
#include "testing/FakeMediaContext.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingProvider.h"

#include <array>
#include <cstdio>
#include <gtest/gtest.h>
#include <optional>
#include <string>
#include <sys/wait.h>

namespace
{
struct Outcome
{
    int status;
    std::string text;
};

/// Runs those tests of the program that leaks on purpose.
Outcome RUN_LEAKING(std::string const& filter)
{
    std::string const command = std::string(LEAKING_PROGRAM) + " --gtest_color=no --gtest_filter='" + filter + "' 2>&1";
    std::FILE* const output = popen(command.c_str(), "r");
    if (output == nullptr)
        return {-1, "could not be started"};
    std::string text;
    std::array<char, 512> part{};
    while (std::size_t const size = std::fread(part.data(), 1, part.size(), output))
        text.append(part.data(), size);
    int const status = pclose(output);
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, text};
}

bool CONTAINS(std::string const& text, std::string const& part) { return text.find(part) != std::string::npos; }
} // namespace

TEST(LeakCheck, NothingChangedComparesEmpty)
{
    LeakCheck const check;
    CC_CallLeg* const leg = new CC_CallLeg;
    leg->removeReference();
    EXPECT_EQ(check.compare(), "");
}

TEST(LeakCheck, SaysWhichClassLeakedHowMany)
{
    LeakCheck const check;
    CC_CallLeg* const first = new CC_CallLeg;
    CC_CallLeg* const second = new CC_CallLeg;
    EXPECT_EQ(check.compare(), "CC_Property: 6 more, CC_CallLeg: 2 more");
    first->removeReference();
    second->removeReference();
    EXPECT_EQ(check.compare(), "");
}

TEST(LeakCheck, AnObjectThatEndedIsOneFewer)
{
    CC_CallLeg* const leg = new CC_CallLeg;
    LeakCheck const check;
    leg->removeReference();
    EXPECT_EQ(check.compare(), "CC_Property: 3 fewer, CC_CallLeg: 1 fewer");
}

TEST(LeakCheck, CountsProvidersEndpointsAndMediaContexts)
{
    LeakCheck const check;
    std::optional<RecordingProvider> provider("p");
    std::optional<RecordingEndpoint> endpoint("e");
    TYPtr<MG_IContext> context(new FakeMediaContext(1));
    EXPECT_EQ(check.compare(), "CC_Provider: 1 more, CC_Endpoint: 1 more, FakeMediaContext: 1 more");
    provider.reset();
    endpoint.reset();
    context.set(nullptr);
    EXPECT_EQ(check.compare(), "");
}

TEST(LeakCheck, TheMainFailsATestThatLeaks)
{
    Outcome const outcome = RUN_LEAKING("Leaking.LeavesALegBehind");
    EXPECT_EQ(outcome.status, 1) << outcome.text;
    EXPECT_TRUE(
        CONTAINS(outcome.text, "The test leaves counted objects behind: CC_Property: 3 more, CC_CallLeg: 1 more"))
        << outcome.text;
    EXPECT_TRUE(CONTAINS(outcome.text, "[  FAILED  ] Leaking.LeavesALegBehind")) << outcome.text;
}

TEST(LeakCheck, TheMainFailsATestThatEndsWhatIsNotItsOwn)
{
    Outcome const outcome = RUN_LEAKING("Leaking.*");
    EXPECT_EQ(outcome.status, 1) << outcome.text;
    EXPECT_TRUE(
        CONTAINS(outcome.text, "The test leaves counted objects behind: CC_Property: 3 fewer, CC_CallLeg: 1 fewer"))
        << outcome.text;
    EXPECT_TRUE(CONTAINS(outcome.text, "[       OK ] Leaking.LeavesNothingBehind")) << outcome.text;
    EXPECT_TRUE(CONTAINS(outcome.text, "2 FAILED TESTS")) << outcome.text;
}

TEST(LeakCheck, TheMainPassesATestThatLeaksNothing)
{
    Outcome const outcome = RUN_LEAKING("Leaking.LeavesNothingBehind");
    EXPECT_EQ(outcome.status, 0) << outcome.text;
    EXPECT_TRUE(CONTAINS(outcome.text, "[  PASSED  ] 1 test.")) << outcome.text;
}
