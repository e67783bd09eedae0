#pragma once

#include "sip/message/SipIsup.h"
#include "sip/stack/Sofia.h"

#include <string>
#include <string_view>

/// What a message's body holds for us: the session description, alone or as a part of a multipart. A plain value.
///
/// By RFC 3261 (8.2.3, 20.11) and RFC 5621: a body, or a part of one, that we do not understand is in the way unless
/// its Content-Disposition says handling=optional. Understood are application/sdp for a session, an advice of charge,
/// which who does not take any passes over, multipart/mixed, whose first description is taken, and
/// multipart/alternative, whose last one is; where it is asked for, a message of ISUP; nothing encoded.
///
///     SipBody const body = SipBody::READ(request);
///     if (!body.isUnderstood())
///         ... // 415 with Accept and Accept-Encoding
///     body.session;
struct SipBody
{
    enum Obstacle
    {
        NONE,
        TYPE,     ///< a type, a use or a structure that is not understood
        ENCODING, ///< a description that is compressed, or encoded for mail
    };

    std::string session; ///< empty: none
    Obstacle obstacle = NONE;
    std::string advice{}; ///< of charge (SipAdvice); empty: none
    SipIsup isup{};

    static SipBody READ(sip_t const* message, bool takesIsup = false);
    /// The whole body, of whatever type; empty: none.
    static std::string PAYLOAD_OF(sip_t const* message);
    /// The same of the headers' values as they stand, empty ones absent. `depth`: of multiparts around it.
    static SipBody READ(std::string_view body, std::string_view type, std::string_view encoding,
                        std::string_view disposition, bool takesIsup = false, unsigned int depth = 0);

    bool isUnderstood() const { return obstacle == NONE; }

    static constexpr char const* ACCEPT = "application/sdp, multipart/mixed, multipart/alternative";
    static constexpr char const* ACCEPT_ENCODING = "identity";
};
