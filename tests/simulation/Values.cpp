#include "tests/simulation/Values.h"

#include "platform/media/VoipCodecAndMode.h"
#include "platform/media/VoipCodecListSet.h"
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
#include "properties/CC_PropertyQoS.h"
#include "properties/CC_PropertyRedirectingReason.h"
#include "properties/CC_PropertyScreeningIndicator.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyTariff.h"
#include "properties/CC_PropertyTypeOfNumber.h"
#include "properties/CC_PropertyUnsigned.h"
#include "properties/CC_PropertyWaitForMessage.h"
#include "tests/simulation/ActingProperty.h"

#include <array>
#include <cstdlib>
#include <iterator>
#include <memory>
#include <typeinfo>

namespace Simulation
{
namespace
{
using namespace CC_PropertyId;

constexpr unsigned int OF_MODULES = 0x408000;
constexpr unsigned int OF_NO_GROUP = 0x400005;

struct Row
{
    unsigned int id;
    Kind kind;
};

// an id may stand here with several classes: whoever stores it first fixes the class
constexpr Row ROWS[] = {
    {NAME, Kind::TEXT},
    {E164_NUMBER, Kind::TEXT},
    {DISPLAY, Kind::TEXT},
    {PRECALL_SERVICE, Kind::TEXT},
    {NETWORK, Kind::TEXT},
    {CALL_LEG_ID, Kind::UNSIGNED},
    {HOPS, Kind::UNSIGNED},
    {TYPE_OF_NUMBER, Kind::TYPE_OF_NUMBER},
    {NUMBERING_PLAN, Kind::NUMBERING_PLAN},
    {PRESENTATION_INDICATOR, Kind::PRESENTATION},
    {SCREENING_INDICATOR, Kind::SCREENING},
    {INFORMATION_TRANSFER_CAPABILITY, Kind::TRANSFER_CAPABILITY},
    {IP_ADDRESS, Kind::IP_ADDRESS},
    {REDIRECTING_REASON, Kind::REDIRECTING_REASON},
    {UNIQUE_IDENTIFIER, Kind::PARAMETRIZED},
    {CALL_TYPE, Kind::CALL_TYPE},
    {USER_TO_USER_INFORMATION, Kind::PARAMETRIZED},
    {SUPPORTED_CODECS, Kind::CODECS},
    {CURRENT_CODEC, Kind::CODEC},
    {CODEC_NEGOTIATING, Kind::NEGOTIATING},
    {WAIT_FOR_MESSAGE, Kind::WAIT_FOR_MESSAGE},
    {CALL_PROGRESS_TONE, Kind::TONE},
    {SUPPORTS_OVERLAP_RECEIVING, Kind::BOOLEAN},
    {ALLOWS_PUSH_BACK, Kind::BOOLEAN},
    {TARIFF, Kind::TARIFF},
    {CHARGE, Kind::CHARGE},
    {CAUSE, Kind::CAUSE},
    {QUALITY_OF_SERVICE, Kind::QUALITY},
    {ENDPOINT_IS_ISDN, Kind::BOOLEAN},
    {PROVIDES_DATA, Kind::BOOLEAN},
    {OF_MODULES, Kind::ACTING},
    {OF_MODULES + 1, Kind::ACTING},
    {ALERT_INFO, Kind::ACTING},
    {NAME, Kind::UNSIGNED},
    {OF_MODULES, Kind::TEXT},
    {OF_NO_GROUP, Kind::UNSIGNED},
};

constexpr char const* TEXTS[Values::NUMBER_OF_TEXTS] = {"",
                                                        "1",
                                                        "23",
                                                        "4989123",
                                                        "Ada",
                                                        "net-a",
                                                        "net-b",
                                                        "bert",
                                                        "x",
                                                        "0800",
                                                        "a text that is longer than any small buffer",
                                                        "*7"};

constexpr unsigned long long NUMBERS[] = {0, 1, 2, 5, 7, 0xffffffff, 0x100000000};

/// The values of the enumerations that are written as numbers.
unsigned long long NUMBER_FOR(Kind kind, unsigned int variant)
{
    static constexpr int REASONS[] = {0, 1, 2, 4, 15};
    static constexpr int CAPABILITIES[] = {0, 8, 16};
    static constexpr int CAUSES[] = {0, 16, 17, 38, -1};
    switch (kind)
    {
    case Kind::UNSIGNED:
        return NUMBERS[variant % std::size(NUMBERS)];
    case Kind::BOOLEAN:
    case Kind::CALL_TYPE:
        return variant % 2;
    case Kind::CAUSE:
        return Values::MAKE_CAUSE(CAUSES[variant % std::size(CAUSES)], variant % 3 * 200).value.number;
    case Kind::REDIRECTING_REASON:
        return static_cast<unsigned int>(REASONS[variant % std::size(REASONS)]);
    case Kind::TRANSFER_CAPABILITY:
        return static_cast<unsigned int>(CAPABILITIES[variant % std::size(CAPABILITIES)]);
    default:
        return variant % Values::NUMBER_OF_VARIANTS;
    }
}

bool IS_MADE(Kind kind) { return kind >= Kind::IP_ADDRESS; }

VoipCodec CODEC_OF(unsigned int variant)
{
    return VoipCodec(variant % 2 == 0 ? MG_Rtp::ECodec::PCMA : MG_Rtp::ECodec::PCMU, 20);
}

std::unique_ptr<CC_Property> MAKE(unsigned int id, Kind kind, unsigned int variant)
{
    switch (kind)
    {
    case Kind::IP_ADDRESS:
    {
        IpAddress address;
        static constexpr char const* ADDRESSES[] = {"0.0.0.0", "192.0.2.1", "2001:db8::1"};
        std::ignore = address.setIpAddrAsString(ADDRESSES[variant]);
        return std::make_unique<CC_PropertyIpAddress>(id, address);
    }
    case Kind::PARAMETRIZED:
        return std::make_unique<CC_PropertyParametrizedString>(id, String(TEXTS[variant * 5]));
    case Kind::CODEC:
        return std::make_unique<CC_PropertyCodec>(id, variant == 0 ? VoipCodecAndMode()
                                                                   : VoipCodecAndMode(CODEC_OF(variant)));
    case Kind::CODECS:
        return std::make_unique<CC_PropertyCodecs>(id);
    case Kind::TARIFF:
        return std::make_unique<CC_PropertyTariff>(id);
    case Kind::CHARGE:
        return std::make_unique<CC_PropertyCharge>(id);
    default:
    {
        CC_QoS quality;
        quality.m_meanOpinionScore = static_cast<int>(variant);
        return std::make_unique<CC_PropertyQoS>(id, quality);
    }
    }
}

/// Of some classes there is only one made value.
unsigned int NUMBER_OF_MADE(Kind kind)
{
    return kind == Kind::CODECS || kind == Kind::TARIFF || kind == Kind::CHARGE ? 1 : Values::NUMBER_OF_VARIANTS;
}

using Made = std::array<std::array<std::unique_ptr<CC_Property>, Values::NUMBER_OF_VARIANTS>, std::size(ROWS)>;

Made MAKE_ALL()
{
    Made all;
    for (std::size_t i = 0; i < std::size(ROWS); ++i)
        if (IS_MADE(ROWS[i].kind))
            for (unsigned int variant = 0; variant < NUMBER_OF_MADE(ROWS[i].kind); ++variant)
                all[i][variant] = MAKE(ROWS[i].id, ROWS[i].kind, variant);
    return all;
}

Made const& ALL_MADE()
{
    static Made const* const all = new Made(MAKE_ALL());
    return *all;
}

CC_Property const& MADE(Property const& property)
{
    for (std::size_t i = 0; i < std::size(ROWS); ++i)
        if (ROWS[i].id == property.id && ROWS[i].kind == property.value.kind)
            return *ALL_MADE()[i][property.value.number];
    std::abort();
}

/// Which of the made values it is; NONE when it is none.
Value FIND_MADE(CC_Property const& property)
{
    for (std::size_t i = 0; i < std::size(ROWS); ++i)
        if (IS_MADE(ROWS[i].kind) && ROWS[i].id == property.getId())
            for (unsigned int variant = 0; variant < NUMBER_OF_MADE(ROWS[i].kind); ++variant)
                if (ALL_MADE()[i][variant]->isEqual(property))
                    return {ROWS[i].kind, variant};
    return {};
}

template <class Class>
bool IS(CC_Property const& property)
{
    return typeid(property) == typeid(Class);
}

template <class Class>
Class const& AS(CC_Property const& property)
{
    return static_cast<Class const&>(property);
}

template <class Class, class Enumeration>
void WITH_ENUMERATION(Property const& property, std::function<void(CC_Property const&)> const& use)
{
    use(Class(property.id, static_cast<Enumeration>(property.value.number)));
}

template <class Class>
bool READ_ENUMERATION(CC_Property const& property, Kind kind, Value& value)
{
    if (!IS<Class>(property))
        return false;
    value = {kind, static_cast<unsigned int>(AS<Class>(property).getValue())};
    return true;
}

constexpr auto CAUSE_BITS = 32U;

bool READ_COMMON(CC_Property const& property, Value& value)
{
    if (IS<CC_PropertyString>(property))
        value = {Kind::TEXT, 0, AS<CC_PropertyString>(property).getValue().c_str()};
    else if (IS<CC_PropertyCallLegState>(property))
        value = Values::MAKE_STATE(AS<CC_PropertyCallLegState>(property).getState()).value;
    else if (IS<CC_PropertyUnsigned>(property))
        value = {Kind::UNSIGNED, AS<CC_PropertyUnsigned>(property).getValue()};
    else if (IS<CC_PropertyBoolean>(property))
        value = {Kind::BOOLEAN, AS<CC_PropertyBoolean>(property).getValue() ? 1U : 0U};
    else if (IS<CC_PropertyCause>(property))
        value = Values::MAKE_CAUSE(static_cast<int>(AS<CC_PropertyCause>(property).getCause()),
                                   AS<CC_PropertyCause>(property).getSipCode())
                    .value;
    else if (IS<CC_PropertyContextId>(property))
    {
        MG_IContext const* const context = AS<CC_PropertyContextId>(property).getContext();
        value = {Kind::MEDIA, context != nullptr ? context->getId() : 0};
    }
    else if (IS<ActingProperty>(property))
        value = {Kind::ACTING, AS<ActingProperty>(property).getNumber()};
    else
        return false;
    return true;
}

bool READ_NUMBERED(CC_Property const& property, Value& value)
{
    if (READ_ENUMERATION<CC_PropertyTypeOfNumber>(property, Kind::TYPE_OF_NUMBER, value) ||
        READ_ENUMERATION<CC_PropertyNumberingPlan>(property, Kind::NUMBERING_PLAN, value) ||
        READ_ENUMERATION<CC_PropertyPresentationIndicator>(property, Kind::PRESENTATION, value) ||
        READ_ENUMERATION<CC_PropertyScreeningIndicator>(property, Kind::SCREENING, value) ||
        READ_ENUMERATION<CC_PropertyInformationTransferCapability>(property, Kind::TRANSFER_CAPABILITY, value) ||
        READ_ENUMERATION<CC_PropertyRedirectingReason>(property, Kind::REDIRECTING_REASON, value) ||
        READ_ENUMERATION<CC_PropertyCallType>(property, Kind::CALL_TYPE, value))
        return true;
    if (IS<CC_PropertyCodecNegotiating>(property))
        value = {Kind::NEGOTIATING, static_cast<unsigned int>(AS<CC_PropertyCodecNegotiating>(property).getState())};
    else if (IS<CC_PropertyWaitForMessage>(property))
        value = {Kind::WAIT_FOR_MESSAGE, static_cast<unsigned int>(AS<CC_PropertyWaitForMessage>(property).getState())};
    else if (IS<CC_PropertyCallProgressTone>(property))
        value = {Kind::TONE, static_cast<unsigned int>(AS<CC_PropertyCallProgressTone>(property).getTone())};
    else
        return false;
    return true;
}
} // namespace

void Values::PREPARE() { std::ignore = ALL_MADE(); }

Property Values::CHOOSE(unsigned int which, unsigned int variant)
{
    Row const& row = ROWS[which % std::size(ROWS)];
    if (row.kind == Kind::TEXT)
        return MAKE_TEXT(row.id, TEXT(variant));
    if (IS_MADE(row.kind))
        return {row.id, {row.kind, variant % NUMBER_OF_MADE(row.kind)}};
    return {row.id, {row.kind, NUMBER_FOR(row.kind, variant)}};
}

Properties Values::CHOOSE_SEVERAL(unsigned int seed)
{
    Properties properties;
    for (unsigned int i = 0; i < seed % 5; ++i)
        properties.push_back(CHOOSE(seed * 7 + i * 13 + seed / 36, seed / 5 + i));
    return properties;
}

char const* Values::TEXT(unsigned int number) { return TEXTS[number % NUMBER_OF_TEXTS]; }

Property Values::MAKE_STATE(int state) { return {STATE, {Kind::STATE, static_cast<unsigned long long>(state + 2)}}; }

Property Values::MAKE_CAUSE(int cause, unsigned int sipCode)
{
    return {CAUSE,
            {Kind::CAUSE, static_cast<unsigned long long>(static_cast<unsigned int>(cause)) << CAUSE_BITS | sipCode}};
}

void Values::WITH(Property const& property, std::function<void(CC_Property const&)> const& use)
{
    Value const& value = property.value;
    unsigned int const id = property.id;
    switch (value.kind)
    {
    case Kind::TEXT:
        return use(CC_PropertyString(id, String(value.text.c_str())));
    case Kind::UNSIGNED:
        return use(CC_PropertyUnsigned(id, value.number));
    case Kind::BOOLEAN:
        return use(CC_PropertyBoolean(id, value.number != 0));
    case Kind::STATE:
        return use(CC_PropertyCallLegState(
            id, static_cast<CC_PropertyCallLegState::State>(static_cast<int>(value.number) - 2)));
    case Kind::CAUSE:
        return use(CC_PropertyCause(id, static_cast<QCause>(static_cast<int>(value.number >> CAUSE_BITS)),
                                    static_cast<unsigned int>(value.number & 0xffffffff)));
    case Kind::ACTING:
        return use(ActingProperty(id, static_cast<unsigned int>(value.number)));
    case Kind::TYPE_OF_NUMBER:
        return WITH_ENUMERATION<CC_PropertyTypeOfNumber, QTypeOfNumber>(property, use);
    case Kind::NUMBERING_PLAN:
        return WITH_ENUMERATION<CC_PropertyNumberingPlan, QNumberingPlan>(property, use);
    case Kind::PRESENTATION:
        return WITH_ENUMERATION<CC_PropertyPresentationIndicator, QPresentationIndicator>(property, use);
    case Kind::SCREENING:
        return WITH_ENUMERATION<CC_PropertyScreeningIndicator, QScreeningIndicator>(property, use);
    case Kind::TRANSFER_CAPABILITY:
        return WITH_ENUMERATION<CC_PropertyInformationTransferCapability, QInformationTransferCapability>(property,
                                                                                                          use);
    case Kind::REDIRECTING_REASON:
        return WITH_ENUMERATION<CC_PropertyRedirectingReason, QReasonForRedirection>(property, use);
    case Kind::CALL_TYPE:
        return WITH_ENUMERATION<CC_PropertyCallType, CC_PropertyCallType::_eCallType>(property, use);
    case Kind::NEGOTIATING:
        return WITH_ENUMERATION<CC_PropertyCodecNegotiating, CC_PropertyCodecNegotiating::State>(property, use);
    case Kind::WAIT_FOR_MESSAGE:
        return WITH_ENUMERATION<CC_PropertyWaitForMessage, CC_PropertyWaitForMessage::State>(property, use);
    case Kind::TONE:
        return WITH_ENUMERATION<CC_PropertyCallProgressTone, CC_PropertyCallProgressTone::Tone>(property, use);
    case Kind::NONE:
    case Kind::MEDIA: // held by reference: written by the operations that have one
        return;
    default:
        return use(MADE(property));
    }
}

void Values::STORE(CC_PropertyContainer& container, Properties const& properties)
{
    for (Property const& property : properties)
        WITH(property, [&](CC_Property const& made) { std::ignore = container.set(made); });
}

Value Values::READ(CC_Property const& property)
{
    Value value;
    if (!READ_COMMON(property, value) && !READ_NUMBERED(property, value))
        value = FIND_MADE(property);
    return value;
}

Properties Values::READ(CC_PropertyContainer const& container)
{
    Properties properties;
    for (unsigned int i = 0; i < container.getNumberOfProperties(); ++i)
    {
        CC_Property const& property = *container.getByIndex(i);
        properties.push_back({property.getId(), READ(property)});
    }
    return properties;
}

std::string Values::PRINT(Property const& property)
{
    static constexpr char const* DIGITS = "0123456789abcdef";
    std::string text;
    for (int shift = 20; shift >= 0; shift -= 4)
        text += DIGITS[property.id >> shift & 0xf];
    text += "=" + std::to_string(static_cast<int>(property.value.kind)) + ":";
    return text + (property.value.kind == Kind::TEXT ? "'" + property.value.text + "'"
                                                     : std::to_string(property.value.number));
}

std::string Values::PRINT(Properties const& properties)
{
    std::string text;
    for (Property const& property : properties)
        text += " " + PRINT(property);
    return text;
}
} // namespace Simulation
