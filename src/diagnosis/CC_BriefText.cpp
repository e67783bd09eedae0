#include "diagnosis/CC_BriefText.h"

#include "diagnosis/Demangled.h"
#include "properties/CC_PropertyClasses.h"

#include <algorithm>
#include <arpa/inet.h>
#include <array>
#include <cstring>
#include <string_view>
#include <tuple>
#include <type_traits>
#include <utility>

namespace
{
using CC_RecordFormat::Brief;
using CC_RecordFormat::BriefHead;

std::string_view TEXT_OF(Brief const& brief) { return {brief.text, brief.textSize}; }

std::string WITH_ELLIPSIS(std::string const& text, Brief const& brief)
{
    return brief.textSize < brief.textLength ? text + "..." : text;
}

std::string PRINT(CC_Property const& property)
{
    String text;
    return std::string(property.getValueString(text).view());
}

template <class Property>
std::string IN_BRACKETS()
{
    return std::string("(") + Property::TYPE_NAME + ")";
}

template <class Property>
concept HAS_NUMBER = requires(Property const& property)
{
    static_cast<unsigned long long>(property.getValue());
};

/// A property with what is left of the value; of most classes a number is.
template <class Property>
std::string TEXT(unsigned int id, Brief const& brief, Property const*)
{
    if constexpr (HAS_NUMBER<Property>)
    {
        using Value = std::decay_t<decltype(std::declval<Property const&>().getValue())>;
        unsigned long long const number = brief.first | static_cast<unsigned long long>(brief.second) << 32;
        return PRINT(Property(id, static_cast<Value>(number)));
    }
    else
        return IN_BRACKETS<Property>();
}

std::string TEXT(unsigned int, Brief const& brief, CC_PropertyString const*)
{
    return WITH_ELLIPSIS(std::string(TEXT_OF(brief)), brief);
}

std::string TEXT(unsigned int, Brief const& brief, CC_PropertyParametrizedString const*)
{
    return WITH_ELLIPSIS(std::string(TEXT_OF(brief)), brief);
}

std::string TEXT(unsigned int id, Brief const& brief, CC_PropertyCallLegState const*)
{
    return PRINT(CC_PropertyCallLegState(id, static_cast<CC_PropertyCallLegState::State>(brief.first)));
}

std::string TEXT(unsigned int id, Brief const& brief, CC_PropertyCause const*)
{
    return WITH_ELLIPSIS(
        PRINT(CC_PropertyCause(id, static_cast<QCause>(brief.first), brief.second, String(TEXT_OF(brief)))), brief);
}

std::string TEXT(unsigned int id, Brief const& brief, CC_PropertyCallProgressTone const*)
{
    auto const tone = static_cast<CC_PropertyCallProgressTone::Tone>(brief.first);
    return WITH_ELLIPSIS(PRINT(CC_PropertyCallProgressTone(id, tone, String(TEXT_OF(brief)))), brief);
}

std::string TEXT(unsigned int id, Brief const& brief, CC_PropertyCodec const*)
{
    VoipCodec const codec(static_cast<MG_Rtp::ECodec::Type>(brief.first), brief.second >> 2);
    return PRINT(CC_PropertyCodec(id, VoipCodecAndMode(codec, static_cast<VoipCodecAndMode::Mode>(brief.second & 3))));
}

std::string TEXT(unsigned int, Brief const& brief, CC_PropertyCodecs const*)
{
    std::string names;
    for (char const codec : TEXT_OF(brief))
    {
        String name;
        VoipCodec(static_cast<MG_Rtp::ECodec::Type>(static_cast<unsigned char>(codec))).getShortInfo(name);
        (names += names.empty() ? "" : " ") += name.view();
    }
    return WITH_ELLIPSIS(names, brief);
}

std::string TEXT(unsigned int id, Brief const& brief, CC_PropertyCodecNegotiating const*)
{
    auto const state = static_cast<CC_PropertyCodecNegotiating::State>(brief.first);
    return PRINT(CC_PropertyCodecNegotiating(id, state, brief.second));
}

std::string TEXT(unsigned int id, Brief const& brief, CC_PropertyWaitForMessage const*)
{
    auto const state = static_cast<CC_PropertyWaitForMessage::State>(brief.first);
    auto const type = static_cast<CC_PropertyWaitForMessage::MessageType>(brief.second);
    return PRINT(CC_PropertyWaitForMessage(id, state, type));
}

// A context without its media layer is a number.
std::string TEXT(unsigned int, Brief const& brief, CC_PropertyContextId const*)
{
    String text;
    return brief.second == 0 ? "(none)" : std::string(text.format("0x%8.8x", brief.first).view());
}

std::string TEXT(unsigned int, Brief const& brief, CC_PropertyIpAddress const*)
{
    std::array<char, 16> octets{};
    std::copy_n(brief.text, std::min<std::size_t>(brief.textSize, octets.size()), octets.begin());
    std::array<char, INET6_ADDRSTRLEN> text{};
    inet_ntop(brief.first == 6 ? AF_INET6 : AF_INET, octets.data(), text.data(), text.size());
    return text.data() + (brief.second != ~0U ? "/" + std::to_string(brief.second) : std::string());
}

using Print = std::string (*)(unsigned int, Brief const&);

constexpr std::array<Print, CC_PropertyClasses::SIZE> PRINTERS = []
{
    std::array<Print, CC_PropertyClasses::SIZE> result{};
    std::size_t place = 0;
    CC_PropertyClasses::FOR_EACH(
        [&]<class Property>()
        {
            result[place++] = [](unsigned int id, Brief const& brief)
            { return TEXT(id, brief, static_cast<Property const*>(nullptr)); };
        });
    return result;
}();

} // namespace

std::string CC_BriefText::OF(unsigned int propertyId, Brief const& brief)
{
    if (brief.place == Brief::NOTHING)
        return "(none)";
    if (brief.place < PRINTERS.size())
        return PRINTERS[brief.place](propertyId, brief);
    return "(" + WITH_ELLIPSIS(DEMANGLED(std::string(TEXT_OF(brief))), brief) + ")";
}

Brief CC_BriefText::TAKE(std::string_view& octets)
{
    auto const take = [&octets](auto& value)
    {
        if (octets.size() < sizeof value)
            return false;
        std::memcpy(&value, octets.data(), sizeof value);
        octets.remove_prefix(sizeof value);
        return true;
    };
    Brief brief;
    BriefHead head;
    if (!take(head))
        return brief;
    brief.place = head.place;
    brief.textLength = head.textLength;
    if ((head.shape & BriefHead::HAS_FIRST) != 0)
        std::ignore = take(brief.first);
    if ((head.shape & BriefHead::HAS_SECOND) != 0)
        std::ignore = take(brief.second);
    auto const size = static_cast<std::size_t>(head.shape & BriefHead::TEXT_SIZE);
    brief.textSize = static_cast<std::uint8_t>(std::min({size, std::size_t{Brief::MOST_TEXT}, octets.size()}));
    std::memcpy(brief.text, octets.data(), brief.textSize);
    octets.remove_prefix(std::min(CC_RecordFormat::WORDS_OF(size), octets.size()));
    return brief;
}
