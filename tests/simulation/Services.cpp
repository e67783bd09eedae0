#include "tests/simulation/Services.h"

#include "services/CC_ServiceBlindTransfer.h"
#include "services/CC_ServiceBlindTransferStatus.h"
#include "services/CC_ServiceConferenceRefer.h"
#include "services/CC_ServicePushBack.h"
#include "services/CC_ServiceUserInput.h"
#include "services/CC_ServiceUserInputUpdate.h"
#include "tests/simulation/Values.h"

namespace Simulation
{
namespace
{
template <class Service>
void USE(Service service, std::function<void(CC_Service&)> const& use)
{
    use(service);
}
} // namespace

void WITH_SERVICE(unsigned int which, unsigned int number, std::function<void(CC_Service&)> const& use)
{
    String const text(Values::TEXT(number));
    switch (which % NUMBER_OF_SERVICES)
    {
    case 0:
        return USE(CC_ServiceUserInput(text), use);
    case 1:
        return USE(CC_ServiceUserInputUpdate(number), use);
    case 2:
        return USE(CC_ServiceBlindTransfer("*7", text), use);
    case 3:
        return USE(CC_ServiceBlindTransferStatus(QCause::NONE), use);
    case 4:
        return USE(CC_ServiceConferenceRefer(text), use);
    default:
        return USE(CC_ServicePushBack(number), use);
    }
}
} // namespace Simulation
