#include "properties/CC_PropertyParametrizedString.h"

#include <utility>

CC_PropertyParametrizedString::TypeId CC_PropertyParametrizedString::s_typeId;

namespace
{
using ParametrizedString = CC_PropertyParametrizedString::ParametrizedString;

String const* FIND_VALUE(ParametrizedString const& string, String const& key)
{
    for (CC_PropertyParametrizedString::KeyValuePair const& parameter : string.parameters)
        if (parameter.key.equalsIgnoreCase(key))
            return &parameter.value;
    return nullptr;
}
} // namespace

String const& ParametrizedString::getParameter(String const& key) const
{
    String const* const found = FIND_VALUE(*this, key);
    return found != nullptr ? *found : String::s_empty;
}

bool ParametrizedString::getParameter(String const& key, String& value) const
{
    String const* const found = FIND_VALUE(*this, key); // first: `value` may be the key's own object
    value.clear();
    if (found != nullptr)
        value = *found;
    return found != nullptr;
}

ParametrizedString const& ParametrizedString::EMPTY()
{
    static ParametrizedString const empty;
    return empty;
}

String& CC_PropertyParametrizedString::getValueString(String& out) const
{
    out = m_content.content;
    for (KeyValuePair const& parameter : m_content.parameters)
        out.concatf(" %s=%s", parameter.key.c_str(), parameter.value.c_str());
    return out;
}

void CC_PropertyParametrizedString::setContent(unsigned int counter, ParametrizedString const& content)
{
    ParametrizedString copy(content);
    m_content = std::move(copy);
    m_updateCounter = counter;
}

bool CC_PropertyParametrizedString::hasSameValue(CC_PropertyParametrizedString const& other) const
{
    return m_content == other.m_content && m_updateCounter == other.m_updateCounter;
}
