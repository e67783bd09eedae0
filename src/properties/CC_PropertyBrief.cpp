#include "properties/CC_PropertyBrief.h"

#include "platform/media/MG_IContext.h"
#include "properties/CC_PropertyClasses.h"
#include "properties/CC_PropertyKind.h"
#include "recorder/CC_RecordWriter.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <limits>
#include <new>
#include <string_view>
#include <typeinfo>

namespace
{
using CC_RecordFormat::Brief;

/// Both ends of so many octets, which together are all when these are no more than twice as many.
template <std::size_t SIZE>
void COPY_ENDS(char* to, std::string_view text)
{
    std::memcpy(to, text.data(), SIZE);
    std::memcpy(to + text.size() - SIZE, text.data() + text.size() - SIZE, SIZE);
}

/// Without the detour through the C library, which costs more than the octets. REQUIRES: no more than 32.
void COPY(char* to, std::string_view text)
{
    static_assert(Brief::MOST_TEXT <= 32);
    if (text.size() >= 16)
        COPY_ENDS<16>(to, text);
    else if (text.size() >= 8)
        COPY_ENDS<8>(to, text);
    else if (text.size() >= 4)
        COPY_ENDS<4>(to, text);
    else if (text.size() >= 2)
        COPY_ENDS<2>(to, text);
    else if (text.size() == 1)
        *to = text[0];
}

void SET_TEXT(Brief& brief, std::string_view text)
{
    constexpr std::size_t WORD = CC_RecordFormat::WORDS_OF(1);
    constexpr std::size_t MOST_LENGTH = std::numeric_limits<std::uint16_t>::max();
    brief.textLength = static_cast<std::uint16_t>(std::min(text.size(), MOST_LENGTH));
    brief.textSize = static_cast<std::uint8_t>(std::min<std::size_t>(text.size(), Brief::MOST_TEXT));
    if (std::size_t const begun = brief.textSize % WORD; begun != 0) // the same value leaves the same octets
        std::memset(brief.text + brief.textSize - begun, 0, WORD);
    COPY(brief.text, {text.data(), brief.textSize});
}

void SET(Brief& brief, unsigned long long number)
{
    brief.first = static_cast<std::uint32_t>(number);
    brief.second = static_cast<std::uint32_t>(number >> 32);
}

// Of most classes the value is a number or a text; records of charge, tariff and quality are too large for either.
template <class Property>
void DESCRIBE(Property const& property, Brief& brief)
{
    if constexpr (requires { SET_TEXT(brief, property.getValue()); })
        SET_TEXT(brief, property.getValue());
    else if constexpr (requires { static_cast<unsigned long long>(property.getValue()); })
        SET(brief, static_cast<unsigned long long>(property.getValue()));
}

void DESCRIBE(CC_PropertyCallLegState const& property, Brief& brief)
{
    brief.first = static_cast<std::uint32_t>(property.getState());
}

void DESCRIBE(CC_PropertyCause const& property, Brief& brief)
{
    brief.first = static_cast<std::uint32_t>(property.getCause());
    brief.second = property.getSipCode();
    SET_TEXT(brief, property.getText());
}

void DESCRIBE(CC_PropertyCallProgressTone const& property, Brief& brief)
{
    brief.first = static_cast<std::uint32_t>(property.getTone());
    SET_TEXT(brief, property.getText());
}

void DESCRIBE(CC_PropertyCodec const& property, Brief& brief)
{
    VoipCodec const& codec = property.getValue().getCodec();
    brief.first = static_cast<std::uint32_t>(codec.getCodec());
    brief.second = codec.getPacketPeriod() << 2 | static_cast<std::uint32_t>(property.getValue().getMode());
}

// The codecs of both directions, an octet each.
void DESCRIBE(CC_PropertyCodecs const& property, Brief& brief)
{
    std::array<char, Brief::MOST_TEXT> codecs;
    std::size_t count = 0;
    for (VoipCodec const& codec : property.getValue().getList(VoipCodecListSet::SEND_RECEIVE))
        if (count < codecs.size())
            codecs[count++] = static_cast<char>(codec.getCodec());
    SET_TEXT(brief, {codecs.data(), count});
}

void DESCRIBE(CC_PropertyCodecNegotiating const& property, Brief& brief)
{
    brief.first = static_cast<std::uint32_t>(property.getState());
    brief.second = property.getNegotiatedValue();
}

void DESCRIBE(CC_PropertyWaitForMessage const& property, Brief& brief)
{
    brief.first = static_cast<std::uint32_t>(property.getState());
    brief.second = static_cast<std::uint32_t>(property.getMessageType());
}

// The media layer is asked, as when the value is printed.
void DESCRIBE(CC_PropertyContextId const& property, Brief& brief)
{
    MG_IContext const* const context = property.getContext();
    brief.first = context != nullptr ? context->getId() : 0;
    brief.second = context != nullptr ? 1 : 0;
}

void DESCRIBE(CC_PropertyIpAddress const& property, Brief& brief)
{
    IpAddress const& address = property.getValue();
    auto const& octets = address.getOctets();
    brief.first = address.getVersion();
    brief.second = address.isNetType() ? address.getPrefixLength() : ~0U;
    SET_TEXT(brief, {reinterpret_cast<char const*>(octets.data()), address.getVersion() == 4 ? 4U : octets.size()});
}

void DESCRIBE(CC_PropertyParametrizedString const& property, Brief& brief)
{
    brief.first = property.getUpdateCounter();
    SET_TEXT(brief, property.getContent().content);
}

/// Describes so many properties of one class, one behind the other; null: no property. Returns the place behind them.
using Describe = char* (*)(char* place, CC_Property const* const* properties, std::size_t count);

template <class Property>
char* DESCRIBE_EACH(char* place, CC_Property const* const* properties, std::size_t count)
{
    for (std::size_t i = 0; i < count; ++i)
    {
        auto& brief = *new (place) Brief;
        if (properties[i] != nullptr)
        {
            brief.place = static_cast<std::uint8_t>(CC_PropertyClasses::PLACE_OF<Property>());
            DESCRIBE(static_cast<Property const&>(*properties[i]), brief);
        }
        place += brief.getSize();
    }
    return place;
}

constexpr std::array<Describe, CC_PropertyClasses::SIZE> DESCRIPTIONS = []
{
    std::array<Describe, CC_PropertyClasses::SIZE> result{};
    std::size_t place = 0;
    CC_PropertyClasses::FOR_EACH([&]<class Property>() { result[place++] = &DESCRIBE_EACH<Property>; });
    return result;
}();
} // namespace

