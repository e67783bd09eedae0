#include "properties/CC_PropertyBrief.h"

#include "platform/media/MG_IContext.h"
#include "properties/CC_PropertyClasses.h"
#include "properties/CC_PropertyContainer.h"
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

using CC_RecordFormat::BriefHead;

template <class Property>
constexpr auto PLACE = static_cast<std::uint8_t>(CC_PropertyClasses::PLACE_OF<Property>());

// Each writes a value where `place` points to, and returns the place behind it. The same value leaves the same octets.

char* PUT_NUMBER(char* place, std::uint32_t number)
{
    std::memcpy(place, &number, sizeof number);
    return place + sizeof number;
}

char* PUT_TEXT(char* place, std::string_view text)
{
    constexpr std::size_t WORD = CC_RecordFormat::WORDS_OF(1);
    std::memset(place + text.size() / WORD * WORD, 0, WORD); // of which the text leaves some
    CC_RecordWriter::APPEND(place, text);
    return place + CC_RecordFormat::WORDS_OF(text.size());
}

char* PUT_HEAD(char* place, std::uint8_t of, unsigned int shape, std::size_t textLength = 0)
{
    new (place) BriefHead{of, static_cast<std::uint8_t>(shape), static_cast<std::uint16_t>(textLength)};
    return place + sizeof(BriefHead);
}

std::size_t KEPT_OF(std::string_view text) { return std::min<std::size_t>(text.size(), Brief::MOST_TEXT); }

std::size_t LENGTH_OF(std::string_view text)
{
    return std::min<std::size_t>(text.size(), std::numeric_limits<std::uint16_t>::max());
}

char* PUT(char* place, std::uint8_t of, std::string_view text)
{
    std::size_t const kept = KEPT_OF(text);
    place = PUT_HEAD(place, of, static_cast<unsigned int>(kept), LENGTH_OF(text));
    return PUT_TEXT(place, {text.data(), kept});
}

/// Most texts are short, and a String has room for these in itself: so all of that is copied, whatever there is of it,
/// and what is behind the text's last word counts no more.
[[gnu::always_inline]] inline char* PUT_STRING(char* place, std::uint8_t of, String const& text)
{
    constexpr std::size_t ROOM = 16;
    std::size_t const size = text.length();
    if (size >= ROOM) [[unlikely]]
        return PUT(place, of, text.view());
    place = PUT_HEAD(place, of, static_cast<unsigned int>(size), size);
    std::memcpy(place, text.c_str(), ROOM);
    std::memset(place + size, 0, CC_RecordFormat::WORDS_OF(1));
    return place + CC_RecordFormat::WORDS_OF(size);
}

char* PUT(char* place, std::uint8_t of, std::uint32_t first, std::uint32_t second, std::string_view text = {})
{
    std::size_t const kept = KEPT_OF(text);
    auto const shape = BriefHead::HAS_FIRST | BriefHead::HAS_SECOND | static_cast<unsigned int>(kept);
    place = PUT_NUMBER(PUT_NUMBER(PUT_HEAD(place, of, shape, LENGTH_OF(text)), first), second);
    return PUT_TEXT(place, {text.data(), kept});
}

char* PUT(char* place, std::uint8_t of, unsigned long long number)
{
    auto const high = static_cast<std::uint32_t>(number >> 32);
    if (high != 0)
        return PUT(place, of, static_cast<std::uint32_t>(number), high);
    return PUT_NUMBER(PUT_HEAD(place, of, BriefHead::HAS_FIRST), static_cast<std::uint32_t>(number));
}

char* PUT_NOTHING(char* place) { return PUT_HEAD(place, Brief::NOTHING, 0); }

// Of most classes the value is a number or a text; records of charge, tariff and quality are too large for either.
template <class Property>
[[gnu::always_inline]] inline char* DESCRIBE(char* place, Property const& property)
{
    if constexpr (requires { property.getValue().view(); })
        return PUT_STRING(place, PLACE<Property>, property.getValue());
    else if constexpr (requires { static_cast<unsigned long long>(property.getValue()); })
        return PUT(place, PLACE<Property>, static_cast<unsigned long long>(property.getValue()));
    else
        return PUT_HEAD(place, PLACE<Property>, 0);
}

