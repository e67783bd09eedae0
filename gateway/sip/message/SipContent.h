#pragma once

#include "sip/message/SipIsup.h"
#include "sip/stack/Sofia.h"

#include <string>

/// What a message of ours has as its body: a session description, an advice of charge, a message of ISUP, or several of
/// them in a multipart/mixed (RFC 5621), of which a receiver may pass over all but the first. A plain value.
///
///     SipContent const content = SipContent::OF(session, advice, isup);
///     TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str()))
struct SipContent
{
    std::string type;
    std::string body;

    /// Empty ones are none.
    static SipContent OF(std::string const& session, std::string const& advice, SipIsup const& isup = {});
    bool isEmpty() const { return body.empty(); }
    /// For a message that is sent while this lives.
    sip_payload_t getPayload() const;
};
