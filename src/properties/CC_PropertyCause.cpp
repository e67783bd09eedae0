#include "properties/CC_PropertyCause.h"

#include "platform/base/NameOf.h"

CC_PropertyCause::TypeId CC_PropertyCause::s_typeId;

namespace
{
// the wording that peers of this system know; it differs from today's RFC 3261 in places, and 606 shares that of 406
constexpr NamedValue<unsigned int> SIP_PHRASES[] = {
    {400, "Bad Request"},
    {401, "Unauthorized"},
    {402, "Payment Required"},
    {403, "Forbidden"},
    {404, "Not Found"},
    {405, "Method Not Allowed"},
    {406, "Not Acceptable"},
    {407, "Proxy Authentication Required"},
    {408, "Request Timeout"},
    {410, "Gone"},
    {413, "Request Entity Too Large"},
    {414, "Request-URI Too Large"},
    {415, "Unsupported Media Type"},
    {416, "Unsupported URI Scheme"},
    {420, "Bad Extension"},
    {421, "Extension Required"},
    {423, "Interval Too Brief"},
    {480, "Temporarily not available"},
    {481, "Call Leg/Transaction Does Not Exist"},
    {482, "Loop Detected"},
    {483, "Too Many Hops"},
    {484, "Address Incomplete"},
    {485, "Ambiguous"},
    {486, "Busy Here"},
    {487, "Request Terminated"},
    {488, "Not Acceptable Here"},
    {491, "Request Pending"},
    {493, "Undecipherable"},
    {500, "Internal Server Error"},
    {501, "Not Implemented"},
    {502, "Bad Gateway"},
    {503, "Service Unavailable"},
    {504, "Server Time-out"},
    {505, "SIP Version not supported"},
    {513, "Message Too Large"},
    {600, "Busy Everywhere"},
    {603, "Decline"},
    {604, "Does not exist anywhere"},
    {606, "Not Acceptable"},
};
} // namespace

String& CC_PropertyCause::getValueString(String& out) const
{
    if (m_text.isEmpty())
        out = QCAUSE_NAME(m_cause);
    else
        out = m_text;
    if (m_sipCode != 0)
        out.concatf(" (%u)", m_sipCode);
    return out;
}

String& CC_PropertyCause::getReasonHeaderString(String& out) const
{
    out.clear();
    if (m_cause != QCause::NONE)
        return out.format("Q.850;cause=%u;text=\"%s\"", static_cast<unsigned int>(m_cause), QCAUSE_NAME(m_cause));
    if (m_sipCode == 0)
        return out;
    String const phrase = m_text.isEmpty() ? getSipTextFromCode(m_sipCode) : m_text;
    return out.format("SIP;cause=%u;text=\"%s\"", m_sipCode, phrase.c_str());
}

String CC_PropertyCause::getSipTextFromCode(unsigned int sipCode) const
{
    return NAME_OF(SIP_PHRASES, sipCode, "UNKNOWN CAUSE");
}
