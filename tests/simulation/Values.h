#pragma once

#include "properties/CC_Property.h"
#include "properties/CC_PropertyContainer.h"

#include <functional>
#include <string>
#include <vector>

namespace Simulation
{
/// The classes of property that the simulator writes.
enum class Kind : unsigned char
{
    NONE,
    TEXT,
    UNSIGNED,
    BOOLEAN,
    STATE,
    CAUSE,
    MEDIA,
    ACTING, // a module's own class
    TYPE_OF_NUMBER,
    NUMBERING_PLAN,
    PRESENTATION,
    SCREENING,
    TRANSFER_CAPABILITY,
    REDIRECTING_REASON,
    CALL_TYPE,
    NEGOTIATING,
    WAIT_FOR_MESSAGE,
    TONE,
    IP_ADDRESS, // from here on of a few made values each, of which `number` tells which
    PARAMETRIZED,
    CODECS,
    CODEC,
    TARIFF,
    CHARGE,
    QUALITY
};

/// What a property is worth, without the library: its class and value.
struct Value
{
    Kind kind = Kind::NONE;
    unsigned long long number = 0;
    std::string text{};
    friend bool operator==(Value const&, Value const&) = default;
};

/// A property without the library.
struct Property
{
    unsigned int id = 0;
    Value value{};
    friend bool operator==(Property const&, Property const&) = default;
};

using Properties = std::vector<Property>;

/// What can be written: which ids, of which classes, with which values.
class Values
{
public:
    static constexpr unsigned int NUMBER_OF_TEXTS = 12;
    static constexpr unsigned int NUMBER_OF_VARIANTS = 3; // of the made values

    /// The property that these two octets choose. Never a State.
    static Property CHOOSE(unsigned int which, unsigned int variant);
    /// Up to four of them.
    static Properties CHOOSE_SEVERAL(unsigned int seed);
    static char const* TEXT(unsigned int number);
    static Property MAKE_TEXT(unsigned int id, std::string const& text) { return {id, {Kind::TEXT, 0, text}}; }
    static Property MAKE_STATE(int state);
    static Property MAKE_CAUSE(int cause, unsigned int sipCode);
    static Property MAKE_NUMBER(unsigned int id, Kind kind, unsigned long long number) { return {id, {kind, number}}; }

    /// Calls `use` with such a property of the library's.
    static void WITH(Property const& property, std::function<void(CC_Property const&)> const& use);
    static void STORE(CC_PropertyContainer& container, Properties const& properties);
    /// The library's property as one without it.
    static Value READ(CC_Property const& property);
    static Properties READ(CC_PropertyContainer const& container);
    /// "Name=TEXT Ada", for messages.
    static std::string PRINT(Property const& property);
    static std::string PRINT(Properties const& properties);

    /// Makes what lives as long as the process, so that it counts for no run.
    static void PREPARE();
};
} // namespace Simulation
