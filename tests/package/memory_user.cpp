// Memory that runs out, in a program without a test framework.
#include "platform/base/TYRecycled.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/FailingAllocator.h"

int main()
{
    TYRecycled::KEEP_BLOCKS(0);
    CC_PropertyString const number(CC_PropertyId::E164_NUMBER, "4989123");
    FailingAllocator::failNth(1);
    CC_Property const* const copy = number.clone();
    FailingAllocator::stop();
    return copy == nullptr && FailingAllocator::hasFailed() ? 0 : 1;
}