void CC_PropertyBrief::APPEND(CC_RecordWriter& recorder, CC_PropertyKind const& kind, CC_Property const* before,
                              CC_Property const& after)
{
    CC_Property const* const both[] = {before, &after};
    recorder.goOnAt(DESCRIPTIONS[kind.place](recorder.getPlace(), both, 2));
}

CC_PropertyBrief::CC_PropertyBrief(CC_Property const* property)
{
    CC_PropertyKind const* const kind = property != nullptr ? CC_PropertyKind::OF(*property) : nullptr;
    if (kind != nullptr)
    {
        m_size = static_cast<std::size_t>(DESCRIPTIONS[kind->place](m_place.data(), &property, 1) - m_place.data());
        return;
    }
    auto& brief = *new (m_place.data()) Brief;
    if (property != nullptr)
    {
        brief.place = Brief::OTHER_CLASS;
        SET_TEXT(brief, typeid(*property).name());
    }
    m_size = brief.getSize();
}

void CC_PropertyBrief::recordChange(CC_RecordFormat::Kind kind, unsigned long long call, unsigned long long leg,
                                    unsigned int propertyId, CC_Property const* after) const
{
    CC_PropertyBrief const now(after);
    CC_RecordWriter* const recorder = CC_RecordWriter::ON();
    if (recorder == nullptr)
        return; // whoever was called meanwhile has ended it
    recorder->beginChange(kind, call, leg, propertyId);
    recorder->append(m_place.data(), m_size);
    recorder->append(now.m_place.data(), now.m_size);
    recorder->end();
}
