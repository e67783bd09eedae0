// A module author's check with the installed kit, without a test framework.
#include "adapters/CC_CallAdapter.h"
#include "callcontrol/CallControl.h"
#include "testing/CallControlFixture.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingProvider.h"

#include <tuple>

int main()
{
    CallControlFixture callControl;
    RecordingProvider isdn("isdn");
    RecordingEndpoint line("line");
    std::ignore = CallControl::ADD_PROVIDER("SWITCH", "isdn", isdn);
    {
        CC_CallAdapter adapter;
        std::ignore = adapter.setup("1", line, nullptr);
        if (!adapter.dial("SWITCH", "isdn", "4989123", {}, {}, {}, nullptr).isOk())
            return 1;
    }
    CallControl::REMOVE_PROVIDER("SWITCH", "isdn");
    return isdn.take() == Lines{"isdn: dial isdn 4989123 ()"} ? 0 : 2;
}
