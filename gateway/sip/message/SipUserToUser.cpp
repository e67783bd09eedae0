#include "sip/message/SipUserToUser.h"

#include "sip/message/SipReason.h"
#include "sip/message/SipText.h"

#include <algorithm>
#include <new>
#include <string_view>

#include <strings.h>

namespace
{
using Content = CC_PropertyParametrizedString::ParametrizedString;

String UNQUOTED(std::string_view text) { return String(std::string_view(SipReason::UNQUOTE(text))); }

bool IS_VALUE(std::string_view text)
{
    return SipText::IS_ONE_TOKEN(text) || (text.size() > 1 && text.front() == '"' && text.back() == '"');
}

/// Empty for what the grammar does not know.
std::optional<Content> PARSE(std::string_view text)
{
    text = SipText::CUT(text, ','); // of several the first
    std::string_view const data = SipText::CUT(text, ';');
    if (!IS_VALUE(data))
        return std::nullopt;
    Content content(UNQUOTED(data));
    while (!text.empty())
    {
        std::string_view value = SipText::CUT(text, ';');
        std::string_view const key = SipText::CUT(value, '=');
        value = SipText::TRIM(value);
        if (!SipText::IS_ONE_TOKEN(key) || !IS_VALUE(value))
            return std::nullopt;
        if (!content.parameters.append({String(key), UNQUOTED(value)}).isOk())
            throw std::bad_alloc();
    }
    return content;
}

bool IS_SOUND(std::string_view text) { return std::none_of(text.begin(), text.end(), SipText::IS_CONTROL); }

std::string WRITTEN(std::string_view text)
{
    return SipText::IS_ONE_TOKEN(text) ? std::string(text) : '"' + SipReason::ESCAPE(text) + '"';
}
} // namespace

std::optional<Content> SipUserToUser::READ(sip_t const* message)
{
    for (sip_unknown_t const* line = message->sip_unknown; line != nullptr; line = line->un_next)
        if (strcasecmp(line->un_name, "User-to-User") == 0 && line->un_value != nullptr)
        {
            std::string_view const value = SipText::TRIM(line->un_value);
            return value.size() <= LONGEST && IS_SOUND(value) ? PARSE(value) : std::nullopt;
        }
    return std::nullopt;
}

std::string SipUserToUser::GET_LINE(Content const& content)
{
    if (content.content.isEmpty() || !IS_SOUND(content.content.view()))
        return {};
    std::string value = WRITTEN(content.content.view());
    for (CC_PropertyParametrizedString::KeyValuePair const& parameter : content.parameters)
    {
        if (!SipText::IS_ONE_TOKEN(parameter.key.view()) || !IS_SOUND(parameter.value.view()))
            return {};
        value.append(";").append(parameter.key.view()).append("=").append(WRITTEN(parameter.value.view()));
    }
    return value.size() <= LONGEST ? "User-to-User: " + value + "\r\n" : std::string();
}
