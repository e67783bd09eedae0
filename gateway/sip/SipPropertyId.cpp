#include "SipPropertyId.h"

#include "properties/CC_PropertyTable.h"

char const* SipPropertyId::NAME(unsigned int id)
{
    switch (id)
    {
    case SESSION_DESCRIPTION:
        return "Session-Description";
    case CALL_NUMBER:
        return "Call-Number";
    case MAX_FORWARDS:
        return "Max-Forwards";
    default:
        CC_PropertyTable::Row const* const row = CC_PropertyTable::FIND(id);
        return row != nullptr && row->longName != nullptr ? row->longName : "(unknown)";
    }
}
