// The typed accessors, as a table: one line each, in the order of the ids.
#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterE164_ValueOf.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCodec.h"
#include "properties/CC_PropertyCodecs.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyInformationTransferCapability.h"
#include "properties/CC_PropertyNumberingPlan.h"
#include "properties/CC_PropertyPresentationIndicator.h"
#include "properties/CC_PropertyQoS.h"
#include "properties/CC_PropertyRedirectingReason.h"
#include "properties/CC_PropertyScreeningIndicator.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyTypeOfNumber.h"
#include "properties/CC_PropertyUnsigned.h"

#include <new>

namespace Id = CC_PropertyId;

using Charge = CC_PropertyCharge::Charge;
using Negotiating = CC_PropertyCodecNegotiating;
using ParametrizedString = CC_PropertyParametrizedString::ParametrizedString;
using Tariff = CC_PropertyTariff::Tariff;
using Wait = CC_PropertyWaitForMessage;

namespace
{
template <class Property, class... Values>
XCode SET_OWN(CC_CallAdapter& adapter, unsigned int id, Values const&... values)
{
    try
    {
        return adapter.setOwnProperty(Property(id, values...));
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

/// With the counter that tells the peer that a message is a new one, though it may read like the one before.
XCode SET_OWN_UPDATE(CC_CallAdapter& adapter, unsigned int id, ParametrizedString const& content)
{
    auto const* const current = CC_PropertyParametrizedString::FROM(adapter.getOwnProperty(id));
    try
    {
        CC_PropertyParametrizedString update(id);
        update.setContent(current != nullptr ? current->getUpdateCounter() + 1 : 0, content);
        return adapter.setOwnProperty(update);
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

/// A copy of the content; empty when memory is out, too.
ParametrizedString CONTENT_OF(CC_Property const* property)
{
    using Class = CC_PropertyParametrizedString;
    try
    {
        return VALUE_OF<Class, &Class::getContent>(property, ParametrizedString::EMPTY());
    }
    catch (std::bad_alloc const&)
    {
        return {};
    }
}
} // namespace

// clang-format off
String const& CC_CallAdapterE164::getOwnNetwork() const                { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::NETWORK), String::s_empty); }
String const& CC_CallAdapterE164::getPeerNetwork() const               { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::NETWORK), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnNetwork(String const& network) { return SET_OWN<CC_PropertyString>(*this, Id::NETWORK, network); }

unsigned long long CC_CallAdapterE164::getOwnCallLegId() const                { return VALUE_OF<CC_PropertyUnsigned>(getOwnProperty(Id::CALL_LEG_ID)); }
unsigned long long CC_CallAdapterE164::getPeerCallLegId() const               { return VALUE_OF<CC_PropertyUnsigned>(getPeerProperty(Id::CALL_LEG_ID)); }
XCode              CC_CallAdapterE164::setOwnCallLegId(unsigned long long id) { return SET_OWN<CC_PropertyUnsigned>(*this, Id::CALL_LEG_ID, id); }

String const& CC_CallAdapterE164::getOwnE164() const               { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::E164_NUMBER), String::s_empty); }
String const& CC_CallAdapterE164::getPeerE164() const              { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::E164_NUMBER), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnE164(String const& number) { return SET_OWN<CC_PropertyString>(*this, Id::E164_NUMBER, number); }

QTypeOfNumber CC_CallAdapterE164::getOwnTypeOfNumber() const             { return VALUE_OF<CC_PropertyTypeOfNumber>(getOwnProperty(Id::TYPE_OF_NUMBER)); }
QTypeOfNumber CC_CallAdapterE164::getPeerTypeOfNumber() const            { return VALUE_OF<CC_PropertyTypeOfNumber>(getPeerProperty(Id::TYPE_OF_NUMBER)); }
XCode         CC_CallAdapterE164::setOwnTypeOfNumber(QTypeOfNumber type) { return SET_OWN<CC_PropertyTypeOfNumber>(*this, Id::TYPE_OF_NUMBER, type); }

