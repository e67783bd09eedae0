#pragma once

#include "testing/ModuleConformance.h"

#include <gtest/gtest.h>
#include <memory>
#include <utility>

/// A conformance case as a test of GoogleTest: fails with the rule's sentence and the ladder, is skipped with the
/// driver's reason.
class ModuleConformanceTest : public testing::Test
{
public:
    /// `tried` outlives the test; each test makes a driver.
    ModuleConformanceTest(ModuleConformance::Case const& tried, ModuleConformance::Factory makeDriver)
        : m_case(tried), m_makeDriver(std::move(makeDriver))
    {
    }

    /// Plays the case.
    void TestBody() override
    {
        ModuleConformance::Outcome const outcome = ModuleConformance::RUN(m_case, m_makeDriver);
        if (outcome.kind == ModuleConformance::Outcome::SKIPPED)
            GTEST_SKIP() << outcome.text;
        if (outcome.kind == ModuleConformance::Outcome::BROKEN)
            FAIL() << outcome.text;
    }

    /// A test of each case, in a suite of that name.
    static bool REGISTER(char const* suite, char const* file, int line, ModuleConformance::Factory const& makeDriver)
    {
        for (ModuleConformance::Case const& tried : ModuleConformance::CASES())
            testing::RegisterTest(suite, tried.name.c_str(), nullptr, nullptr, file, line,
                                  [&tried, makeDriver]() -> ModuleConformanceTest*
                                  { return new ModuleConformanceTest(tried, makeDriver); });
        return true;
    }

private:
    ModuleConformance::Case const& m_case;
    ModuleConformance::Factory m_makeDriver;
};

/// Tries a module with all conformance cases, as the tests of a suite of that name. At namespace scope; `Driver` is
/// the module's ModuleDriver, made anew for each test.
///
///     CALLCONTROL_MODULE_CONFORMANCE(LineConformance, LineDriver);
#define CALLCONTROL_MODULE_CONFORMANCE(Suite, Driver)                                                                  \
    [[maybe_unused]] static bool const s_is##Suite##Registered =                                                       \
        ModuleConformanceTest::REGISTER(#Suite, __FILE__, __LINE__, [] { return std::make_unique<Driver>(); })
