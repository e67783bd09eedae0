#pragma once

#include "platform/asn1/AsnSyntax.h"
#include "properties/CC_Property.h"

#include <memory>
#include <string>
#include <string_view>
#include <vector>

/// The types of the records' module by their names, for the tool, its tests and the fuzzer.
///
///     std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE("Amount");
///     if (value == nullptr)
///         ... // no such type, or no memory
class RecordTypes
{
public:
    /// A value of the type with its initial value, null for a name of no type. "QoS" is another name of "CC-QoS".
    static std::unique_ptr<AsnSyntax> CREATE(std::string_view name);
    /// The names of all types in the module's order.
    static std::vector<char const*> NAMES();
    /// The text that a property with that value prints; false for a type that is no property's value.
    static bool TEXT_OF(AsnSyntax const& value, String& out);
};
