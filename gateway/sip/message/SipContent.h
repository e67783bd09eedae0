#pragma once

#include <string>

/// What a message of ours has as its body: a session description, an advice of charge, or both in a multipart/mixed
/// (RFC 5621), of which a receiver may pass the latter over. A plain value.
///
///     SipContent const content = SipContent::OF(session, advice);
///     TAG_IF(!content.isEmpty(), SIPTAG_CONTENT_TYPE_STR(content.type.c_str()))
struct SipContent
{
    std::string type;
    std::string body;

    /// Empty ones are none.
    static SipContent OF(std::string const& session, std::string const& advice);
    bool isEmpty() const { return body.empty(); }
};
