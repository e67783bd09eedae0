#pragma once

#include <cstdint>

namespace Simulation
{
/// The places at which call control calls somebody else's code. Append, never insert.
enum class CallOut : std::uint8_t
{
    CALL_ENDED,
    LEG_ADDED,
    LEG_REMOVED,
    CALL_CHANGED,
    LEG_ENDED,
    LEG_RELINKED,
    LEG_CHANGED,
    LEG_SERVICE,
    CONTEXT_DESTROYED,
    PROVIDER_ADDED,
    PROVIDER_REMOVED,
    CALL_CREATED,
    CALL_RELEASED,
    REGISTRY_ADDED,
    REGISTRY_DESTROYED,
    PROVIDER_DESTROYED,
    ENDPOINT_DESTROYED,
    PROVIDER_DIAL,
    ENDPOINT_OFFER,
    ENDPOINT_NAME,
    ENDPOINT_DUMP,
    PEER_CHANGED,
    PEER_SERVICE,
    INPUT_FILTER,
    OUTPUT_FILTER,
    FILTER_CLONE,
    FILTER_END,
    PROPERTY_CLONE,
    PROPERTY_ASSIGN,
    PROPERTY_COMPARE,
    PROPERTY_TEXT,
    PROPERTY_END,
    MEDIA_REQUEST,
    MEDIA_END,
    REBOOT_ADD,
    REBOOT_RELEASE,
    LOG_LINE,
    ADAPTER_DIAL,
    ADAPTER_ACCEPT,
    ADAPTER_DROP,
    ADAPTER_SETUP,
    ADAPTER_CLEANUP,
    NUMBER_OF_CALL_OUTS
};

inline CallOut CALL_OUT_OF(unsigned int number)
{
    return static_cast<CallOut>(number % static_cast<unsigned int>(CallOut::NUMBER_OF_CALL_OUTS));
}

char const* NAME_OF(CallOut kind);
} // namespace Simulation
