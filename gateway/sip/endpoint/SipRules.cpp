#include "sip/endpoint/SipRules.h"

#include "sip/message/SipBody.h"

#include <algorithm>
#include <strings.h>

namespace
{
constexpr unsigned long LARGEST_MAX_FORWARDS = 255; // RFC 3261, 20.22

/// A sips URI asks for TLS on every hop, which is not there: it must not be served with less.
bool IS_SCHEME_SERVED(url_t const& uri) { return uri.url_type == url_sip || uri.url_type == url_tel; }
} // namespace

int SipRules::CHECK(nta_incoming_t* transaction, sip_t const* request, sip_supported_t const* supported)
{
    if (!IS_SCHEME_SERVED(*request->sip_request->rq_url))
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

int SipRules::CHECK_BODY(nta_incoming_t* transaction, sip_t const* request)
{
    if (SipBody::READ(request).isUnderstood())
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

bool SipRules::CAME_OVER_TCP(sip_t const* request)
{
    return request->sip_via != nullptr && request->sip_via->v_protocol != nullptr &&
           strcasecmp(request->sip_via->v_protocol, "SIP/2.0/TCP") == 0;
}
