#include "properties/CC_PropertyTable.h"

#include "platform/base/Assert.h"
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
#include "properties/CC_PropertyNumberingPlan.h"
#include "properties/CC_PropertyParametrizedString.h"
#include "properties/CC_PropertyPresentationIndicator.h"
#include "properties/CC_PropertyRedirectingReason.h"
#include "properties/CC_PropertyScreeningIndicator.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyTariff.h"
#include "properties/CC_PropertyTypeOfNumber.h"
#include "properties/CC_PropertyUnsigned.h"
#include "properties/CC_PropertyWaitForMessage.h"

#include <algorithm>
#include <array>
#include <iterator>
#include <new>

namespace
{
/// A new property of the class with that initial value; its default where none is given.
template <class Property, auto... INITIAL_VALUE>
CC_Property* CREATE(unsigned int id)
{
    try
    {
        return new Property(id, INITIAL_VALUE...);
    }
    catch (std::bad_alloc const&)
    {
        return nullptr;
    }
}

// in ascending order of the ids: id, long name, short name, class and initial value, list position
// clang-format off
constexpr CC_PropertyTable::Row ROWS[] = {
    {CC_PropertyId::NETWORK, "Network", "network", CREATE<CC_PropertyString>, 1},
    {CC_PropertyId::CALL_LEG_ID, "Call-Leg-ID", "call-leg-id", CREATE<CC_PropertyUnsigned>, 2},
    {CC_PropertyId::E164_NUMBER, "E164-Number", "e164", CREATE<CC_PropertyString>, 3},
    {CC_PropertyId::TYPE_OF_NUMBER, "Type-Of-Number", "type-of-number", CREATE<CC_PropertyTypeOfNumber, QTypeOfNumber::UNKNOWN>, 4},
    {CC_PropertyId::NUMBERING_PLAN, "Numbering-Plan", "numbering-plan", CREATE<CC_PropertyNumberingPlan, QNumberingPlan::UNKNOWN>, 5},
    {CC_PropertyId::PRESENTATION_INDICATOR, "Presentation-Indicator", "pi", CREATE<CC_PropertyPresentationIndicator, QPresentationIndicator::ALLOWED>, 6},
    {CC_PropertyId::SCREENING_INDICATOR, "Screening-Indicator", "si", CREATE<CC_PropertyScreeningIndicator, QScreeningIndicator::USER_PROVIDED_NOT_SCREENED>, 7},
    {CC_PropertyId::DIVERSION_PRESENTATION_INDICATOR, "Diversion-Presentation-Indicator", "diversion-pi", CREATE<CC_PropertyPresentationIndicator, QPresentationIndicator::ALLOWED>, 8},
    {CC_PropertyId::DIVERSION_SCREENING_INDICATOR, "Diversion-Screening-Indicator", "diversion-si", CREATE<CC_PropertyScreeningIndicator, QScreeningIndicator::USER_PROVIDED_NOT_SCREENED>, 9},
    {CC_PropertyId::SECOND_E164_NUMBER, "Second-E164-Number", "second-e164", CREATE<CC_PropertyString>, 10},
    {CC_PropertyId::SECOND_TYPE_OF_NUMBER, "Second-Type-Of-Number", "second-type-of-number", CREATE<CC_PropertyTypeOfNumber, QTypeOfNumber::UNKNOWN>, 11},
    {CC_PropertyId::SECOND_NUMBERING_PLAN, "Second-Numbering-Plan", "second-numbering-plan", CREATE<CC_PropertyNumberingPlan, QNumberingPlan::UNKNOWN>, 12},
    {CC_PropertyId::SECOND_PRESENTATION_INDICATOR, "Second-Presentation-Indicator", "second-pi", CREATE<CC_PropertyPresentationIndicator, QPresentationIndicator::ALLOWED>, 13},
    {CC_PropertyId::SECOND_SCREENING_INDICATOR, "Second-Screening-Indicator", "second-si", CREATE<CC_PropertyScreeningIndicator, QScreeningIndicator::USER_PROVIDED_NOT_SCREENED>, 14},
    {CC_PropertyId::IP_ADDRESS, "IP-Address", "ip", CREATE<CC_PropertyIpAddress>, 15},
    {CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY, "Information-Transfer-Capability", "itc", CREATE<CC_PropertyInformationTransferCapability, QInformationTransferCapability::SPEECH>, 16},
    {CC_PropertyId::PRECALL_SERVICE, "Precall-Service", "precall-service", CREATE<CC_PropertyString>, 17},
    // an id with a name but neither class nor list position belongs to another factory
    {CC_PropertyId::URI, "URI", "uri", nullptr, 0},
    {CC_PropertyId::NAME, "Name", "name", CREATE<CC_PropertyString>, 18},
    {CC_PropertyId::HOPS, "Hops", "hops", CREATE<CC_PropertyUnsigned>, 19},
    {CC_PropertyId::REDIRECTING_E164_NUMBER, "Redirecting-E164-Number", "redir-e164", CREATE<CC_PropertyString>, 20},
    {CC_PropertyId::REDIRECTING_NAME, "Redirecting-Name", "redir-name", CREATE<CC_PropertyString>, 21},
    {CC_PropertyId::REDIRECTING_REASON, "Redirecting-Reason", "redir-reason", CREATE<CC_PropertyRedirectingReason, QReasonForRedirection::UNKNOWN>, 22},
    {CC_PropertyId::UNIQUE_IDENTIFIER, "Unique Identifier", "unique-id", CREATE<CC_PropertyParametrizedString>, 23},
    {CC_PropertyId::ENDPOINT_IS_ISDN, "Endpoint-Is-Isdn", "is-isdn", CREATE<CC_PropertyBoolean, false>, 24},
    {CC_PropertyId::REDIRECTING_FIRST_E164_NUMBER, "Redirecting-First-E164-Number", "redir-first-e164", CREATE<CC_PropertyString>, 25},
    {CC_PropertyId::REDIRECTING_FIRST_NAME, "Redirecting-First-Name", "redir-first-name", CREATE<CC_PropertyString>, 26},
    {CC_PropertyId::REDIRECTING_FIRST_REASON, "Redirecting-First-Reason", "redir-first-reason", CREATE<CC_PropertyRedirectingReason, QReasonForRedirection::UNKNOWN>, 27},
    {CC_PropertyId::REDIRECTING_COUNTER, "Redirecting-Counter", "redir-counter", CREATE<CC_PropertyUnsigned>, 28},
    {CC_PropertyId::CALL_TYPE, "Call-Type", "call-type", CREATE<CC_PropertyCallType, CC_PropertyCallType::NORMAL>, 29},
    {CC_PropertyId::MESSAGE_WAITING_INDICATION, "Message Waiting Indication", "mwi", CREATE<CC_PropertyBoolean, false>, 30},
    {CC_PropertyId::ALERT_INFO, "Alert-Info", "alert-info", CREATE<CC_PropertyString>, 31},
    {CC_PropertyId::CONNECTED_NUMBER_UPDATE, "Connected Number Update", "colp-update", CREATE<CC_PropertyBoolean, false>, 32},
    // created and listed without names: those who use these ids agree on them among themselves
    {CC_PropertyId::UNNAMED_UNSIGNED, nullptr, nullptr, CREATE<CC_PropertyUnsigned>, 35},
    {CC_PropertyId::UNNAMED_BOOLEAN, nullptr, nullptr, CREATE<CC_PropertyBoolean, false>, 36},
    {CC_PropertyId::UNNAMED_STRING, nullptr, nullptr, CREATE<CC_PropertyString>, 37},
    {CC_PropertyId::UNNAMED_SECOND_STRING, nullptr, nullptr, CREATE<CC_PropertyString>, 38},
    {CC_PropertyId::UNNAMED_THIRD_STRING, nullptr, nullptr, CREATE<CC_PropertyString>, 39},
    {CC_PropertyId::UNNAMED_SECOND_BOOLEAN, nullptr, nullptr, CREATE<CC_PropertyBoolean, false>, 40},
    {CC_PropertyId::X_ORG_CONN_ID, "X-Org-ConnID", "x-org-connid", CREATE<CC_PropertyString>, 42},
    {CC_PropertyId::SIP_HEADERS, "SIP Headers", "sip-headers", nullptr, 0},
    {CC_PropertyId::USER_TO_USER_INFORMATION, "User-to-User Information", "user-to-user", CREATE<CC_PropertyParametrizedString>, 33},
    {CC_PropertyId::REPLACES_INFORMATION, "Replaces Information", "replaces", CREATE<CC_PropertyParametrizedString>, 34},
    {CC_PropertyId::DISPLAY, "Display", "display", CREATE<CC_PropertyString>, 55},
    {CC_PropertyId::SUPPORTED_CODECS, "Supported Codecs", "supported-codecs", CREATE<CC_PropertyCodecs>, 49},
    {CC_PropertyId::CURRENT_CODEC, "Current Codec", "codec", CREATE<CC_PropertyCodec>, 50},
    {CC_PropertyId::CODEC_NEGOTIATING, "Codec Negotiating", "codec-negotiating", CREATE<CC_PropertyCodecNegotiating>, 51},
    {CC_PropertyId::WAIT_FOR_MESSAGE, "Wait-for-Message", "wait-for-message", CREATE<CC_PropertyWaitForMessage>, 52},
    {CC_PropertyId::READY_FOR_CODEC_NEGOTIATION, "Ready-for-Codec-Negotiation", "ready-negotiation", CREATE<CC_PropertyBoolean, false>, 53},
    {CC_PropertyId::CONTEXT, "Context", "context", CREATE<CC_PropertyContextId>, 41},
    {CC_PropertyId::PROVIDES_DATA, "Provides Data", "data", CREATE<CC_PropertyBoolean, false>, 43},
    {CC_PropertyId::CALL_PROGRESS_TONE, "Call-Progress Tone", "call-progress-tone", CREATE<CC_PropertyCallProgressTone, MG_Tones::ECallProgressTone::NONE>, 44},
    // an endpoint can do these unless it says otherwise; every other Boolean starts false
    {CC_PropertyId::SUPPORTS_OVERLAP_RECEIVING, "Supports Overlap-Receiving", "supports-overlap-receiving", CREATE<CC_PropertyBoolean, true>, 45},
    {CC_PropertyId::SUPPORTS_OVERLAP_SENDING, "Supports Overlap-Sending", "supports-overlap-sending", CREATE<CC_PropertyBoolean, true>, 46},
    {CC_PropertyId::ALLOWS_PUSH_BACK, "Allows Push-Back", "allows-push-back", CREATE<CC_PropertyBoolean, true>, 47},
    {CC_PropertyId::TARIFF, "Tariff", "tariff", CREATE<CC_PropertyTariff>, 48},
    {CC_PropertyId::CHARGE, "Charge", "charge", CREATE<CC_PropertyCharge>, 54},
    {CC_PropertyId::CAUSE, "Cause", "cause", CREATE<CC_PropertyCause, QCause::NONE, 0U>, 56},
    {CC_PropertyId::QUALITY_OF_SERVICE, "Quality-Of-Service", "qos", nullptr, 0},
    {CC_PropertyId::STATE, "State", "state", CREATE<CC_PropertyCallLegState, CC_PropertyCallLegState::RELEASED>, 57},
};
// clang-format on

constexpr bool ARE_IDS_ASCENDING()
{
    return std::adjacent_find(std::begin(ROWS), std::end(ROWS),
                              [](auto const& row, auto const& next) { return row.id >= next.id; }) == std::end(ROWS);
}

constexpr bool IS_EACH_POSITION_TAKEN_ONCE()
{
    for (unsigned int position = 1; position <= CC_PropertyTable::NUMBER_OF_LISTED_IDS; ++position)
        if (std::count_if(std::begin(ROWS), std::end(ROWS),
                          [position](auto const& row) { return row.listPosition == position; }) != 1)
            return false;
    return true;
}

static_assert(std::size(ROWS) == CC_PropertyTable::NUMBER_OF_IDS);
static_assert(ARE_IDS_ASCENDING(), "an id is doubled or stands in the wrong place");
static_assert(IS_EACH_POSITION_TAKEN_ONCE(), "a list position is doubled or missing");

constexpr auto LISTED_IDS = []
{
    std::array<unsigned int, CC_PropertyTable::NUMBER_OF_LISTED_IDS> ids{};
    for (CC_PropertyTable::Row const& row : ROWS)
        if (row.listPosition != 0)
            ids[row.listPosition - 1] = row.id;
    return ids;
}();
} // namespace

CC_PropertyTable::Row const* CC_PropertyTable::FIND(unsigned int id)
{
    Row const* const row = std::lower_bound(std::begin(ROWS), std::end(ROWS), id,
                                            [](Row const& left, unsigned int right) { return left.id < right; });
    return row != std::end(ROWS) && row->id == id ? row : nullptr;
}

CC_PropertyTable::Row const& CC_PropertyTable::GET_ROW(unsigned int index)
{
    TY_ASSERT(index < NUMBER_OF_IDS, "row past the end");
    return ROWS[index];
}

unsigned int CC_PropertyTable::GET_LISTED_ID(unsigned int index)
{
    TY_ASSERT(index < NUMBER_OF_LISTED_IDS, "list position past the end");
    return LISTED_IDS[index];
}