QNumberingPlan CC_CallAdapterE164::getOwnNumberingPlan() const              { return VALUE_OF<CC_PropertyNumberingPlan>(getOwnProperty(Id::NUMBERING_PLAN)); }
QNumberingPlan CC_CallAdapterE164::getPeerNumberingPlan() const             { return VALUE_OF<CC_PropertyNumberingPlan>(getPeerProperty(Id::NUMBERING_PLAN)); }
XCode          CC_CallAdapterE164::setOwnNumberingPlan(QNumberingPlan plan) { return SET_OWN<CC_PropertyNumberingPlan>(*this, Id::NUMBERING_PLAN, plan); }

QPresentationIndicator CC_CallAdapterE164::getOwnPresentationIndicator() const                               { return VALUE_OF<CC_PropertyPresentationIndicator>(getOwnProperty(Id::PRESENTATION_INDICATOR)); }
QPresentationIndicator CC_CallAdapterE164::getPeerPresentationIndicator(QPresentationIndicator absent) const { return VALUE_OF<CC_PropertyPresentationIndicator>(getPeerProperty(Id::PRESENTATION_INDICATOR), absent); }
bool                   CC_CallAdapterE164::existsPeerPresentationIndicator() const                           { return getPeerProperty(Id::PRESENTATION_INDICATOR) != nullptr; }
XCode                  CC_CallAdapterE164::setOwnPresentationIndicator(QPresentationIndicator indicator)     { return SET_OWN<CC_PropertyPresentationIndicator>(*this, Id::PRESENTATION_INDICATOR, indicator); }

QScreeningIndicator CC_CallAdapterE164::getOwnScreeningIndicator() const                            { return VALUE_OF<CC_PropertyScreeningIndicator>(getOwnProperty(Id::SCREENING_INDICATOR)); }
QScreeningIndicator CC_CallAdapterE164::getPeerScreeningIndicator(QScreeningIndicator absent) const { return VALUE_OF<CC_PropertyScreeningIndicator>(getPeerProperty(Id::SCREENING_INDICATOR), absent); }
bool                CC_CallAdapterE164::existsPeerScreeningIndicator() const                        { return getPeerProperty(Id::SCREENING_INDICATOR) != nullptr; }
XCode               CC_CallAdapterE164::setOwnScreeningIndicator(QScreeningIndicator indicator)     { return SET_OWN<CC_PropertyScreeningIndicator>(*this, Id::SCREENING_INDICATOR, indicator); }

QPresentationIndicator CC_CallAdapterE164::getOwnDiversionPresentationIndicator() const                           { return VALUE_OF<CC_PropertyPresentationIndicator>(getOwnProperty(Id::DIVERSION_PRESENTATION_INDICATOR)); }
QPresentationIndicator CC_CallAdapterE164::getPeerDiversionPresentationIndicator() const                          { return VALUE_OF<CC_PropertyPresentationIndicator>(getPeerProperty(Id::DIVERSION_PRESENTATION_INDICATOR)); }
XCode                  CC_CallAdapterE164::setOwnDiversionPresentationIndicator(QPresentationIndicator indicator) { return SET_OWN<CC_PropertyPresentationIndicator>(*this, Id::DIVERSION_PRESENTATION_INDICATOR, indicator); }

QScreeningIndicator CC_CallAdapterE164::getOwnDiversionScreeningIndicator() const                        { return VALUE_OF<CC_PropertyScreeningIndicator>(getOwnProperty(Id::DIVERSION_SCREENING_INDICATOR)); }
QScreeningIndicator CC_CallAdapterE164::getPeerDiversionScreeningIndicator() const                       { return VALUE_OF<CC_PropertyScreeningIndicator>(getPeerProperty(Id::DIVERSION_SCREENING_INDICATOR)); }
XCode               CC_CallAdapterE164::setOwnDiversionScreeningIndicator(QScreeningIndicator indicator) { return SET_OWN<CC_PropertyScreeningIndicator>(*this, Id::DIVERSION_SCREENING_INDICATOR, indicator); }

String const& CC_CallAdapterE164::getPeerSecondE164() const { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::SECOND_E164_NUMBER), String::s_empty); }