char* DESCRIBE(char* place, CC_PropertyCallLegState const& property)
{
    return PUT(place, PLACE<CC_PropertyCallLegState>, static_cast<std::uint32_t>(property.getState()));
}

char* DESCRIBE(char* place, CC_PropertyCause const& property)
{
    return PUT(place, PLACE<CC_PropertyCause>, static_cast<std::uint32_t>(property.getCause()), property.getSipCode(),
               property.getText());
}

char* DESCRIBE(char* place, CC_PropertyCallProgressTone const& property)
{
    return PUT(place, PLACE<CC_PropertyCallProgressTone>, static_cast<std::uint32_t>(property.getTone()), 0,
               property.getText());
}

char* DESCRIBE(char* place, CC_PropertyCodec const& property)
{
    VoipCodec const& codec = property.getValue().getCodec();
    return PUT(place, PLACE<CC_PropertyCodec>, static_cast<std::uint32_t>(codec.getCodec()),
               codec.getPacketPeriod() << 2 | static_cast<std::uint32_t>(property.getValue().getMode()));
}

// The codecs of both directions, an octet each.
char* DESCRIBE(char* place, CC_PropertyCodecs const& property)
{
    std::array<char, Brief::MOST_TEXT> codecs;
    std::size_t count = 0;
    for (VoipCodec const& codec : property.getValue().getList(VoipCodecListSet::SEND_RECEIVE))
        if (count < codecs.size())
            codecs[count++] = static_cast<char>(codec.getCodec());
    return PUT(place, PLACE<CC_PropertyCodecs>, {codecs.data(), count});
}

char* DESCRIBE(char* place, CC_PropertyCodecNegotiating const& property)
{
    return PUT(place, PLACE<CC_PropertyCodecNegotiating>, static_cast<std::uint32_t>(property.getState()),
               property.getNegotiatedValue());
}

char* DESCRIBE(char* place, CC_PropertyWaitForMessage const& property)
{
    return PUT(place, PLACE<CC_PropertyWaitForMessage>, static_cast<std::uint32_t>(property.getState()),
               static_cast<std::uint32_t>(property.getMessageType()));
}

// The media layer is asked, as when the value is printed.
char* DESCRIBE(char* place, CC_PropertyContextId const& property)
{
    MG_IContext const* const context = property.getContext();
    return PUT(place, PLACE<CC_PropertyContextId>, context != nullptr ? context->getId() : 0,
               context != nullptr ? 1 : 0);
}

char* DESCRIBE(char* place, CC_PropertyIpAddress const& property)
{
    IpAddress const& address = property.getValue();
    auto const& octets = address.getOctets();
    return PUT(place, PLACE<CC_PropertyIpAddress>, address.getVersion(),
               address.isNetType() ? address.getPrefixLength() : ~0U,
               {reinterpret_cast<char const*>(octets.data()), address.getVersion() == 4 ? 4U : octets.size()});
}

char* DESCRIBE(char* place, CC_PropertyParametrizedString const& property)
{
    return PUT(place, PLACE<CC_PropertyParametrizedString>, property.getUpdateCounter(), 0,
               property.getContent().content);
}

/// Describes two properties of one class, one behind the other. The first one is null: no property. The second one is
/// null: only the first.
using Describe = char* (*)(char* place, CC_Property const* first, CC_Property const* second);

template <class Property>
char* DESCRIBE_BOTH(char* place, CC_Property const* first, CC_Property const* second)
{
    place = first != nullptr ? DESCRIBE(place, static_cast<Property const&>(*first)) : PUT_NOTHING(place);
    return second != nullptr ? DESCRIBE(place, static_cast<Property const&>(*second)) : place;
}

/// Whether it is a text of the library's own class: what most values are.
bool IS_TEXT(CC_Property const& property) { return &typeid(property) == &typeid(CC_PropertyString); }

/// Whether memory sufficed.
bool ASSIGN(CC_PropertyString& stored, CC_PropertyString const& property)
{
    try
    {
        stored.setValue(property.getValue());
        return true;
    }
    catch (std::bad_alloc const&)
    {
        return false;
    }
}

