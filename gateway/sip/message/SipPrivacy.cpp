#include "sip/message/SipPrivacy.h"

#include "sip/message/SipText.h"

#include <spdlog/spdlog.h>

#include <initializer_list>

namespace
{
using Values = std::initializer_list<char const*>;

bool HOLDS(sip_privacy_t const* header, Values values)
{
    if (header == nullptr)
        return false;
    for (msg_param_t const* value = header->priv_values; value != nullptr && *value != nullptr; ++value)
        if (SipText::IS_ONE_OF(*value, values))
            return true;
    return false;
}

bool HOLDS(sip_t const* message, Values values)
{
    if (HOLDS(message->sip_privacy, values))
        return true;
    // the stack puts the second header of a kind that it knows but once among those in error, as what it is
    for (sip_error_t const* other = message->sip_error; other != nullptr; other = other->er_next)
        if (other->er_common->h_class == sip_privacy_class &&
            HOLDS(reinterpret_cast<sip_privacy_t const*>(other), values))
            return true;
    return false;
}

bool IS_MALFORMED(sip_t const* message)
{
    for (sip_error_t const* error = message->sip_error; error != nullptr; error = error->er_next)
        if (error->er_common->h_class == sip_error_class && error->er_name != nullptr &&
            SipText::EQUALS_IGNORING_CASE(error->er_name, "Privacy"))
            return true;
    return false;
}
} // namespace

bool SipPrivacy::RESTRICTS_SENDER(sip_t const* message)
{
    if (!IS_MALFORMED(message))
        return HOLDS(message, {"id", "user", "header"});
    spdlog::info("Privacy is malformed and counts as \"id\"");
    return true;
}

bool SipPrivacy::RESTRICTS_HISTORY(sip_t const* message)
{
    return IS_MALFORMED(message) || HOLDS(message, {"history", "header", "session"});
}

bool SipPrivacy::IS_NONE(sip_t const* message) { return HOLDS(message, {"none"}); }