QTypeOfNumber CC_CallAdapterE164::getPeerSecondTypeOfNumber() const { return VALUE_OF<CC_PropertyTypeOfNumber>(getPeerProperty(Id::SECOND_TYPE_OF_NUMBER)); }

QNumberingPlan CC_CallAdapterE164::getPeerSecondNumberingPlan() const { return VALUE_OF<CC_PropertyNumberingPlan>(getPeerProperty(Id::SECOND_NUMBERING_PLAN)); }

QPresentationIndicator CC_CallAdapterE164::getPeerSecondPresentationIndicator(QPresentationIndicator) const { return VALUE_OF<CC_PropertyPresentationIndicator>(getPeerProperty(Id::SECOND_PRESENTATION_INDICATOR)); }
bool                   CC_CallAdapterE164::existsPeerSecondPresentationIndicator() const                    { return getPeerProperty(Id::SECOND_PRESENTATION_INDICATOR) != nullptr; }

QScreeningIndicator CC_CallAdapterE164::getPeerSecondScreeningIndicator(QScreeningIndicator absent) const { return VALUE_OF<CC_PropertyScreeningIndicator>(getPeerProperty(Id::SECOND_SCREENING_INDICATOR), absent); }
bool                CC_CallAdapterE164::existsPeerSecondScreeningIndicator() const                        { return getPeerProperty(Id::SECOND_SCREENING_INDICATOR) != nullptr; }

QInformationTransferCapability CC_CallAdapterE164::getInformationTransferCapability() const { return VALUE_OF<CC_PropertyInformationTransferCapability>(getCallProperty(Id::INFORMATION_TRANSFER_CAPABILITY)); }

String const& CC_CallAdapterE164::getOwnPrecallService() const                { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::PRECALL_SERVICE), String::s_empty); }
String const& CC_CallAdapterE164::getPeerPrecallService() const               { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::PRECALL_SERVICE), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnPrecallService(String const& service) { return SET_OWN<CC_PropertyString>(*this, Id::PRECALL_SERVICE, service); }

String const& CC_CallAdapterE164::getOwnName() const             { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::NAME), String::s_empty); }
String const& CC_CallAdapterE164::getPeerName() const            { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::NAME), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnName(String const& name) { return SET_OWN<CC_PropertyString>(*this, Id::NAME, name); }

String const& CC_CallAdapterE164::getOwnRedirectingE164() const               { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::REDIRECTING_E164_NUMBER), String::s_empty); }
String const& CC_CallAdapterE164::getPeerRedirectingE164() const              { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::REDIRECTING_E164_NUMBER), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnRedirectingE164(String const& number) { return SET_OWN<CC_PropertyString>(*this, Id::REDIRECTING_E164_NUMBER, number); }

String const& CC_CallAdapterE164::getOwnRedirectingName() const             { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::REDIRECTING_NAME), String::s_empty); }
String const& CC_CallAdapterE164::getPeerRedirectingName() const            { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::REDIRECTING_NAME), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnRedirectingName(String const& name) { return SET_OWN<CC_PropertyString>(*this, Id::REDIRECTING_NAME, name); }

QReasonForRedirection CC_CallAdapterE164::getOwnRedirectingReason() const                       { return VALUE_OF<CC_PropertyRedirectingReason>(getOwnProperty(Id::REDIRECTING_REASON)); }
QReasonForRedirection CC_CallAdapterE164::getPeerRedirectingReason() const                      { return VALUE_OF<CC_PropertyRedirectingReason>(getPeerProperty(Id::REDIRECTING_REASON)); }
XCode                 CC_CallAdapterE164::setOwnRedirectingReason(QReasonForRedirection reason) { return SET_OWN<CC_PropertyRedirectingReason>(*this, Id::REDIRECTING_REASON, reason); }

bool  CC_CallAdapterE164::getOwnIsIsdn() const      { return VALUE_OF<CC_PropertyBoolean>(getOwnProperty(Id::ENDPOINT_IS_ISDN)); }
bool  CC_CallAdapterE164::getPeerIsIsdn() const     { return VALUE_OF<CC_PropertyBoolean>(getPeerProperty(Id::ENDPOINT_IS_ISDN)); }
XCode CC_CallAdapterE164::setOwnIsIsdn(bool isIsdn) { return SET_OWN<CC_PropertyBoolean>(*this, Id::ENDPOINT_IS_ISDN, isIsdn); }

