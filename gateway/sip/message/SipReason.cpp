#include "sip/message/SipReason.h"

#include "sip/message/SipText.h"

namespace
{
using namespace SipText;

/// One reason value: "protocol;cause=...;text=...".
void READ_VALUE(std::string_view value, SipReason& reason)
{
    std::string_view const protocol = CUT(value, ';');
    bool const isQ850 = EQUALS_IGNORING_CASE(protocol, "Q.850");
    if (!isQ850 && !EQUALS_IGNORING_CASE(protocol, "SIP"))
        return;
    unsigned int cause = 0;
    std::string text;
    while (!value.empty())
    {
        std::string_view parameter = CUT(value, ';');
        std::string_view const name = CUT(parameter, '=');
        if (EQUALS_IGNORING_CASE(name, "cause"))
            cause = isQ850 ? NUMBER(TRIM(parameter), 1, 127) : NUMBER(TRIM(parameter), 100, 699);
        else if (EQUALS_IGNORING_CASE(name, "text"))
            text = SipReason::UNQUOTE(TRIM(parameter));
    }
    if (cause == 0)
        return;
    unsigned int& target = isQ850 ? reason.q850Cause : reason.sipCode;
    if (target == 0)
        target = cause;
    if (reason.text.empty())
        reason.text = text;
}
} // namespace

SipReason SipReason::PARSE(std::string_view value)
{
    SipReason reason;
    while (!value.empty())
        READ_VALUE(CUT(value, ','), reason);
    return reason;
}

std::string SipReason::ESCAPE(std::string_view text)
{
    std::string escaped;
    escaped.reserve(text.size());
    for (char const c : text)
    {
        if (c == '"' || c == '\\')
            escaped += '\\';
        escaped += IS_CONTROL(c) ? ' ' : c;
    }
    return escaped;
}

std::string SipReason::UNQUOTE(std::string_view text)
{
    bool const isQuoted = text.size() >= 2 && text.front() == '"' && text.back() == '"';
    if (isQuoted)
        text = text.substr(1, text.size() - 2);
    std::string plain;
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        if (isQuoted && text[i] == '\\' && i + 1 < text.size())
            ++i;
        plain += IS_CONTROL(text[i]) ? ' ' : text[i];
    }
    return plain;
}
