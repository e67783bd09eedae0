#include "testing/PropertyNames.h"

#include "properties/CC_Flags.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyContainer.h"
#include "testing/FailingAllocator.h"

#include <cstdio>
#include <limits>
#include <string_view>

namespace
{
constexpr unsigned int NO_BIT = std::numeric_limits<unsigned int>::max();

void APPEND(std::string& list, std::string const& item)
{
    list += list.empty() ? "" : ", ";
    list += item;
}

std::string NAME_OF_PROPERTY(CC_Property const& property)
{
    std::string_view const name = property.getPropertyName();
    if (name != "(unknown)")
        return std::string(name);
    char id[16];
    std::snprintf(id, sizeof id, "0x%x", property.getId());
    return id;
}
} // namespace

std::string PROPERTY_NAME(unsigned int id) { return NAME_OF_PROPERTY(CC_PropertyBoolean(id)); }

std::string PROPERTY_NAMES(CC_Flags const& flags)
{
    FailingAllocator::Pause const unseen;
    std::string names;
    for (unsigned int id = flags.getFirstSet(0); id != NO_BIT; id = flags.getFirstSet(id + 1))
        APPEND(names, PROPERTY_NAME(id));
    return names;
}

std::string PROPERTY_NAMES(CC_PropertyContainer const& properties)
{
    FailingAllocator::Pause const unseen;
    std::string names;
    for (CC_Property const& property : properties)
        APPEND(names, NAME_OF_PROPERTY(property));
    return names;
}

std::string PROPERTY_VALUES(CC_PropertyContainer const& properties)
{
    FailingAllocator::Pause const unseen;
    std::string values;
    for (CC_Property const& property : properties)
    {
        String value;
        APPEND(values, NAME_OF_PROPERTY(property) + ": " + property.getValueString(value).c_str());
    }
    return values;
}
