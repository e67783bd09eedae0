#include "properties/CC_PropertyName.h"

#include "platform/base/NameOf.h"

namespace
{
// "calling-" is tried first; the general container's empty prefix begins every name and so comes last
constexpr NamedValue<CC_PropertyContainerType> PREFIXES[] = {
    {CC_PCT_CALLING, "calling-"}, {CC_PCT_CALLED, "called-"}, {CC_PCT_GENERAL, ""}};
} // namespace

char const* CC_PROPERTY_CONTAINER_TYPE_NAME(CC_PropertyContainerType type) { return NAME_OF(PREFIXES, type); }

void SPLIT_PROPERTY_NAME(String& prefix, String& name, String const& fullName)
{
    name = fullName;
    prefix.clear();
    for (NamedValue<CC_PropertyContainerType> const& row : PREFIXES)
        if (String const tried(row.name); name.startsWith(tried))
        {
            prefix = tried;
            name.deleteRegion(0, tried.length());
            return;
        }
}

int GET_PROPERTY_TYPE(String const& fullName)
{
    if (fullName.isEmpty())
        return -1;
    for (NamedValue<CC_PropertyContainerType> const& row : PREFIXES)
        if (fullName.startsWith(row.name))
            return row.value;
    return -1;
}