constexpr std::array<Describe, CC_PropertyClasses::SIZE> DESCRIPTIONS = []
{
    std::array<Describe, CC_PropertyClasses::SIZE> result{};
    std::size_t place = 0;
    CC_PropertyClasses::FOR_EACH([&]<class Property>() { result[place++] = &DESCRIBE_BOTH<Property>; });
    return result;
}();
} // namespace

CC_PropertyBrief::CC_PropertyBrief(CC_Property const* property)
{
    CC_PropertyKind const* const kind = property != nullptr ? CC_PropertyKind::OF(*property) : nullptr;
    char* const place = m_place.data();
    char* behind = place;
    if (kind != nullptr && kind->place != CC_PropertyKind::NO_PLACE)
        behind = DESCRIPTIONS[kind->place](place, property, nullptr);
    else if (property != nullptr)
        behind = PUT(place, Brief::OTHER_CLASS, typeid(*property).name());
    else
        behind = PUT_NOTHING(place);
    m_size = static_cast<std::size_t>(behind - place);
}

XCode CC_PropertyBrief::REPLACE(CC_PropertyContainer& in, CC_Property* stored, CC_Property const& property,
                                CC_RecordFormat::Kind kind, unsigned long long call, unsigned long long leg)
{
    if (stored == nullptr || !IS_TEXT(property) || !IS_TEXT(*stored))
        return REPLACE_OF_ANY_CLASS(in, stored, property, kind, call, leg);
    auto& former = static_cast<CC_PropertyString&>(*stored);
    auto const& text = static_cast<CC_PropertyString const&>(property);
    CC_RecordWriter& recorder = CC_RecordWriter::INSTANCE();
    char* const values = recorder.beginChange(kind, call, leg, text.getId());
    recorder.fill(DESCRIBE(DESCRIBE(values, former), text));
    if (!ASSIGN(former, text))
        return XCode::NO_ELEMENT;
    recorder.endChange();
    return XCode::OK;
}

__attribute__((noinline)) XCode CC_PropertyBrief::REPLACE_OF_ANY_CLASS(CC_PropertyContainer& in, CC_Property* stored,
                                                                       CC_Property const& property,
                                                                       CC_RecordFormat::Kind kind,
                                                                       unsigned long long call, unsigned long long leg)
{
    CC_PropertyKind const* const known = CC_PropertyKind::OF(property);
    bool const isUndisturbed = known != nullptr && known->isSelfContained &&
                               known->place != CC_PropertyKind::NO_PLACE &&
                               (stored == nullptr || &typeid(*stored) == &typeid(property));
    if (!isUndisturbed)
        return REPLACE_OF_ANY_KIND(in, property, kind, call, leg);
    // nobody is called, so both values go straight into the record
    CC_RecordWriter& recorder = CC_RecordWriter::INSTANCE();
    char* const values = recorder.beginChange(kind, call, leg, property.getId());
    recorder.fill(DESCRIPTIONS[known->place](values, stored, &property));
    if (!(stored != nullptr ? known->assign(*stored, property) : in.appendCopy(property)))
        return XCode::NO_ELEMENT;
    recorder.endChange();
    return XCode::OK;
}

/// As above, where others are called: they may change what is stored, and end the recording.
XCode CC_PropertyBrief::REPLACE_OF_ANY_KIND(CC_PropertyContainer& in, CC_Property const& property,
                                            CC_RecordFormat::Kind kind, unsigned long long call, unsigned long long leg)
{
    unsigned int const id = property.getId();
    CC_PropertyBrief const before(in.find(id));
    if (!in.replace(in.find(id), property).isOk())
        return XCode::REFUSED;
    CC_PropertyBrief const now(in.find(id));
    CC_RecordWriter* const recorder = CC_RecordWriter::ON();
    if (recorder == nullptr)
        return XCode::OK;
    char* place = recorder->beginChange(kind, call, leg, id);
    for (std::string_view const octets : {before.getOctets(), now.getOctets()})
        place = CC_RecordWriter::APPEND(place, octets);
    recorder->fill(place);
    recorder->endChange();
    return XCode::OK;
}
