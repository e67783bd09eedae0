#pragma once

#include <array>
#include <string>

/// Compares the numbers of counted objects alive at two moments: what a test has left behind.
///
/// The test main does so around every test and fails the test that leaks; on its own:
///
///     LeakCheck const check;
///     wholeCall();
///     EXPECT_EQ(check.compare(), "");    // or "CC_Call: 1 more, CC_CallLeg: 2 more"
class LeakCheck
{
public:
    /// One count for each.
    static constexpr std::size_t NUMBER_OF_CLASSES = 8;
    /// In the order of `CLASS_NAME`.
    using Counts = std::array<unsigned int, NUMBER_OF_CLASSES>;

    /// Remembers the numbers of now.
    LeakCheck() : m_before(COUNTS()) {}

    /// The classes whose number has changed and by how much, in the order of `CLASS_NAME`; empty when none has.
    std::string compare() const;

    /// The present numbers, and the classes to which they belong: CC_Property, CC_Call, CC_CallLeg, CC_CallAdapter,
    /// CC_Provider, CC_Endpoint, TYEvent, FakeMediaContext. @{
    static Counts COUNTS();
    static char const* CLASS_NAME(std::size_t index);
    /// @}

private:
    Counts m_before;
};
