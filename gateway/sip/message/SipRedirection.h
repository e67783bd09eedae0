#pragma once

#include "properties/CC_PropertyParametrizedString.h"
#include "sip/message/SipDiversion.h"
#include "sip/stack/Sofia.h"

#include <optional>
#include <string>

/// Where a response from 300 to 302 sends a call (RFC 3261, 8.1.3.4), and what is to come of it: a property of the leg
/// that got it, for the other side. A plain value.
///
/// Of its contacts the best by q counts that has a number. Of that the number alone is taken: where it is, the
/// gateway's routes say. Why is the cause in its URI (RFC 4458), or else the reason of a Diversion; without either it
/// is an unconditional redirection, or a deflection where the callee has rung.
struct SipRedirection
{
    std::string number;             ///< where to
    SipDiversion::Redirection from; ///< by whom, and why
    bool isWithheld = false;        ///< who that is
    bool isHandedOn = false;        ///< the caller is to dial; else the gateway does,
    std::string interface;          ///< as if the call came in there

    /// None for any other response, one that names no number among them. Throws std::bad_alloc.
    static std::optional<SipRedirection> READ(sip_t const* response, bool hasRung);
    /// Throws std::bad_alloc. @{
    CC_PropertyParametrizedString getProperty() const;
    static SipRedirection OF(CC_PropertyParametrizedString::ParametrizedString const& content);
    /// @}
};
