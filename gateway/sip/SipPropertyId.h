#pragma once

/// The properties that the SIP modules exchange beyond those that every module knows. They are of the group of the
/// party information (0x4002xx), so containers copy them with it.
namespace SipPropertyId
{
inline constexpr unsigned int SESSION_DESCRIPTION =
    0x4002f0;                                          ///< CC_PropertyString, of a leg: its side's own offer or answer
inline constexpr unsigned int CALL_NUMBER = 0x4002f1;  ///< CC_PropertyUnsigned, of a call: the gateway's number for it
inline constexpr unsigned int MAX_FORWARDS = 0x4002f2; ///< CC_PropertyUnsigned, of an offer: how many hops are left

/// The name of any property id, these included; "(unknown)" otherwise.
char const* NAME(unsigned int id);
} // namespace SipPropertyId
