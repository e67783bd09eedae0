// The main of all tests: GoogleTest's, and a test that leaks a counted object fails.
#include "platform/base/TYRecycled.h"
#include "testing/FailingAllocator.h"
#include "testing/LeakListener.h"
#include "testing/ReplacedNew.h"

#include <gtest/gtest.h>

namespace
{
/// A test that ends in the middle of a count must not let a later one fail.
class StopFailing : public testing::EmptyTestEventListener
{
public:
    void OnTestEnd(testing::TestInfo const&) override { FailingAllocator::stop(); }
};
} // namespace

int main(int argc, char** argv)
{
    USE_REPLACED_NEW();
    TYRecycled::KEEP_BLOCKS(0); // any allocation may be made to fail, and a sanitizer sees every block end
    testing::InitGoogleTest(&argc, argv);
    testing::TestEventListeners& listeners = testing::UnitTest::GetInstance()->listeners();
    listeners.Append(new LeakListener);
    listeners.Append(new StopFailing); // ends are told in reverse order: this one first
    return RUN_ALL_TESTS();
}
