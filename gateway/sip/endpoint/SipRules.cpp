#include "sip/endpoint/SipRules.h"

#include "sip/message/SipBody.h"
#include "sip/message/SipService.h"

#include <algorithm>
#include <strings.h>

namespace
{
constexpr unsigned long LARGEST_MAX_FORWARDS = 255; // RFC 3261, 20.22

bool CAME_OVER(sip_t const* request, char const* protocol)
{
    return request->sip_via != nullptr && request->sip_via->v_protocol != nullptr &&
           strcasecmp(request->sip_via->v_protocol, protocol) == 0;
}

/// A sips URI asks for TLS on every hop: it must not be served with less.
bool IS_SCHEME_SERVED(sip_t const* request)
{
    auto const scheme = static_cast<url_type_e>(request->sip_request->rq_url->url_type);
    return scheme == url_sip || scheme == url_tel || (scheme == url_sips && CAME_OVER(request, "SIP/2.0/TLS")) ||
           !SipService::READ(*request->sip_request->rq_url).empty();
}

bool IS_SIPS(url_t const& uri) { return uri.url_type == url_sips; }

bool IS_SECURED_DIALOG(sip_t const* request)
{
    if (IS_SIPS(*request->sip_request->rq_url))
        return true;
    if (request->sip_record_route != nullptr)
        return IS_SIPS(*request->sip_record_route->r_url);
    return request->sip_contact != nullptr && IS_SIPS(*request->sip_contact->m_url);
}
} // namespace

int SipRules::CHECK(nta_incoming_t* transaction, sip_t const* request, sip_supported_t const* supported)
{
    if (!IS_SCHEME_SERVED(request))
        return 416;
    if (int const refused = CHECK_REQUIRED(transaction, request, supported); refused != 0)
        return refused;
    sip_max_forwards_t const* const maxForwards = request->sip_max_forwards;
    if (maxForwards == nullptr)
        return 0;
    if (maxForwards->mf_count > LARGEST_MAX_FORWARDS)
    {
        nta_incoming_treply(transaction, 400, "Bad Max-Forwards Header", TAG_END());
        return 400;
    }
    bool const goesOn = request->sip_request->rq_method == sip_method_invite; // all else ends here
    return maxForwards->mf_count == 0 && goesOn ? 483 : 0;
}

int SipRules::CHECK_REQUIRED(nta_incoming_t* transaction, sip_t const* request, sip_supported_t const* supported)
{
    return nta_check_required(transaction, request, supported, TAG_END());
}

int SipRules::CHECK_BODY(nta_incoming_t* transaction, sip_t const* request, bool takesIsup)
{
    if (SipBody::READ(request, takesIsup).isUnderstood())
        return 0;
    nta_incoming_treply(transaction, SIP_415_UNSUPPORTED_MEDIA, SIPTAG_ACCEPT_STR(SipBody::ACCEPT),
                        SIPTAG_ACCEPT_ENCODING_STR(SipBody::ACCEPT_ENCODING), TAG_END());
    return 415;
}

unsigned int SipRules::MAX_FORWARDS_AFTER(sip_t const* request)
{
    if (request->sip_max_forwards == nullptr)
        return MOST_FORWARDS - 1;
    unsigned long const own = request->sip_max_forwards->mf_count;
    return static_cast<unsigned int>(std::clamp(own, 1ul, MOST_FORWARDS + 1ul)) - 1;
}

SipWay::Way SipRules::WAY_OF(sip_t const* request)
{
    if (CAME_OVER(request, "SIP/2.0/TCP"))
        return SipWay::TCP;
    if (!CAME_OVER(request, "SIP/2.0/TLS"))
        return SipWay::UDP;
    return IS_SECURED_DIALOG(request) ? SipWay::SIPS : SipWay::TLS;
}
