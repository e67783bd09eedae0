#pragma once

#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCallProgressTone.h"
#include "properties/CC_PropertyCallType.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyCharge.h"
#include "properties/CC_PropertyCodec.h"
#include "properties/CC_PropertyCodecNegotiating.h"
#include "properties/CC_PropertyCodecs.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyInformationTransferCapability.h"
#include "properties/CC_PropertyIpAddress.h"
#include "properties/CC_PropertyKey.h"
#include "properties/CC_PropertyNumberingPlan.h"
#include "properties/CC_PropertyParametrizedString.h"
#include "properties/CC_PropertyPresentationIndicator.h"
#include "properties/CC_PropertyQoS.h"
#include "properties/CC_PropertyRedirectingReason.h"
#include "properties/CC_PropertyScreeningIndicator.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyTariff.h"
#include "properties/CC_PropertyTypeOfNumber.h"
#include "properties/CC_PropertyUnsigned.h"
#include "properties/CC_PropertyWaitForMessage.h"

/// The keys of all property ids: the id together with the class of its properties. CC_PropertyTable.cpp is made from
/// them, so that the factory creates what the keys say. The built-in factory creates neither URI, SIP_HEADERS nor
/// QUALITY_OF_SERVICE; a class derived from the key's will do for them as for all.
///
///     adapter.setOwn(Key::NAME, "Ada");
///     if (adapter.getPeer(Key::STATE) == CC_PropertyCallLegState::CONNECTED)
///         display(adapter.getPeer(Key::NAME, "unknown"));
///     container.set(Key::CAUSE, QCause::USER_BUSY, 486);
namespace Key
{
/// The network and the identity of a call leg. @{
inline constexpr CC_PropertyKey<CC_PropertyString> NETWORK(CC_PropertyId::NETWORK);
inline constexpr CC_PropertyKey<CC_PropertyUnsigned> CALL_LEG_ID(CC_PropertyId::CALL_LEG_ID);
/// @}

/// Parties, numbers and what else their signalling exchanges. @{
inline constexpr CC_PropertyKey<CC_PropertyString> E164_NUMBER(CC_PropertyId::E164_NUMBER);
inline constexpr CC_PropertyKey<CC_PropertyTypeOfNumber> TYPE_OF_NUMBER(CC_PropertyId::TYPE_OF_NUMBER);
inline constexpr CC_PropertyKey<CC_PropertyNumberingPlan> NUMBERING_PLAN(CC_PropertyId::NUMBERING_PLAN);
inline constexpr CC_PropertyKey<CC_PropertyPresentationIndicator>
    PRESENTATION_INDICATOR(CC_PropertyId::PRESENTATION_INDICATOR);
inline constexpr CC_PropertyKey<CC_PropertyScreeningIndicator> SCREENING_INDICATOR(CC_PropertyId::SCREENING_INDICATOR);
inline constexpr CC_PropertyKey<CC_PropertyPresentationIndicator>
    DIVERSION_PRESENTATION_INDICATOR(CC_PropertyId::DIVERSION_PRESENTATION_INDICATOR);
inline constexpr CC_PropertyKey<CC_PropertyScreeningIndicator>
    DIVERSION_SCREENING_INDICATOR(CC_PropertyId::DIVERSION_SCREENING_INDICATOR);
inline constexpr CC_PropertyKey<CC_PropertyString> SECOND_E164_NUMBER(CC_PropertyId::SECOND_E164_NUMBER);
inline constexpr CC_PropertyKey<CC_PropertyTypeOfNumber> SECOND_TYPE_OF_NUMBER(CC_PropertyId::SECOND_TYPE_OF_NUMBER);
inline constexpr CC_PropertyKey<CC_PropertyNumberingPlan> SECOND_NUMBERING_PLAN(CC_PropertyId::SECOND_NUMBERING_PLAN);
inline constexpr CC_PropertyKey<CC_PropertyPresentationIndicator>
    SECOND_PRESENTATION_INDICATOR(CC_PropertyId::SECOND_PRESENTATION_INDICATOR);
inline constexpr CC_PropertyKey<CC_PropertyScreeningIndicator>
    SECOND_SCREENING_INDICATOR(CC_PropertyId::SECOND_SCREENING_INDICATOR);
inline constexpr CC_PropertyKey<CC_PropertyIpAddress> IP_ADDRESS(CC_PropertyId::IP_ADDRESS);
inline constexpr CC_PropertyKey<CC_PropertyInformationTransferCapability>
    INFORMATION_TRANSFER_CAPABILITY(CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY);
inline constexpr CC_PropertyKey<CC_PropertyString> PRECALL_SERVICE(CC_PropertyId::PRECALL_SERVICE);
inline constexpr CC_PropertyKey<CC_PropertyString> URI(CC_PropertyId::URI);
inline constexpr CC_PropertyKey<CC_PropertyString> NAME(CC_PropertyId::NAME);
inline constexpr CC_PropertyKey<CC_PropertyUnsigned> HOPS(CC_PropertyId::HOPS);
inline constexpr CC_PropertyKey<CC_PropertyString> REDIRECTING_E164_NUMBER(CC_PropertyId::REDIRECTING_E164_NUMBER);
inline constexpr CC_PropertyKey<CC_PropertyString> REDIRECTING_NAME(CC_PropertyId::REDIRECTING_NAME);
inline constexpr CC_PropertyKey<CC_PropertyRedirectingReason> REDIRECTING_REASON(CC_PropertyId::REDIRECTING_REASON);
inline constexpr CC_PropertyKey<CC_PropertyParametrizedString> UNIQUE_IDENTIFIER(CC_PropertyId::UNIQUE_IDENTIFIER);
inline constexpr CC_PropertyKey<CC_PropertyBoolean> ENDPOINT_IS_ISDN(CC_PropertyId::ENDPOINT_IS_ISDN);
inline constexpr CC_PropertyKey<CC_PropertyString>
    REDIRECTING_FIRST_E164_NUMBER(CC_PropertyId::REDIRECTING_FIRST_E164_NUMBER);
inline constexpr CC_PropertyKey<CC_PropertyString> REDIRECTING_FIRST_NAME(CC_PropertyId::REDIRECTING_FIRST_NAME);
inline constexpr CC_PropertyKey<CC_PropertyRedirectingReason>
    REDIRECTING_FIRST_REASON(CC_PropertyId::REDIRECTING_FIRST_REASON);
inline constexpr CC_PropertyKey<CC_PropertyUnsigned> REDIRECTING_COUNTER(CC_PropertyId::REDIRECTING_COUNTER);
inline constexpr CC_PropertyKey<CC_PropertyCallType> CALL_TYPE(CC_PropertyId::CALL_TYPE);
inline constexpr CC_PropertyKey<CC_PropertyBoolean>
    MESSAGE_WAITING_INDICATION(CC_PropertyId::MESSAGE_WAITING_INDICATION);
inline constexpr CC_PropertyKey<CC_PropertyString> ALERT_INFO(CC_PropertyId::ALERT_INFO);
inline constexpr CC_PropertyKey<CC_PropertyBoolean> CONNECTED_NUMBER_UPDATE(CC_PropertyId::CONNECTED_NUMBER_UPDATE);
inline constexpr CC_PropertyKey<CC_PropertyString> X_ORG_CONN_ID(CC_PropertyId::X_ORG_CONN_ID);
inline constexpr CC_PropertyKey<CC_PropertyString> SIP_HEADERS(CC_PropertyId::SIP_HEADERS);
inline constexpr CC_PropertyKey<CC_PropertyParametrizedString>
    USER_TO_USER_INFORMATION(CC_PropertyId::USER_TO_USER_INFORMATION);
inline constexpr CC_PropertyKey<CC_PropertyParametrizedString>
    REPLACES_INFORMATION(CC_PropertyId::REPLACES_INFORMATION);
inline constexpr CC_PropertyKey<CC_PropertyString> DISPLAY(CC_PropertyId::DISPLAY);
inline constexpr CC_PropertyKey<CC_PropertyCodecs> SUPPORTED_CODECS(CC_PropertyId::SUPPORTED_CODECS);
inline constexpr CC_PropertyKey<CC_PropertyCodec> CURRENT_CODEC(CC_PropertyId::CURRENT_CODEC);
inline constexpr CC_PropertyKey<CC_PropertyCodecNegotiating> CODEC_NEGOTIATING(CC_PropertyId::CODEC_NEGOTIATING);
inline constexpr CC_PropertyKey<CC_PropertyWaitForMessage> WAIT_FOR_MESSAGE(CC_PropertyId::WAIT_FOR_MESSAGE);
inline constexpr CC_PropertyKey<CC_PropertyBoolean>
    READY_FOR_CODEC_NEGOTIATION(CC_PropertyId::READY_FOR_CODEC_NEGOTIATION);
/// @}

/// Ids that modules may use between themselves: the factory creates them, but they have no name. @{
inline constexpr CC_PropertyKey<CC_PropertyUnsigned> UNNAMED_UNSIGNED(CC_PropertyId::UNNAMED_UNSIGNED);
inline constexpr CC_PropertyKey<CC_PropertyBoolean> UNNAMED_BOOLEAN(CC_PropertyId::UNNAMED_BOOLEAN);
inline constexpr CC_PropertyKey<CC_PropertyString> UNNAMED_STRING(CC_PropertyId::UNNAMED_STRING);
inline constexpr CC_PropertyKey<CC_PropertyString> UNNAMED_SECOND_STRING(CC_PropertyId::UNNAMED_SECOND_STRING);
inline constexpr CC_PropertyKey<CC_PropertyString> UNNAMED_THIRD_STRING(CC_PropertyId::UNNAMED_THIRD_STRING);
inline constexpr CC_PropertyKey<CC_PropertyBoolean> UNNAMED_SECOND_BOOLEAN(CC_PropertyId::UNNAMED_SECOND_BOOLEAN);
/// @}

/// The media context and tones. @{
inline constexpr CC_PropertyKey<CC_PropertyContextId> CONTEXT(CC_PropertyId::CONTEXT);
inline constexpr CC_PropertyKey<CC_PropertyBoolean> PROVIDES_DATA(CC_PropertyId::PROVIDES_DATA);
inline constexpr CC_PropertyKey<CC_PropertyCallProgressTone> CALL_PROGRESS_TONE(CC_PropertyId::CALL_PROGRESS_TONE);
/// @}

/// What an endpoint announces that it can do, and the tariff. @{
inline constexpr CC_PropertyKey<CC_PropertyBoolean>
    SUPPORTS_OVERLAP_RECEIVING(CC_PropertyId::SUPPORTS_OVERLAP_RECEIVING);
inline constexpr CC_PropertyKey<CC_PropertyBoolean> SUPPORTS_OVERLAP_SENDING(CC_PropertyId::SUPPORTS_OVERLAP_SENDING);
inline constexpr CC_PropertyKey<CC_PropertyBoolean> ALLOWS_PUSH_BACK(CC_PropertyId::ALLOWS_PUSH_BACK);
inline constexpr CC_PropertyKey<CC_PropertyTariff> TARIFF(CC_PropertyId::TARIFF);
/// @}

/// Records and the state of a call leg. @{
inline constexpr CC_PropertyKey<CC_PropertyCharge> CHARGE(CC_PropertyId::CHARGE);
inline constexpr CC_PropertyKey<CC_PropertyCause> CAUSE(CC_PropertyId::CAUSE);
inline constexpr CC_PropertyKey<CC_PropertyQoS> QUALITY_OF_SERVICE(CC_PropertyId::QUALITY_OF_SERVICE);
inline constexpr CC_PropertyKey<CC_PropertyCallLegState> STATE(CC_PropertyId::STATE);
/// @}
} // namespace Key
