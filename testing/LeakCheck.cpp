#include "testing/LeakCheck.h"

#include "adapters/CC_CallAdapter.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "platform/eventloop/TYEvent.h"
#include "properties/CC_Property.h"
#include "testing/FakeMediaContext.h"

LeakCheck::Counts LeakCheck::COUNTS()
{
    return {CC_Property::s_numberOfInstances,    CC_Call::s_numberOfInstances,         CC_CallLeg::s_numberOfInstances,
            CC_CallAdapter::s_numberOfInstances, CC_Provider::s_numberOfInstances,     CC_Endpoint::s_numberOfInstances,
            TYEvent::s_numberOfInstances.load(), FakeMediaContext::s_numberOfInstances};
}

char const* LeakCheck::CLASS_NAME(std::size_t index)
{
    static constexpr char const* NAMES[NUMBER_OF_CLASSES] = {"CC_Property",    "CC_Call",         "CC_CallLeg",
                                                             "CC_CallAdapter", "CC_Provider",     "CC_Endpoint",
                                                             "TYEvent",        "FakeMediaContext"};
    return NAMES[index];
}

std::string LeakCheck::compare() const
{
    Counts const now = COUNTS();
    std::string text;
    for (std::size_t i = 0; i < NUMBER_OF_CLASSES; ++i)
    {
        if (now[i] == m_before[i])
            continue;
        bool const isMore = now[i] > m_before[i];
        text += text.empty() ? "" : ", ";
        text += std::string(CLASS_NAME(i)) + ": " +
                std::to_string(isMore ? now[i] - m_before[i] : m_before[i] - now[i]) + (isMore ? " more" : " fewer");
    }
    return text;
}
