#include "platform/asn1/AsnTrace.h"

#include <cstdarg>
#include <cstdio>

bool AsnTrace::fail(char const* format, ...)
{
    char reason[160]; // every reason is one short sentence of the codec's own
    std::va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(reason, sizeof reason, format, arguments);
    va_end(arguments);
    m_error = m_root;
    appendPath(m_last);
    m_error.concatf(": %s", reason);
    return false;
}

void AsnTrace::appendPath(Step const* last)
{
    if (last == nullptr)
        return;
    appendPath(last->m_before); // as deep as the value is, which the decoder bounds
    if (last->m_name != nullptr)
        m_error.concatf(".%s", last->m_name);
    else
        m_error.concatf("[%zu]", last->m_index);
}
