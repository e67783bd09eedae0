#pragma once

#include "testing/LeakCheck.h"

#include <gtest/gtest.h>

/// Fails a test that leaves counted objects behind. The test main appends one; a program with a main of its own may:
///
///     testing::UnitTest::GetInstance()->listeners().Append(new LeakListener); // GoogleTest owns it then
class LeakListener : public testing::EmptyTestEventListener
{
public:
    /// Counts before each test, and compares after it. @{
    void OnTestStart(testing::TestInfo const&) override { m_check = LeakCheck(); }
    void OnTestEnd(testing::TestInfo const&) override
    {
        if (std::string const leaked = m_check.compare(); !leaked.empty())
            ADD_FAILURE() << "The test leaves counted objects behind: " << leaked;
    }
    /// @}

private:
    LeakCheck m_check;
};
