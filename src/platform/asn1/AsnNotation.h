#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/base/XCode.h"

class AsnSyntax;

/// Prints types and values in the notation of ASN.1 (X.680), from what the classes declare.
///
///     String text;
///     if (AsnNotation::TYPE_OF(Q956::Time(), text).isOk())
///         std::puts(text.c_str()); // Time ::= SEQUENCE { ... }
class CC_EXPORT AsnNotation
{
public:
    /// Replaces `out` by the definition of the value's type, as a module under IMPLICIT TAGS holds it: one line for
    /// each component, types with a name by their name. OK, or NO_ELEMENT when memory is out.
    static XCode TYPE_OF(AsnSyntax const& value, String& out);
    /// Replaces `out` by the value in value notation, on one line. A choice without a selection prints nothing after
    /// the place where it stands, an enumeration's number without a name prints as the number. OK, or NO_ELEMENT when
    /// memory is out.
    static XCode VALUE_OF(AsnSyntax const& value, String& out);
    /// The name of the value's type, or what kind of type it is ("SEQUENCE") where it has none. Lives for ever.
    static char const* NAME_OF(AsnSyntax const& value);
};