String const& CC_CallAdapterE164::getOwnRedirectingFirstE164() const               { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::REDIRECTING_FIRST_E164_NUMBER), String::s_empty); }
String const& CC_CallAdapterE164::getPeerRedirectingFirstE164() const              { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::REDIRECTING_FIRST_E164_NUMBER), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnRedirectingFirstE164(String const& number) { return SET_OWN<CC_PropertyString>(*this, Id::REDIRECTING_FIRST_E164_NUMBER, number); }

String const& CC_CallAdapterE164::getOwnRedirectingFirstName() const             { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::REDIRECTING_FIRST_NAME), String::s_empty); }
String const& CC_CallAdapterE164::getPeerRedirectingFirstName() const            { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::REDIRECTING_FIRST_NAME), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnRedirectingFirstName(String const& name) { return SET_OWN<CC_PropertyString>(*this, Id::REDIRECTING_FIRST_NAME, name); }

QReasonForRedirection CC_CallAdapterE164::getOwnRedirectingFirstReason() const                       { return VALUE_OF<CC_PropertyRedirectingReason>(getOwnProperty(Id::REDIRECTING_FIRST_REASON)); }
QReasonForRedirection CC_CallAdapterE164::getPeerRedirectingFirstReason() const                      { return VALUE_OF<CC_PropertyRedirectingReason>(getPeerProperty(Id::REDIRECTING_FIRST_REASON)); }
XCode                 CC_CallAdapterE164::setOwnRedirectingFirstReason(QReasonForRedirection reason) { return SET_OWN<CC_PropertyRedirectingReason>(*this, Id::REDIRECTING_FIRST_REASON, reason); }

unsigned long long CC_CallAdapterE164::getOwnRedirectingCounter() const                     { return VALUE_OF<CC_PropertyUnsigned>(getOwnProperty(Id::REDIRECTING_COUNTER)); }
unsigned long long CC_CallAdapterE164::getPeerRedirectingCounter() const                    { return VALUE_OF<CC_PropertyUnsigned>(getPeerProperty(Id::REDIRECTING_COUNTER)); }
XCode              CC_CallAdapterE164::setOwnRedirectingCounter(unsigned long long counter) { return SET_OWN<CC_PropertyUnsigned>(*this, Id::REDIRECTING_COUNTER, counter); }

String const& CC_CallAdapterE164::getOwnAlertInfo() const             { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::ALERT_INFO), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnAlertInfo(String const& info) { return SET_OWN<CC_PropertyString>(*this, Id::ALERT_INFO, info); }

bool  CC_CallAdapterE164::getOwnConnectedNrUpdate() const        { return VALUE_OF<CC_PropertyBoolean>(getOwnProperty(Id::CONNECTED_NUMBER_UPDATE)); }
bool  CC_CallAdapterE164::getPeerConnectedNrUpdate() const       { return VALUE_OF<CC_PropertyBoolean>(getPeerProperty(Id::CONNECTED_NUMBER_UPDATE)); }
XCode CC_CallAdapterE164::setOwnConnectedNrUpdate(bool isUpdate) { return SET_OWN<CC_PropertyBoolean>(*this, Id::CONNECTED_NUMBER_UPDATE, isUpdate); }

String const& CC_CallAdapterE164::getOwnXOrgConnID() const           { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::X_ORG_CONN_ID), String::s_empty); }
String const& CC_CallAdapterE164::getPeerXOrgConnID() const          { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::X_ORG_CONN_ID), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnXOrgConnID(String const& id) { return SET_OWN<CC_PropertyString>(*this, Id::X_ORG_CONN_ID, id); }

ParametrizedString CC_CallAdapterE164::getOwnUserToUser() const                            { return CONTENT_OF(getOwnProperty(Id::USER_TO_USER_INFORMATION)); }
ParametrizedString CC_CallAdapterE164::getPeerUserToUser() const                           { return CONTENT_OF(getPeerProperty(Id::USER_TO_USER_INFORMATION)); }
XCode              CC_CallAdapterE164::setOwnUserToUser(ParametrizedString const& content) { return SET_OWN_UPDATE(*this, Id::USER_TO_USER_INFORMATION, content); }

