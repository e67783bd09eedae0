#pragma once

/// The ids of the properties that the two sides of a call exchange. The names, classes and initial values that belong
/// to them stand in CC_PropertyTable.cpp.
///
/// Bits 8 to 15 hold an id's group, by which containers copy selectively (`CC_PropertyContainer::set(other, mask)`).
///
///     leg.setProperty(CC_PropertyString(CC_PropertyId::E164_NUMBER, "49891234"));
namespace CC_PropertyId
{
/// The network and the identity of a call leg. @{
inline constexpr unsigned int NETWORK = 0x400100;
inline constexpr unsigned int CALL_LEG_ID = 0x400101;
/// @}

/// Parties, numbers and what else their signalling exchanges. @{
inline constexpr unsigned int E164_NUMBER = 0x400200;
inline constexpr unsigned int TYPE_OF_NUMBER = 0x400201;
inline constexpr unsigned int NUMBERING_PLAN = 0x400202;
inline constexpr unsigned int PRESENTATION_INDICATOR = 0x400203;
inline constexpr unsigned int SCREENING_INDICATOR = 0x400204;
inline constexpr unsigned int DIVERSION_PRESENTATION_INDICATOR = 0x400205;
inline constexpr unsigned int DIVERSION_SCREENING_INDICATOR = 0x400206;
inline constexpr unsigned int SECOND_E164_NUMBER = 0x400207;
inline constexpr unsigned int SECOND_TYPE_OF_NUMBER = 0x400208;
inline constexpr unsigned int SECOND_NUMBERING_PLAN = 0x400209;
inline constexpr unsigned int SECOND_PRESENTATION_INDICATOR = 0x40020a;
inline constexpr unsigned int SECOND_SCREENING_INDICATOR = 0x40020b;
inline constexpr unsigned int IP_ADDRESS = 0x40020c;
inline constexpr unsigned int INFORMATION_TRANSFER_CAPABILITY = 0x40020d;
inline constexpr unsigned int PRECALL_SERVICE = 0x40020e;
inline constexpr unsigned int URI = 0x40020f;
inline constexpr unsigned int NAME = 0x400210;
inline constexpr unsigned int HOPS = 0x400211;
inline constexpr unsigned int REDIRECTING_E164_NUMBER = 0x400212;
inline constexpr unsigned int REDIRECTING_NAME = 0x400213;
inline constexpr unsigned int REDIRECTING_REASON = 0x400214;
inline constexpr unsigned int UNIQUE_IDENTIFIER = 0x400215;
inline constexpr unsigned int ENDPOINT_IS_ISDN = 0x400216;
inline constexpr unsigned int REDIRECTING_FIRST_E164_NUMBER = 0x400217;
inline constexpr unsigned int REDIRECTING_FIRST_NAME = 0x400218;
inline constexpr unsigned int REDIRECTING_FIRST_REASON = 0x400219;
inline constexpr unsigned int REDIRECTING_COUNTER = 0x40021a;
inline constexpr unsigned int CALL_TYPE = 0x40021b;
inline constexpr unsigned int MESSAGE_WAITING_INDICATION = 0x40021c;
inline constexpr unsigned int ALERT_INFO = 0x40021d;
inline constexpr unsigned int CONNECTED_NUMBER_UPDATE = 0x40021e;
inline constexpr unsigned int X_ORG_CONN_ID = 0x400225;
inline constexpr unsigned int SIP_HEADERS = 0x400226;
inline constexpr unsigned int USER_TO_USER_INFORMATION = 0x400227;
inline constexpr unsigned int REPLACES_INFORMATION = 0x400228;
inline constexpr unsigned int DISPLAY = 0x400229;
inline constexpr unsigned int SUPPORTED_CODECS = 0x40022a;
inline constexpr unsigned int CURRENT_CODEC = 0x40022b;
inline constexpr unsigned int CODEC_NEGOTIATING = 0x40022c;
inline constexpr unsigned int WAIT_FOR_MESSAGE = 0x40022d;
inline constexpr unsigned int READY_FOR_CODEC_NEGOTIATION = 0x40022e;
/// @}

/// Ids that modules may use between themselves: the factory creates them, but they have no name. @{
inline constexpr unsigned int UNNAMED_UNSIGNED = 0x40021f;
inline constexpr unsigned int UNNAMED_BOOLEAN = 0x400220;
inline constexpr unsigned int UNNAMED_STRING = 0x400221;
inline constexpr unsigned int UNNAMED_SECOND_STRING = 0x400222;
inline constexpr unsigned int UNNAMED_THIRD_STRING = 0x400223;
inline constexpr unsigned int UNNAMED_SECOND_BOOLEAN = 0x400224;
/// @}

/// The media context and tones. @{
inline constexpr unsigned int CONTEXT = 0x400400;
inline constexpr unsigned int PROVIDES_DATA = 0x400401;
inline constexpr unsigned int CALL_PROGRESS_TONE = 0x400402;
/// @}

/// What an endpoint announces that it can do, and the tariff. @{
inline constexpr unsigned int SUPPORTS_OVERLAP_RECEIVING = 0x400801;
inline constexpr unsigned int SUPPORTS_OVERLAP_SENDING = 0x400802;
inline constexpr unsigned int ALLOWS_PUSH_BACK = 0x400803;
inline constexpr unsigned int TARIFF = 0x400804;
/// @}

/// Records and the state of a call leg. @{
inline constexpr unsigned int CHARGE = 0x401000;
inline constexpr unsigned int CAUSE = 0x401001;
inline constexpr unsigned int QUALITY_OF_SERVICE = 0x401002;
inline constexpr unsigned int STATE = 0x401003;
/// @}

/// Set apart for modules, which agree among themselves who takes which. They are a group of their own, of bit 15 alone:
/// the library gives it to none of its ids, and none of its other groups' masks has it, so they are in nobody's way and
/// cross with ALL_GROUPS like all others. Declared names: CC_PropertyTable::DECLARE, or CC_PropertyKey. @{
inline constexpr unsigned int FIRST_OF_MODULES = 0x408000;
inline constexpr unsigned int LAST_OF_MODULES = 0x4080ff;
/// @}
} // namespace CC_PropertyId
