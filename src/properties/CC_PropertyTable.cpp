#include "properties/CC_PropertyTable.h"

#include "platform/base/Assert.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyKeys.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <cstring>
#include <iterator>
#include <new>
#include <string>

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

template <auto... INITIAL_VALUE, class Property>
constexpr CC_PropertyTable::Row ROW(CC_PropertyKey<Property> key, char const* longName, char const* shortName,
                                    unsigned int listPosition)
{
    return {key.getId(), longName, shortName, CREATE<Property, INITIAL_VALUE...>, listPosition};
}

template <class Property>
constexpr CC_PropertyTable::Row NAMED(CC_PropertyKey<Property> key, char const* longName, char const* shortName)
{
    return {key.getId(), longName, shortName, nullptr, 0};
}

// in ascending order of the ids: key, long name, short name, list position; the initial value in front
// clang-format off
constexpr CC_PropertyTable::Row ROWS[] = {
    ROW(Key::NETWORK, "Network", "network", 1),
    ROW(Key::CALL_LEG_ID, "Call-Leg-ID", "call-leg-id", 2),
    ROW(Key::E164_NUMBER, "E164-Number", "e164", 3),
    ROW<QTypeOfNumber::UNKNOWN>(Key::TYPE_OF_NUMBER, "Type-Of-Number", "type-of-number", 4),
    ROW<QNumberingPlan::UNKNOWN>(Key::NUMBERING_PLAN, "Numbering-Plan", "numbering-plan", 5),
    ROW<QPresentationIndicator::ALLOWED>(Key::PRESENTATION_INDICATOR, "Presentation-Indicator", "pi", 6),
    ROW<QScreeningIndicator::USER_PROVIDED_NOT_SCREENED>(Key::SCREENING_INDICATOR, "Screening-Indicator", "si", 7),
    ROW<QPresentationIndicator::ALLOWED>(Key::DIVERSION_PRESENTATION_INDICATOR, "Diversion-Presentation-Indicator", "diversion-pi", 8),
    ROW<QScreeningIndicator::USER_PROVIDED_NOT_SCREENED>(Key::DIVERSION_SCREENING_INDICATOR, "Diversion-Screening-Indicator", "diversion-si", 9),
    ROW(Key::SECOND_E164_NUMBER, "Second-E164-Number", "second-e164", 10),
    ROW<QTypeOfNumber::UNKNOWN>(Key::SECOND_TYPE_OF_NUMBER, "Second-Type-Of-Number", "second-type-of-number", 11),
    ROW<QNumberingPlan::UNKNOWN>(Key::SECOND_NUMBERING_PLAN, "Second-Numbering-Plan", "second-numbering-plan", 12),
    ROW<QPresentationIndicator::ALLOWED>(Key::SECOND_PRESENTATION_INDICATOR, "Second-Presentation-Indicator", "second-pi", 13),
    ROW<QScreeningIndicator::USER_PROVIDED_NOT_SCREENED>(Key::SECOND_SCREENING_INDICATOR, "Second-Screening-Indicator", "second-si", 14),
    ROW(Key::IP_ADDRESS, "IP-Address", "ip", 15),
    ROW<QInformationTransferCapability::SPEECH>(Key::INFORMATION_TRANSFER_CAPABILITY, "Information-Transfer-Capability", "itc", 16),
    ROW(Key::PRECALL_SERVICE, "Precall-Service", "precall-service", 17),
    // an id with a name alone belongs to another factory
    NAMED(Key::URI, "URI", "uri"),
    ROW(Key::NAME, "Name", "name", 18),
    ROW(Key::HOPS, "Hops", "hops", 19),
    ROW(Key::REDIRECTING_E164_NUMBER, "Redirecting-E164-Number", "redir-e164", 20),
    ROW(Key::REDIRECTING_NAME, "Redirecting-Name", "redir-name", 21),
    ROW<QReasonForRedirection::UNKNOWN>(Key::REDIRECTING_REASON, "Redirecting-Reason", "redir-reason", 22),
    ROW(Key::UNIQUE_IDENTIFIER, "Unique Identifier", "unique-id", 23),
    ROW<false>(Key::ENDPOINT_IS_ISDN, "Endpoint-Is-Isdn", "is-isdn", 24),
    ROW(Key::REDIRECTING_FIRST_E164_NUMBER, "Redirecting-First-E164-Number", "redir-first-e164", 25),
    ROW(Key::REDIRECTING_FIRST_NAME, "Redirecting-First-Name", "redir-first-name", 26),
    ROW<QReasonForRedirection::UNKNOWN>(Key::REDIRECTING_FIRST_REASON, "Redirecting-First-Reason", "redir-first-reason", 27),
    ROW(Key::REDIRECTING_COUNTER, "Redirecting-Counter", "redir-counter", 28),
    ROW<CC_PropertyCallType::NORMAL>(Key::CALL_TYPE, "Call-Type", "call-type", 29),
    ROW<false>(Key::MESSAGE_WAITING_INDICATION, "Message Waiting Indication", "mwi", 30),
    ROW(Key::ALERT_INFO, "Alert-Info", "alert-info", 31),
    ROW<false>(Key::CONNECTED_NUMBER_UPDATE, "Connected Number Update", "colp-update", 32),
    // created and listed without names: those who use these ids agree on them among themselves
    ROW(Key::UNNAMED_UNSIGNED, nullptr, nullptr, 35),
    ROW<false>(Key::UNNAMED_BOOLEAN, nullptr, nullptr, 36),
    ROW(Key::UNNAMED_STRING, nullptr, nullptr, 37),
    ROW(Key::UNNAMED_SECOND_STRING, nullptr, nullptr, 38),
    ROW(Key::UNNAMED_THIRD_STRING, nullptr, nullptr, 39),
    ROW<false>(Key::UNNAMED_SECOND_BOOLEAN, nullptr, nullptr, 40),
    ROW(Key::X_ORG_CONN_ID, "X-Org-ConnID", "x-org-connid", 42),
    NAMED(Key::SIP_HEADERS, "SIP Headers", "sip-headers"),
    ROW(Key::USER_TO_USER_INFORMATION, "User-to-User Information", "user-to-user", 33),
    ROW(Key::REPLACES_INFORMATION, "Replaces Information", "replaces", 34),
    ROW(Key::DISPLAY, "Display", "display", 55),
    ROW(Key::SUPPORTED_CODECS, "Supported Codecs", "supported-codecs", 49),
    ROW(Key::CURRENT_CODEC, "Current Codec", "codec", 50),
    ROW(Key::CODEC_NEGOTIATING, "Codec Negotiating", "codec-negotiating", 51),
    ROW(Key::WAIT_FOR_MESSAGE, "Wait-for-Message", "wait-for-message", 52),
    ROW<false>(Key::READY_FOR_CODEC_NEGOTIATION, "Ready-for-Codec-Negotiation", "ready-negotiation", 53),
    ROW(Key::CONTEXT, "Context", "context", 41),
    ROW<false>(Key::PROVIDES_DATA, "Provides Data", "data", 43),
    ROW<MG_Tones::ECallProgressTone::NONE>(Key::CALL_PROGRESS_TONE, "Call-Progress Tone", "call-progress-tone", 44),
    // an endpoint can do these unless it says otherwise; every other Boolean starts false
    ROW<true>(Key::SUPPORTS_OVERLAP_RECEIVING, "Supports Overlap-Receiving", "supports-overlap-receiving", 45),
    ROW<true>(Key::SUPPORTS_OVERLAP_SENDING, "Supports Overlap-Sending", "supports-overlap-sending", 46),
    ROW<true>(Key::ALLOWS_PUSH_BACK, "Allows Push-Back", "allows-push-back", 47),
    ROW(Key::TARIFF, "Tariff", "tariff", 48),
    ROW(Key::CHARGE, "Charge", "charge", 54),
    ROW<QCause::NONE, 0U>(Key::CAUSE, "Cause", "cause", 56),
    NAMED(Key::QUALITY_OF_SERVICE, "Quality-Of-Service", "qos"),
    ROW<CC_PropertyCallLegState::RELEASED>(Key::STATE, "State", "state", 57),
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

namespace
{
/// A module's row with the texts that it points to: modules may be unloaded, names live for ever.
struct DeclaredRow
{
    std::string longName;
    std::string shortName;
    CC_PropertyTable::Row row;
};

constexpr std::size_t NUMBER_OF_MODULE_IDS = CC_PropertyId::LAST_OF_MODULES - CC_PropertyId::FIRST_OF_MODULES + 1;
constinit std::array<std::atomic<DeclaredRow const*>, NUMBER_OF_MODULE_IDS> s_declared{};

bool IS_OF_MODULES(unsigned int id)
{
    return id >= CC_PropertyId::FIRST_OF_MODULES && id <= CC_PropertyId::LAST_OF_MODULES;
}

bool HAS_NAME(CC_PropertyTable::Row const& row, char const* longName, char const* shortName)
{
    return row.longName != nullptr &&
           (std::strcmp(row.longName, longName) == 0 || std::strcmp(row.shortName, shortName) == 0);
}

bool IS_TAKEN(char const* longName, char const* shortName)
{
    return std::any_of(std::begin(ROWS), std::end(ROWS),
                       [&](auto const& row) { return HAS_NAME(row, longName, shortName); }) ||
           std::any_of(s_declared.begin(), s_declared.end(),
                       [&](auto const& declared)
                       {
                           DeclaredRow const* const other = declared.load(std::memory_order_acquire);
                           return other != nullptr && HAS_NAME(other->row, longName, shortName);
                       });
}

bool IS_EMPTY(char const* name) { return name == nullptr || *name == '\0'; }

/// Null when memory is out.
DeclaredRow const* MAKE_ROW(unsigned int id, char const* longName, char const* shortName)
{
    try
    {
        auto* const made = new DeclaredRow{longName, shortName, {id, nullptr, nullptr, nullptr, 0}};
        made->row.longName = made->longName.c_str();
        made->row.shortName = made->shortName.c_str();
        return made;
    }
    catch (std::bad_alloc const&)
    {
        return nullptr;
    }
}
} // namespace

CC_PropertyTable::Row const* CC_PropertyTable::FIND(unsigned int id)
{
    if (IS_OF_MODULES(id))
    {
        auto const& declared = s_declared[id - CC_PropertyId::FIRST_OF_MODULES];
        DeclaredRow const* const found = declared.load(std::memory_order_acquire);
        return found != nullptr ? &found->row : nullptr;
    }
    Row const* const row = std::lower_bound(std::begin(ROWS), std::end(ROWS), id,
                                            [](Row const& left, unsigned int right) { return left.id < right; });
    return row != std::end(ROWS) && row->id == id ? row : nullptr;
}

XCode CC_PropertyTable::DECLARE(unsigned int id, char const* longName, char const* shortName)
{
    if (!IS_OF_MODULES(id) || IS_EMPTY(longName) || IS_EMPTY(shortName) || IS_TAKEN(longName, shortName))
        return XCode::REFUSED;
    DeclaredRow const* const made = MAKE_ROW(id, longName, shortName);
    if (made == nullptr)
        return XCode::NO_ELEMENT;
    DeclaredRow const* none = nullptr;
    auto& declared = s_declared[id - CC_PropertyId::FIRST_OF_MODULES];
    if (declared.compare_exchange_strong(none, made, std::memory_order_acq_rel))
        return XCode::OK;
    delete made;
    return XCode::REFUSED;
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