String const& CC_CallAdapterE164::getOwnDisplay() const             { return VALUE_OF<CC_PropertyString>(getOwnProperty(Id::DISPLAY), String::s_empty); }
String const& CC_CallAdapterE164::getPeerDisplay() const            { return VALUE_OF<CC_PropertyString>(getPeerProperty(Id::DISPLAY), String::s_empty); }
XCode         CC_CallAdapterE164::setOwnDisplay(String const& text) { return SET_OWN<CC_PropertyString>(*this, Id::DISPLAY, text); }

VoipCodecListSet const& CC_CallAdapterE164::getOwnSupportedCodecs() const                         { return VALUE_OF<CC_PropertyCodecs>(getOwnProperty(Id::SUPPORTED_CODECS), VoipCodecListSet::EMPTY()); }
VoipCodecListSet const& CC_CallAdapterE164::getPeerSupportedCodecs() const                        { return VALUE_OF<CC_PropertyCodecs>(getPeerProperty(Id::SUPPORTED_CODECS), VoipCodecListSet::EMPTY()); }
bool                    CC_CallAdapterE164::existsPeerSupportedCodecs() const                     { return getPeerProperty(Id::SUPPORTED_CODECS) != nullptr; }
XCode                   CC_CallAdapterE164::setOwnSupportedCodecs(VoipCodecListSet const& codecs) { return SET_OWN<CC_PropertyCodecs>(*this, Id::SUPPORTED_CODECS, codecs); }

VoipCodecAndMode const& CC_CallAdapterE164::getOwnCodec() const                        { return VALUE_OF<CC_PropertyCodec>(getOwnProperty(Id::CURRENT_CODEC), VoipCodecAndMode::EMPTY()); }
VoipCodecAndMode const& CC_CallAdapterE164::getPeerCodec() const                       { return VALUE_OF<CC_PropertyCodec>(getPeerProperty(Id::CURRENT_CODEC), VoipCodecAndMode::EMPTY()); }
bool                    CC_CallAdapterE164::existsPeerCodec() const                    { return getPeerProperty(Id::CURRENT_CODEC) != nullptr; }
XCode                   CC_CallAdapterE164::setOwnCodec(VoipCodecAndMode const& codec) { return SET_OWN<CC_PropertyCodec>(*this, Id::CURRENT_CODEC, codec); }

Negotiating::State CC_CallAdapterE164::getOwnCodecNegotiatingState() const                                      { return VALUE_OF<Negotiating, &Negotiating::getState>(getOwnProperty(Id::CODEC_NEGOTIATING)); }
Negotiating::State CC_CallAdapterE164::getPeerCodecNegotiatingState() const                                     { return VALUE_OF<Negotiating, &Negotiating::getState>(getPeerProperty(Id::CODEC_NEGOTIATING)); }
XCode              CC_CallAdapterE164::setOwnCodecNegotiatingState(Negotiating::State state, unsigned int code) { return SET_OWN<Negotiating>(*this, Id::CODEC_NEGOTIATING, state, code); }
XCode              CC_CallAdapterE164::setOwnCodecNegotiatingState(Negotiating::State state)                    { return SET_OWN<Negotiating>(*this, Id::CODEC_NEGOTIATING, state, 0U); }

unsigned int CC_CallAdapterE164::getOwnCodecNegotiatingCode() const  { return VALUE_OF<Negotiating, &Negotiating::getNegotiatedValue>(getOwnProperty(Id::CODEC_NEGOTIATING)); }
unsigned int CC_CallAdapterE164::getPeerCodecNegotiatingCode() const { return VALUE_OF<Negotiating, &Negotiating::getNegotiatedValue>(getPeerProperty(Id::CODEC_NEGOTIATING)); }

