// Every typed accessor of the E.164 adapter, by tables.
#include "properties/CC_PropertyInformationTransferCapability.h"
#include "properties/CC_PropertyNumberingPlan.h"
#include "properties/CC_PropertyPresentationIndicator.h"
#include "properties/CC_PropertyRedirectingReason.h"
#include "properties/CC_PropertyScreeningIndicator.h"
#include "properties/CC_PropertyTypeOfNumber.h"
#include "tests/support/TestAccessorE164.h"

#include <cctype>
#include <ostream>

namespace
{
using A = CC_CallAdapterE164;
using Negotiating = CC_PropertyCodecNegotiating;
using ParametrizedString = CC_PropertyParametrizedString::ParametrizedString;
using Wait = CC_PropertyWaitForMessage;
namespace Id = CC_PropertyId;

struct Row
{
    unsigned int id;
    unsigned int count;
    void (*absent)(AccessorLines&, unsigned int);
    void (*setAndReadBack)(AccessorLines&, unsigned int);
    void (*wrongClass)(AccessorLines&, unsigned int);
    void (*inputFiltered)(AccessorLines&, unsigned int);
    void (*outputFiltered)(AccessorLines&, unsigned int);
    void (*withoutMemory)(AccessorLines&, unsigned int);
};

void PrintTo(Row const& row, std::ostream* out) { *out << CC_PropertyUnsigned(row.id).getPropertyName(); }

template <class Property, auto OWN, auto PEER, auto EXISTS, auto SET, Absent ABSENT = Absent::NOTHING>
constexpr Row ROW(unsigned int id)
{
    using Of = Accessors<Property, OWN, PEER, EXISTS, SET, ABSENT>;
    return {id,
            Of::COUNT,
            Of::absent,
            Of::setAndReadBack,
            Of::wrongClass,
            Of::inputFiltered,
            Of::outputFiltered,
            Of::withoutMemory};
}

// clang-format off
constexpr Row ROWS[] = {
    //  class                                      own getter                                 peer getter                                 exists                                      setter
    ROW<CC_PropertyString,                         &A::getOwnNetwork,                         &A::getPeerNetwork,                         nullptr,                                    &A::setOwnNetwork>(Id::NETWORK),
    ROW<CC_PropertyUnsigned,                       &A::getOwnCallLegId,                       &A::getPeerCallLegId,                       nullptr,                                    &A::setOwnCallLegId>(Id::CALL_LEG_ID),
    ROW<CC_PropertyString,                         &A::getOwnE164,                            &A::getPeerE164,                            nullptr,                                    &A::setOwnE164>(Id::E164_NUMBER),
    ROW<CC_PropertyTypeOfNumber,                   &A::getOwnTypeOfNumber,                    &A::getPeerTypeOfNumber,                    nullptr,                                    &A::setOwnTypeOfNumber>(Id::TYPE_OF_NUMBER),
    ROW<CC_PropertyNumberingPlan,                  &A::getOwnNumberingPlan,                   &A::getPeerNumberingPlan,                   nullptr,                                    &A::setOwnNumberingPlan>(Id::NUMBERING_PLAN),
    ROW<CC_PropertyPresentationIndicator,          &A::getOwnPresentationIndicator,           &A::getPeerPresentationIndicator,           &A::existsPeerPresentationIndicator,        &A::setOwnPresentationIndicator, Absent::ARGUMENT>(Id::PRESENTATION_INDICATOR),
    ROW<CC_PropertyScreeningIndicator,             &A::getOwnScreeningIndicator,              &A::getPeerScreeningIndicator,              &A::existsPeerScreeningIndicator,           &A::setOwnScreeningIndicator, Absent::ARGUMENT>(Id::SCREENING_INDICATOR),
    ROW<CC_PropertyPresentationIndicator,          &A::getOwnDiversionPresentationIndicator,  &A::getPeerDiversionPresentationIndicator,  nullptr,                                    &A::setOwnDiversionPresentationIndicator>(Id::DIVERSION_PRESENTATION_INDICATOR),
    ROW<CC_PropertyScreeningIndicator,             &A::getOwnDiversionScreeningIndicator,     &A::getPeerDiversionScreeningIndicator,     nullptr,                                    &A::setOwnDiversionScreeningIndicator>(Id::DIVERSION_SCREENING_INDICATOR),
    ROW<CC_PropertyString,                         nullptr,                                   &A::getPeerSecondE164,                      nullptr,                                    nullptr>(Id::SECOND_E164_NUMBER),
    ROW<CC_PropertyTypeOfNumber,                   nullptr,                                   &A::getPeerSecondTypeOfNumber,              nullptr,                                    nullptr>(Id::SECOND_TYPE_OF_NUMBER),
    ROW<CC_PropertyNumberingPlan,                  nullptr,                                   &A::getPeerSecondNumberingPlan,             nullptr,                                    nullptr>(Id::SECOND_NUMBERING_PLAN),
    // the one that ignores its argument: intended
    ROW<CC_PropertyPresentationIndicator,          nullptr,                                   &A::getPeerSecondPresentationIndicator,     &A::existsPeerSecondPresentationIndicator,  nullptr>(Id::SECOND_PRESENTATION_INDICATOR),
    ROW<CC_PropertyScreeningIndicator,             nullptr,                                   &A::getPeerSecondScreeningIndicator,        &A::existsPeerSecondScreeningIndicator,     nullptr, Absent::ARGUMENT>(Id::SECOND_SCREENING_INDICATOR),
    ROW<CC_PropertyString,                         &A::getOwnPrecallService,                  &A::getPeerPrecallService,                  nullptr,                                    &A::setOwnPrecallService>(Id::PRECALL_SERVICE),
    ROW<CC_PropertyString,                         &A::getOwnName,                            &A::getPeerName,                            nullptr,                                    &A::setOwnName>(Id::NAME),
    ROW<CC_PropertyString,                         &A::getOwnRedirectingE164,                 &A::getPeerRedirectingE164,                 nullptr,                                    &A::setOwnRedirectingE164>(Id::REDIRECTING_E164_NUMBER),
    ROW<CC_PropertyString,                         &A::getOwnRedirectingName,                 &A::getPeerRedirectingName,                 nullptr,                                    &A::setOwnRedirectingName>(Id::REDIRECTING_NAME),
    ROW<CC_PropertyRedirectingReason,              &A::getOwnRedirectingReason,               &A::getPeerRedirectingReason,               nullptr,                                    &A::setOwnRedirectingReason>(Id::REDIRECTING_REASON),
    ROW<CC_PropertyBoolean,                        &A::getOwnIsIsdn,                          &A::getPeerIsIsdn,                          nullptr,                                    &A::setOwnIsIsdn>(Id::ENDPOINT_IS_ISDN),
    ROW<CC_PropertyString,                         &A::getOwnRedirectingFirstE164,            &A::getPeerRedirectingFirstE164,            nullptr,                                    &A::setOwnRedirectingFirstE164>(Id::REDIRECTING_FIRST_E164_NUMBER),
    ROW<CC_PropertyString,                         &A::getOwnRedirectingFirstName,            &A::getPeerRedirectingFirstName,            nullptr,                                    &A::setOwnRedirectingFirstName>(Id::REDIRECTING_FIRST_NAME),
    ROW<CC_PropertyRedirectingReason,              &A::getOwnRedirectingFirstReason,          &A::getPeerRedirectingFirstReason,          nullptr,                                    &A::setOwnRedirectingFirstReason>(Id::REDIRECTING_FIRST_REASON),
    ROW<CC_PropertyUnsigned,                       &A::getOwnRedirectingCounter,              &A::getPeerRedirectingCounter,              nullptr,                                    &A::setOwnRedirectingCounter>(Id::REDIRECTING_COUNTER),
    ROW<CC_PropertyString,                         &A::getOwnAlertInfo,                       nullptr,                                    nullptr,                                    &A::setOwnAlertInfo>(Id::ALERT_INFO),
    ROW<CC_PropertyBoolean,                        &A::getOwnConnectedNrUpdate,               &A::getPeerConnectedNrUpdate,               nullptr,                                    &A::setOwnConnectedNrUpdate>(Id::CONNECTED_NUMBER_UPDATE),
    ROW<CC_PropertyString,                         &A::getOwnXOrgConnID,                      &A::getPeerXOrgConnID,                      nullptr,                                    &A::setOwnXOrgConnID>(Id::X_ORG_CONN_ID),
    ROW<CC_PropertyString,                         &A::getOwnDisplay,                         &A::getPeerDisplay,                         nullptr,                                    &A::setOwnDisplay>(Id::DISPLAY),
    ROW<CC_PropertyCodecs,                         &A::getOwnSupportedCodecs,                 &A::getPeerSupportedCodecs,                 &A::existsPeerSupportedCodecs,              &A::setOwnSupportedCodecs>(Id::SUPPORTED_CODECS),
    ROW<CC_PropertyCodec,                          &A::getOwnCodec,                           &A::getPeerCodec,                           &A::existsPeerCodec,                        &A::setOwnCodec>(Id::CURRENT_CODEC),
    ROW<CC_PropertyBoolean,                        &A::getOwnSupportsOverlapReceiving,        &A::getPeerSupportsOverlapReceiving,        nullptr,                                    &A::setOwnSupportsOverlapReceiving, Absent::TRUE>(Id::SUPPORTS_OVERLAP_RECEIVING),
    ROW<CC_PropertyBoolean,                        &A::getOwnSupportsOverlapSending,          &A::getPeerSupportsOverlapSending,          nullptr,                                    &A::setOwnSupportsOverlapSending, Absent::TRUE>(Id::SUPPORTS_OVERLAP_SENDING),
    ROW<CC_PropertyTariff,                         &A::getOwnTariff,                          &A::getPeerTariff,                          nullptr,                                    &A::setOwnTariff>(Id::TARIFF),
    ROW<CC_PropertyCharge,                         &A::getOwnCharge,                          &A::getPeerCharge,                          nullptr,                                    &A::setOwnCharge>(Id::CHARGE),
    ROW<CC_PropertyQoS,                            &A::getOwnQoS,                             nullptr,                                    nullptr,                                    &A::setOwnQoS>(Id::QUALITY_OF_SERVICE),
};

/// Those that are not one value of one property: tested one by one.
constexpr std::tuple OTHERS = {
    &A::getInformationTransferCapability, &A::getPeerCauseProperty,
    &A::getOwnUserToUser, &A::getPeerUserToUser, &A::setOwnUserToUser,
    &A::getOwnCodecNegotiatingState, &A::getPeerCodecNegotiatingState,
    &A::getOwnCodecNegotiatingCode, &A::getPeerCodecNegotiatingCode,
    static_cast<XCode (A::*)(Negotiating::State, unsigned int)>(&A::setOwnCodecNegotiatingState),
    static_cast<XCode (A::*)(Negotiating::State)>(&A::setOwnCodecNegotiatingState),
    &A::getOwnWaitForMessageState, &A::getPeerWaitForMessageState,
    &A::getOwnWaitForMessageType, &A::getPeerWaitForMessageType,
    static_cast<XCode (A::*)(Wait::State, Wait::MessageType)>(&A::setOwnWaitForMessageState),
    static_cast<XCode (A::*)(Wait::State)>(&A::setOwnWaitForMessageState),
};
// clang-format on

constexpr std::size_t NUMBER_OF_ACCESSORS = []
{
    std::size_t count = std::tuple_size_v<decltype(OTHERS)>;
    for (Row const& row : ROWS)
        count += row.count;
    return count;
}();
static_assert(NUMBER_OF_ACCESSORS == 116);

static_assert(std::is_same_v<decltype(&A::getOwnUserToUser), ParametrizedString (A::*)() const>, "by value");
static_assert(std::is_same_v<decltype(&A::getPeerUserToUser), ParametrizedString (A::*)() const>, "by value");

// --- the table, row by row -------------------------------------------------------------------------------------------

class CC_CallAdapterE164_Accessors_Test : public testing::TestWithParam<Row>
{
protected:
    AccessorLines lines;
};

INSTANTIATE_TEST_SUITE_P(EachId, CC_CallAdapterE164_Accessors_Test, testing::ValuesIn(ROWS),
                         [](testing::TestParamInfo<Row> const& row)
                         {
                             std::string name = CC_PropertyUnsigned(row.param.id).getPropertyName();
                             std::erase_if(name,
                                           [](char c) { return std::isalnum(static_cast<unsigned char>(c)) == 0; });
                             return name;
                         });

} // namespace

TEST_P(CC_CallAdapterE164_Accessors_Test, AnAbsentPropertyReadsAsTheDefault)
{
    GetParam().absent(lines, GetParam().id);
}
TEST_P(CC_CallAdapterE164_Accessors_Test, WhatIsSetReadsBackOnBothSides)
{
    GetParam().setAndReadBack(lines, GetParam().id);
}
TEST_P(CC_CallAdapterE164_Accessors_Test, APropertyOfAnotherClassReadsAsTheDefaultButExists)
{
    GetParam().wrongClass(lines, GetParam().id);
}
TEST_P(CC_CallAdapterE164_Accessors_Test, ASetterPassesThroughTheInputFilters)
{
    GetParam().inputFiltered(lines, GetParam().id);
}
TEST_P(CC_CallAdapterE164_Accessors_Test, APeerGetterReadsBehindTheOutputFilters)
{
    GetParam().outputFiltered(lines, GetParam().id);
}
TEST_P(CC_CallAdapterE164_Accessors_Test, ReadingNeedsNoMemoryAndASetterWithoutItSaysSo)
{
    GetParam().withoutMemory(lines, GetParam().id);
}
