#include "SipPrivacy.h"

#include "sip/SipText.h"

namespace
{
bool HOLDS(sip_privacy_t const* header, std::initializer_list<char const*> values)
{
    if (header == nullptr)
        return false;
    for (msg_param_t const* value = header->priv_values; value != nullptr && *value != nullptr; ++value)
        if (SipText::IS_ONE_OF(*value, values))
            return true;
    return false;
}
} // namespace

bool SipPrivacy::HOLDS(sip_t const* message, std::initializer_list<char const*> values)
{
    if (::HOLDS(message->sip_privacy, values))
        return true;
    // the stack puts the second header of a kind that it knows but once among those in error, as what it is
    for (sip_error_t const* other = message->sip_error; other != nullptr; other = other->er_next)
        if (other->er_common->h_class == sip_privacy_class &&
            ::HOLDS(reinterpret_cast<sip_privacy_t const*>(other), values))
            return true;
    return false;
}

bool SipPrivacy::IS_MALFORMED(sip_t const* message)
{
    for (sip_error_t const* error = message->sip_error; error != nullptr; error = error->er_next)
        if (error->er_common->h_class == sip_error_class && error->er_name != nullptr &&
            SipText::EQUALS_IGNORING_CASE(error->er_name, "Privacy"))
            return true;
    return false;
}
