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

void SET_TEXT(Brief& brief, std::string_view text)
{
    constexpr std::size_t MOST_LENGTH = std::numeric_limits<std::uint16_t>::max();
    brief.textLength = static_cast<std::uint16_t>(std::min(text.size(), MOST_LENGTH));
    brief.textSize = static_cast<std::uint8_t>(std::min<std::size_t>(text.size(), Brief::MOST_TEXT));
    std::memcpy(brief.text, text.data(), brief.textSize);
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

using Describe = void (*)(CC_Property const&, Brief&);

constexpr std::array<Describe, CC_PropertyClasses::SIZE> DESCRIPTIONS = []
{
    std::array<Describe, CC_PropertyClasses::SIZE> result{};
    std::size_t place = 0;
    CC_PropertyClasses::FOR_EACH(
        [&]<class Property>()
        {
            result[place++] = [](CC_Property const& property, Brief& brief)
            { DESCRIBE(static_cast<Property const&>(property), brief); };
        });
    return result;
}();
} // namespace

void CC_PropertyBrief::APPEND(CC_RecordWriter& recorder, CC_PropertyKind const& kind, CC_Property const* property)
{
    auto& brief = *new (recorder.getPlace()) Brief;
    if (property != nullptr)
    {
        brief.place = static_cast<std::uint8_t>(kind.place);
        DESCRIPTIONS[kind.place](*property, brief);
    }
    recorder.skip(brief.getSize());
}

CC_PropertyBrief::CC_PropertyBrief(CC_Property const* property)
{
    auto& brief = *new (m_place.data()) Brief;
    CC_PropertyKind const* const kind = property != nullptr ? CC_PropertyKind::OF(*property) : nullptr;
    if (kind != nullptr)
    {
        brief.place = static_cast<std::uint8_t>(kind->place);
        DESCRIPTIONS[kind->place](*property, brief);
    }
    else if (property != nullptr)
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
