#include "sip/message/SipPropertyId.h"

#include "properties/CC_PropertyTable.h"

#include <cstring>
#include <initializer_list>

XCode SipPropertyId::DECLARE()
{
    struct Names
    {
        unsigned int id;
        char const* longName;
        char const* shortName;
    };
    for (Names const& names :
         {Names{CONFERENCE, "Conference", "conference"}, Names{FORK, "Fork", "fork"},
          Names{SECURED, "Secured", "secured"}, Names{HEADERS_FOR_TARGET, "Headers-For-Target", "headers-for-target"},
          Names{SESSION_OFFER, "Session-Offer", "session-offer"},
          Names{SESSION_ANSWER, "Session-Answer", "session-answer"}, Names{CALL_NUMBER, "Call-Number", "call-number"},
          Names{MAX_FORWARDS, "Max-Forwards", "max-forwards"}, Names{REDIRECTION, "Redirection", "redirection"},
          Names{CARRIED_HEADERS, "Carried-Headers", "carried-headers"}, Names{ISUP, "ISUP", "isup"}})
        if (std::strcmp(NAME(names.id), names.longName) != 0)
            if (XCode const result = CC_PropertyTable::DECLARE(names.id, names.longName, names.shortName);
                !result.isOk())
                return result;
    return XCode::OK;
}

char const* SipPropertyId::NAME(unsigned int id)
{
    CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(id);
    return row != nullptr && row->longName != nullptr ? row->longName : "(unknown)";
}
