#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/signalling/QCause.h"
#include "platform/signalling/QReasonForRedirection.h"

// The short names by which configuration and diagnostics write causes and redirection reasons, and the tables' values
// by index, for those who list them. Constant data; any thread.
//
//     QCause const cause = GET_CAUSE_BY_SHORT_NAME("user-busy");
//     for (unsigned int i = 0; i < GET_CAUSE_SIZE(); ++i)
//         std::puts(CAUSE_SHORT_NAME(GET_CAUSE_BY_INDEX(i)));

/// "user-busy"; "(unspecified)" for UNSPECIFIED, the empty text for a value that the table lacks.
CC_EXPORT char const* CAUSE_SHORT_NAME(QCause cause);
/// The cause at that index of the table, UNSPECIFIED past its end.
CC_EXPORT QCause GET_CAUSE_BY_INDEX(unsigned int index);
/// How many causes the table holds: 54.
CC_EXPORT unsigned int GET_CAUSE_SIZE();
/// The cause with exactly that short name, UNSPECIFIED if there is none ("(unspecified)" and "" are no names).
CC_EXPORT QCause GET_CAUSE_BY_SHORT_NAME(String const& name);

/// "cfu"; "(unspecified)" for UNSPECIFIED, the empty text for a value that the table lacks.
CC_EXPORT char const* REASON_FOR_REDIRECTION_SHORT_NAME(QReasonForRedirection reason);
/// The reason at that index of the table, UNSPECIFIED past its end (7 and above).
CC_EXPORT QReasonForRedirection GET_REASON_FOR_REDIRECTION_BY_INDEX(unsigned int index);
/// The reason with exactly that short name, UNSPECIFIED if there is none.
CC_EXPORT QReasonForRedirection GET_REASON_FOR_REDIRECTION_BY_SHORT_NAME(String const& name);