Wait::State CC_CallAdapterE164::getOwnWaitForMessageState() const                                    { return VALUE_OF<Wait, &Wait::getState>(getOwnProperty(Id::WAIT_FOR_MESSAGE)); }
Wait::State CC_CallAdapterE164::getPeerWaitForMessageState() const                                   { return VALUE_OF<Wait, &Wait::getState>(getPeerProperty(Id::WAIT_FOR_MESSAGE)); }
XCode       CC_CallAdapterE164::setOwnWaitForMessageState(Wait::State state, Wait::MessageType type) { return SET_OWN<Wait>(*this, Id::WAIT_FOR_MESSAGE, state, type); }
XCode       CC_CallAdapterE164::setOwnWaitForMessageState(Wait::State state)                         { return SET_OWN<Wait>(*this, Id::WAIT_FOR_MESSAGE, state, Wait::UNDEFINED); }

Wait::MessageType CC_CallAdapterE164::getOwnWaitForMessageType() const  { return VALUE_OF<Wait, &Wait::getMessageType>(getOwnProperty(Id::WAIT_FOR_MESSAGE)); }
Wait::MessageType CC_CallAdapterE164::getPeerWaitForMessageType() const { return VALUE_OF<Wait, &Wait::getMessageType>(getPeerProperty(Id::WAIT_FOR_MESSAGE)); }

bool  CC_CallAdapterE164::getOwnSupportsOverlapReceiving() const        { return VALUE_OF<CC_PropertyBoolean>(getOwnProperty(Id::SUPPORTS_OVERLAP_RECEIVING), true); }
bool  CC_CallAdapterE164::getPeerSupportsOverlapReceiving() const       { return VALUE_OF<CC_PropertyBoolean>(getPeerProperty(Id::SUPPORTS_OVERLAP_RECEIVING), true); }
XCode CC_CallAdapterE164::setOwnSupportsOverlapReceiving(bool supports) { return SET_OWN<CC_PropertyBoolean>(*this, Id::SUPPORTS_OVERLAP_RECEIVING, supports); }

bool  CC_CallAdapterE164::getOwnSupportsOverlapSending() const        { return VALUE_OF<CC_PropertyBoolean>(getOwnProperty(Id::SUPPORTS_OVERLAP_SENDING), true); }
bool  CC_CallAdapterE164::getPeerSupportsOverlapSending() const       { return VALUE_OF<CC_PropertyBoolean>(getPeerProperty(Id::SUPPORTS_OVERLAP_SENDING), true); }
XCode CC_CallAdapterE164::setOwnSupportsOverlapSending(bool supports) { return SET_OWN<CC_PropertyBoolean>(*this, Id::SUPPORTS_OVERLAP_SENDING, supports); }

Tariff const* CC_CallAdapterE164::getOwnTariff() const               { return POINTER_TO<CC_PropertyTariff>(getOwnProperty(Id::TARIFF)); }
Tariff const* CC_CallAdapterE164::getPeerTariff() const              { return POINTER_TO<CC_PropertyTariff>(getPeerProperty(Id::TARIFF)); }
XCode         CC_CallAdapterE164::setOwnTariff(Tariff const& tariff) { return SET_OWN<CC_PropertyTariff>(*this, Id::TARIFF, tariff); }

Charge const* CC_CallAdapterE164::getOwnCharge() const               { return POINTER_TO<CC_PropertyCharge>(getOwnProperty(Id::CHARGE)); }
Charge const* CC_CallAdapterE164::getPeerCharge() const              { return POINTER_TO<CC_PropertyCharge>(getPeerProperty(Id::CHARGE)); }
XCode         CC_CallAdapterE164::setOwnCharge(Charge const& charge) { return SET_OWN<CC_PropertyCharge>(*this, Id::CHARGE, charge); }

CC_Property const* CC_CallAdapterE164::getPeerCauseProperty() const { return getPeerProperty(Id::CAUSE); }

CC_QoS const* CC_CallAdapterE164::getOwnQoS() const            { return POINTER_TO<CC_PropertyQoS>(getOwnProperty(Id::QUALITY_OF_SERVICE)); }
XCode         CC_CallAdapterE164::setOwnQoS(CC_QoS const& qos) { return SET_OWN<CC_PropertyQoS>(*this, Id::QUALITY_OF_SERVICE, qos); }
// clang-format on
